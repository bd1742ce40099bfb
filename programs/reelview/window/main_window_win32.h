// The main window: what is open, its settings, and everything the user can do with it. Windows only.
#pragma once

#include <windows.h>
#include <shellapi.h>

#include <atomic>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelview/document/settings_history.h"
#include "programs/reelview/document/command_line.h"
#include "programs/reelview/keeper/export_job_win32.h"
#include "programs/reelview/library/engine.h"
#include "programs/reelview/library/worker.h"
#include "programs/reelview/panel/panel_window_win32.h"
#include "programs/reelview/view/picture_window_win32.h"
#include "programs/reelview/view/preset_list_win32.h"
#include "programs/reelview/view/transport_bar_win32.h"
#include "programs/reelview/window/dialogs_win32.h"
#include "programs/reelview/window/menus_win32.h"
#include "programs/reelview/window/stored_state_win32.h"

namespace velmora::reelview {

inline constexpr wchar_t kMainClass[] = L"Velmora Reel View";
inline constexpr wchar_t kProgramName[] = L"Velmora Reel View";

// Its message; lParam: a std::function<void()> to run and delete.
inline constexpr UINT kMessageRun = WM_APP + 1;

inline constexpr UINT_PTR kTimerPlay = 1, kTimerIdle = 2, kTimerWatch = 3;
inline constexpr UINT kPlayMilliseconds = 10, kIdleMilliseconds = 350;

class MainWindow final : public PanelOwner {
  public:
    // `library` must outlive the window.
    MainWindow(const hosts::EffectLibrary& library, const ViewOptions& options);
    ~MainWindow();
    MainWindow(const MainWindow&) = delete;
    MainWindow& operator=(const MainWindow&) = delete;

    // Returns when the window is closed.
    void Run(int show);

    void OnValueChosen(std::uint32_t parameter, ValueWord value, std::uint32_t gesture) override;
    [[nodiscard]] bool PanelKnobsDragVertical() override;

    LRESULT OnMessage(UINT message, WPARAM wParam, LPARAM lParam);
    HWND m_window = nullptr;

  private:
    struct Preview {
        std::uint32_t clip = 0;  // identifies the opening of the clip that it belongs to
        SharedPicture before, after;
        double milliseconds = 0.0;
        std::string error;
    };

    // main_window_win32.cpp: the window and its parts
    void MakeParts();
    void LayOut();
    void Restyle();
    LRESULT OnNotify(const NMHDR& notification, LPARAM lParam);
    bool OnKey(WPARAM key);
    void OnDrop(HDROP drop);
    void OnDpiChanged(int dpi, const RECT& place);
    void OnLookChanged(UINT message);
    std::optional<LRESULT> OnLookMessage(UINT message, WPARAM wParam, LPARAM lParam);
    std::optional<LRESULT> OnInputMessage(UINT message, WPARAM wParam, LPARAM lParam);
    void OnTimer(WPARAM id);
    bool Translate(MSG& message);
    void Close();

    // main_commands_win32.cpp: the user's commands
    void OnCommand(int command, int code);
    void OnFileCommand(int command);
    void OnViewCommand(int command);
    void OnClipCommand(int command);
    void AskAndOpen(bool isSequence);
    void SaveFrame();
    void SaveClip();
    void OnExported(const ExportResult& result, const std::wstring& file);
    void LoadPreset();
    void SavePreset();
    void CopyFrame();
    void CopyCommand();
    void PutOnClipboard(UINT format, const void* bytes, std::size_t size);
    void ShowHelp(int topic);
    void ShowAbout();
    void ApplyPreset(std::uint32_t preset);

    // main_render_win32.cpp: results from the rendering thread
    void OnWorker(std::function<void()> task);  // runs it on the window's thread; callable from any thread
    void Open(ClipRequest request);
    void OnOpened(const ClipFacts& facts, const ClipRequest& request);
    void RequestPreview();
    void OnPreview(Preview preview);
    void RequestThumbnails();
    void ShowStatus();
    void Complain(const std::wstring& about, const std::string& key);
    // Calls the library on the window's thread. False, after a message, when it failed now or before.
    bool CallLibrary(std::function<void()> call);

    void ShowSettings();     // after undo, presets and the like
    void ShowEffectParts();  // after a change of effect
    void ShowMarks();
    [[nodiscard]] const hosts::EffectInfo& Effect() const {
        return m_library.Effects()[m_history.Now().effect];
    }
    [[nodiscard]] std::optional<std::uint32_t> PresetInUse() const;
    [[nodiscard]] static double Now();

    const hosts::EffectLibrary& m_library;
    Texts m_texts;
    SettingsHistory m_history;
    std::vector<std::vector<Values>> m_presets;  // by effect and preset
    Theme m_theme;
    Transport m_transport;
    RecentFiles m_recent;

    std::unique_ptr<MenuBar> m_menu;
    std::unique_ptr<PictureWindow> m_picture;
    std::unique_ptr<TransportBar> m_bar;
    std::unique_ptr<PanelWindow> m_panel;
    std::unique_ptr<PresetList> m_presetList;
    std::unique_ptr<ProgressWindow> m_progress;
    HWND m_effectLabel = nullptr, m_effectBox = nullptr, m_status = nullptr;

    bool m_isOpen = false, m_hasComplained = false, m_hasLibraryFailed = false;
    std::wstring m_file;
    bool m_isPartOfSequence = false;  // dropped pictures: there may be more with later numbers
    ClipFacts m_facts;
    std::uint32_t m_clip = 0, m_previewsAsked = 0;
    bool m_isRendering = false;
    double m_askedAt = 0.0, m_milliseconds = 0.0;
    std::vector<double> m_shownAt;  // times of the last second's frames
    std::string m_error;
    std::wstring m_note;  // the last action
    std::uint32_t m_shownEffect = 0xFFFFFFFFu;
    struct ThumbnailKey {
        std::uint32_t clip = 0, effect = 0;
        std::int64_t frame = -1;
        int dpi = 0;
        bool operator==(const ThumbnailKey&) const = default;
    } m_thumbnails;
    std::shared_ptr<std::atomic<std::uint32_t>> m_thumbnailRound;
    std::atomic<bool> m_isCancelled = false;

    std::unique_ptr<Engine> m_engine;  // used on the worker's thread
    std::unique_ptr<Worker> m_worker;
};

}  // namespace velmora::reelview
