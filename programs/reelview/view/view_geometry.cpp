#include "programs/reelview/view/view_geometry.h"

#include <algorithm>
#include <cmath>

namespace velmora::reelview {
namespace {

constexpr double kGap = 8.0, kMargin = 8.0;

double Factor(const ViewState& state, hosts::FrameSize picture, double width, double height) {
    if (state.zoom == Zoom::kFull) return 1.0;
    if (state.zoom == Zoom::kDouble) return 2.0;
    const double fit = std::min(width / picture.width, height / picture.height);
    return std::max(fit, 1.0 / std::max(picture.width, picture.height));
}

struct Span {
    std::int32_t start, length, panRange;
};

Span Centred(double areaStart, double area, double size, std::int32_t pan) {
    const auto length = std::max(static_cast<std::int32_t>(std::lround(size)), 1);
    const auto range = std::max(static_cast<std::int32_t>((length - area + 1.0) / 2.0), 0);
    const auto start = static_cast<std::int32_t>(std::floor(areaStart + (area - length) / 2.0));
    return {start + std::clamp(pan, -range, range), length, range};
}

}  // namespace

ViewPlaces PlacePicture(const ViewState& state, hosts::FrameSize picture, std::int32_t width,
                        std::int32_t height, double scale) {
    ViewPlaces places;
    const bool beside = state.compare == Compare::kSideBySide;
    const double margin = state.zoom == Zoom::kFit ? kMargin * scale : 0.0;
    const double gap = beside ? kGap * scale : 0.0;
    const double areaHeight = std::max(height - 2.0 * margin, 1.0);
    const double areaWidth = std::max((width - 2.0 * margin - gap) / (beside ? 2.0 : 1.0), 1.0);
    const double factor = Factor(state, picture, areaWidth, areaHeight);
    const Span x = Centred(margin, areaWidth, picture.width * factor, state.panX);
    const Span y = Centred(margin, areaHeight, picture.height * factor, state.panY);
    places.before = {x.start, y.start, x.start + x.length, y.start + y.length};
    places.after = places.before;
    if (beside) {
        const auto shift = static_cast<std::int32_t>(areaWidth + gap);
        places.after.left += shift;
        places.after.right += shift;
    }
    places.divider =
        x.start + static_cast<std::int32_t>(std::lround(std::clamp(state.divider, 0.0, 1.0) * x.length));
    places.panRangeX = x.panRange;
    places.panRangeY = y.panRange;
    return places;
}

double DividerAt(const ViewPlaces& places, std::int32_t x) {
    if (places.before.Width() <= 0) return 0.5;
    return std::clamp(static_cast<double>(x - places.before.left) / places.before.Width(), 0.0, 1.0);
}

}  // namespace velmora::reelview
