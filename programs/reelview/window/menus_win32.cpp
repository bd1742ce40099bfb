#include "programs/reelview/window/menus_win32.h"

#include <oleacc.h>

#include <algorithm>

#include "programs/reelview/window/commands.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {

// Data of an owner-drawn item. Screen readers read the first members.
struct MenuBar::Item {
    MSAAMENUINFO forReaders = {};
    std::wstring text;  // with its shortcut after a tab
    bool isTop = false;
};

namespace {

struct Row {
    int command;  // 0: a separator
    const char* text;
    const wchar_t* keys;
};

constexpr Row kFileRows[] = {
    {kCommandOpen, text::kOpen, L"Ctrl+O"},
    {kCommandOpenSequence, text::kOpenSequence, L"Ctrl+Shift+O"},
    {kCommandRecent, text::kRecent, nullptr},
    {0, nullptr, nullptr},
    {kCommandSaveFrame, text::kSaveFrame, L"Ctrl+S"},
    {kCommandSaveClip, text::kSaveClip, L"Ctrl+E"},
    {0, nullptr, nullptr},
    {kCommandLoadPreset, text::kLoadPreset, L"Ctrl+L"},
    {kCommandSavePreset, text::kSavePreset, L"Ctrl+P"},
    {0, nullptr, nullptr},
    {kCommandExit, text::kExit, L"Alt+F4"},
};
constexpr Row kEditRows[] = {
    {kCommandUndo, text::kUndo, L"Ctrl+Z"},
    {kCommandRedo, text::kRedo, L"Ctrl+Y"},
    {0, nullptr, nullptr},
    {kCommandCopyFrame, text::kCopyFrame, L"Ctrl+C"},
    {kCommandCopyCommand, text::kCopyCommand, L"Ctrl+Shift+C"},
    {0, nullptr, nullptr},
    {kCommandDefaults, text::kDefaults, nullptr},
    {kCommandOptions, text::kOptions, nullptr},
};
constexpr Row kViewRows[] = {
    {kCommandAfter, text::kAfterOnly, L"Ctrl+1"},
    {kCommandDivider, text::kDivider, L"Ctrl+2"},
    {kCommandSideBySide, text::kSideBySide, L"Ctrl+3"},
    {0, nullptr, nullptr},
    {kCommandFit, text::kFit, L"Ctrl+0"},
    {kCommandFull, text::kFull, nullptr},
    {kCommandDouble, text::kDouble, nullptr},
};
constexpr Row kClipRows[] = {
    {kCommandPlay, text::kPlayOrPause, L"F5"},
    {kCommandNextFrame, text::kNextFrameItem, L"F7"},
    {kCommandPreviousFrame, text::kPreviousFrameItem, L"F6"},
    {kCommandFirstFrame, text::kFirstFrame, L"Ctrl+Home"},
    {kCommandLastFrame, text::kLastFrame, L"Ctrl+End"},
    {0, nullptr, nullptr},
    {kCommandLoop, text::kLoopItem, nullptr},
};
constexpr Row kHelpRows[] = {
    {kCommandHelp, text::kContents, L"F1"},
    {kCommandEffectHelp, text::kEffectHelp, L"Shift+F1"},
    {0, nullptr, nullptr},
    {kCommandAbout, text::kAbout, nullptr},
};

void Mark(HMENU bar, int command, bool isChecked) {
    CheckMenuItem(bar, static_cast<UINT>(command), isChecked ? MF_CHECKED : MF_UNCHECKED);
}

void Enable(HMENU bar, int command, bool isEnabled) {
    EnableMenuItem(bar, static_cast<UINT>(command), isEnabled ? MF_ENABLED : MF_GRAYED);
}

COLORREF Lighter(COLORREF colour) {
    const auto channel = [](int value) { return static_cast<BYTE>(std::min(value + 40, 255)); };
    return RGB(channel(GetRValue(colour)), channel(GetGValue(colour)), channel(GetBValue(colour)));
}

}  // namespace

MenuBar::MenuBar(HWND window, const Texts& texts, const Theme& theme)
    : m_window(window), m_theme(theme), m_bar(CreateMenu()) {
    Build(texts);
    SetMenu(window, m_bar);
    Restyle();
}

MenuBar::~MenuBar() {
    if (!IsWindow(m_window)) return;  // the menu was destroyed with the window
    SetMenu(m_window, nullptr);
    DestroyMenu(m_bar);
}

