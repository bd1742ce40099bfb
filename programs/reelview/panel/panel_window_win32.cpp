#include "programs/reelview/panel/panel_window_win32.h"

#include <commctrl.h>
#include <commdlg.h>

#include <algorithm>

#include "programs/reelview/panel/panel_layout.h"
#include "programs/reelview/base/texts.h"
#include "programs/reelview/base/window_class_win32.h"

namespace velmora::reelview {
namespace {

using hosts::ParamInfo;

RECT RectOf(const Box& box) {
    return {box.left, box.top, box.right, box.bottom};
}

std::wstring TextOf(HWND window) {
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
    return text;
}

char DecimalPoint() {
    wchar_t point[4] = {};
    GetLocaleInfoW(LOCALE_USER_DEFAULT, LOCALE_SDECIMAL, point, 4);
    return point[0] == L',' ? ',' : '.';
}

double OriginOf(const ParamInfo& param) {
    const bool crossesZero = param.minimum < 0.0f && param.maximum > 0.0f;
    return crossesZero ? -param.minimum / (double{param.maximum} - param.minimum) : 0.0;
}

// Ampersands in a library's names do not mark menu letters.
std::wstring CaptionOf(const std::string& name) {
    std::wstring text = WideOf(name);
    for (std::size_t i = text.find(L'&'); i != std::wstring::npos; i = text.find(L'&', i + 2))
        text.insert(i, 1, L'&');
    return text;
}

}  // namespace

PanelWindow::PanelWindow(HWND parent, PanelOwner& owner, const Theme& theme)
    : m_owner(owner), m_theme(theme) {
    RegisterObjectClass<PanelWindow>(kPanelClass, 0);
    CreateWindowExW(WS_EX_CONTROLPARENT, kPanelClass, L"", WS_CHILD | WS_VISIBLE | WS_CLIPCHILDREN, 0, 0, 0,
                    0, parent, nullptr, GetModuleHandleW(nullptr), this);
}

PanelWindow::~PanelWindow() {
    m_controls.clear();
    if (m_window != nullptr) DestroyWindow(m_window);
}

void PanelWindow::ShowEffect(const hosts::EffectInfo& effect, const Values& values) {
    m_isShowing = true;
    for (Control& control : m_controls) {
        for (HWND window : {control.caption, control.field, control.knob ? nullptr : control.control}) {
            if (window != nullptr) DestroyWindow(window);
        }
    }
    m_controls.clear();
    m_effect = &effect;
    m_values = values;
    m_scrollX = m_scrollY = 0;
    m_layout = LayOutPanel(effect.params, m_theme.Units());
    for (const PanelItem& item : m_layout.items) {
        Control control;
        control.item = item;
        m_controls.push_back(std::move(control));
        if (item.shape != PanelShape::kFrame) MakeControl(m_controls.back());
    }
    m_isShowing = false;
    Restyle();
    ShowValues(values);
}

HWND PanelWindow::MakeWindow(const wchar_t* className, const std::wstring& text, DWORD style, int id) {
    return CreateWindowExW(0, className, text.c_str(), WS_CHILD | WS_VISIBLE | style, 0, 0, 0, 0, m_window,
                           reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), GetModuleHandleW(nullptr),
                           nullptr);
}

