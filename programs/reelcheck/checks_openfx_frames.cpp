// The frames that the OpenFX plug-ins render.

#include <algorithm>
#include <cmath>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/openfx_host.h"

namespace velmora::reelcheck {
namespace {

constexpr const char* kDepths[] = {kOfxBitDepthByte, kOfxBitDepthShort, kOfxBitDepthFloat};

}  // namespace

void CheckOpenfxFirstFrames(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        for (int format = 0; format < 6; ++format) {
            PictureShape shape = Plain(97, 61);
            shape.depth = kDepths[format % 3];
            shape.components = format < 3 ? kOfxImageComponentRGBA : kOfxImageComponentRGB;
            HostPicture source(shape), output(shape), expected(shape);
            source.Paint(context.dice, true);
            OpenfxInstance instance(plugin);
            instance.Param("seed").values[0] = kSeed;
            for (std::uint32_t preset = 0; preset < plugin.Effect().presetNames.size(); ++preset) {
                SetPlace("%s, %s, %s, %s", plugin.Effect().name, plugin.Effect().presetNames[preset],
                         shape.depth, shape.components);
                instance.ChoosePreset(preset);
                instance.RenderWhole(source, output, kTime);
                RenderExpected(plugin.Effect(), preset, kSeed, kSeconds, source, expected);
                Require(output.IsSameAs(expected), "not the picture of reelfx");
            }
        }
    }
    RequireNothingHeld();
}

// Light values come out as the display values would, premultiplied ones as if they were not.
void CheckOpenfxSpaces(CheckContext& context) {
    enum Space { kDisplay, kLinearSrgb, kLinear24, kNone };
    const auto toLight = [](int space, double v) {
        if (space == kLinear24) return std::pow(v, 2.4);
        return v <= 0.04045 ? v / 12.92 : std::pow((v + 0.055) / 1.055, 2.4);
    };
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 1);
    for (const char* depth : kDepths) {
        for (const int space : {kDisplay, kLinearSrgb, kLinear24}) {
            for (const bool isPremultiplied : {false, true}) {
                SetPlace("%s, space %d%s", depth, space, isPremultiplied ? ", premultiplied" : "");
                PictureShape shape = Plain(40, 24);
                shape.depth = kOfxBitDepthFloat;
                HostPicture display(shape), expected(shape);
                display.Paint(context.dice);
                RenderExpected(busy.plugin.Effect(), Busy::kPreset, kSeed, kSeconds, display, expected);
                shape.depth = depth;
                shape.isPremultiplied = isPremultiplied;
                HostPicture source(shape), output(shape);
                const auto coded = [&](const HostPicture& from, int x, int y, int c) {
                    const double value = from.Sample(x, y, c), alpha = from.Sample(x, y, 3);
                    if (c == 3) return value;
                    return (space == kDisplay ? value : toLight(space, value)) *
                           (isPremultiplied ? alpha : 1.0);
                };
                for (int p = 0; p < 40 * 24 * 4; ++p) {
                    source.SetSample(p / 4 % 40, p / 160, p % 4, coded(display, p / 4 % 40, p / 160, p % 4));
                }
                busy.instance.Param("workingSpace").values[0] = space;
                busy.instance.RenderWhole(source, output, kTime);
                // What the source's samples round away is amplified by the curves and by dividing by small alphas, so
                // shallow pictures are compared where they are opaque and not dark.
                const bool isFloat = shape.SampleBytes() == 4;
                const double most = isFloat ? 0.0005 : shape.SampleBytes() == 2 ? 0.01 : 0.08;
                for (int y = 0; y < 24; ++y) {
                    for (int x = 0; x < 40; ++x) {
                        if (display.Sample(x, y, 3) < (isFloat ? 0.05 : 1.0)) continue;
                        for (int c = 0; c < 4; ++c) {
                            const double difference = output.Sample(x, y, c) - coded(expected, x, y, c);
                            if (!isFloat && c < 3 && display.Sample(x, y, c) < 0.2) continue;
                            if (std::abs(difference) > most)
                                Fail(Text("%g away at %d,%d,%d", difference, x, y, c));
                        }
                    }
                }
            }
        }
    }
    // Taken as it is: what alpha says does not matter.
    busy.instance.Param("workingSpace").values[0] = kNone;
    PictureShape shape = Plain(20, 10);
    HostPicture straight(shape), one(shape);
    shape.isPremultiplied = true;
    HostPicture multiplied(shape), other(shape);
    straight.Paint(context.dice);
    for (int y = 0; y < 10; ++y) std::copy_n(straight.Pixel(0, y), 80, multiplied.Pixel(0, y));
    busy.instance.RenderWhole(straight, one, kTime);
    busy.instance.RenderWhole(multiplied, other, kTime);
    Require(one.IsSameAs(other), "raw values are converted");
    RequireNothingHeld();
}

