#include "programs/reelview/panel/panel_layout.h"

#include <algorithm>
#include <cmath>

namespace velmora::reelview {
namespace {

using hosts::ParamInfo;

// In dialog units.
constexpr std::int32_t kMargin = 6;
constexpr std::int32_t kFurthest = 2000;
constexpr std::int32_t kBoxWidth = 48;
constexpr std::int32_t kCaptionHeight = 9, kFieldWidth = 38, kFieldHeight = 11;
constexpr std::int32_t kCaptionOverhang = 7;  // on either side: captions may be wider than knobs
constexpr std::int32_t kKnobTop = 11, kKnobSide = 48, kFieldTop = 61;
constexpr std::int32_t kSwatchInset = 6;
constexpr std::int32_t kMenuWidth = 95, kMenuHeight = 13;
constexpr std::int32_t kCheckWidth = 60, kCheckHeight = 11;
constexpr std::int32_t kTitleInset = 6, kTitleHeight = 9;

std::int32_t Place(std::int32_t units) {
    return std::clamp(units, 0, kFurthest);
}

std::int32_t SizeOr(std::int32_t units, std::int32_t usual) {
    return units > 0 ? std::min(units, kFurthest) : usual;
}

Box BoxAt(std::int32_t x, std::int32_t y, std::int32_t width, std::int32_t height) {
    return {x, y, x + width, y + height};
}

Box StatedBox(const ParamInfo& param) {
    return BoxAt(Place(param.x), Place(param.y), SizeOr(param.width, 0), SizeOr(param.height, 0));
}

bool HasBarShape(const ParamInfo& param) {
    return param.height > 0 && param.width >= 2 * param.height;
}

bool BarsFit(const std::vector<ParamInfo>& params) {
    std::vector<Box> bars;
    for (const ParamInfo& param : params) {
        if (param.kind != kKindSlider || !param.isVisible) continue;
        if (!HasBarShape(param)) return false;
        const Box box = StatedBox(param);
        if (std::ranges::any_of(bars, [&](const Box& bar) { return bar.Meets(box); })) return false;
        bars.push_back(box);
    }
    return !bars.empty();
}

void PlaceKnob(PanelItem& item, std::int32_t x, std::int32_t y) {
    item.caption = BoxAt(x - kCaptionOverhang, y, kBoxWidth + 2 * kCaptionOverhang, kCaptionHeight);
    item.control = BoxAt(x, y + kKnobTop, kKnobSide, kKnobSide);
    item.field = BoxAt(x + (kBoxWidth - kFieldWidth) / 2, y + kFieldTop, kFieldWidth, kFieldHeight);
}

void PlaceColour(PanelItem& item, std::int32_t x, std::int32_t y) {
    PlaceKnob(item, x, y);
    item.field = BoxAt(x - 1, y + kFieldTop, kBoxWidth + 2, kFieldHeight);
    item.control = BoxAt(x + kSwatchInset, y + kKnobTop + kSwatchInset, kKnobSide - 2 * kSwatchInset,
                         kKnobSide - 2 * kSwatchInset);
}

void PlaceBar(PanelItem& item, const Box& box) {
    const std::int32_t lower = std::max(box.Height() - kCaptionHeight, kFieldHeight);
    item.caption = BoxAt(box.left, box.top, box.Width(), kCaptionHeight);
    const std::int32_t top = box.top + kCaptionHeight;
    item.control = BoxAt(box.left, top, std::max(box.Width() - kFieldWidth - 4, 10), std::min(lower, 16));
    item.field = BoxAt(item.control.right + 4, top + 1, kFieldWidth, kFieldHeight);
}

void PlaceMenu(PanelItem& item, const ParamInfo& param, std::int32_t x, std::int32_t y) {
    const std::int32_t width = SizeOr(param.width, kMenuWidth);
    item.caption = BoxAt(x, y, width, kCaptionHeight);
    item.control = BoxAt(x, y + kKnobTop, width, kMenuHeight);
}

PanelShape ShapeOf(const ParamInfo& param, bool asBars) {
    switch (param.kind) {
        case kKindMenu:
            return PanelShape::kMenu;
        case kKindColour:
            return PanelShape::kColour;
        case kKindCheckBox:
            return PanelShape::kCheckBox;
        default:
            return asBars ? PanelShape::kBar : PanelShape::kKnob;
    }
}

PanelItem ItemOf(const ParamInfo& param, std::uint32_t index, bool asBars) {
    PanelItem item;
    item.parameter = index;
    item.title = param.name;
    item.shape = ShapeOf(param, asBars);
    const std::int32_t x = Place(param.x), y = Place(param.y);
    if (item.shape == PanelShape::kKnob) PlaceKnob(item, x, y);
    if (item.shape == PanelShape::kBar) PlaceBar(item, StatedBox(param));
    if (item.shape == PanelShape::kColour) PlaceColour(item, x, y);
    if (item.shape == PanelShape::kMenu) PlaceMenu(item, param, x, y);
    if (item.shape == PanelShape::kCheckBox) {
        item.control = BoxAt(x, y, SizeOr(param.width, kCheckWidth), std::max(param.height, kCheckHeight));
        item.control.bottom = std::min(item.control.bottom, y + 2 * kCheckHeight);
    }
    return item;
}

PanelItem FrameOf(const ParamInfo& end, std::uint32_t index) {
    PanelItem item;
    item.parameter = index;
    item.title = end.name;
    item.control = StatedBox(end);
    item.caption = BoxAt(item.control.left + kTitleInset, item.control.top - kTitleHeight / 2,
                         std::max(item.control.Width() - 2 * kTitleInset, 0), kTitleHeight);
    return item;
}

class Scaler {
  public:
    explicit Scaler(UnitScale scale) : m_scale(scale) {}
    void Apply(Box& box) const {
        if (box.Width() <= 0 || box.Height() <= 0) {
            box = {};
            return;
        }
        box = {X(box.left), Y(box.top), X(box.right), Y(box.bottom)};
    }
    [[nodiscard]] std::int32_t X(std::int32_t units) const { return Pixels(units + kMargin, m_scale.x); }
    [[nodiscard]] std::int32_t Y(std::int32_t units) const { return Pixels(units + kMargin, m_scale.y); }

