#include "programs/reelfx/commands/picture_commands.h"

#include "programs/reelfx/common/interrupt.h"
#include "programs/reelfx/pictures/picture_grid.h"
#include "programs/reelfx/media/picture_turn.h"
#include "programs/reelfx/media/pixel_converter.h"
#include "programs/reelfx/pictures/still_writer.h"

namespace velmora::hosts {
namespace {

constexpr std::int32_t kSheetCellWidth = 480;

// These commands write at their very end.
void FailIfInterrupted() {
    if (Interrupts() > 0) throw Failure(kExitInterrupted, "interrupted; nothing was written");
}

// A frame of the clip as a viewer sees it.
struct SourcePicture {
    BgraPicture picture;
    double seconds = 0.0;
};

SourcePicture ReadFrame(const PictureOptions& options) {
    MediaReader reader(options.input);
    std::int64_t index = 0;
    for (;;) {
        FailIfInterrupted();
        MediaReader::Item item = reader.Next();
        if (!item.frame && !item.packet) break;
        if (!item.frame || index++ != options.frame) continue;
        BgraPicture lying(item.frame->width, item.frame->height);
        PixelConverter().ToBgra(*item.frame, lying);
        SourcePicture source;
        source.seconds = reader.SecondsOf(item.frame->pts);
        TurnPicture(lying, QuarterTurnsOf(reader.Picture()), source.picture);
        return source;
    }
    if (!reader.BreakOff().empty()) throw Failure(kExitInput, reader.Name() + ": " + reader.BreakOff());
    throw Failure(kExitInput, reader.Name() + ": has no frame " + std::to_string(options.frame) +
                                  "; it has " + std::to_string(index));
}

BgraPicture Render(effects::EffectSession& session, SourcePicture& source) {
    FailIfInterrupted();
    BgraPicture result(source.picture.Width(), source.picture.Height());
    if (!session.Render(source.picture.Record(), result.Record(), source.seconds)) {
        throw Failure(kExitInternal, "the frame cannot be rendered");
    }
    return result;
}

}  // namespace

ExitCode RunFrame(const PictureOptions& options) {
    CheckStillName(options.out);
    const EffectChoice choice(options.effect);
    SourcePicture source = ReadFrame(options);
    std::string label = choice.Info().name;
    if (options.effect.preset) label += ": " + *options.effect.preset;
    std::vector<GridCell> cells;
    cells.push_back({"Source", source.picture});
    cells.push_back({label, Render(*choice.NewSession(), source)});
    const std::int32_t width = options.width > 0 ? options.width : source.picture.Width();
    WriteStill(DrawGrid(cells, {"", 2, width}), options.out, options.mayOverwrite);
    return kExitDone;
}

ExitCode RunSheet(const PictureOptions& options) {
    CheckStillName(options.out);
    const EffectChoice choice(options.effect);
    SourcePicture source = ReadFrame(options);
    std::vector<GridCell> cells;
    cells.push_back({"Source", source.picture});
    for (std::uint32_t preset = 0; preset < choice.Info().presets.size(); ++preset) {
        cells.push_back({choice.Info().presets[preset], Render(*choice.NewSession(preset), source)});
    }
    const std::int32_t width = options.width > 0 ? options.width : kSheetCellWidth;
    WriteStill(DrawGrid(cells, {choice.Info().name, options.columns, width}), options.out,
               options.mayOverwrite);
    return kExitDone;
}

}  // namespace velmora::hosts
