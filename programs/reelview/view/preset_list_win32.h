// The built-in presets of an effect, each with a thumbnail of its result. Windows only.
#pragma once

#include <windows.h>
#include <commctrl.h>

#include <optional>
#include <string>
#include <vector>

#include "programs/reelview/base/picture.h"
#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

class PresetList {
  public:
    PresetList(HWND parent, int id, const Theme& theme, const std::wstring& name);
    ~PresetList();
    PresetList(const PresetList&) = delete;
    PresetList& operator=(const PresetList&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    [[nodiscard]] HWND Label() const { return m_label; }
    void ShowNames(const std::vector<std::string>& names);
    // The largest thumbnail size.
    [[nodiscard]] hosts::FrameSize PictureSize() const;
    void ShowPicture(std::uint32_t preset, const Picture& picture);
    // Empty: the controls match no preset.
    void Select(std::optional<std::uint32_t> preset);
    // The preset that a notification from the list selects.
    [[nodiscard]] std::optional<std::uint32_t> ChosenBy(const NMHDR& notification) const;
    void Restyle();
    // The height needed to show one row.
    [[nodiscard]] int NaturalHeight() const;

  private:
    void MakePictures();
    [[nodiscard]] HBITMAP BitmapOf(const Picture* picture) const;

    const Theme& m_theme;
    HWND m_label = nullptr, m_window = nullptr;
    HIMAGELIST m_pictures = nullptr;
    std::vector<std::string> m_names;
    bool m_isShowing = false;
};

}  // namespace velmora::reelview
