#include "programs/reelview/panel/knob_window_win32.h"

#include <windowsx.h>

#include <algorithm>
#include <cmath>

#include "programs/reelview/base/window_class_win32.h"
#include "programs/reelview/panel/knob.h"

namespace velmora::reelview {
namespace {

// The length of a straight drag through the whole range, in pixels at 96 dots per inch.
constexpr int kTravel = 200;

std::uint32_t NewGesture() {
    static std::uint32_t last = 0;
    return ++last;
}

bool IsDown(int key) {
    return GetKeyState(key) < 0;
}

}  // namespace

KnobWindow::KnobWindow(HWND parent, int id, const Facts& facts, KnobOwner& owner)
    : m_facts(facts), m_owner(owner) {
    RegisterObjectClass<KnobWindow>(kKnobClass, CS_DBLCLKS | CS_HREDRAW | CS_VREDRAW);
    CreateWindowExW(0, kKnobClass, facts.name.c_str(), WS_CHILD | WS_VISIBLE | WS_TABSTOP, 0, 0, 0, 0, parent,
                    reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), GetModuleHandleW(nullptr), this);
}

KnobWindow::~KnobWindow() {
    if (m_window != nullptr) DestroyWindow(m_window);
}

void KnobWindow::Show(double value) {
    if (value == m_value) return;
    m_value = value;
    InvalidateRect(m_window, nullptr, FALSE);
    NotifyWinEvent(EVENT_OBJECT_VALUECHANGE, m_window, OBJID_CLIENT, CHILDID_SELF);
}

void KnobWindow::Place(const Box& box) {
    MoveWindow(m_window, box.left, box.top, box.Width(), box.Height(), TRUE);
}

void KnobWindow::Move(double value, std::uint32_t gesture) {
    if (value == m_value) return;
    Show(value);
    m_owner.OnKnobMoved(m_facts.parameter, value, gesture);
}

void KnobWindow::BeginDrag(LPARAM lParam) {
    SetFocus(m_window);
    SetCapture(m_window);
    m_isDragging = true;
    m_gesture = NewGesture();
    RECT area = {};
    GetClientRect(m_window, &area);
    const DragWay round = m_owner.KnobsDragVertical() ? DragWay::kVertical : DragWay::kCircle;
    const double travel = m_facts.isBar ? area.right : m_owner.CurrentTheme().Px(kTravel);
    m_drag.Begin(m_facts.isBar ? DragWay::kHorizontal : round, m_value,
                 GET_X_LPARAM(lParam) - area.right / 2.0, GET_Y_LPARAM(lParam) - area.bottom / 2.0, travel);
}

void KnobWindow::Drag(LPARAM lParam, bool isFine) {
    RECT area = {};
    GetClientRect(m_window, &area);
    Move(m_drag.Move(GET_X_LPARAM(lParam) - area.right / 2.0, GET_Y_LPARAM(lParam) - area.bottom / 2.0,
                     isFine),
         m_gesture);
}

bool KnobWindow::OnWheel(WPARAM wParam) {
    const int delta = GET_WHEEL_DELTA_WPARAM(wParam);
    const bool isFine = (GET_KEYSTATE_WPARAM(wParam) & (MK_CONTROL | MK_SHIFT)) != 0;
    Move(AfterWheel(m_value, static_cast<double>(delta) / WHEEL_DELTA, isFine), 0);
    return true;
}

bool KnobWindow::OnKey(WPARAM key) {
    struct Row {
        WPARAM key;
        KnobKey meaning;
    };
    static constexpr Row kKeys[] = {
        {VK_UP, KnobKey::kUp},     {VK_RIGHT, KnobKey::kUp},     {VK_DOWN, KnobKey::kDown},
        {VK_LEFT, KnobKey::kDown}, {VK_PRIOR, KnobKey::kPageUp}, {VK_NEXT, KnobKey::kPageDown},
        {VK_HOME, KnobKey::kHome}, {VK_END, KnobKey::kEnd},
    };
    for (const Row& row : kKeys) {
        if (row.key != key) continue;
        Move(AfterKey(m_value, row.meaning, IsDown(VK_CONTROL) || IsDown(VK_SHIFT)), 0);
        return true;
    }
    if (key != VK_DELETE && key != VK_BACK) return false;
    Move(m_facts.defaultValue, 0);
    return true;
}

void KnobWindow::PaintBar(HDC dc, const RECT& area) const {
    const Theme& theme = m_owner.CurrentTheme();
    const Palette& colours = theme.Colours();
    FillRect(dc, &area, theme.WindowBrush());
    const int middle = area.bottom / 2, half = theme.Px(3), inset = theme.Px(6);
    const int length = area.right - 2 * inset;
    const auto at = [&](double value) { return inset + static_cast<int>(std::lround(value * length)); };
    const auto fill = [&](RECT box, COLORREF colour) {
        const Brush brush(CreateSolidBrush(colour));
        FillRect(dc, &box, brush.get());
    };
    fill({inset, middle - half, inset + length, middle + half}, colours.edge);
    const int from = at(std::min(m_facts.origin, m_value)), to = at(std::max(m_facts.origin, m_value));
    fill({from, middle - half, to, middle + half}, colours.accent);
    fill({at(m_value) - theme.Px(3), middle - theme.Px(8), at(m_value) + theme.Px(3), middle + theme.Px(8)},
         colours.text);
    if (GetFocus() == m_window) DrawFocusRect(dc, &area);
}

void KnobWindow::Paint(HDC dc, const RECT& area) const {
    if (m_facts.isBar) {
        PaintBar(dc, area);
        return;
    }
    const Theme& theme = m_owner.CurrentTheme();
    const int side = std::min(area.right, area.bottom);
    if (side < 8) return;
    KnobLook look;
    look.value = m_value;
    look.origin = m_facts.origin;
    look.hasFocus = GetFocus() == m_window;
    DrawPicture(dc, DrawKnob(side, look, theme.Colours().knob), 0, 0);
}

LRESULT KnobWindow::OnMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_PAINT: {
            const support::win32::Painting painting(m_window);
            RECT area = {};
            GetClientRect(m_window, &area);
            if (area.right > 0 && area.bottom > 0) Paint(BufferedPaint(painting.Dc(), area).Dc(), area);
            return 0;
        }
        case WM_ERASEBKGND:
            return 1;
        case WM_LBUTTONDOWN:
            BeginDrag(lParam);
            return 0;
        case WM_LBUTTONDBLCLK:
            SetFocus(m_window);
            Move(m_facts.defaultValue, 0);
            return 0;
        case WM_MOUSEMOVE:
            if (m_isDragging) Drag(lParam, (wParam & MK_SHIFT) != 0);
            return 0;
        case WM_LBUTTONUP:
            if (m_isDragging) ReleaseCapture();
            return 0;
        case WM_CAPTURECHANGED:
            m_isDragging = false;
            return 0;
        case WM_MOUSEWHEEL:
            return OnWheel(wParam) ? 0 : 1;
        case WM_KEYDOWN:
            if (OnKey(wParam)) return 0;
            break;
        case WM_GETDLGCODE:
            return DLGC_WANTARROWS;
        case WM_SETFOCUS:
        case WM_KILLFOCUS:
            InvalidateRect(m_window, nullptr, FALSE);
            return 0;
        case WM_GETOBJECT:
            if (static_cast<LONG>(lParam) == OBJID_CLIENT) return AccessibleKnob(*this, wParam);
            break;
        default:
            break;
    }
    return DefWindowProcW(m_window, message, wParam, lParam);
}

}  // namespace velmora::reelview