void MenuBar::Build(const Texts& texts) {
    const auto build = [&](const char* title, const auto& rows) {
        const HMENU menu = AddMenu(texts(title));
        for (const Row& row : rows) {
            if (row.command == 0) {
                AppendMenuW(menu, MF_SEPARATOR, 0, nullptr);
            } else if (row.command == kCommandRecent) {
                m_recent = CreatePopupMenu();
                AppendMenuW(menu, MF_POPUP, reinterpret_cast<UINT_PTR>(m_recent), texts(row.text).c_str());
            } else {
                Add(menu, row.command, texts(row.text), row.keys);
            }
        }
    };
    build(text::kFile, kFileRows);
    build(text::kEdit, kEditRows);
    build(text::kView, kViewRows);
    build(text::kClip, kClipRows);
    build(text::kHelp, kHelpRows);
}

HMENU MenuBar::AddMenu(const std::wstring& title) {
    const HMENU menu = CreatePopupMenu();
    AppendMenuW(m_bar, MF_POPUP, reinterpret_cast<UINT_PTR>(menu), title.c_str());
    return menu;
}

void MenuBar::Add(HMENU menu, int command, const std::wstring& text, const wchar_t* keys) {
    const std::wstring whole = keys != nullptr ? text + L'\t' + keys : text;
    AppendMenuW(menu, MF_STRING, static_cast<UINT_PTR>(command), whole.c_str());
}

void MenuBar::ShowRecent(const std::vector<std::u16string>& files) {
    while (DeleteMenu(m_recent, 0, MF_BYPOSITION)) {
    }
    for (std::size_t i = 0; i < files.size(); ++i) {
        std::wstring text(files[i].begin(), files[i].end());
        for (std::size_t mark = text.find(L'&'); mark != std::wstring::npos;
             mark = text.find(L'&', mark + 2)) {
            text.insert(mark, 1, L'&');
        }
        const std::wstring numbered = L'&' + std::to_wstring(i + 1) + L' ' + text;
        Add(m_recent, kCommandRecent + static_cast<int>(i), numbered, nullptr);
    }
    if (files.empty()) AppendMenuW(m_recent, MF_STRING | MF_GRAYED, 0, L"-");
    Restyle();
}

void MenuBar::ShowMarks(const MenuMarks& marks) {
    for (const int command : {kCommandFit, kCommandFull, kCommandDouble})
        Mark(m_bar, command, command == marks.zoom);
    for (const int command : {kCommandAfter, kCommandDivider, kCommandSideBySide}) {
        Mark(m_bar, command, command == marks.compare);
    }
    Mark(m_bar, kCommandLoop, marks.loops);
    Enable(m_bar, kCommandUndo, marks.canUndo);
    Enable(m_bar, kCommandRedo, marks.canRedo);
    for (const int command : {kCommandSaveFrame, kCommandSaveClip, kCommandCopyFrame, kCommandCopyCommand}) {
        Enable(m_bar, command, marks.isOpen);
    }
    for (const int command : {kCommandPlay, kCommandNextFrame, kCommandPreviousFrame, kCommandFirstFrame,
                              kCommandLastFrame, kCommandLoop}) {
        Enable(m_bar, command, marks.isFilm);
    }
}

void MenuBar::Restyle() {
    const bool isOwn = m_theme.IsDark();
    Own(m_bar, true, false);  // back to text items, then rebuilt
    m_items.clear();
    m_background.reset(isOwn ? CreateSolidBrush(m_theme.Colours().window) : nullptr);
    if (isOwn) Own(m_bar, true, true);
    MENUINFO info = {};
    info.cbSize = sizeof info;
    info.fMask = MIM_BACKGROUND | MIM_APPLYTOSUBMENUS;
    info.hbrBack = m_background.get();
    SetMenuInfo(m_bar, &info);
    DrawMenuBar(m_window);
}

void MenuBar::Own(HMENU menu, bool isBar, bool isOwn) {
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        MENUITEMINFOW info = {};
        info.cbSize = sizeof info;
        info.fMask = MIIM_FTYPE | MIIM_DATA | MIIM_SUBMENU;
        GetMenuItemInfoW(menu, static_cast<UINT>(i), TRUE, &info);
        if (info.hSubMenu != nullptr) Own(info.hSubMenu, false, isOwn);
        const bool isOwned = (info.fType & MFT_OWNERDRAW) != 0;
        if ((info.fType & MFT_SEPARATOR) != 0 || isOwned == isOwn) continue;
        if (isOwned) {
            const auto* const item = reinterpret_cast<const Item*>(info.dwItemData);
            std::wstring text = item->text;
            info.fMask = MIIM_FTYPE | MIIM_STRING | MIIM_DATA;
            info.fType &= ~static_cast<UINT>(MFT_OWNERDRAW);
            info.dwItemData = 0;
            info.dwTypeData = text.data();
            SetMenuItemInfoW(menu, static_cast<UINT>(i), TRUE, &info);
            continue;
        }
        wchar_t text[512] = {};
        GetMenuStringW(menu, static_cast<UINT>(i), text, 512, MF_BYPOSITION);
        auto item = std::make_unique<Item>();
        item->text = text;
        item->isTop = isBar;
        item->forReaders.dwMSAASignature = static_cast<DWORD>(MSAA_MENU_SIG);
        item->forReaders.cchWText = static_cast<DWORD>(item->text.size());
        item->forReaders.pszWText = item->text.data();
        info.fMask = MIIM_FTYPE | MIIM_DATA;
        info.fType |= MFT_OWNERDRAW;
        info.dwItemData = reinterpret_cast<ULONG_PTR>(item.get());
        m_items.push_back(std::move(item));
        SetMenuItemInfoW(menu, static_cast<UINT>(i), TRUE, &info);
    }
}

