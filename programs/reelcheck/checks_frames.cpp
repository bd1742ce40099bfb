// Frames of all shapes.

#include <algorithm>
#include <cstring>
#include <vector>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"

namespace velmora::reelcheck {
namespace {

// Runs `check` for each effect, with everything turned on in its host.
template <typename Visit>
void ForEachEffect(CheckContext& context, Visit&& check) {
    const OpenLibrary library(context.libraryPath);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = library.Effect(index);
        const EffectFacts facts = EffectFacts::Of(*effect);
        SetPlace("%s", facts.name.c_str());
        PlayingHost host;
        ChooseFull(host, facts);
        check(*effect, facts, host);
    }
}

void SetPlaceOf(const EffectFacts& facts, const Layout& s, const Layout& d) {
    const auto letter = [](const Layout& l) { return l.edge == Edge::kBack ? 'b' : 'f'; };
    SetPlace("%s, %dx%d at %d,%d+%d%s%c to %dx%d at %d,%d+%d%s%c", facts.name.c_str(), s.width, s.height,
             s.xOrigin, s.yOrigin, s.padding, s.bottomUp ? "u" : "", letter(s), d.width, d.height, d.xOrigin,
             d.yOrigin, d.padding, d.bottomUp ? "u" : "", letter(d));
}

void RenderShape(IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host, const Layout& from,
                 const Layout& to, double seconds, Dice& dice) {
    SetPlaceOf(facts, from, to);
    Frame source(from), destination(to);
    source.Paint(dice);
    source.ForbidWriting();
    RenderInside(effect, host, source, destination, seconds);
}

Layout RandomLayout(Dice& dice, std::int32_t largest) {
    Layout layout;
    layout.width = dice.Between(1, dice.OneIn(3) ? 8 : largest);
    layout.height = dice.Between(1, dice.OneIn(3) ? 8 : largest);
    if (dice.OneIn(2)) layout.xOrigin = dice.Between(0, 40);
    if (dice.OneIn(2)) layout.yOrigin = dice.Between(0, 20);
    if (dice.OneIn(2)) layout.padding = dice.Between(0, 70);
    layout.bottomUp = dice.OneIn(2);
    layout.edge = dice.OneIn(2) ? Edge::kFront : Edge::kBack;
    return layout;
}

}  // namespace

void CheckFirstFrames(CheckContext& context) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        Frame source(Layout{160, 120}), destination(Layout{160, 120});
        source.Paint(context.dice);
        RenderInside(effect, host, source, destination, 1.0);
        Require(host.questions > 0, "does not ask for its parameters");
        Require(destination.Digest() != source.Digest(), "everything on changes nothing");
        ChoosePreset(host, effect, facts.Preset("Reset To None"));
        RenderInside(effect, host, source, destination, 2.0);
        Require(destination.Digest() == source.Digest(), "\"Reset To None\" changes the picture");
    });
}

void CheckSmallSizes(CheckContext& context) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        const std::int32_t widest = context.Rounds(18, 70), highest = context.Rounds(5, 40);
        for (std::int32_t width = 1; width <= widest; ++width) {
            for (std::int32_t height = 1; height <= highest; ++height) {
                for (const Edge edge : {Edge::kFront, Edge::kBack}) {
                    Layout layout{width, height};
                    layout.edge = edge;
                    RenderShape(effect, facts, host, layout, layout, width + height / 30.0, context.dice);
                }
            }
        }
        // Source and destination of different sizes.
        for (const auto& [a, b] :
             {std::pair(Layout{1, 9}, Layout{33, 2}), std::pair(Layout{64, 1}, Layout{7, 20})}) {
            RenderShape(effect, facts, host, a, b, 1.0, context.dice);
            RenderShape(effect, facts, host, b, a, 1.0, context.dice);
        }
    });
}

