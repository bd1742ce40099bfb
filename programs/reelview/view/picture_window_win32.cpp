#include "programs/reelview/view/picture_window_win32.h"

#include <windowsx.h>

#include <algorithm>
#include <cstdlib>
#include <utility>

#include "programs/reelview/base/window_class_win32.h"

namespace velmora::reelview {
namespace {

constexpr int kGrip = 5;  // pixels at 96 dots per inch on both sides of the divider
constexpr double kDividerStep = 0.02;

}  // namespace

PictureWindow::PictureWindow(HWND parent, int id, const Theme& theme, Labels labels)
    : m_theme(theme), m_labels(std::move(labels)) {
    RegisterObjectClass<PictureWindow>(kPictureClass, CS_HREDRAW | CS_VREDRAW);
    CreateWindowExW(0, kPictureClass, m_labels.name.c_str(), WS_CHILD | WS_VISIBLE | WS_TABSTOP, 0, 0, 0, 0,
                    parent, reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), GetModuleHandleW(nullptr),
                    this);
}

PictureWindow::~PictureWindow() {
    if (m_window != nullptr) DestroyWindow(m_window);
}

void PictureWindow::SetZoom(Zoom zoom) {
    m_state.zoom = zoom;
    m_state.panX = m_state.panY = 0;
    InvalidateRect(m_window, nullptr, FALSE);
}

void PictureWindow::SetCompare(Compare compare) {
    m_state.compare = compare;
    InvalidateRect(m_window, nullptr, FALSE);
}

void PictureWindow::Show(SharedPicture before, SharedPicture after, bool isMoving) {
    m_before = std::move(before);
    m_after = std::move(after);
    m_isMoving = isMoving;
    InvalidateRect(m_window, nullptr, FALSE);
}

ViewPlaces PictureWindow::Places() const {
    RECT area = {};
    GetClientRect(m_window, &area);
    const hosts::FrameSize size = m_before ? m_before->size : hosts::FrameSize{1, 1};
    return PlacePicture(m_state, size, area.right, area.bottom, m_theme.Dpi() / 96.0);
}

void PictureWindow::PaintPicture(HDC dc, const Picture& picture, const Box& place) const {
    const BITMAPINFO info = BitmapInfoOf(picture.size);
    const bool isReduced = place.Width() < picture.size.width;
    SetStretchBltMode(dc, isReduced && !m_isMoving ? HALFTONE : COLORONCOLOR);
    SetBrushOrgEx(dc, 0, 0, nullptr);
    StretchDIBits(dc, place.left, place.top, place.Width(), place.Height(), 0, 0, picture.size.width,
                  picture.size.height, picture.pixels.data(), &info, DIB_RGB_COLORS, SRCCOPY);
}

void PictureWindow::PaintLabel(HDC dc, const std::wstring& text, int x, int y, bool isRight) const {
    SIZE size = {};
    GetTextExtentPoint32W(dc, text.c_str(), static_cast<int>(text.size()), &size);
    const int inset = m_theme.Px(6);
    RECT box = {x, y, x + size.cx + 2 * inset, y + size.cy + inset};
    if (isRight) OffsetRect(&box, -(box.right - box.left), 0);
    FillRect(dc, &box, m_theme.WindowBrush());
    SetTextColor(dc, m_theme.Colours().text);
    SetBkMode(dc, TRANSPARENT);
    DrawTextW(dc, text.c_str(), -1, &box, DT_CENTER | DT_VCENTER | DT_SINGLELINE | DT_NOPREFIX);
}

void PictureWindow::PaintInvitation(HDC dc, const RECT& area) const {
    const bool isContrast = m_theme.CurrentScheme() == Scheme::kHighContrast;
    SetTextColor(dc, isContrast ? m_theme.Colours().text : RGB(0xE8, 0xE8, 0xE8));
    SetBkMode(dc, TRANSPARENT);
    RECT box = area, lines = area;
    DrawTextW(dc, m_labels.invitation.c_str(), -1, &lines,
              DT_CALCRECT | DT_CENTER | DT_WORDBREAK | DT_NOPREFIX);
    OffsetRect(&box, 0, (area.bottom - lines.bottom) / 2);
    DrawTextW(dc, m_labels.invitation.c_str(), -1, &box, DT_CENTER | DT_WORDBREAK | DT_NOPREFIX);
}

void PictureWindow::PaintClipped(HDC dc, const Picture& picture, const Box& place, const RECT& clip) const {
    const int saved = SaveDC(dc);
    IntersectClipRect(dc, clip.left, clip.top, clip.right, clip.bottom);
    PaintPicture(dc, picture, place);
    RestoreDC(dc, saved);
}

void PictureWindow::PaintDivider(HDC dc, const ViewPlaces& places, const RECT& area) const {
    const int half = std::max(m_theme.Px(1), 1), grip = m_theme.Px(4);
    const RECT line = {places.divider - half, std::max(places.before.top, 0), places.divider + half,
                       std::min<LONG>(places.before.bottom, area.bottom)};
    const LONG middle = (line.top + line.bottom) / 2;
    const RECT handle = {places.divider - grip, middle - 4 * grip, places.divider + grip, middle + 4 * grip};
    const Brush brush(CreateSolidBrush(m_theme.Colours().accent));
    FillRect(dc, &line, brush.get());
    FillRect(dc, &handle, brush.get());
}

