// Colours and fonts of the window: the system's light colours, dark ones in dark mode, and the user's own in high
// contrast mode. Windows only.
#pragma once

#include <windows.h>
#include <commctrl.h>

#include <optional>
#include <string>

#include "programs/reelview/base/picture.h"
#include "platform/win32.h"

namespace velmora::reelview {

using Font = support::win32::Owner<HFONT, &DeleteObject>;
using Brush = support::win32::Owner<HBRUSH, &DeleteObject>;

enum class Scheme { kLight, kDark, kHighContrast };
[[nodiscard]] Scheme SystemScheme();

struct Palette {
    COLORREF window, text, dimText, edge, field, fieldText, accent,
        stage;  // stage: the area behind the picture
    KnobColours knob;
};

class Theme {
  public:
    explicit Theme(int dpi) { Set(SystemScheme(), dpi); }
    void Set(Scheme scheme, int dpi);

    [[nodiscard]] Scheme CurrentScheme() const { return m_scheme; }
    [[nodiscard]] bool IsDark() const { return m_scheme == Scheme::kDark; }
    [[nodiscard]] const Palette& Colours() const { return m_palette; }
    [[nodiscard]] HBRUSH WindowBrush() const { return m_windowBrush.get(); }
    [[nodiscard]] HBRUSH FieldBrush() const { return m_fieldBrush.get(); }
    [[nodiscard]] HFONT TextFont() const { return m_font.get(); }
    [[nodiscard]] int Dpi() const { return m_dpi; }
    // Converts a length at 96 dots per inch to pixels.
    [[nodiscard]] int Px(int length) const { return MulDiv(length, m_dpi, 96); }
    [[nodiscard]] UnitScale Units() const { return {1.5 * m_dpi / 96.0, 1.625 * m_dpi / 96.0}; }

    // Gives a control the font, and the system's dark style where it has one.
    void Dress(HWND control) const;
    // The title bar.
    void DressFrame(HWND window) const;
    // Draws what the system would leave light in a dark window: check boxes and the track of a slider. Empty when the
    // system draws.
    [[nodiscard]] std::optional<LRESULT> DrawPart(const NMCUSTOMDRAW& part) const;
    // Draws the edge and the button of a combo box in a dark window.
    void PaintMenuBox(HWND menu) const;
    // Fills the rest of the menu bar in a dark window.
    void PaintMenuRest(HWND window) const;
    // The answer to WM_CTLCOLOR...; `isField` for edits and lists.
    [[nodiscard]] HBRUSH ControlColours(HDC dc, bool isField) const;

  private:
    void DrawCheckBox(const NMCUSTOMDRAW& part) const;

    Scheme m_scheme = Scheme::kLight;
    Palette m_palette = {};
    int m_dpi = 96;
    Brush m_windowBrush, m_fieldBrush;
    Font m_font;
};

// The dots per inch of a window's monitor where the system provides them; else the system's.
[[nodiscard]] int DpiOf(HWND window);

}  // namespace velmora::reelview