// A caption comes just before its control in the window order, where screen readers look for it.
void PanelWindow::MakeControl(Control& control) {
    const PanelItem& item = control.item;
    const ParamInfo& param = m_effect->params[item.parameter];
    const std::wstring caption = CaptionOf(item.title);
    const int offset = static_cast<int>(item.parameter), id = kFirstControl + offset;
    const bool isSlider = item.shape == PanelShape::kKnob || item.shape == PanelShape::kBar;
    if (isSlider) {
        const KnobWindow::Facts facts = {item.parameter,
                                         item.shape == PanelShape::kBar,
                                         param.defaultValue.number,
                                         OriginOf(param),
                                         WideOf(item.title),
                                         WideOf(item.group)};
        control.knob = std::make_unique<KnobWindow>(m_window, id, facts, *this);
        control.control = control.knob->Window();
    } else if (item.shape == PanelShape::kColour) {
        control.control = MakeWindow(WC_BUTTONW, caption, BS_OWNERDRAW | WS_TABSTOP, id);
    } else if (item.shape == PanelShape::kCheckBox) {
        control.control = MakeWindow(WC_BUTTONW, caption, BS_AUTOCHECKBOX | WS_TABSTOP, id);
        return;
    }
    const DWORD align = item.shape == PanelShape::kMenu ? SS_LEFT : SS_CENTER;
    control.caption = MakeWindow(WC_STATICW, caption, align | SS_ENDELLIPSIS, kFirstCaption + offset);
    if (item.shape == PanelShape::kMenu) {
        control.control =
            MakeWindow(WC_COMBOBOXW, L"", CBS_DROPDOWNLIST | CBS_HASSTRINGS | WS_VSCROLL | WS_TABSTOP, id);
        FillMenu(control.control, param);
        return;
    }
    control.field =
        MakeWindow(WC_EDITW, L"", ES_CENTER | ES_AUTOHSCROLL | WS_BORDER | WS_TABSTOP, kFirstField + offset);
    SetWindowSubclass(control.field, FieldProcedure, item.parameter, reinterpret_cast<DWORD_PTR>(this));
    SendMessageW(control.field, EM_SETLIMITTEXT, 32, 0);
}

void PanelWindow::FillMenu(HWND menu, const ParamInfo& param) {
    for (const std::string& item : param.items) {
        SendMessageW(menu, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(WideOf(item).c_str()));
    }
}

void PanelWindow::Restyle() {
    for (Control& control : m_controls) {
        for (HWND window : {control.caption, control.control, control.field}) {
            if (window != nullptr) m_theme.Dress(window);
        }
    }
    LayOut();
    InvalidateRect(m_window, nullptr, TRUE);
}

void PanelWindow::LayOut() {
    if (m_effect == nullptr) return;
    m_layout = LayOutPanel(m_effect->params, m_theme.Units());
    for (std::size_t i = 0; i < m_controls.size(); ++i) m_controls[i].item = m_layout.items[i];
    SetScroll();
    PlaceControls();
}

void PanelWindow::PlaceControls() {
    const auto place = [&](HWND window, const Box& box, int extraHeight) {
        if (window == nullptr) return;
        SetWindowPos(window, nullptr, box.left - m_scrollX, box.top - m_scrollY, box.Width(),
                     box.Height() + extraHeight, SWP_NOZORDER | SWP_NOACTIVATE);
    };
    for (const Control& control : m_controls) {
        const bool isMenu = control.item.shape == PanelShape::kMenu;
        place(control.caption, control.item.caption, 0);
        place(control.control, control.item.control, isMenu ? m_theme.Px(220) : 0);  // including its list
        place(control.field, control.item.field, 0);
    }
}

PanelWindow::Control* PanelWindow::ControlOf(std::uint32_t parameter) {
    const auto found = std::ranges::find_if(m_controls, [&](const Control& control) {
        return control.item.parameter == parameter && control.item.shape != PanelShape::kFrame;
    });
    return found != m_controls.end() ? &*found : nullptr;
}

int PanelWindow::ParameterOf(HWND window) const {
    for (const Control& control : m_controls) {
        if (window != nullptr && (control.control == window || control.field == window)) {
            return static_cast<int>(control.item.parameter);
        }
    }
    return -1;
}

void PanelWindow::ShowValues(const Values& values) {
    m_values = values;
    for (Control& control : m_controls) {
        if (control.item.shape != PanelShape::kFrame) ShowValue(control);
    }
}

void PanelWindow::ShowValue(Control& control) {
    m_isShowing = true;
    const ValueWord value = m_values[control.item.parameter];
    switch (control.item.shape) {
        case PanelShape::kKnob:
        case PanelShape::kBar:
            control.knob->Show(std::clamp(double{value.number}, 0.0, 1.0));
            break;
        case PanelShape::kMenu:
            SendMessageW(control.control, CB_SETCURSEL, value.count, 0);
            break;
        case PanelShape::kCheckBox:
            SendMessageW(control.control, BM_SETCHECK, value.flag != 0 ? BST_CHECKED : BST_UNCHECKED, 0);
            break;
        default:
            InvalidateRect(control.control, nullptr, FALSE);
            break;
    }
    if (control.field != nullptr) {
        const std::wstring text = ShownText(control.item.parameter);
        if (text != TextOf(control.field)) SetWindowTextW(control.field, text.c_str());
    }
    m_isShowing = false;
}

