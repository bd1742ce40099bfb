#include "programs/reelview/view/transport_bar_win32.h"

#include <commctrl.h>

#include <algorithm>
#include <initializer_list>
#include <utility>

namespace velmora::reelview {
namespace {

// A very long clip has more frames than the bar has steps.
constexpr std::int64_t kMostSteps = 1'000'000;

std::int64_t StepsOf(const Transport& transport) {
    return std::min(transport.Frames() - 1, kMostSteps);
}

void Fill(HDC dc, std::initializer_list<POINT> points, COLORREF colour) {
    const Brush brush(CreateSolidBrush(colour));
    const support::win32::Selection fill(dc, brush.get());
    const support::win32::Selection edge(dc, GetStockObject(NULL_PEN));
    Polygon(dc, points.begin(), static_cast<int>(points.size()));
}

// Symbols are drawn around the button's centre, with `u` pixels per unit.
void DrawTriangle(HDC dc, POINT c, int u, int way, COLORREF colour) {
    Fill(dc, {{c.x - way * 4 * u, c.y - 6 * u}, {c.x + way * 6 * u, c.y}, {c.x - way * 4 * u, c.y + 6 * u}},
         colour);
}

void DrawBarAt(HDC dc, LONG x, LONG y, int u, COLORREF colour) {
    Fill(dc, {{x, y - 6 * u}, {x + 3 * u, y - 6 * u}, {x + 3 * u, y + 6 * u}, {x, y + 6 * u}}, colour);
}

void DrawLoop(HDC dc, POINT c, int u, COLORREF colour) {
    const auto pen = support::win32::Owner<HPEN, &DeleteObject>(CreatePen(PS_SOLID, 2 * u, colour));
    {
        const support::win32::Selection line(dc, pen.get());
        const support::win32::Selection hollow(dc, GetStockObject(NULL_BRUSH));
        RoundRect(dc, c.x - 7 * u, c.y - 5 * u, c.x + 8 * u, c.y + 6 * u, 9 * u, 9 * u);
    }
    Fill(dc, {{c.x - 2 * u, c.y - 9 * u}, {c.x + 4 * u, c.y - 5 * u}, {c.x - 2 * u, c.y - u}}, colour);
}

}  // namespace

TransportBar::TransportBar(HWND parent, const Theme& theme, Labels labels)
    : m_theme(theme), m_labels(std::move(labels)) {
    m_previous = MakeButton(parent, m_labels.previous, kTransportPrevious);
    m_play = MakeButton(parent, m_labels.play, kTransportPlay);
    m_next = MakeButton(parent, m_labels.next, kTransportNext);
    m_loop = MakeButton(parent, m_labels.loop, kTransportLoop);
    const HINSTANCE instance = GetModuleHandleW(nullptr);
    // Hidden, but it names the bar for screen readers.
    m_positionLabel = CreateWindowExW(0, WC_STATICW, m_labels.position.c_str(), WS_CHILD, 0, 0, 0, 0, parent,
                                      nullptr, instance, nullptr);
    m_scrub = CreateWindowExW(0, TRACKBAR_CLASSW, m_labels.position.c_str(),
                              WS_CHILD | WS_VISIBLE | WS_TABSTOP | TBS_HORZ | TBS_NOTICKS | TBS_BOTH, 0, 0, 0,
                              0, parent, reinterpret_cast<HMENU>(static_cast<INT_PTR>(kTransportScrub)),
                              instance, nullptr);
    m_tip = CreateWindowExW(WS_EX_TOPMOST, TOOLTIPS_CLASSW, nullptr, WS_POPUP | TTS_ALWAYSTIP | TTS_NOPREFIX,
                            0, 0, 0, 0, parent, nullptr, instance, nullptr);
    for (const HWND button : {m_previous, m_play, m_next, m_loop}) {
        TOOLINFOW tool = {};
        tool.cbSize = TTTOOLINFOW_V1_SIZE;
        tool.uFlags = TTF_IDISHWND | TTF_SUBCLASS;
        tool.hwnd = parent;
        tool.uId = reinterpret_cast<UINT_PTR>(button);
        tool.lpszText = LPSTR_TEXTCALLBACKW;
        SendMessageW(m_tip, TTM_ADDTOOLW, 0, reinterpret_cast<LPARAM>(&tool));
    }
    Restyle();
}

HWND TransportBar::MakeButton(HWND parent, const std::wstring& text, int id) {
    return CreateWindowExW(0, WC_BUTTONW, text.c_str(), WS_CHILD | WS_VISIBLE | WS_TABSTOP | BS_OWNERDRAW, 0,
                           0, 0, 0, parent, reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)),
                           GetModuleHandleW(nullptr), nullptr);
}