void CheckRefusedFrames(CheckContext& context) {
    constexpr std::int32_t kMost = 0x7FFFFFFF, kLeast = -kMost - 1;
    struct Fault {
        const char* name;
        void (*spoil)(FrameRecord& record);
    };
    static constexpr Fault kFaults[] = {
        {"no pixels", [](FrameRecord& r) { r.pixels = nullptr; }},
        {"no width", [](FrameRecord& r) { r.width = 0; }},
        {"negative width", [](FrameRecord& r) { r.width = -1; }},
        {"least width", [](FrameRecord& r) { r.width = kLeast; }},
        {"most width", [](FrameRecord& r) { r.width = kMost; }},
        {"width that wraps", [](FrameRecord& r) { r.width = 0x40000001; }},
        {"no height", [](FrameRecord& r) { r.height = 0; }},
        {"negative height", [](FrameRecord& r) { r.height = -7; }},
        {"least height", [](FrameRecord& r) { r.height = kLeast; }},
        {"negative x origin", [](FrameRecord& r) { r.xOrigin = -1; }},
        {"most x origin", [](FrameRecord& r) { r.xOrigin = kMost; }},
        {"least x origin", [](FrameRecord& r) { r.xOrigin = kLeast; }},
        {"negative y origin", [](FrameRecord& r) { r.yOrigin = -1; }},
        {"most y origin", [](FrameRecord& r) { r.yOrigin = kMost; }},
        {"narrow step", [](FrameRecord& r) { r.rowStep = 4 * r.width - 1; }},
        {"narrow step upward", [](FrameRecord& r) { r.rowStep = 1 - 4 * r.width; }},
        {"no step", [](FrameRecord& r) { r.rowStep = 0; }},
        {"least step", [](FrameRecord& r) { r.rowStep = kLeast; }},
    };
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        Frame frame(Layout{8, 6});
        frame.Fill(0x77);
        const FrameRecord good = frame.Record();
        for (const Fault& fault : kFaults) {
            SetPlace("%s, %s", facts.name.c_str(), fault.name);
            FrameRecord bad = good;
            fault.spoil(bad);
            // With a narrow counterpart the processed size stays small, so the record itself must be validated.
            Require(!Process(effect, &host, bad, good, 1.0), "is taken as a source");
            Require(!Process(effect, &host, good, bad, 1.0), "is taken as a destination");
            Require(!Process(effect, &host, bad, bad, 1.0), "is taken as both");
        }
        Require(host.questions == 0, "asks for parameters all the same");
        Require(frame.OnlyInside(0, 0, 0x77), "writes all the same");
        Require(Process(effect, &host, good, good, 1.0), "refuses a good frame after bad ones");
    });
}

void CheckLayouts(CheckContext& context) {
    static constexpr std::int32_t kOddPaddings[] = {0, 1, 2, 3, 5, 64};
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        for (const Layout& size : {Layout{61, 33}, Layout{128, 40}, Layout{5, 90}}) {
            Frame source(size), plain(size);
            source.Paint(context.dice);
            RenderInside(effect, host, source, plain, 3.0);
            for (const std::int32_t padding : kOddPaddings) {
                for (int variant = 0; variant < 4; ++variant) {
                    Layout layout = size;
                    layout.padding = padding;
                    layout.bottomUp = (variant & 1) != 0;
                    if ((variant & 2) != 0) layout.xOrigin = 3, layout.yOrigin = 2;
                    Frame from(layout), to(layout);
                    from.CopyRegion(source);
                    from.ForbidWriting();
                    for (const auto& [s, d] :
                         {std::pair(&from, &to), std::pair(&source, &to), std::pair(&from, &plain)}) {
                        SetPlaceOf(facts, s->Shape(), d->Shape());
                        const std::uint64_t expected = plain.Digest();
                        RenderInside(effect, host, *s, *d, 3.0);
                        Require(d->Digest() == expected, "another layout gives another picture");
                    }
                }
            }
        }
    });
}

void CheckInPlace(CheckContext& context) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        for (int i = 0; i < context.Rounds(12, 300); ++i) {
            Layout layout = RandomLayout(context.dice, 90);
            ChooseFair(host, facts, context.dice);
            SetPlaceOf(facts, layout, layout);
            Frame source(layout), apart(layout), same(layout);
            source.Paint(context.dice);
            RenderInside(effect, host, source, apart, i / 3.0);
            same.CopyRegion(source);
            Require(Process(effect, &host, same.Record(), same.Record(), i / 3.0),
                    "the effect refuses the frame");
            Require(same.Digest() == apart.Digest(), "in place the picture differs");
        }
    });
}

