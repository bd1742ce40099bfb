// The converter between packed 4:2:2 and 32-bit frames.

#include <algorithm>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/frame.h"
#include "programs/reelcheck/library.h"

namespace velmora::reelcheck {
namespace {

constexpr std::uint8_t kOutside = 0xA5;

using Convert = bool (VM_CALL IFrameProcessor::*)(const FrameRecord*, const FrameRecord*, std::uint8_t);

struct Direction {
    const char* name;
    Packing from, to;
    Convert convert;
};
constexpr Direction kDirections[] = {
    {"to 32-bit", Packing::kYcbcr, Packing::kBgra, &IFrameProcessor::ConvertYcbcrToBgra},
    {"to 4:2:2", Packing::kBgra, Packing::kYcbcr, &IFrameProcessor::ConvertBgraToYcbcr},
};

void ConvertInside(IFrameProcessor& processor, const Direction& direction, const Layout& from,
                   const Layout& to, Dice& dice) {
    SetPlace("%s, %dx%d at %d,%d to %dx%d at %d,%d", direction.name, from.width, from.height, from.xOrigin,
             from.yOrigin, to.width, to.height, to.xOrigin, to.yOrigin);
    Frame source(from, direction.from), destination(to, direction.to);
    source.Paint(dice);
    source.ForbidWriting();
    destination.Fill(kOutside);
    const FrameRecord in = source.Record(), out = destination.Record();
    Require((processor.*direction.convert)(&in, &out, 200), "refuses the frame");
    const std::int32_t width = std::min(from.width, to.width), height = std::min(from.height, to.height);
    Require(destination.OnlyInside(width, height, kOutside), "something outside the rectangle is written");
}

Layout RandomLayout(Dice& dice) {
    Layout layout{dice.Between(1, 150), dice.Between(1, 60)};
    if (dice.OneIn(2)) layout.xOrigin = 2 * dice.Between(0, 9);
    if (dice.OneIn(2)) layout.yOrigin = dice.Between(0, 9);
    if (dice.OneIn(2)) layout.padding = dice.Between(0, 33);
    layout.bottomUp = dice.OneIn(2);
    layout.edge = dice.OneIn(2) ? Edge::kFront : Edge::kBack;
    return layout;
}

// For converting 32-bit pixels to 4:2:2 in place.
void ConvertInPlace(IFrameProcessor& processor, const Layout& size, Dice& dice) {
    Frame source(size), apart(size, Packing::kYcbcr);
    source.Paint(dice);
    FrameRecord in = source.Record(), out = apart.Record();
    Require(processor.ConvertBgraToYcbcr(&in, &out, 0), "refuses the frame");
    Frame shared(size);
    shared.CopyRegion(source);
    in = shared.Record();
    out = in;
    out.rowStep = apart.Record().rowStep;
    Require(processor.ConvertBgraToYcbcr(&in, &out, 0), "refuses the frame in place");
    const std::size_t used =
        apart.Size() - (size.width % 2 != 0 ? 2 : 0);  // a single last pixel takes two bytes
    Require(
        std::equal(apart.Bytes(),
                   apart.Bytes() + std::min<std::size_t>(used, 4 * static_cast<std::size_t>(size.width) / 2),
                   shared.Bytes()),
        "in place the first row differs");
}

}  // namespace

void CheckConverter(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const Reference<IFrameProcessor> processor = library.Processor();
    for (const Direction& direction : kDirections) {
        for (std::int32_t width = 1; width <= context.Rounds(40, 150); ++width) {
            for (const Edge edge : {Edge::kFront, Edge::kBack}) {
                Layout layout{width, 1 + width % 4};
                layout.edge = edge;
                ConvertInside(*processor, direction, layout, layout, context.dice);
            }
        }
        ConvertInside(*processor, direction, Layout{9, 3}, Layout{4, 8}, context.dice);
        ConvertInside(*processor, direction, Layout{4, 8}, Layout{9, 3}, context.dice);
    }
    for (const std::int32_t width : {1, 2, 7, 64, 65}) {
        SetPlace("in place, %d wide", width);
        ConvertInPlace(*processor, Layout{width, 5}, context.dice);
    }
}

void CheckConverterShapes(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const Reference<IFrameProcessor> processor = library.Processor();
    for (int i = 0; i < context.Rounds(200, 5000); ++i) {
        const Direction& direction = kDirections[i % 2];
        ConvertInside(*processor, direction, RandomLayout(context.dice), RandomLayout(context.dice),
                      context.dice);
    }
}

}  // namespace velmora::reelcheck