void CheckOpenfxLayouts(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        Busy busy(module, i);
        for (int round = 0; round < context.Rounds(60, 2000); ++round) {
            PictureShape shape = Plain(context.dice.Between(1, 40), context.dice.Between(1, 24));
            shape.depth = kDepths[round % 3];
            shape.components = context.dice.OneIn(2) ? kOfxImageComponentRGBA : kOfxImageComponentRGB;
            HostPicture plain(shape), expected(shape);
            plain.Paint(context.dice);
            busy.instance.RenderWhole(plain, expected, kTime);
            // The same picture elsewhere, its rows in another order, in part.
            const int dx = context.dice.Between(-9, 9), dy = context.dice.Between(-9, 9);
            shape.bounds = Square(dx, dy, shape.Width(), shape.Height());
            shape.padding = context.dice.Between(0, 9);
            shape.isTopDown = context.dice.OneIn(2);
            shape.edge = context.dice.OneIn(2) ? Edge::kFront : Edge::kBack;
            HostPicture source(shape);
            shape.isTopDown = context.dice.OneIn(2);
            HostPicture output(shape), whole(shape);
            for (int y = 0; y < shape.Height(); ++y) {
                const auto bytes =
                    static_cast<std::size_t>(shape.Width()) * static_cast<std::size_t>(plain.PixelBytes());
                std::copy_n(plain.Pixel(0, y), bytes, source.Pixel(dx, dy + y));
                std::copy_n(expected.Pixel(0, y), bytes, whole.Pixel(dx, dy + y));
            }
            source.memory.ForbidWriting();
            output.Fill(0xA5);
            const OfxRectI window = Square(dx + context.dice.Between(0, shape.Width() - 1),
                                           dy + context.dice.Between(0, shape.Height() - 1),
                                           context.dice.Between(0, 20), context.dice.Between(0, 20));
            SetPlace("%s, %dx%d at %d,%d, window %d,%d to %d,%d", busy.plugin.Effect().name, shape.Width(),
                     shape.Height(), dx, dy, window.x1, window.y1, window.x2, window.y2);
            busy.instance.Clip("Source").Show(&source);
            busy.instance.Clip("Output").Show(&output);
            Require(busy.instance.Render(kTime, window) == kOfxStatOK, "is not rendered");
            Require(IsOnlyInside(output, whole, window, 0xA5),
                    "a wrong picture, or something outside the window");
        }
    }
    RequireNothingHeld();
}

// The source has less than its region, the output is larger than it.
void CheckOpenfxParts(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 1);
    PictureShape shape = Plain(30, 20);
    HostPicture whole(shape), expected(shape);
    whole.Paint(context.dice);
    for (int y = 0; y < 20; ++y) {
        for (int x = 0; x < 30; ++x) {
            if (x < 4 || x >= 25 || y < 3 || y >= 17) std::fill_n(whole.Pixel(x, y), 4, std::uint8_t{0});
        }
    }
    busy.instance.RenderWhole(whole, expected, kTime);
    shape.region = shape.bounds;
    shape.bounds = {4, 3, 25, 17};
    HostPicture part(shape);
    for (int y = 3; y < 17; ++y) std::copy_n(whole.Pixel(4, y), 21 * 4, part.Pixel(4, y));
    PictureShape wide = Plain(1, 1);
    wide.bounds = {-5, -5, 40, 30};
    HostPicture output(wide);
    busy.instance.RenderWhole(part, output, kTime);
    for (int y = -5; y < 30; ++y) {
        for (int x = -5; x < 40; ++x) {
            const bool isThere = x >= 4 && x < 25 && y >= 3 && y < 17;
            const std::uint8_t* const pixel = output.Pixel(x, y);
            if (isThere ? !std::equal(pixel, pixel + 4, expected.Pixel(x, y))
                        : std::any_of(pixel, pixel + 4, [](auto byte) { return byte != 0; })) {
                Fail(Text("a wrong pixel at %d,%d", x, y));
            }
        }
    }
    RequireNothingHeld();
}