void CheckOverlaps(CheckContext& context) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        for (int i = 0; i < context.Rounds(20, 400); ++i) {
            Dice& dice = context.dice;
            const Layout size{dice.Between(1, 60), dice.Between(1, 40)};
            Layout whole = size;
            whole.height += 6;
            const std::int32_t offsets[] = {0, dice.Between(1, 16), dice.Between(1, 6) * size.width * 4};
            const std::int32_t from = offsets[dice.Between(0, 2)], to = offsets[dice.Between(0, 2)];
            ChooseFair(host, facts, dice);
            SetPlace("%s, %dx%d from %d to %d", facts.name.c_str(), size.width, size.height, from, to);
            Frame shared(whole), source(size), apart(size), result(size);
            shared.Paint(dice);
            std::memcpy(source.Bytes(), shared.Bytes() + from, source.Size());
            RenderInside(effect, host, source, apart, i / 30.0);
            Require(Process(effect, &host, shared.RecordAt(from, size), shared.RecordAt(to, size), i / 30.0),
                    "the effect refuses the frame");
            std::memcpy(result.Bytes(), shared.Bytes() + to, result.Size());
            Require(result.Digest() == apart.Digest(), "the picture differs from that of separate frames");
        }
    });
}

void CheckRandomShapes(CheckContext& context) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        for (int i = 0; i < context.Rounds(100, 3000); ++i) {
            const Layout from = RandomLayout(context.dice, 300);
            Layout to = RandomLayout(context.dice, 300);
            if (context.dice.OneIn(2)) to.width = from.width, to.height = from.height;
            if (context.dice.OneIn(3)) {
                ChooseHostile(host, facts, context.dice);
            } else {
                ChooseFair(host, facts, context.dice);
            }
            RenderShape(effect, facts, host, from, to, context.dice.Between(-100, 100000) / 30.0,
                        context.dice);
        }
    });
}

namespace {

void RenderPresets(CheckContext& context, const Layout& size, bool inPlaceToo) {
    ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
        Frame source(size), destination(size);
        source.Paint(context.dice);
        source.ForbidWriting();
        for (std::uint32_t preset = 0; preset < facts.presets.size(); ++preset) {
            SetPlace("%s, %s, %dx%d", facts.name.c_str(), facts.presets[preset].c_str(), size.width,
                     size.height);
            ChoosePreset(host, effect, preset);
            RenderInside(effect, host, source, destination, preset / 30.0);
            if (!inPlaceToo) continue;
            Require(Process(effect, &host, destination.Record(), destination.Record(), preset / 30.0),
                    "the effect refuses the frame in place");
        }
    });
}

}  // namespace

void CheckVideoSizes(CheckContext& context) {
    for (const Layout& size : {Layout{720, 576}, Layout{1280, 720}, Layout{1920, 1080}}) {
        RenderPresets(context, size, context.level >= 9);
    }
}

void CheckLargestSizes(CheckContext& context) {
    struct Size {
        std::int32_t width, height;
    };
    for (const Size& size : {Size{8192, 1}, Size{1, 4320}, Size{8192, 16}, Size{16, 4320}, Size{3840, 2160},
                             Size{4096, 4320}, Size{8191, 4319}, Size{8192, 4320}}) {
        ForEachEffect(context, [&](IVideoEffect& effect, const EffectFacts& facts, PlayingHost& host) {
            Layout layout{size.width, size.height};
            RenderShape(effect, facts, host, layout, layout, 1.0, context.dice);
            if (context.level < kHighestLevel) return;
            layout.padding = 4;
            layout.bottomUp = true;
            layout.edge = Edge::kFront;
            ChooseFair(host, facts, context.dice);
            RenderShape(effect, facts, host, layout, layout, 100.0, context.dice);
        });
    }
}

}  // namespace velmora::reelcheck
