#include "programs/reelfx/commands/command_options.h"

#include <CLI/CLI.hpp>

#include "programs/reelfx/media/encoder_choice.h"
#include "text/number_text.h"

namespace velmora::hosts {
namespace {

void AddInput(CLI::App& command, TypedOptions& typed) {
    command
        .add_option(
            "IN", typed.input.path,
            "Clip, still picture, image sequence (frames-%03d.png, \"frames-*.png\", a folder) or - for "
            "standard input")
        ->type_name("FILE")
        ->required();
    command.add_option("--size", typed.size, "IN is raw BGRA of this size")->type_name("WxH");
    command.add_option("--rate", typed.rate, "Frame rate of raw BGRA and image sequences")->type_name("FPS");
    command
        .add_option("--start-number", typed.startNumber,
                    "First number of an image sequence; default: the first that exists")
        ->type_name("N");
    command.add_flag(
        "--linear-as-is", typed.input.keepsLight,
        "Take and write the values of OpenEXR as they are, without converting them from and to light");
}

// An option of one value that each effect of a list can have.
CLI::Option& AddOfEach(CLI::App& command, const char* names, std::vector<std::string>& values,
                       const char* help) {
    return *command.add_option(names, values, help)->allow_extra_args(false);
}

void AddEffect(CLI::App& command, TypedOptions& typed) {
    AddOfEach(command, "--effect,-e", typed.effects, "Effect; reelfx list shows all")
        .type_name("EFFECT")
        ->envname("REELFX_EFFECT");
}

void AddPresetOf(CLI::App& command, TypedOptions& typed) {
    AddOfEach(command, "--preset,-p", typed.presets, "Preset of the effect").type_name("PRESET");
    AddOfEach(command, "--preset-file", typed.presetFiles,
              "Preset file as saved by editors or reelfx preset save")
        .type_name("FILE");
}

void AddSettings(CLI::App& command, TypedOptions& typed) {
    AddOfEach(command, "--set,-s", typed.settings,
              "Set one parameter, overriding the preset; may be repeated. NAME=\"V@T V@T\" changes it evenly "
              "from one value to the next; T is a frame of the clip, counted from 0, or a time in seconds, "
              "followed by s: Wear=\"10@0 60@5s\"")
        .type_name("NAME=VALUE");
}

void AddMix(CLI::App& command, TypedOptions& typed) {
    AddOfEach(
        command, "--mix", typed.mixes,
        "How much of the effect is mixed into the picture, 0 to 100; may change over time, as with --set")
        .type_name("N")
        ->default_str("100");
}

void AddRandom(CLI::App& command, TypedOptions& typed) {
    AddOfEach(command, "--seed", typed.seeds,
              "Another seed gives other shake, flicker and damage; with 0, flicker and scratches are those "
              "of the effects in Windows editors")
        .type_name("N")
        ->default_str("0")
        ->envname("REELFX_SEED");
    command
        .add_option(
            "--random-state", typed.randomState,
            "Use one continuous random sequence from this state, as the effects do in Windows editors")
        ->type_name("HEX");
}

void AddEffectList(CLI::App& command, TypedOptions& typed) {
    AddEffect(command, typed);
    AddPresetOf(command, typed);
    AddSettings(command, typed);
    AddMix(command, typed);
    AddRandom(command, typed);
    command.add_flag(
        "--then", typed.thens,
        "Apply another effect to the result so far: -e A -p B --then -e C. Without a --seed of its own it "
        "uses that of the previous effect");
}

void AddRender(CLI::App& app, TypedOptions& typed) {
    CLI::App& render = *app.add_subcommand("render", "Render a clip through one or several effects");
    AddInput(render, typed);
    render
        .add_option("OUT", typed.outPath,
                    "File, image pattern, or - for standard output (YUV4MPEG2, or as --format says)")
        ->type_name("FILE");
    render.add_option("MORE", typed.more, "With --into: more clips; OUT is then a clip, too")
        ->type_name("FILE");
    render
        .add_option("--into", typed.into,
                    "Render each clip to a file of the same name in this folder; --format chooses another "
                    "container. A clip that fails does not stop the others")
        ->type_name("FOLDER");
    AddEffectList(render, typed);
    render
        .add_option("--frames", typed.frames,
                    "Frames from A up to but not including B; either may be omitted")
        ->type_name("A:B");
    render
        .add_option("--farm", typed.farm,
                    "Render part N of M parts of about the same length, without sound, for rendering one "
                    "clip on many machines; reelfx-farm-join joins the parts")
        ->type_name("N/M");
    render.add_option("--start", typed.start, "Start at this time of the clip")->type_name("TIME");
    render.add_option("--duration", typed.duration, "Length of the part to render")->type_name("TIME");
    render
        .add_option(
            "--depth", typed.depth,
            "Precision of the effects: 8 bits, 16 bits or float. Default: float for clips of more than 8 "
            "bits, else 8")
        ->type_name("auto|8|16|float")
        ->check(CLI::IsMember({"auto", "8", "16", "float"}))
        ->capture_default_str();
    render.add_option("--threads,-j", typed.threads, "Frames rendered at once; 0, and at most: one per processor")
        ->type_name("N")
        ->check(CLI::Range(0, 256))
        ->envname("REELFX_THREADS");
    render.add_option("--format", typed.format, "Container, if the file name extension of OUT does not say")
        ->type_name("FORMAT");
    render.add_option("--codec", typed.codec, "Video codec")->type_name("CODEC")->envname("REELFX_CODEC");
    render.preparse_callback([&render](std::size_t) { NameUsualCodecs(render); });
    render.add_option("--crf", typed.crf, "Quality, on the codec's own scale; default: " + UsualQualities())
        ->type_name("N")
        ->envname("REELFX_CRF");
    render.add_option("--pix-fmt", typed.pixelFormat, "Pixel format; default: the source's")
        ->type_name("PIXELS")
        ->envname("REELFX_PIX_FMT");
    render.add_flag(
        "--matte", typed.matte,
        "Write only the damage (wear, spots, scratches) on a transparent background, with straight alpha "
        "and without sound, for compositing in other programs");
    render.add_flag("--raw-bgra", typed.output.isRawBgra, "OUT is raw BGRA frames");
    render.add_flag(
        "--hash", typed.digests,
        "Print the MD5 of each frame as the effects leave it: BGRA at 8 bits, RGBA at other depths; "
        "OUT may be omitted");
    render
        .add_option("--audio", typed.output.audio,
                    "Sound: auto copies it if OUT can hold it and encodes it otherwise; copy, none, or "
                    "the name of an audio codec")
        ->type_name("auto|copy|none")
        ->capture_default_str();
    render.add_flag("--no-sound", typed.noSound,
                    "Leave out sound, subtitles and everything else but the picture");
    render
        .add_option("--fps", typed.fps,
                    "Constant frame rate of OUT; frames are repeated or left out. Default: the frames' own "
                    "times where OUT can hold them")
        ->type_name("FPS");
    render.add_flag("--upright", typed.output.isUpright,
                    "Turn the pixels of a rotated clip, even if OUT can hold the rotation tag");
    render.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing OUT");
    render
        .add_option(
            "--progress", typed.progress,
            "Progress on standard error: text for people, lines of JSON for programs; auto means text at a "
            "terminal, otherwise none")
        ->type_name("auto|none|text|json")
        ->capture_default_str()
        ->envname("REELFX_PROGRESS");
    render.add_flag("--quiet,-q", typed.quiet, "Same as --progress none");
    render.add_flag("--dry-run", typed.dryRun,
                    "Check everything and print what would be done, but write nothing");
}

// The help texts that differ between the commands that write stills.
struct PictureTexts {
    const char* what;
    const char* out;
    const char* frame;
};

std::string CountedFromZero(const std::string& text) {
    const auto number = ParseInteger(text);
    return number && *number >= 0 ? "" : "takes the number of a frame, counted from 0, not \"" + text + '"';
}

CLI::App& AddPicture(CLI::App& app, TypedOptions& typed, const char* name, const PictureTexts& texts) {
    CLI::App& command = *app.add_subcommand(name, texts.what);
    AddInput(command, typed);
    command.add_option("OUT", typed.picture.out, texts.out)->type_name("FILE")->required();
    CLI::Option* const frame = command.add_option("--frame,-n", typed.picture.place.frame, texts.frame)
                                   ->type_name("N")
                                   ->check(CountedFromZero);
    command
        .add_option("--start", typed.start,
                    "Instead of --frame: the first frame at or after this time of the clip")
        ->type_name("TIME")
        ->excludes(frame);
    command.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing OUT");
    return command;
}

void AddWidth(CLI::App& command, TypedOptions& typed) {
    command.add_option("--width", typed.picture.width, "Width of each picture in pixels")
        ->type_name("W")
        ->check(CLI::Range(16, 8192));
}

void AddColumns(CLI::App& command, TypedOptions& typed, const char* what) {
    command.add_option("--columns", typed.picture.columns, what)->type_name("N")->check(CLI::Range(1, 32));
}

void AddPictures(CLI::App& app, TypedOptions& typed) {
    CLI::App& frame = AddPicture(app, typed, "frame",
                                 {.what = "Write one frame before and after, side by side",
                                  .out = "PNG or JPEG",
                                  .frame = "Frame of the clip, counted from 0; default: the first"});
    AddEffectList(frame, typed);
    AddWidth(frame, typed);
    CLI::App& sheet = AddPicture(
        app, typed, "sheet",
        {.what = "Write one frame through all presets of an effect",
         .out = "PNG or JPEG; with --all a folder, or a name with %s for the effect's name: sheets/%s.jpg",
         .frame = "Frame of the clip, counted from 0; default: the middle one, or the first of a pipe"});
    AddEffect(sheet, typed);
    AddSettings(sheet, typed);
    AddMix(sheet, typed);
    AddRandom(sheet, typed);
    AddWidth(sheet, typed);
    AddColumns(sheet, typed, "Pictures per row; default: 4");
    sheet.add_flag("--all", typed.allSheets, "Write a sheet for each effect: film-camera.png and so on");
    CLI::App& strip = AddPicture(
        app, typed, "strip",
        {.what = "Write successive frames through an effect side by side at 100 %, to judge motion",
         .out = "PNG or JPEG",
         .frame = "First frame, counted from 0; default: the frames in the middle of the clip, or the first "
                  "ones of a pipe"});
    AddEffectList(strip, typed);
    strip.add_option("--frames", typed.stripFrames, "Number of frames; fewer if the clip ends earlier")
        ->type_name("N")
        ->capture_default_str()
        ->check(CLI::Range(1, 240));
    strip
        .add_option("--crop", typed.crop,
                    "Part of the frame that each picture shows: its size, and its distance from the left and "
                    "top, in pixels; without +X+Y, the middle. Default: the middle, 540 pixels high and wide "
                    "enough for a row of 1920 pixels")
        ->type_name("WxH+X+Y");
    AddColumns(strip, typed, "Pictures per row; default: all");
}

void AddPreset(CLI::App& app, TypedOptions& typed) {
    CLI::App& preset = *app.add_subcommand("preset", "Show and save preset files");
    preset.require_subcommand(1);
    CLI::App& show = *preset.add_subcommand("show", "Print the contents of a preset file");
    show.add_option("FILE", typed.presetShow.file, "Preset file")->type_name("FILE")->required();
    show.add_flag("--json", typed.presetShow.asJson, "Print as JSON");
    CLI::App& save = *preset.add_subcommand("save", "Write settings as a preset file");
    save.add_option("FILE", typed.presetSave.file, "Preset file")->type_name("FILE")->required();
    AddEffect(save, typed);
    AddPresetOf(save, typed);
    AddSettings(save, typed);
    save.add_option("--name", typed.presetSave.name, "Name of the preset; default: the file name")
        ->type_name("TEXT");
    save.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing FILE");
}

void AddList(CLI::App& app, TypedOptions& typed) {
    CLI::App& list = *app.add_subcommand("list", "List effects, parameters and presets");
    list.add_option("EFFECT", typed.listEffect, "Only this effect")->type_name("EFFECT");
    list.add_flag("--json", typed.list.asJson, "Print as JSON");
    CLI::App& presets = *app.add_subcommand("presets", "List the presets of an effect with their settings");
    presets.add_option("EFFECT", typed.presetsOf.effect, "The effect")->type_name("EFFECT")->required();
    presets.add_flag("--json", typed.presetsOf.asJson, "Print as JSON");
}

void AddInfo(CLI::App& app, TypedOptions& typed) {
    CLI::App& info = *app.add_subcommand("info", "Describe a clip and how it would be rendered");
    AddInput(info, typed);
    info.add_flag("--json", typed.info.asJson, "Print as JSON");
}

std::string ExitCodesText() {
    std::string text = "Exit codes:";
    for (const ExitMeaning& exit : kExitMeanings) {
        text += (exit.code == kExitDone ? " " : ", ") + std::to_string(exit.code) + ' ' + exit.meaning;
    }
    return text + ".\n" + kOnInterrupt;
}

}  // namespace

void NameUsualCodecs(CLI::App& render) {
    render.get_option("--codec")->description("Video codec; default: " + UsualCodecs());
}

void AddCommands(CLI::App& app, TypedOptions& typed) {
    app.name("reelfx");
    app.description("The look of old film for any footage.");
    app.footer(ExitCodesText());
    app.set_version_flag("--version", std::string("reelfx ") + kReelEffectsVersion);
    app.require_subcommand(1);
    AddList(app, typed);
    AddRender(app, typed);
    AddPictures(app, typed);
    AddPreset(app, typed);
    AddInfo(app, typed);
    app.add_subcommand("studio", "Open the effects as a page in the browser")
        ->add_flag("--path", typed.studio.isPathOnly, "Print the path of the page instead");
}

}  // namespace velmora::hosts
