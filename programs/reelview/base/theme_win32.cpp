#include "programs/reelview/base/theme_win32.h"

#include <dwmapi.h>
#include <uxtheme.h>

#include <algorithm>

namespace velmora::reelview {
namespace {

std::uint32_t Rgb(COLORREF colour) {
    return (std::uint32_t{GetRValue(colour)} << 16) | (std::uint32_t{GetGValue(colour)} << 8) |
           GetBValue(colour);
}

COLORREF Between(COLORREF a, COLORREF b, int percentOfB) {
    const auto mix = [&](int x, int y) { return static_cast<BYTE>(x + (y - x) * percentOfB / 100); };
    return RGB(mix(GetRValue(a), GetRValue(b)), mix(GetGValue(a), GetGValue(b)),
               mix(GetBValue(a), GetBValue(b)));
}

constexpr COLORREF kAmber = RGB(0xB4, 0x6E, 0x1E), kAmberOnDark = RGB(0xE8, 0xB0, 0x5C);

KnobColours KnobsOf(const Palette& palette, bool isDark) {
    KnobColours knob;
    knob.background = Rgb(palette.window);
    knob.track = Rgb(Between(palette.window, palette.text, 22));
    knob.value = Rgb(palette.accent);
    knob.body = Rgb(isDark ? RGB(0x4A, 0x4A, 0x4C) : RGB(0xFC, 0xFC, 0xFC));
    knob.rim = Rgb(Between(palette.window, palette.text, isDark ? 40 : 35));
    knob.pointer = Rgb(palette.text);
    knob.focus = Rgb(isDark ? RGB(0x6C, 0xB4, 0xF0) : RGB(0x00, 0x5F, 0xB8));
    return knob;
}

Palette LightPalette() {
    Palette palette = {};
    palette.window = GetSysColor(COLOR_3DFACE);
    palette.text = GetSysColor(COLOR_BTNTEXT);
    palette.dimText = Between(palette.text, palette.window, 35);
    palette.edge = Between(palette.window, palette.text, 25);
    palette.field = GetSysColor(COLOR_WINDOW);
    palette.fieldText = GetSysColor(COLOR_WINDOWTEXT);
    palette.accent = kAmber;
    palette.stage = RGB(0x60, 0x60, 0x60);
    palette.knob = KnobsOf(palette, false);
    return palette;
}

Palette DarkPalette() {
    Palette palette = {};
    palette.window = RGB(0x24, 0x24, 0x26);
    palette.text = RGB(0xEC, 0xEC, 0xEC);
    palette.dimText = RGB(0xA8, 0xA8, 0xAC);
    palette.edge = RGB(0x58, 0x58, 0x5C);
    palette.field = RGB(0x34, 0x34, 0x37);
    palette.fieldText = palette.text;
    palette.accent = kAmberOnDark;
    palette.stage = RGB(0x16, 0x16, 0x18);
    palette.knob = KnobsOf(palette, true);
    return palette;
}

Palette ContrastPalette() {
    Palette palette = {};
    palette.window = GetSysColor(COLOR_WINDOW);
    palette.text = palette.fieldText = GetSysColor(COLOR_WINDOWTEXT);
    palette.dimText = palette.text;
    palette.edge = palette.text;
    palette.field = palette.window;
    palette.accent = GetSysColor(COLOR_HIGHLIGHT);
    palette.stage = palette.window;
    palette.knob = {Rgb(palette.window), Rgb(palette.text), Rgb(palette.accent), Rgb(palette.window),
                    Rgb(palette.text),   Rgb(palette.text), Rgb(palette.accent)};
    return palette;
}

// Only called where the system has it, because the program also runs on older ones.
template <class Function>
Function SystemFunction(const wchar_t* module, const char* name) {
    const HMODULE loaded = LoadLibraryW(module);
    if (loaded == nullptr) return nullptr;
    return reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(loaded, name)));
}

Font MessageFont(int dpi) {
    NONCLIENTMETRICSW metrics = {};
    metrics.cbSize = sizeof metrics;
    SystemParametersInfoW(SPI_GETNONCLIENTMETRICS, sizeof metrics, &metrics, 0);
    // Nine points, independent of the resolution at system start.
    metrics.lfMessageFont.lfHeight = -MulDiv(9, dpi, 72);
    return Font(CreateFontIndirectW(&metrics.lfMessageFont));
}

