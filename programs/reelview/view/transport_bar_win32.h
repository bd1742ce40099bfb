// Buttons and a bar for moving through a clip. Windows only.
#pragma once

#include <windows.h>

#include <string>

#include "programs/reelview/view/transport.h"
#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

// Also used as button identifiers.
enum TransportCommand : int {
    kTransportPrevious = 300,
    kTransportPlay,
    kTransportNext,
    kTransportLoop,
    kTransportScrub,
};

class TransportBar {
  public:
    struct Labels {
        std::wstring previous, play, pause, next, loop, position;
    };

    TransportBar(HWND parent, const Theme& theme, Labels labels);

    [[nodiscard]] HWND Scrub() const { return m_scrub; }
    void Show(const Transport& transport, bool isOpen);
    // The frame to which the user has dragged the bar.
    [[nodiscard]] std::int64_t ScrubbedFrame(const Transport& transport) const;
    void Place(const RECT& area);
    [[nodiscard]] int NaturalHeight() const { return m_theme.Px(36); }
    void Restyle();
    // Handles WM_DRAWITEM for its buttons; false for other controls.
    bool Draw(const DRAWITEMSTRUCT& item) const;

  private:
    HWND MakeButton(HWND parent, const std::wstring& text, int id);

    const Theme& m_theme;
    Labels m_labels;
    HWND m_previous, m_play, m_next, m_loop, m_positionLabel, m_scrub, m_tip;
    bool m_isPlaying = false, m_loops = true;
};

}  // namespace velmora::reelview
