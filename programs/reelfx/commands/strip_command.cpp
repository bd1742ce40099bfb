#include "programs/reelfx/commands/commands.h"

#include <algorithm>
#include <cstring>
#include <tuple>
#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/common/output_place.h"
#include "programs/reelfx/pictures/pictures.h"

namespace velmora::hosts {
namespace {

struct Rectangle {
    std::int32_t left, top, width, height;
};

std::string TextOf(FrameSize size) {
    return std::to_string(size.width) + "x" + std::to_string(size.height);
}

std::string TextOf(const Rectangle& part) {
    return TextOf(FrameSize{part.width, part.height}) + "+" + std::to_string(part.left) + "+" +
           std::to_string(part.top);
}

// A row of all frames fills a screen 1920 pixels wide, at half the height of 1080-line video.
FrameSize DefaultSize(const BgraPicture& picture, int columns) {
    constexpr std::int32_t kScreen = 1920, kGap = 4, kLeast = 48, kHeight = 540;
    const std::int32_t width = std::max(kLeast, (kScreen - kGap) / columns - kGap);
    return {std::min(width, picture.Width()), std::min(kHeight, picture.Height())};
}

Rectangle PartOf(const BgraPicture& picture, const std::optional<Crop>& crop, int columns) {
    const FrameSize size = crop ? crop->size : DefaultSize(picture, columns);
    Rectangle part = {(picture.Width() - size.width) / 2, (picture.Height() - size.height) / 2, size.width,
                      size.height};
    if (crop && crop->corner) std::tie(part.left, part.top) = *crop->corner;
    if (part.left < 0 || part.top < 0 || part.left > picture.Width() - part.width ||
        part.top > picture.Height() - part.height) {
        throw UsageError("--crop " + (crop->corner ? TextOf(part) : TextOf(size)) +
                         " extends beyond the picture of " +
                         TextOf(FrameSize{picture.Width(), picture.Height()}));
    }
    return part;
}

BgraPicture Cut(const BgraPicture& picture, const Rectangle& part) {
    BgraPicture result(part.width, part.height);
    for (std::int32_t y = 0; y < part.height; ++y) {
        std::memcpy(result.Row(y), picture.Row(part.top + y) + std::ptrdiff_t{part.left} * 4,
                    static_cast<std::size_t>(part.width) * 4);
    }
    return result;
}

std::string TitleOf(const EffectList& effects, const Rectangle& part) {
    std::string title;
    for (const EffectChoice& choice : effects.Choices()) {
        const EffectOptions& effect = choice.Options();
        title += (title.empty() ? "" : " + ") + choice.Title();
        for (const std::string& setting : effect.settings) title += ", " + setting;
        if (!effect.randomState) title += ", seed " + std::to_string(effect.seed);
    }
    return title + ", " + TextOf(part);
}

}  // namespace

std::optional<Crop> ParseCrop(const std::string& text) {
    const std::size_t plus = text.find('+');
    const auto size = ParseSize(text.substr(0, plus));
    if (!size) return std::nullopt;
    if (plus == std::string::npos) return Crop{*size, std::nullopt};
    const std::string corner = text.substr(plus + 1);
    const std::size_t middle = corner.find('+');
    if (middle == std::string::npos) return std::nullopt;
    const auto left = ParseInteger(corner.substr(0, middle)), top = ParseInteger(corner.substr(middle + 1));
    constexpr std::int64_t kMost = 32768;
    if (!left || !top || *left < 0 || *top < 0 || *left > kMost || *top > kMost) return std::nullopt;
    return Crop{*size, std::pair(static_cast<std::int32_t>(*left), static_cast<std::int32_t>(*top))};
}

ExitCode Run(const StripOptions& options) {
    const PictureOptions& picture = options.picture;
    CheckStillName(picture.out);
    const EffectList effects(picture.effects);
    CheckIsNotInput(picture.out, picture.input.path);
    CheckOutputPlace(picture.out, picture.mayOverwrite);
    const int columns = picture.columns > 0 ? picture.columns : options.frames;
    EffectListSession session = effects.NewSession();
    ClipPictures frames(picture.input, picture.place, options.frames);
    std::optional<Rectangle> part;
    std::vector<GridCell> cells;
    while (cells.size() < static_cast<std::size_t>(options.frames)) {
        std::optional<ClipPicture> frame = frames.Next();
        if (!frame) break;
        if (!part) part = PartOf(frame->picture, options.crop, columns);
        cells.push_back({std::to_string(frame->index), Cut(Rendered(session, *frame), *part)});
    }
    const GridOptions grid = {TitleOf(effects, *part), columns, part->width};
    WriteStill(DrawGrid(cells, grid), picture.out, picture.mayOverwrite);
    return kExitDone;
}

}  // namespace velmora::hosts