std::wstring PanelWindow::ShownText(std::uint32_t parameter) {
    const ParamInfo& param = m_effect->params[parameter];
    if (param.kind == kKindColour) return WideOf(ColourText(m_values[parameter].colour));
    return WideOf(SliderText(param, m_values[parameter].number, DecimalPoint()));
}

void PanelWindow::Choose(std::uint32_t parameter, ValueWord value, std::uint32_t gesture) {
    m_values[parameter] = value;
    if (Control* const control = ControlOf(parameter)) ShowValue(*control);
    m_owner.OnValueChosen(parameter, value, gesture);
}

void PanelWindow::OnKnobMoved(std::uint32_t parameter, double value, std::uint32_t gesture) {
    ValueWord word{};
    word.number = static_cast<float>(value);
    Choose(parameter, word, gesture);
}

void PanelWindow::OnTypedText(std::uint32_t parameter, const std::wstring& text) {
    const ParamInfo& param = m_effect->params[parameter];
    ValueWord word{};
    if (param.kind == kKindColour) {
        const auto colour = TypedColour(Utf8Of(text));
        if (!colour) return;
        word.colour = *colour;
    } else {
        const auto value = TypedSlider(param, Utf8Of(text));
        if (!value) return;
        word.number = static_cast<float>(*value);
    }
    Choose(parameter, word, 0);
}

void PanelWindow::CommitField(std::uint32_t parameter) {
    Control* const control = ControlOf(parameter);
    if (control == nullptr || control->field == nullptr) return;
    const std::wstring text = TextOf(control->field);
    if (text != ShownText(parameter)) OnTypedText(parameter, text);
    ShowValue(*control);  // replaces invalid text by the current value
}

bool PanelWindow::OnFieldKey(std::uint32_t parameter, WPARAM key) {
    Control* const control = ControlOf(parameter);
    if (control == nullptr) return false;
    if (key == VK_RETURN) {
        CommitField(parameter);
        SendMessageW(control->field, EM_SETSEL, 0, -1);
        return true;
    }
    if (key == VK_ESCAPE) {
        ShowValue(*control);
        SendMessageW(control->field, EM_SETSEL, 0, -1);
        return true;
    }
    const bool isStep = key == VK_UP || key == VK_DOWN || key == VK_PRIOR || key == VK_NEXT;
    if (!isStep || !control->knob) return false;
    CommitField(parameter);
    return control->knob->OnKey(key);
}

LRESULT CALLBACK PanelWindow::FieldProcedure(HWND field, UINT message, WPARAM wParam, LPARAM lParam,
                                             UINT_PTR id, DWORD_PTR panel) {
    auto& self = *reinterpret_cast<PanelWindow*>(panel);
    const auto parameter = static_cast<std::uint32_t>(id);
    switch (message) {
        case WM_GETDLGCODE:
            return DefSubclassProc(field, message, wParam, lParam) |
                   (wParam == VK_RETURN || wParam == VK_ESCAPE ? DLGC_WANTMESSAGE : 0);
        case WM_KEYDOWN:
            if (self.OnFieldKey(parameter, wParam)) return 0;
            break;
        case WM_CHAR:
            if (wParam == L'\r' || wParam == L'\x1B') return 0;  // the edit would beep
            break;
        case WM_MOUSEWHEEL:
            if (Control* const control = self.ControlOf(parameter); control != nullptr && control->knob) {
                self.CommitField(parameter);
                control->knob->OnWheel(wParam);
                return 0;
            }
            break;
        case WM_NCDESTROY:
            RemoveWindowSubclass(field, FieldProcedure, id);
            break;
        default:
            break;
    }
    return DefSubclassProc(field, message, wParam, lParam);
}

void PanelWindow::ChooseColour(std::uint32_t parameter) {
    static COLORREF ownColours[16] = {};
    CHOOSECOLORW dialog = {};
    dialog.lStructSize = sizeof dialog;
    dialog.hwndOwner = GetAncestor(m_window, GA_ROOT);
    dialog.rgbResult = m_values[parameter].colour & 0xFFFFFFu;
    dialog.lpCustColors = ownColours;
    dialog.Flags = CC_RGBINIT | CC_FULLOPEN;
    if (!ChooseColorW(&dialog)) return;
    ValueWord word{};
    word.colour = dialog.rgbResult & 0xFFFFFFu;
    Choose(parameter, word, 0);
}

