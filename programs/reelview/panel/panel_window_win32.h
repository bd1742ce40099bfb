// The panel of an effect: its controls as windows, placed by LayOutPanel. Windows only.
#pragma once

#include <windows.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "programs/common/effect_info.h"
#include "programs/reelview/document/settings_history.h"
#include "programs/reelview/panel/knob_window_win32.h"
#include "programs/reelview/panel/panel_layout.h"

namespace velmora::reelview {

inline constexpr wchar_t kPanelClass[] = L"Velmora Reel Panel";

// Identifiers of the windows of a parameter.
inline constexpr int kFirstControl = 1000, kFirstField = 1200, kFirstCaption = 1400;

class PanelOwner {
  public:
    virtual void OnValueChosen(std::uint32_t parameter, ValueWord value, std::uint32_t gesture) = 0;
    [[nodiscard]] virtual bool PanelKnobsDragVertical() = 0;

  protected:
    ~PanelOwner() = default;
};

class PanelWindow final : public KnobOwner {
  public:
    PanelWindow(HWND parent, PanelOwner& owner, const Theme& theme);
    ~PanelWindow();
    PanelWindow(const PanelWindow&) = delete;
    PanelWindow& operator=(const PanelWindow&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    // Creates the controls again. `effect` must outlive them.
    void ShowEffect(const hosts::EffectInfo& effect, const Values& values);
    // Does not notify the owner.
    void ShowValues(const Values& values);
    // After a change of colours, fonts or resolution.
    void Restyle();
    // In pixels, not counting scroll bars.
    [[nodiscard]] SIZE NaturalSize() const { return {m_layout.width, m_layout.height}; }
    void ShowFocus();
    [[nodiscard]] int ParameterOf(HWND control) const;

    void OnKnobMoved(std::uint32_t parameter, double value, std::uint32_t gesture) override;
    [[nodiscard]] bool KnobsDragVertical() override { return m_owner.PanelKnobsDragVertical(); }
    [[nodiscard]] std::wstring ShownText(std::uint32_t parameter) override;
    void OnTypedText(std::uint32_t parameter, const std::wstring& text) override;
    [[nodiscard]] const Theme& CurrentTheme() override { return m_theme; }

    LRESULT OnMessage(UINT message, WPARAM wParam, LPARAM lParam);
    HWND m_window = nullptr;

  private:
    struct Control {
        PanelItem item;
        std::unique_ptr<KnobWindow> knob;
        HWND caption = nullptr, control = nullptr, field = nullptr;
    };

    static LRESULT CALLBACK FieldProcedure(HWND field, UINT message, WPARAM wParam, LPARAM lParam,
                                           UINT_PTR id, DWORD_PTR panel);
    bool OnFieldKey(std::uint32_t parameter, WPARAM key);
    void MakeControl(Control& control);
    HWND MakeWindow(const wchar_t* className, const std::wstring& text, DWORD style, int id);
    void FillMenu(HWND menu, const hosts::ParamInfo& param);
    void LayOut();
    void PlaceControls();
    void ShowValue(Control& control);
    void Choose(std::uint32_t parameter, ValueWord value, std::uint32_t gesture);
    void ChooseColour(std::uint32_t parameter);
    void OnCommand(WPARAM wParam);
    void CommitField(std::uint32_t parameter);
    Control* ControlOf(std::uint32_t parameter);
    void Paint(HDC dc);
    void DrawSwatch(const DRAWITEMSTRUCT& item);
    void SetScroll();
    void OnScroll(int bar, WPARAM wParam);
    void ScrollTo(int x, int y);

    PanelOwner& m_owner;
    const Theme& m_theme;
    const hosts::EffectInfo* m_effect = nullptr;
    Values m_values;
    PanelLayout m_layout;
    std::vector<Control> m_controls;
    int m_scrollX = 0, m_scrollY = 0;
    bool m_isShowing = false;  // controls are being set by the program, not by the user
};

}  // namespace velmora::reelview