void CheckOpenfxRefused(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 4, kOfxImageEffectContextGeneral);
    HostPicture good(Plain(8, 6)), output(Plain(8, 6));
    good.Paint(context.dice);
    const auto refuses = [&](const char* what, HostPicture* source, HostPicture* to, OfxStatus expected) {
        SetPlace("%s", what);
        output.Fill(0x5A);
        busy.instance.Clip("Source").Show(source);
        busy.instance.Clip("Output").Show(to);
        const OfxStatus status = busy.instance.Render(kTime, {0, 0, 8, 6});
        if (status != expected) Fail(Text("status %d, not %d", status, expected));
        Require(IsOnlyInside(output, output, {}, 0x5A), "writes");
        RequireNothingHeld();
    };
    refuses("no output", &good, nullptr, kOfxStatFailed);
    const auto refusesShape = [&](const char* what, auto&& change) {
        PictureShape shape = Plain(8, 6);
        change(shape);
        HostPicture odd(shape);
        refuses(what, &odd, &output, kOfxStatErrImageFormat);
    };
    refusesShape("another depth", [](PictureShape& shape) { shape.depth = kOfxBitDepthShort; });
    refusesShape("other components", [](PictureShape& shape) { shape.components = kOfxImageComponentRGB; });
    refusesShape("alpha alone", [](PictureShape& shape) { shape.components = kOfxImageComponentAlpha; });
    refusesShape("an unknown depth", [](PictureShape& shape) { shape.depth = "OfxBitDepthHalf"; });
    refusesShape("rows that overlap", [](PictureShape& shape) { shape.padding = -8; });
}

// A clip without a picture at a time counts as black and transparent: nothing to change, or a mask that hides everything.
void CheckOpenfxAbsent(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 4, kOfxImageEffectContextGeneral);
    HostPicture source(Plain(24, 18)), black(Plain(24, 18)), output(Plain(24, 18));
    source.Paint(context.dice);
    black.Fill(0);
    const auto renders = [&](const char* what, const HostPicture& expected) {
        SetPlace("%s", what);
        output.Fill(0x5A);
        busy.instance.Clip("Output").Show(&output);
        Require(busy.instance.Render(kTime, {2, 3, 20, 15}) == kOfxStatOK, "is not rendered");
        Require(IsOnlyInside(output, expected, {2, 3, 20, 15}, 0x5A), "a wrong picture");
        RequireNothingHeld();
    };
    busy.instance.Clip("Source").Show(&source);
    busy.instance.ShowMask(nullptr);
    busy.instance.Clip("Mask").properties.Put(kOfxImageClipPropConnected, {1});
    renders("a connected mask without a picture", source);
    busy.instance.Clip("Source").Show(nullptr);
    renders("no source", black);
}

void CheckOpenfxMask(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 4, kOfxImageEffectContextGeneral);
    HostPicture source(Plain(40, 30)), full(Plain(40, 30)), output(Plain(40, 30));
    source.Paint(context.dice);
    busy.instance.RenderWhole(source, full, kTime);
    PictureShape maskShape = Plain(1, 1);
    maskShape.bounds = {5, 4, 35, 25};
    for (const char* depth : {kOfxBitDepthByte, kOfxBitDepthFloat}) {
        maskShape.components =
            depth == std::string_view(kOfxBitDepthByte) ? kOfxImageComponentAlpha : kOfxImageComponentRGBA;
        maskShape.depth = depth;
        HostPicture mask(maskShape);
        mask.Paint(context.dice);
        const int alpha = maskShape.Channels() - 1;
        for (const double percent : {100.0, 37.5}) {
            SetPlace("%s, mix %g", depth, percent);
            busy.instance.ShowMask(&mask);
            busy.instance.Param("mix").values[0] = percent;
            busy.instance.RenderWhole(source, output, kTime);
            for (int y = 0; y < 30; ++y) {
                for (int x = 0; x < 40; ++x) {
                    const bool isCovered = x >= 5 && x < 35 && y >= 4 && y < 25;
                    const double share = isCovered ? mask.Sample(x, y, alpha) * percent / 100.0 : 0.0;
                    for (int c = 0; c < 3; ++c) {
                        const double from = source.Pixel(x, y)[c], to = full.Pixel(x, y)[c];
                        const double exact = from + (to - from) * share;
                        // Half a step of rounding, and the last bits of the float arithmetic.
                        if (std::abs(output.Pixel(x, y)[c] - exact) > 0.501)
                            Fail(Text("a wrong mix at %d,%d", x, y));
                    }
                }
            }
        }
    }
    RequireNothingHeld();
}

void CheckOpenfxFields(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 0);
    PictureShape shape = Plain(24, 18);
    shape.bounds = {-3, -3, 21, 15};
    HostPicture source(shape), whole(shape), output(shape);
    source.Paint(context.dice);
    busy.instance.RenderWhole(source, whole, kTime);
    busy.instance.Clip("Output").Show(&output);
    for (int field = 0; field < 2; ++field) {
        SetPlace("field %d", field);
        output.Fill(0x77);
        const char* const name = field == 0 ? kOfxImageFieldLower : kOfxImageFieldUpper;
        Require(busy.instance.Render(kTime, shape.bounds, name) == kOfxStatOK, "is not rendered");
        Require(IsOnlyInside(output, whole, shape.bounds, 0x77, field), "not the rows of the field");
    }
    RequireNothingHeld();
}

}  // namespace velmora::reelcheck
