// The desktop code's decisions that need no window.
#include <gtest/gtest.h>

#include <functional>

#include "api/host_api.h"
#include "desktop/bit_button_state.h"
#include "desktop/shell_services.h"

namespace velmora::support {
namespace {

using Mouse = BitButtonMouse;

void MoveIn(BitButtonState& button) {
    button.OnMouseMove(true);
}
void MoveOut(BitButtonState& button) {
    button.OnMouseMove(false);
}
void Press(BitButtonState& button) {
    button.OnButtonDown();
}

// A new button in the given state.
BitButtonState ButtonIn(Mouse state, bool notify = true) {
    BitButtonState button(notify);
    if (state == Mouse::kHover) MoveIn(button);
    if (state == Mouse::kPressedInside || state == Mouse::kPressedOutside) Press(button);
    if (state == Mouse::kPressedOutside) MoveOut(button);
    EXPECT_EQ(button.Mouse(), state);
    return button;
}

TEST(BitButtonState, FollowsEveryEventInEveryState) {
    using Event = std::function<BitButtonReaction(BitButtonState&)>;
    const Event moveIn = [](BitButtonState& b) { return b.OnMouseMove(true); };
    const Event moveOut = [](BitButtonState& b) { return b.OnMouseMove(false); };
    const Event down = [](BitButtonState& b) { return b.OnButtonDown(); };
    const Event up = [](BitButtonState& b) { return b.OnButtonUp(); };
    const Event leave = [](BitButtonState& b) { return b.OnMouseLeave(); };
    const Event captureChanged = [](BitButtonState& b) { return b.OnCaptureChanged(); };

    const BitButtonReaction nothing = {};
    const BitButtonReaction redraw = {.redraw = true};
    const BitButtonReaction enter = {.trackLeave = true, .redraw = true};
    const BitButtonReaction press = {.captureMouse = true, .redraw = true};
    const BitButtonReaction let = {.releaseCapture = true, .redraw = true};
    const BitButtonReaction click = {.click = true, .releaseCapture = true, .redraw = true};

    constexpr Mouse normal = Mouse::kNormal;
    constexpr Mouse hover = Mouse::kHover;
    constexpr Mouse inside = Mouse::kPressedInside;
    constexpr Mouse outside = Mouse::kPressedOutside;
    const struct {
        const char* name;
        const Event& event;
        Mouse before;
        Mouse after;
        const BitButtonReaction& reaction;
    } rows[] = {
        {"move in", moveIn, normal, hover, enter},
        {"move in", moveIn, hover, hover, nothing},
        {"move in", moveIn, inside, inside, nothing},
        {"move in", moveIn, outside, inside, redraw},
        {"move out", moveOut, normal, normal, nothing},
        {"move out", moveOut, hover, normal, redraw},
        {"move out", moveOut, inside, outside, redraw},
        {"move out", moveOut, outside, outside, nothing},
        {"down", down, normal, inside, press},
        {"down", down, hover, inside, press},
        {"down", down, inside, inside, press},
        {"down", down, outside, inside, press},
        {"up", up, normal, normal, let},
        {"up", up, hover, hover, let},
        {"up", up, inside, hover, click},
        {"up", up, outside, normal, let},
        {"leave", leave, normal, normal, nothing},
        {"leave", leave, hover, normal, redraw},
        {"leave", leave, inside, inside, nothing},
        {"leave", leave, outside, outside, nothing},
        {"capture changed", captureChanged, normal, normal, redraw},
        {"capture changed", captureChanged, hover, normal, redraw},
        {"capture changed", captureChanged, inside, normal, redraw},
        {"capture changed", captureChanged, outside, normal, redraw},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(testing::Message() << row.name << " in state " << static_cast<int>(row.before));
        BitButtonState button = ButtonIn(row.before);
        EXPECT_EQ(row.event(button), row.reaction);
        EXPECT_EQ(button.Mouse(), row.after);
    }
}

TEST(BitButtonState, ChoosesTheImage) {
    const struct {
        Mouse state;
        int image;
    } rows[] = {
        {Mouse::kNormal, 2}, {Mouse::kHover, 1}, {Mouse::kPressedInside, 0}, {Mouse::kPressedOutside, 1}};
    for (const auto& row : rows) {
        EXPECT_EQ(ButtonIn(row.state).ImageIndex(), row.image) << static_cast<int>(row.state);
        EXPECT_EQ(ButtonIn(row.state, false).ImageIndex(), 0) << static_cast<int>(row.state);
    }
}

class Library final : public Uncounted<com::IUnknown> {};

TEST(TextSources, AnotherLivingLibraryStepsIn) {
    Library first;
    Library second;
    Library third;
    TextSources sources;
    EXPECT_EQ(sources.Current(), nullptr);
    sources.Add(&first);
    sources.Add(&second);
    sources.Add(&third);
    EXPECT_EQ(sources.Current(), &first);
    sources.Remove(&second);
    EXPECT_EQ(sources.Current(), &first);
    sources.Remove(&first);
    EXPECT_EQ(sources.Current(), &third);
    EXPECT_EQ(sources.Count(), 1u);
    sources.Remove(&third);
    EXPECT_EQ(sources.Current(), nullptr);
    EXPECT_EQ(sources.Count(), 0u);
}

}  // namespace
}  // namespace velmora::support
