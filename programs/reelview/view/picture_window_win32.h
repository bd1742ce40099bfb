// The picture, before and after. Windows only.
#pragma once

#include <windows.h>

#include <string>

#include "programs/reelview/base/picture.h"
#include "programs/reelview/view/view_geometry.h"
#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

inline constexpr wchar_t kPictureClass[] = L"Velmora Reel Picture";

class PictureWindow {
  public:
    struct Labels {
        std::wstring name, before, after, invitation;
    };

    PictureWindow(HWND parent, int id, const Theme& theme, Labels labels);
    ~PictureWindow();
    PictureWindow(const PictureWindow&) = delete;
    PictureWindow& operator=(const PictureWindow&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    [[nodiscard]] const ViewState& State() const { return m_state; }
    void SetZoom(Zoom zoom);
    void SetCompare(Compare compare);
    // Both null when nothing is open; `after` null when it is not rendered yet. `isMoving` draws faster and coarser.
    void Show(SharedPicture before, SharedPicture after, bool isMoving);
    [[nodiscard]] const SharedPicture& After() const { return m_after; }

    LRESULT OnMessage(UINT message, WPARAM wParam, LPARAM lParam);
    HWND m_window = nullptr;

  private:
    [[nodiscard]] ViewPlaces Places() const;
    void Paint(HDC dc, const RECT& area) const;
    void PaintPicture(HDC dc, const Picture& picture, const Box& place) const;
    void PaintClipped(HDC dc, const Picture& picture, const Box& place, const RECT& clip) const;
    void PaintInvitation(HDC dc, const RECT& area) const;
    void PaintDivider(HDC dc, const ViewPlaces& places, const RECT& area) const;
    void PaintLabel(HDC dc, const std::wstring& text, int x, int y, bool isRight) const;
    [[nodiscard]] bool IsOnDivider(int x) const;
    void OnButtonDown(int x, int y);
    void OnMouseMove(int x, int y);
    bool OnKey(WPARAM key);

    const Theme& m_theme;
    Labels m_labels;
    ViewState m_state;
    SharedPicture m_before, m_after;
    bool m_isMoving = false;
    enum class Drag { kNone, kDivider, kPan } m_drag = Drag::kNone;
    POINT m_dragStart = {};
    ViewState m_dragState;
};

}  // namespace velmora::reelview
