#include "programs/reelfx/commands/commands.h"

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/pictures/pictures.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/media/pixel_converter.h"
#include <filesystem>
#include <optional>
#include <utility>
#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/common/output_place.h"

namespace velmora::hosts {
namespace {

constexpr std::int32_t kSheetCellWidth = 480;
constexpr int kSheetColumns = 4;
constexpr char kNameMark[] = "%s";  // stands for the effect's name when several sheets are written

BgraPicture DrawSheet(const EffectChoice& choice, ClipPicture& source, const PictureOptions& options) {
    std::vector<GridCell> cells;
    cells.push_back({"Source", source.picture});
    for (std::uint32_t preset = 0; preset < choice.Info().presets.size(); ++preset) {
        const EffectList effects(choice.WithPreset(preset));
        EffectListSession session = effects.NewSession();
        cells.push_back({choice.Info().presets[preset], Rendered(session, source)});
    }
    const std::int32_t width = options.width > 0 ? options.width : kSheetCellWidth;
    return DrawGrid(cells,
                    {choice.Info().name, options.columns > 0 ? options.columns : kSheetColumns, width});
}

// "film-pro"
std::string FileNameOf(std::string effect) {
    for (char& letter : effect) {
        letter = letter == ' '                    ? '-'
                 : letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter + 'a' - 'A')
                                                  : letter;
    }
    return effect;
}

// Where several sheets are written.
class SheetPlaces {
  public:
    explicit SheetPlaces(const std::string& out) : m_pattern(out) {
        namespace fs = std::filesystem;
        if (out.find(kNameMark) == std::string::npos) {
            if (!IsFolder(out))
                throw UsageError(out + ": --all needs a folder, or a name like sheets/%s.png");
            m_pattern = (fs::path(out) / kNameMark).string() + ".png";
        }
        CheckStillName(m_pattern);
        m_folder.emplace(fs::path(m_pattern).parent_path());
    }

    [[nodiscard]] std::string Of(const std::string& effect) const {
        std::string path = m_pattern;
        const std::string name = FileNameOf(effect);
        for (std::size_t at = 0; (at = path.find(kNameMark, at)) != std::string::npos; at += name.size())
            path.replace(at, sizeof(kNameMark) - 1, name);
        return path;
    }

  private:
    // A name with an extension is a file, unless a folder of that name exists.
    static bool IsFolder(const std::string& path) {
        namespace fs = std::filesystem;
        std::error_code ignored;
        const fs::file_status status = fs::status(path, ignored);
        return fs::exists(status) ? fs::is_directory(status) : !fs::path(path).has_extension();
    }

    std::string m_pattern;
    std::optional<MadeFolder> m_folder;
};

// All are drawn before the first is written, so that a failure does not leave some of the five.
ExitCode RunAllSheets(const PictureOptions& options) {
    const SheetPlaces places(options.out);
    for (const EffectInfo& info : CoreEffects()) {
        CheckIsNotInput(places.Of(info.name), options.input.path);
        CheckOutputPlace(places.Of(info.name), options.mayOverwrite);
    }
    ClipPicture source = *ClipPictures(options.input, options.place, 1).Next();
    std::vector<BgraPicture> sheets;
    for (const EffectInfo& info : CoreEffects()) {
        EffectOptions effect = options.effects.front();
        effect.effect = info.name;
        sheets.push_back(DrawSheet(EffectChoice(effect), source, options));
    }
    for (std::size_t i = 0; i < sheets.size(); ++i)
        WriteStill(sheets[i], places.Of(CoreEffects()[i].name), options.mayOverwrite);
    return kExitDone;
}

}  // namespace

ExitCode Run(const FrameOptions& command) {
    const PictureOptions& options = command.picture;
    CheckStillName(options.out);
    const EffectList effects(options.effects);
    CheckIsNotInput(options.out, options.input.path);
    CheckOutputPlace(options.out, options.mayOverwrite);
    FramePlace place = options.place;
    if (!place.start && !place.frame) place.frame = 0;
    ClipPicture source = *ClipPictures(options.input, place, 1).Next();
    std::vector<GridCell> cells;
    cells.push_back({"Source", source.picture});
    EffectListSession session = effects.NewSession();
    cells.push_back({effects.Title(), Rendered(session, source)});
    const std::int32_t width = options.width > 0 ? options.width : source.picture.Width();
    WriteStill(DrawGrid(cells, {"", 2, width}), options.out, options.mayOverwrite);
    return kExitDone;
}

ExitCode Run(const SheetOptions& command) {
    const PictureOptions& options = command.picture;
    if (command.allEffects) return RunAllSheets(options);
    CheckStillName(options.out);
    const EffectChoice choice(options.effects.front());
    CheckIsNotInput(options.out, options.input.path);
    CheckOutputPlace(options.out, options.mayOverwrite);
    ClipPicture source = *ClipPictures(options.input, options.place, 1).Next();
    WriteStill(DrawSheet(choice, source, options), options.out, options.mayOverwrite);
    return kExitDone;
}

}  // namespace velmora::hosts
