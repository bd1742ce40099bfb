// A slider's control: a round knob or a horizontal bar. Windows only.
#pragma once

#include <windows.h>

#include <cstdint>
#include <string>

#include "programs/common/effect_info.h"
#include "programs/reelview/panel/knob.h"
#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

inline constexpr wchar_t kKnobClass[] = L"Velmora Reel Knob";

// Notifications to the panel.
class KnobOwner {
  public:
    // `gesture` is the same for all steps of one drag, and 0 for a separate step.
    virtual void OnKnobMoved(std::uint32_t parameter, double value, std::uint32_t gesture) = 0;
    [[nodiscard]] virtual bool KnobsDragVertical() = 0;
    [[nodiscard]] virtual std::wstring ShownText(std::uint32_t parameter) = 0;
    virtual void OnTypedText(std::uint32_t parameter, const std::wstring& text) = 0;
    [[nodiscard]] virtual const Theme& CurrentTheme() = 0;

  protected:
    ~KnobOwner() = default;
};

class KnobWindow {
  public:
    struct Facts {
        std::uint32_t parameter = 0;
        bool isBar = false;
        double defaultValue = 0.0, origin = 0.0;
        std::wstring name, group;
    };

    KnobWindow(HWND parent, int id, const Facts& facts, KnobOwner& owner);
    ~KnobWindow();
    KnobWindow(const KnobWindow&) = delete;
    KnobWindow& operator=(const KnobWindow&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    [[nodiscard]] const Facts& About() const { return m_facts; }
    [[nodiscard]] double Value() const { return m_value; }
    // Does not notify the owner.
    void Show(double value);
    void Place(const Box& box);
    bool OnWheel(WPARAM wParam);
    bool OnKey(WPARAM key);
    void TypeText(const std::wstring& text) { m_owner.OnTypedText(m_facts.parameter, text); }
    [[nodiscard]] std::wstring ShownText() const { return m_owner.ShownText(m_facts.parameter); }

    LRESULT OnMessage(UINT message, WPARAM wParam, LPARAM lParam);
    HWND m_window = nullptr;

  private:
    void Paint(HDC dc, const RECT& area) const;
    void PaintBar(HDC dc, const RECT& area) const;
    void BeginDrag(LPARAM lParam);
    void Drag(LPARAM lParam, bool isFine);
    void Move(double value, std::uint32_t gesture);

    Facts m_facts;
    KnobOwner& m_owner;
    double m_value = 0.0;
    KnobDrag m_drag;
    bool m_isDragging = false;
    std::uint32_t m_gesture = 0;
};

// An IAccessible object for WM_GETOBJECT; 0 when the system has no such interface.
[[nodiscard]] LRESULT AccessibleKnob(KnobWindow& knob, WPARAM wParam);

}  // namespace velmora::reelview
