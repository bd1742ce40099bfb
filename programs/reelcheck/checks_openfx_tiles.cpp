// Parts, sizes and times of the frames that the OpenFX plug-ins render.

#include <algorithm>
#include <cmath>
#include <string_view>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/openfx_host.h"
#include "text/names.h"

namespace velmora::reelcheck {
namespace {

constexpr const char* kDepths[] = {kOfxBitDepthByte, kOfxBitDepthShort, kOfxBitDepthFloat};

bool IsSame(const OfxRectD& a, const OfxRectD& b) {
    return a.x1 == b.x1 && a.y1 == b.y1 && a.x2 == b.x2 && a.y2 == b.y2;
}

OfxRectD Canonical(const OfxRectI& r) {
    const double width = State().canonicalWidth, height = State().canonicalHeight;
    return {r.x1 * width, r.y1 * height, r.x2 * width, r.y2 * height};
}

OfxRectI RandomPart(Dice& dice, const OfxRectI& whole) {
    const int x = dice.Between(whole.x1, whole.x2 - 1), y = dice.Between(whole.y1, whole.y2 - 1);
    return {x, y, dice.Between(x + 1, whole.x2), dice.Between(y + 1, whole.y2)};
}

// The part of a picture that a plug-in asks for, and nothing beside it.
std::unique_ptr<HostPicture> PartOf(const HostPicture& whole, const OfxRectD& asked) {
    PictureShape shape = whole.shape;
    shape.region = whole.shape.bounds;
    shape.bounds = {int(asked.x1), int(asked.y1), int(asked.x2), int(asked.y2)};
    auto part = std::make_unique<HostPicture>(shape);
    const auto bytes = static_cast<std::size_t>(shape.Width()) * static_cast<std::size_t>(whole.PixelBytes());
    for (int y = shape.bounds.y1; y < shape.bounds.y2; ++y) {
        std::copy_n(whole.Pixel(shape.bounds.x1, y), bytes, part->Pixel(shape.bounds.x1, y));
    }
    part->memory.ForbidWriting();
    return part;
}

double ShownAt(const HostParam& param, double time) {
    return param.values[0] + param.perFrame * std::clamp(time, param.keys.front(), param.keys.back());
}

}  // namespace

// The host gives a tile of the source where the plug-in asks for one.
void CheckOpenfxTiles(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        OpenfxInstance instance(plugin);
        instance.Param("seed").values[0] = kSeed;
        int tiled = 0;
        const auto presets = static_cast<std::uint32_t>(plugin.Effect().presetNames.size());
        for (std::uint32_t preset = 0; preset < presets; ++preset) {
            const std::string_view name = plugin.Effect().presetNames[preset];
            instance.ChoosePreset(preset);
            PictureShape shape = Plain(61, 43);
            shape.bounds = Square(context.dice.Between(-9, 9), context.dice.Between(-9, 9), 61, 43);
            shape.depth = kDepths[preset % 3];
            HostPicture source(shape), whole(shape), output(shape);
            source.Paint(context.dice);
            instance.Param("mix").values[0] = 100.0;
            if (context.dice.OneIn(4)) instance.Param("mix").values[0] = 62.5;
            instance.RenderWhole(source, whole, kTime);
            const OfxRectI tile = RandomPart(context.dice, shape.bounds);
            const OfxRectD asked = instance.RegionOfInterest(kTime, Canonical(tile));
            const bool isTile = IsSame(asked, Canonical(tile));
            Require(isTile || IsSame(asked, Canonical(shape.bounds)), "asks for an odd part");
            if (isTile) ++tiled;
            SetPlace("%s, %s, tile %d,%d to %d,%d", plugin.Effect().name, plugin.Effect().presetNames[preset],
                     tile.x1, tile.y1, tile.x2, tile.y2);
            Require(!isTile || (name != "Diffusion" && name != "Earthquake!"), "asks for too little");
            const auto part = PartOf(source, asked);
            output.Fill(0x3C);
            instance.Clip("Source").Show(part.get());
            instance.Clip("Output").Show(&output);
            Require(instance.Render(kTime, tile) == kOfxStatOK, "is not rendered");
            Require(IsOnlyInside(output, whole, tile, 0x3C), "a wrong tile, or something outside it");
        }
        SetPlace("%s", plugin.Effect().name);
        const bool isDamage = std::string_view(plugin.Effect().name) == "Film Damage";
        Require(tiled > (isDamage ? static_cast<int>(presets) - 1 : 0), "asks for more than it needs");
    }
    RequireNothingHeld();
}

