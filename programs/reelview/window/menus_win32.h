// The menu bar, with the system's look, or drawn here where that would be light on a dark window. Windows only.
#pragma once

#include <windows.h>

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/base/texts.h"
#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

struct MenuMarks {
    bool isOpen = false, isFilm = false, canUndo = false, canRedo = false, loops = true;
    int zoom = 0, compare = 0;  // the selected commands
};

class MenuBar {
  public:
    MenuBar(HWND window, const Texts& texts, const Theme& theme);
    ~MenuBar();
    MenuBar(const MenuBar&) = delete;
    MenuBar& operator=(const MenuBar&) = delete;

    void ShowRecent(const std::vector<std::u16string>& files);
    void ShowMarks(const MenuMarks& marks);
    void Restyle();
    bool Measure(MEASUREITEMSTRUCT& item) const;
    bool Draw(const DRAWITEMSTRUCT& item) const;
    // The answer to WM_MENUCHAR for owner-drawn items.
    [[nodiscard]] LRESULT OnLetter(wchar_t letter, HMENU menu) const;

  private:
    struct Item;

    void Build(const Texts& texts);
    HMENU AddMenu(const std::wstring& title);
    void Add(HMENU menu, int command, const std::wstring& text, const wchar_t* keys);
    void Own(HMENU menu, bool isBar, bool isOwn);

    HWND m_window;
    const Theme& m_theme;
    HMENU m_bar, m_recent = nullptr;
    std::vector<std::unique_ptr<Item>> m_items;
    Brush m_background;
};

}  // namespace velmora::reelview