void TransportBar::Restyle() {
    for (const HWND window : {m_previous, m_play, m_next, m_loop, m_scrub}) {
        m_theme.Dress(window);
        InvalidateRect(window, nullptr, TRUE);
    }
}

void TransportBar::Show(const Transport& transport, bool isOpen) {
    const bool isFilm = isOpen && transport.Frames() > 1;
    for (const HWND window : {m_previous, m_play, m_next, m_loop, m_scrub}) {
        if ((IsWindowEnabled(window) != FALSE) != isFilm) EnableWindow(window, isFilm);
    }
    if (m_isPlaying != transport.IsPlaying()) {
        m_isPlaying = transport.IsPlaying();
        SetWindowTextW(m_play, (m_isPlaying ? m_labels.pause : m_labels.play).c_str());
        InvalidateRect(m_play, nullptr, FALSE);
    }
    if (m_loops != transport.Loops()) {
        m_loops = transport.Loops();
        InvalidateRect(m_loop, nullptr, FALSE);
    }
    const std::int64_t steps = std::max<std::int64_t>(StepsOf(transport), 0);
    if (SendMessageW(m_scrub, TBM_GETRANGEMAX, 0, 0) != steps) {
        SendMessageW(m_scrub, TBM_SETRANGEMAX, TRUE, static_cast<LPARAM>(steps));
        SendMessageW(m_scrub, TBM_SETPAGESIZE, 0, static_cast<LPARAM>(std::max<std::int64_t>(steps / 10, 1)));
    }
    const std::int64_t place = steps > 0 ? transport.Frame() * steps / (transport.Frames() - 1) : 0;
    if (SendMessageW(m_scrub, TBM_GETPOS, 0, 0) != place) {
        SendMessageW(m_scrub, TBM_SETPOS, TRUE, static_cast<LPARAM>(place));
    }
}

std::int64_t TransportBar::ScrubbedFrame(const Transport& transport) const {
    const std::int64_t steps = StepsOf(transport);
    const std::int64_t place = SendMessageW(m_scrub, TBM_GETPOS, 0, 0);
    return steps > 0 ? place * (transport.Frames() - 1) / steps : 0;
}

void TransportBar::Place(const RECT& area) {
    const int side = m_theme.Px(32), height = area.bottom - area.top;
    const int top = area.top + (height - side) / 2;
    int x = area.left;
    for (const HWND button : {m_previous, m_play, m_next, m_loop}) {
        MoveWindow(button, x, top, side, side, TRUE);
        x += side + m_theme.Px(2);
    }
    MoveWindow(m_scrub, x, top, std::max<int>(area.right - x, 0), side, TRUE);
}

bool TransportBar::Draw(const DRAWITEMSTRUCT& item) const {
    const HWND button = item.hwndItem;
    const bool isOurs = button == m_previous || button == m_play || button == m_next || button == m_loop;
    if (!isOurs) return false;
    const Palette& colours = m_theme.Colours();
    RECT area = item.rcItem;
    FillRect(item.hDC, &area, m_theme.WindowBrush());
    const bool isPressed = (item.itemState & ODS_SELECTED) != 0, isOff = (item.itemState & ODS_DISABLED) != 0;
    if (isPressed || (button == m_loop && m_loops && !isOff)) {
        FillRect(item.hDC, &area, m_theme.FieldBrush());
        const Brush edge(CreateSolidBrush(colours.edge));
        FrameRect(item.hDC, &area, edge.get());
    }
    const COLORREF colour = isOff                         ? colours.edge
                            : button == m_loop && m_loops ? colours.accent
                                                          : colours.text;
    const POINT centre = {(area.left + area.right) / 2, (area.top + area.bottom) / 2};
    const int u = std::max(m_theme.Px(10) / 10, 1);
    if (button == m_loop) DrawLoop(item.hDC, centre, u, colour);
    if (button == m_play && m_isPlaying) {
        DrawBarAt(item.hDC, centre.x - 5 * u, centre.y, u, colour);
        DrawBarAt(item.hDC, centre.x + 2 * u, centre.y, u, colour);
    }
    if (button == m_play && !m_isPlaying) DrawTriangle(item.hDC, centre, u, 1, colour);
    if (button == m_next) {
        DrawTriangle(item.hDC, {centre.x + 2 * u, centre.y}, u, 1, colour);
        DrawBarAt(item.hDC, centre.x - 7 * u, centre.y, u, colour);
    }
    if (button == m_previous) {
        DrawTriangle(item.hDC, {centre.x - 2 * u, centre.y}, u, -1, colour);
        DrawBarAt(item.hDC, centre.x + 4 * u, centre.y, u, colour);
    }
    if ((item.itemState & ODS_FOCUS) != 0) DrawFocusRect(item.hDC, &area);
    return true;
}

}  // namespace velmora::reelview