void PanelWindow::OnCommand(WPARAM wParam) {
    if (m_isShowing || m_effect == nullptr) return;
    const int id = LOWORD(wParam), code = HIWORD(wParam);
    const auto count = static_cast<int>(m_effect->params.size());
    if (id >= kFirstField && id < kFirstField + count) {
        if (code == EN_KILLFOCUS) CommitField(static_cast<std::uint32_t>(id - kFirstField));
        return;
    }
    if (id < kFirstControl || id >= kFirstControl + count) return;
    const auto parameter = static_cast<std::uint32_t>(id - kFirstControl);
    Control* const control = ControlOf(parameter);
    if (control == nullptr) return;
    ValueWord word{};
    if (control->item.shape == PanelShape::kColour && code == BN_CLICKED) {
        ChooseColour(parameter);
    } else if (control->item.shape == PanelShape::kCheckBox && code == BN_CLICKED) {
        word.bits = SendMessageW(control->control, BM_GETCHECK, 0, 0) == BST_CHECKED ? 1 : 0;
        Choose(parameter, word, 0);
    } else if (control->item.shape == PanelShape::kMenu && code == CBN_SELCHANGE) {
        const LRESULT item = SendMessageW(control->control, CB_GETCURSEL, 0, 0);
        if (item == CB_ERR) return;
        word.count = static_cast<std::uint32_t>(item);
        Choose(parameter, word, 0);
    }
}

void PanelWindow::Paint(HDC dc) {
    RECT area = {};
    GetClientRect(m_window, &area);
    FillRect(dc, &area, m_theme.WindowBrush());
    const Brush edge(CreateSolidBrush(m_theme.Colours().edge));
    const support::win32::Selection font(dc, m_theme.TextFont());
    SetTextColor(dc, m_theme.Colours().text);
    SetBkColor(dc, m_theme.Colours().window);
    SetBkMode(dc, OPAQUE);
    for (const Control& control : m_controls) {
        if (control.item.shape != PanelShape::kFrame) continue;
        RECT frame = RectOf(control.item.control), title = RectOf(control.item.caption);
        OffsetRect(&frame, -m_scrollX, -m_scrollY);
        OffsetRect(&title, -m_scrollX, -m_scrollY);
        FrameRect(dc, &frame, edge.get());
        const std::wstring text = L' ' + WideOf(control.item.title) + L' ';
        DrawTextW(dc, text.c_str(), -1, &title,
                  DT_LEFT | DT_VCENTER | DT_SINGLELINE | DT_NOPREFIX | DT_NOCLIP);
    }
}

void PanelWindow::DrawSwatch(const DRAWITEMSTRUCT& item) {
    const auto parameter = static_cast<std::uint32_t>(item.CtlID) - kFirstControl;
    if (m_effect == nullptr || parameter >= m_values.size()) return;
    const bool hasFocus = (item.itemState & ODS_FOCUS) != 0;
    RECT area = item.rcItem;
    FillRect(item.hDC, &area, m_theme.WindowBrush());
    const KnobColours& knob = m_theme.Colours().knob;
    const std::uint32_t rim = hasFocus ? knob.focus : knob.rim;
    const Brush edge(CreateSolidBrush(RGB((rim >> 16) & 0xFF, (rim >> 8) & 0xFF, rim & 0xFF)));
    FillRect(item.hDC, &area, edge.get());
    const int width = m_theme.Px(hasFocus ? 3 : 1);
    InflateRect(&area, -width, -width);
    const Brush fill(CreateSolidBrush(m_values[parameter].colour & 0xFFFFFFu));
    FillRect(item.hDC, &area, fill.get());
}