void PictureWindow::Paint(HDC dc, const RECT& area) const {
    const Brush stage(CreateSolidBrush(m_theme.Colours().stage));
    FillRect(dc, &area, stage.get());
    const support::win32::Selection font(dc, m_theme.TextFont());
    if (!m_before) {
        PaintInvitation(dc, area);
        return;
    }
    const ViewPlaces places = Places();
    const Picture& after = m_after ? *m_after : *m_before;
    if (m_state.compare == Compare::kSideBySide) {
        // Each is clipped to its half of the window.
        const int middle = area.right / 2, gap = m_theme.Px(4);
        PaintClipped(dc, *m_before, places.before, {0, 0, middle - gap, area.bottom});
        PaintClipped(dc, after, places.after, {middle + gap, 0, area.right, area.bottom});
    } else {
        PaintPicture(dc, after, places.after);
    }
    if (m_state.compare == Compare::kDivider) {
        PaintClipped(dc, *m_before, places.before, {places.before.left, 0, places.divider, area.bottom});
        PaintDivider(dc, places, area);
    }
    if (m_state.compare == Compare::kAfter) return;
    const int inset = m_theme.Px(8), top = std::max(places.before.top, 0) + inset;
    PaintLabel(dc, m_labels.before, std::max(places.before.left, 0) + inset, top, false);
    PaintLabel(dc, m_labels.after, std::min<int>(places.after.right, area.right) - inset, top, true);
}

bool PictureWindow::IsOnDivider(int x) const {
    return m_before && m_state.compare == Compare::kDivider &&
           std::abs(x - Places().divider) <= m_theme.Px(kGrip);
}

void PictureWindow::OnButtonDown(int x, int y) {
    SetFocus(m_window);
    if (!m_before) return;
    m_drag = IsOnDivider(x) ? Drag::kDivider : Drag::kPan;
    m_dragStart = {x, y};
    m_dragState = m_state;
    SetCapture(m_window);
}

void PictureWindow::OnMouseMove(int x, int y) {
    if (m_drag == Drag::kNone) {
        SetCursor(LoadCursorW(nullptr, IsOnDivider(x) ? IDC_SIZEWE : IDC_ARROW));
        return;
    }
    if (m_drag == Drag::kDivider) {
        m_state.divider = DividerAt(Places(), x);
    } else {
        const ViewPlaces places = Places();
        const auto moved = [](LONG start, LONG by, std::int32_t range) {
            return std::clamp<std::int32_t>(start + by, -range, range);
        };
        m_state.panX = moved(m_dragState.panX, x - m_dragStart.x, places.panRangeX);
        m_state.panY = moved(m_dragState.panY, y - m_dragStart.y, places.panRangeY);
    }
    InvalidateRect(m_window, nullptr, FALSE);
}

// Home and End belong to the clip, so the divider moves with Ctrl and the arrow keys.
bool PictureWindow::OnKey(WPARAM key) {
    const bool isArrow = key == VK_LEFT || key == VK_RIGHT;
    if (!isArrow || GetKeyState(VK_CONTROL) >= 0) return false;
    const double by = key == VK_LEFT ? -kDividerStep : kDividerStep;
    m_state.divider = std::clamp(m_state.divider + by, 0.0, 1.0);
    InvalidateRect(m_window, nullptr, FALSE);
    return true;
}

LRESULT PictureWindow::OnMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_PAINT: {
            const support::win32::Painting painting(m_window);
            RECT area = {};
            GetClientRect(m_window, &area);
            if (area.right > 0 && area.bottom > 0) {
                const BufferedPaint buffer(painting.Dc(), area);
                Paint(buffer.Dc(), area);
                if (GetFocus() == m_window) DrawFocusRect(buffer.Dc(), &area);
            }
            return 0;
        }
        case WM_ERASEBKGND:
            return 1;
        case WM_SETCURSOR:
            if (LOWORD(lParam) == HTCLIENT) return TRUE;
            break;
        case WM_LBUTTONDOWN:
            OnButtonDown(GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam));
            return 0;
        case WM_MOUSEMOVE:
            OnMouseMove(GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam));
            return 0;
        case WM_LBUTTONUP:
            if (m_drag != Drag::kNone) ReleaseCapture();
            return 0;
        case WM_CAPTURECHANGED:
            m_drag = Drag::kNone;
            return 0;
        case WM_GETDLGCODE:
            return DLGC_WANTARROWS;
        case WM_KEYDOWN:
            if (OnKey(wParam)) return 0;
            // The parent window handles the other keys.
            return SendMessageW(GetParent(m_window), message, wParam, lParam);
        case WM_SETFOCUS:
        case WM_KILLFOCUS:
            InvalidateRect(m_window, nullptr, FALSE);
            return 0;
        default:
            break;
    }
    return DefWindowProcW(m_window, message, wParam, lParam);
}

}  // namespace velmora::reelview