bool MenuBar::Measure(MEASUREITEMSTRUCT& measured) const {
    if (measured.CtlType != ODT_MENU || measured.itemData == 0) return false;
    const auto& item = *reinterpret_cast<const Item*>(measured.itemData);
    const support::win32::WindowDc dc(m_window);
    const support::win32::Selection font(dc.Dc(), m_theme.TextFont());
    RECT box = {};
    DrawTextW(dc.Dc(), item.text.c_str(), -1, &box, DT_CALCRECT | DT_SINGLELINE | DT_EXPANDTABS);
    const int margin = item.isTop ? 0 : m_theme.Px(48);
    measured.itemWidth = static_cast<UINT>(box.right + margin);
    measured.itemHeight = static_cast<UINT>(box.bottom + m_theme.Px(8));
    return true;
}

bool MenuBar::Draw(const DRAWITEMSTRUCT& drawn) const {
    if (drawn.CtlType != ODT_MENU || drawn.itemData == 0) return false;
    const auto& item = *reinterpret_cast<const Item*>(drawn.itemData);
    const Palette& colours = m_theme.Colours();
    const bool isLit = (drawn.itemState & (ODS_SELECTED | ODS_HOTLIGHT)) != 0;
    const bool isOff = (drawn.itemState & (ODS_GRAYED | ODS_DISABLED)) != 0;
    const Brush brush(CreateSolidBrush(isLit ? Lighter(colours.window) : colours.window));
    FillRect(drawn.hDC, &drawn.rcItem, brush.get());
    const support::win32::Selection font(drawn.hDC, m_theme.TextFont());
    SetBkMode(drawn.hDC, TRANSPARENT);
    SetTextColor(drawn.hDC, isOff ? colours.edge : colours.text);
    RECT box = drawn.rcItem;
    const UINT letters = (drawn.itemState & ODS_NOACCEL) != 0 ? DT_HIDEPREFIX : 0u;
    if (item.isTop) {
        DrawTextW(drawn.hDC, item.text.c_str(), -1, &box, DT_CENTER | DT_VCENTER | DT_SINGLELINE | letters);
        return true;
    }
    const std::size_t tab = item.text.find(L'\t');
    const std::wstring text = item.text.substr(0, tab);
    if ((drawn.itemState & ODS_CHECKED) != 0) {
        RECT mark = box;
        mark.right = mark.left + m_theme.Px(24);
        DrawTextW(drawn.hDC, L"\u2022", -1, &mark, DT_CENTER | DT_VCENTER | DT_SINGLELINE);
    }
    box.left += m_theme.Px(24);
    box.right -= m_theme.Px(12);
    DrawTextW(drawn.hDC, text.c_str(), -1, &box, DT_LEFT | DT_VCENTER | DT_SINGLELINE | letters);
    if (tab != std::wstring::npos) {
        DrawTextW(drawn.hDC, item.text.c_str() + tab + 1, -1, &box, DT_RIGHT | DT_VCENTER | DT_SINGLELINE);
    }
    return true;
}

LRESULT MenuBar::OnLetter(wchar_t letter, HMENU menu) const {
    const auto upper = [](wchar_t c) {
        return static_cast<wchar_t>(
            reinterpret_cast<ULONG_PTR>(CharUpperW(reinterpret_cast<LPWSTR>(ULONG_PTR{c}))));
    };
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        MENUITEMINFOW info = {};
        info.cbSize = sizeof info;
        info.fMask = MIIM_FTYPE | MIIM_DATA;
        GetMenuItemInfoW(menu, static_cast<UINT>(i), TRUE, &info);
        if ((info.fType & MFT_OWNERDRAW) == 0 || info.dwItemData == 0) continue;
        const std::wstring& text = reinterpret_cast<const Item*>(info.dwItemData)->text;
        const std::size_t mark = text.find(L'&');
        if (mark == std::wstring::npos || mark + 1 >= text.size()) continue;
        if (upper(text[mark + 1]) == upper(letter)) return MAKELRESULT(i, MNC_EXECUTE);
    }
    return MAKELRESULT(0, MNC_IGNORE);
}

}  // namespace velmora::reelview