void PanelWindow::SetScroll() {
    RECT window = {};
    GetClientRect(m_window, &window);
    const auto set = [&](int bar, int page, int length, int& place) {
        SCROLLINFO info = {};
        info.cbSize = sizeof info;
        info.fMask = SIF_RANGE | SIF_PAGE | SIF_POS;
        info.nMax = length - 1;
        info.nPage = static_cast<UINT>(page);
        place = std::clamp(place, 0, std::max(length - page, 0));
        info.nPos = place;
        SetScrollInfo(m_window, bar, &info, TRUE);
    };
    set(SB_VERT, window.bottom, m_layout.height, m_scrollY);
    GetClientRect(m_window, &window);
    set(SB_HORZ, window.right, m_layout.width, m_scrollX);
}

void PanelWindow::ScrollTo(int x, int y) {
    const int beforeX = m_scrollX, beforeY = m_scrollY;
    m_scrollX = x;
    m_scrollY = y;
    SetScroll();
    if (m_scrollX == beforeX && m_scrollY == beforeY) return;
    PlaceControls();
    InvalidateRect(m_window, nullptr, TRUE);
}

void PanelWindow::OnScroll(int bar, WPARAM wParam) {
    SCROLLINFO info = {};
    info.cbSize = sizeof info;
    info.fMask = SIF_ALL;
    GetScrollInfo(m_window, bar, &info);
    int place = info.nPos;
    switch (LOWORD(wParam)) {
        case SB_LINEUP:
            place -= m_theme.Px(20);
            break;
        case SB_LINEDOWN:
            place += m_theme.Px(20);
            break;
        case SB_PAGEUP:
            place -= static_cast<int>(info.nPage);
            break;
        case SB_PAGEDOWN:
            place += static_cast<int>(info.nPage);
            break;
        case SB_THUMBTRACK:
        case SB_THUMBPOSITION:
            place = info.nTrackPos;
            break;
        default:
            return;
    }
    if (bar == SB_VERT)
        ScrollTo(m_scrollX, place);
    else
        ScrollTo(place, m_scrollY);
}

void PanelWindow::ShowFocus() {
    const HWND focus = GetFocus();
    if (focus == nullptr || GetParent(focus) != m_window) return;
    RECT box = {}, area = {};
    GetWindowRect(focus, &box);
    MapWindowPoints(nullptr, m_window, reinterpret_cast<POINT*>(&box), 2);
    GetClientRect(m_window, &area);
    const int margin = m_theme.Px(18);
    int x = m_scrollX, y = m_scrollY;
    if (box.bottom + margin > area.bottom) y += box.bottom + margin - area.bottom;
    if (box.top - margin < 0) y += box.top - margin;
    if (box.right > area.right) x += box.right - area.right;
    if (box.left < 0) x += box.left;
    if (x != m_scrollX || y != m_scrollY) ScrollTo(x, y);
}

LRESULT PanelWindow::OnMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_PAINT: {
            const support::win32::Painting painting(m_window);
            Paint(painting.Dc());
            return 0;
        }
        case WM_ERASEBKGND:
            return 1;
        case WM_SIZE:
            SetScroll();
            PlaceControls();
            return 0;
        case WM_VSCROLL:
            OnScroll(SB_VERT, wParam);
            return 0;
        case WM_HSCROLL:
            OnScroll(SB_HORZ, wParam);
            return 0;
        case WM_MOUSEWHEEL:
            ScrollTo(m_scrollX, m_scrollY - GET_WHEEL_DELTA_WPARAM(wParam) * m_theme.Px(60) / WHEEL_DELTA);
            return 0;
        case WM_COMMAND:
            OnCommand(wParam);
            return 0;
        case WM_NOTIFY:
            return m_theme.DrawPart(*reinterpret_cast<const NMCUSTOMDRAW*>(lParam)).value_or(0);
        case WM_DRAWITEM:
            DrawSwatch(*reinterpret_cast<const DRAWITEMSTRUCT*>(lParam));
            return TRUE;
        case WM_CTLCOLORSTATIC:
        case WM_CTLCOLORBTN:
            return reinterpret_cast<LRESULT>(m_theme.ControlColours(reinterpret_cast<HDC>(wParam), false));
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORLISTBOX:
            return reinterpret_cast<LRESULT>(m_theme.ControlColours(reinterpret_cast<HDC>(wParam), true));
        default:
            return DefWindowProcW(m_window, message, wParam, lParam);
    }
}

}  // namespace velmora::reelview