// A preview of another size, pixels that are not square: the picture is that of so many pixels, its regions are in
// canonical coordinates.
void CheckOpenfxScales(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    constexpr struct { double scale, aspect; } kCases[] = {{0.5, 1.0}, {0.25, 2.0}, {1.0, 64.0 / 45.0}};
    for (int i = 0; i < module.Count(); ++i) {
        Busy busy(module, i);
        for (const auto& [scale, aspect] : kCases) {
            SetPlace("%s, scale %g, pixel aspect %g", busy.plugin.Effect().name, scale, aspect);
            State().canonicalWidth = aspect / scale;
            State().canonicalHeight = 1.0 / scale;
            const PictureShape shape = Plain(44, 36);
            HostPicture source(shape), output(shape), expected(shape);
            source.Paint(context.dice);
            busy.instance.RenderWhole(source, output, kTime);
            const OfxRectD defined = busy.instance.RegionOfDefinition(kTime), whole = Canonical(shape.bounds);
            const OfxRectD part = Canonical(RandomPart(context.dice, shape.bounds));
            const OfxRectD asked = busy.instance.RegionOfInterest(kTime, part);
            State().canonicalWidth = State().canonicalHeight = 1.0;
            Require(IsSame(defined, whole), "another region than the source's");
            Require(IsSame(asked, whole) || IsSame(asked, part), "asks for an odd part");
            RenderExpected(busy.plugin.Effect(), Busy::kPreset, kSeed, kSeconds, source, expected);
            Require(output.IsSameAs(expected), "not the picture of so many pixels");
        }
    }
    RequireNothingHeld();
}

// The clip's frame is the host's plus the start frame, at the source's rate.
void CheckOpenfxTimes(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    constexpr struct {
        double given, exact;
    } kRates[] = {{24.0, 24.0}, {23.976, 24000.0 / 1001.0}, {29.97, 30000.0 / 1001.0}, {60.0, 60.0}};
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        HostPicture source(Plain(40, 30)), output(Plain(40, 30)), expected(Plain(40, 30));
        source.Paint(context.dice);
        for (const auto& [given, exact] : kRates) {
            OpenfxInstance instance(plugin, kOfxImageEffectContextFilter, given);
            instance.ChoosePreset(Busy::kPreset);
            instance.Param("seed").values[0] = kSeed;
            for (const int start : {0, 300, -40}) {
                const double time = context.dice.Between(-5, 500);
                SetPlace("%s, %g frames a second, start frame %d, time %g", plugin.Effect().name, given,
                         start, time);
                instance.Param("startFrame").values[0] = start;
                instance.RenderWhole(source, output, time);
                RenderExpected(plugin.Effect(), Busy::kPreset, kSeed, (time + start) / exact, source,
                               expected);
                Require(output.IsSameAs(expected), "not the clip's frame");
            }
        }
    }
    RequireNothingHeld();
}

// An animated value keeps scratches and flicker where they are, as a fade of reelfx does.
void CheckOpenfxAnimation(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 2);
    const effects::EffectTable& table = busy.plugin.Effect();
    HostParam& wear = busy.instance.Param("wear");
    HostParam& density = busy.instance.Param("density");
    wear.values[0] = 20.0, wear.perFrame = 0.5, wear.keys = {10.0, 60.0};
    density.values[0] = 70.0, density.perFrame = -1.0, density.keys = {0.0, 20.0, 50.0};
    for (const char* depth : kDepths) {
        PictureShape shape = Plain(64, 40);
        shape.depth = depth;
        HostPicture source(shape), output(shape), expected(shape);
        source.Paint(context.dice);
        for (double time = 0.0; time < 70.0; time += 6.0) {
            SetPlace("%s, time %g", depth, time);
            const auto session = effects::EffectSession::Create(table);
            session->ApplyPreset(Busy::kPreset);
            session->PinRandom(kSeed);
            const auto set = [&](const HostParam& param, double shown) {
                for (std::uint32_t p = 0; p < table.params.size(); ++p) {
                    const effects::ParamRow& row = table.params[p];
                    if (!IsSameName(param.name, row.name) || row.kind != kKindSlider) continue;
                    const double range = double{row.maximum} - row.minimum;
                    session->SetValue(p, {.number = static_cast<float>((shown - row.minimum) / range)});
                }
            };
            set(wear, ShownAt(wear, 60.0));
            set(density, ShownAt(density, 0.0));
            session->KeepArrangement();
            set(wear, ShownAt(wear, time));
            set(density, ShownAt(density, time));
            busy.instance.RenderWhole(source, output, time);
            RenderExpected(*session, time / 25.0, source, expected);
            Require(output.IsSameAs(expected), "not the frame of the same fade in reelfx");
        }
    }
    RequireNothingHeld();
}

}  // namespace velmora::reelcheck