  private:
    static std::int32_t Pixels(std::int32_t units, double scale) {
        return static_cast<std::int32_t>(std::lround(units * scale));
    }

    UnitScale m_scale;
};

// Knobs and swatches are as wide as they are high.
void MakeSquare(Box& box) {
    const std::int32_t side = std::min(box.Width(), box.Height());
    box.left += (box.Width() - side) / 2;
    box.top += (box.Height() - side) / 2;
    box.right = box.left + side;
    box.bottom = box.top + side;
}

// The library's own panels have check boxes that are declared wider than the frame around them.
void KeepInsideFrames(PanelLayout& layout, std::int32_t gap) {
    for (PanelItem& item : layout.items) {
        if (item.shape != PanelShape::kCheckBox) continue;
        for (const PanelItem& frame : layout.items) {
            const Box& box = frame.control;
            const bool isIn = frame.shape == PanelShape::kFrame && frame.control.Meets(item.control) &&
                              item.control.left > box.left && item.control.top > box.top &&
                              item.control.bottom < box.bottom;
            if (isIn) item.control.right = std::min(item.control.right, box.right - gap);
        }
    }
}

}  // namespace

PanelLayout LayOutPanel(const std::vector<ParamInfo>& params, UnitScale scale) {
    const bool asBars = BarsFit(params);
    const Scaler scaler(scale);
    PanelLayout layout;
    std::vector<std::string> groups;
    std::int32_t right = 0, bottom = 0;
    for (std::size_t i = 0; i < params.size(); ++i) {
        const ParamInfo& param = params[i];
        const bool isGroup = param.kind == kKindGroup;
        if (isGroup && !param.isGroupEnd) groups.push_back(param.name);
        const std::string group = groups.empty() ? std::string() : groups.back();
        if (isGroup && param.isGroupEnd && !groups.empty()) groups.pop_back();
        const bool isShown = param.isVisible && (isGroup ? param.isGroupEnd : param.HoldsValue());
        if (!isShown) continue;
        const auto index = static_cast<std::uint32_t>(i);
        PanelItem item = isGroup ? FrameOf(param, index) : ItemOf(param, index, asBars);
        if (!isGroup) item.group = group;
        for (const Box* box : {&item.control, &item.field}) {
            right = std::max(right, box->right);
            bottom = std::max(bottom, box->bottom);
        }
        for (Box* box : {&item.caption, &item.control, &item.field}) scaler.Apply(*box);
        if (item.shape == PanelShape::kKnob || item.shape == PanelShape::kColour) MakeSquare(item.control);
        layout.items.push_back(std::move(item));
    }
    KeepInsideFrames(layout, scaler.X(kMargin) / kMargin);
    layout.width = scaler.X(right + kMargin);
    layout.height = scaler.Y(bottom + kMargin);
    return layout;
}

}  // namespace velmora::reelview