// Redraws the button and edge of the combo box, because not every system has dark ones.
LRESULT CALLBACK DarkMenuProcedure(HWND menu, UINT message, WPARAM wParam, LPARAM lParam, UINT_PTR id,
                                   DWORD_PTR data) {
    const LRESULT result = DefSubclassProc(menu, message, wParam, lParam);
    const Theme& theme = *reinterpret_cast<const Theme*>(data);
    if (message == WM_PAINT && theme.IsDark()) theme.PaintMenuBox(menu);
    if (message == WM_NCDESTROY) RemoveWindowSubclass(menu, DarkMenuProcedure, id);
    return result;
}

}  // namespace

void Theme::PaintMenuBox(HWND menu) const {
    COMBOBOXINFO info = {};
    info.cbSize = sizeof info;
    if (!GetComboBoxInfo(menu, &info)) return;
    RECT area = {};
    GetClientRect(menu, &area);
    const support::win32::WindowDc dc(menu);
    const Brush edge(CreateSolidBrush(m_palette.edge));
    RECT button = {info.rcButton.left, 1, area.right - 1, area.bottom - 1};
    FillRect(dc.Dc(), &button, FieldBrush());
    FrameRect(dc.Dc(), &area, edge.get());
    InflateRect(&area, -1, -1);
    FrameRect(dc.Dc(), &area, FieldBrush());
    // Around the text too, where a system without dark controls draws a light line.
    const RECT inner = {area.left + 1, area.top + 1, button.left, area.bottom - 1};
    FrameRect(dc.Dc(), &inner, FieldBrush());
    const int x = (button.left + button.right) / 2, y = (button.top + button.bottom) / 2, half = Px(4);
    const POINT arrow[] = {{x - half, y - half / 2}, {x + half, y - half / 2}, {x, y + half / 2 + 1}};
    const Brush text(CreateSolidBrush(m_palette.text));
    const support::win32::Selection fill(dc.Dc(), text.get());
    const support::win32::Selection line(dc.Dc(), GetStockObject(NULL_PEN));
    Polygon(dc.Dc(), arrow, 3);
}

Scheme SystemScheme() {
    HIGHCONTRASTW contrast = {};
    contrast.cbSize = sizeof contrast;
    const bool isKnown = SystemParametersInfoW(SPI_GETHIGHCONTRAST, sizeof contrast, &contrast, 0) != FALSE;
    if (isKnown && (contrast.dwFlags & HCF_HIGHCONTRASTON) != 0) return Scheme::kHighContrast;
    DWORD isLight = 1, size = sizeof isLight;
    RegGetValueW(HKEY_CURRENT_USER, L"Software\\Microsoft\\Windows\\CurrentVersion\\Themes\\Personalize",
                 L"AppsUseLightTheme", RRF_RT_REG_DWORD, nullptr, &isLight, &size);
    return isLight == 0 ? Scheme::kDark : Scheme::kLight;
}

void Theme::Set(Scheme scheme, int dpi) {
    m_scheme = scheme;
    m_dpi = dpi;
    m_palette = scheme == Scheme::kDark           ? DarkPalette()
                : scheme == Scheme::kHighContrast ? ContrastPalette()
                                                  : LightPalette();
    m_windowBrush.reset(CreateSolidBrush(m_palette.window));
    m_fieldBrush.reset(CreateSolidBrush(m_palette.field));
    m_font = MessageFont(dpi);
}

void Theme::Dress(HWND control) const {
    SendMessageW(control, WM_SETFONT, reinterpret_cast<WPARAM>(m_font.get()), TRUE);
    wchar_t name[32] = {};
    GetClassNameW(control, name, 32);
    if (!IsDark()) {
        SetWindowTheme(control, nullptr, nullptr);
    } else if (lstrcmpiW(name, L"ComboBox") == 0) {
        SetWindowTheme(control, L"DarkMode_CFD", nullptr);
        SetWindowSubclass(control, DarkMenuProcedure, 1, reinterpret_cast<DWORD_PTR>(this));
    } else {
        SetWindowTheme(control, L"DarkMode_Explorer", nullptr);
    }
}

void Theme::DressFrame(HWND window) const {
    constexpr DWORD kDarkFrame = 20;
    static const auto setAttribute =
        SystemFunction<decltype(&DwmSetWindowAttribute)>(L"dwmapi.dll", "DwmSetWindowAttribute");
    const BOOL isDark = IsDark();
    if (setAttribute != nullptr) setAttribute(window, kDarkFrame, &isDark, sizeof isDark);
}

// The themed check box draws black text, whatever colour is set.
void Theme::DrawCheckBox(const NMCUSTOMDRAW& part) const {
    const HWND control = part.hdr.hwndFrom;
    RECT area = {};
    GetClientRect(control, &area);
    FillRect(part.hdc, &area, WindowBrush());
    const int side = Px(13), top = (area.bottom - side) / 2;
    RECT box = {0, top, side, top + side};
    FillRect(part.hdc, &box, FieldBrush());
    const Brush edge(CreateSolidBrush(m_palette.dimText));
    FrameRect(part.hdc, &box, edge.get());
    if (SendMessageW(control, BM_GETCHECK, 0, 0) == BST_CHECKED) {
        const support::win32::Owner<HPEN, &DeleteObject> pen(
            CreatePen(PS_SOLID, std::max(Px(2), 2), m_palette.accent));
        const support::win32::Selection line(part.hdc, pen.get());
        const POINT mark[] = {{Px(3), top + Px(6)}, {Px(5), top + Px(9)}, {Px(10), top + Px(3)}};
        Polyline(part.hdc, mark, 3);
    }
    wchar_t text[128] = {};
    GetWindowTextW(control, text, 128);
    const support::win32::Selection font(part.hdc, TextFont());
    SetTextColor(part.hdc, m_palette.text);
    SetBkMode(part.hdc, TRANSPARENT);
    RECT label = {side + Px(4), 0, area.right, area.bottom};
    DrawTextW(part.hdc, text, -1, &label, DT_LEFT | DT_VCENTER | DT_SINGLELINE);
    if ((part.uItemState & CDIS_FOCUS) != 0 || GetFocus() == control) DrawFocusRect(part.hdc, &label);
}

std::optional<LRESULT> Theme::DrawPart(const NMCUSTOMDRAW& part) const {
    if (!IsDark() || part.hdr.code != NM_CUSTOMDRAW) return std::nullopt;
    wchar_t name[32] = {};
    GetClassNameW(part.hdr.hwndFrom, name, 32);
    if (lstrcmpiW(name, WC_BUTTONW) == 0 && part.dwDrawStage == CDDS_PREPAINT) {
        DrawCheckBox(part);
        return CDRF_SKIPDEFAULT;
    }
    if (lstrcmpiW(name, TRACKBAR_CLASSW) != 0) return std::nullopt;
    if (part.dwDrawStage == CDDS_PREPAINT) return CDRF_NOTIFYITEMDRAW;
    const bool isPart = part.dwItemSpec == TBCD_CHANNEL || part.dwItemSpec == TBCD_THUMB;
    if (part.dwDrawStage != CDDS_ITEMPREPAINT || !isPart) return CDRF_DODEFAULT;
    const bool isOff = IsWindowEnabled(part.hdr.hwndFrom) == FALSE;
    RECT area = part.rc;
    if (part.dwItemSpec == TBCD_CHANNEL) {
        SendMessageW(part.hdr.hwndFrom, TBM_GETCHANNELRECT, 0, reinterpret_cast<LPARAM>(&area));
    }
    const Brush brush(
        CreateSolidBrush(part.dwItemSpec == TBCD_THUMB && !isOff ? m_palette.text : m_palette.edge));
    FillRect(part.hdc, &area, brush.get());
    return CDRF_SKIPDEFAULT;
}

// In window coordinates. The line below the bar belongs to the frame and is light too.
void Theme::PaintMenuRest(HWND window) const {
    MENUBARINFO bar = {};
    bar.cbSize = sizeof bar;
    const HMENU menu = GetMenu(window);
    if (!IsDark() || menu == nullptr || !GetMenuBarInfo(window, OBJID_MENU, 0, &bar)) return;
    RECT last = {}, whole = bar.rcBar, frame = {};
    GetWindowRect(window, &frame);
    GetMenuItemRect(window, menu, static_cast<UINT>(GetMenuItemCount(menu) - 1), &last);
    whole.left = std::max(last.right, whole.left);
    OffsetRect(&whole, -frame.left, -frame.top);
    RECT line = {bar.rcBar.left - frame.left, whole.bottom, whole.right, whole.bottom + 1};
    const HDC dc = GetWindowDC(window);
    FillRect(dc, &whole, WindowBrush());
    FillRect(dc, &line, WindowBrush());
    ReleaseDC(window, dc);
}

HBRUSH Theme::ControlColours(HDC dc, bool isField) const {
    SetTextColor(dc, isField ? m_palette.fieldText : m_palette.text);
    SetBkColor(dc, isField ? m_palette.field : m_palette.window);
    return isField ? FieldBrush() : WindowBrush();
}

int DpiOf(HWND window) {
    static const auto dpiForWindow = SystemFunction<UINT(WINAPI*)(HWND)>(L"user32.dll", "GetDpiForWindow");
    const UINT dpi = dpiForWindow != nullptr ? dpiForWindow(window) : 0;
    if (dpi != 0) return static_cast<int>(dpi);
    const support::win32::WindowDc dc(window);
    return GetDeviceCaps(dc.Dc(), LOGPIXELSY);
}

}  // namespace velmora::reelview
