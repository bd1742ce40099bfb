#include <cstring>
#include <utility>

#include "help/topics.h"
#include "programs/reelview/document/command_line.h"
#include "programs/reelview/keeper/export_job_win32.h"
#include "programs/reelview/window/commands.h"
#include "programs/reelview/window/main_window_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

// Another program may be reading the clipboard just now.
bool OpenFreeClipboard(HWND owner) {
    for (int i = 0; i < 20; ++i) {
        if (OpenClipboard(owner)) return true;
        Sleep(25);
    }
    return false;
}

}  // namespace

void MainWindow::OnCommand(int command, int code) {
    if (command == kControlEffect) {
        // Not while the list is open: choosing moves the box, and the arrow keys pass through other effects. The list may
        // close before or after the selection changes.
        const bool isOpen = SendMessageW(m_effectBox, CB_GETDROPPEDSTATE, 0, 0) != FALSE;
        if (code != CBN_CLOSEUP && (code != CBN_SELCHANGE || isOpen)) return;
        const LRESULT effect = SendMessageW(m_effectBox, CB_GETCURSEL, 0, 0);
        if (effect == CB_ERR) return;
        m_history.ChooseEffect(static_cast<std::uint32_t>(effect));
        ShowSettings();
        return;
    }
    if (m_progress) return;
    if (command >= kCommandRecent && command < kCommandRecentEnd) {
        const auto index = static_cast<std::size_t>(command - kCommandRecent);
        if (index >= m_recent.Files().size()) return;
        const std::u16string& file = m_recent.Files()[index];
        Open({{std::wstring(file.begin(), file.end())}, false});
        return;
    }
    OnFileCommand(command);
    OnViewCommand(command);
    OnClipCommand(command);
}

void MainWindow::OnFileCommand(int command) {
    switch (command) {
        case kCommandOpen:
            return AskAndOpen(false);
        case kCommandOpenSequence:
            return AskAndOpen(true);
        case kCommandSaveFrame:
            return SaveFrame();
        case kCommandSaveClip:
            return SaveClip();
        case kCommandLoadPreset:
            return LoadPreset();
        case kCommandSavePreset:
            return SavePreset();
        case kCommandExit:
            PostMessageW(m_window, WM_CLOSE, 0, 0);
            return;
        case kCommandUndo:
            m_history.Undo();
            return ShowSettings();
        case kCommandRedo:
            m_history.Redo();
            return ShowSettings();
        case kCommandCopyFrame:
            return CopyFrame();
        case kCommandCopyCommand:
            return CopyCommand();
        case kCommandDefaults:
            m_history.SetAll(DefaultsOf(Effect()));
            return ShowSettings();
        case kCommandOptions:
            CallLibrary([this] {
                IShellServices* const services = m_library.Object().GetShellServices();
                if (services != nullptr) services->ShowOptions(m_window);
            });
            return;
        case kCommandHelp:
            return ShowHelp(help::kReelView);
        case kCommandEffectHelp:
            return ShowHelp(help::kFilmCamera + static_cast<int>(m_history.Now().effect));
        case kCommandAbout:
            return ShowAbout();
        default:
            return;
    }
}

void MainWindow::OnViewCommand(int command) {
    switch (command) {
        case kCommandAfter:
            return m_picture->SetCompare(Compare::kAfter);
        case kCommandDivider:
            return m_picture->SetCompare(Compare::kDivider);
        case kCommandSideBySide:
            return m_picture->SetCompare(Compare::kSideBySide);
        case kCommandFit:
            return m_picture->SetZoom(Zoom::kFit);
        case kCommandFull:
            return m_picture->SetZoom(Zoom::kFull);
        case kCommandDouble:
            return m_picture->SetZoom(Zoom::kDouble);
        default:
            return;
    }
}

void MainWindow::OnClipCommand(int command) {
    const bool isMove = command == kCommandNextFrame || command == kTransportNext ||
                        command == kCommandPreviousFrame || command == kTransportPrevious ||
                        command == kCommandFirstFrame || command == kCommandLastFrame;
    const bool isPlay = command == kCommandPlay || command == kTransportPlay;
    const bool isLoop = command == kCommandLoop || command == kTransportLoop;
    if (!m_isOpen || !(isMove || isPlay || isLoop)) return;
    if (isLoop) {
        m_transport.SetLoop(!m_transport.Loops());
        m_bar->Show(m_transport, m_isOpen);
        return;
    }
    if (isPlay && !m_transport.IsPlaying()) {
        m_shownAt.clear();
        m_transport.Play(Now());
        if (m_transport.IsPlaying()) SetTimer(m_window, kTimerPlay, kPlayMilliseconds, nullptr);
    } else {
        m_transport.Pause();
    }
    if (command == kCommandNextFrame || command == kTransportNext) m_transport.Step(1);
    if (command == kCommandPreviousFrame || command == kTransportPrevious) m_transport.Step(-1);
    if (command == kCommandFirstFrame) m_transport.Step(-m_transport.Frames());
    if (command == kCommandLastFrame) m_transport.Step(m_transport.Frames());
    RequestPreview();
}

void MainWindow::AskAndOpen(bool isSequence) {
    if (const auto file = AskOpenFile(m_window, m_texts)) Open({{*file}, isSequence});
}

void MainWindow::SaveFrame() {
    const SharedPicture picture = m_picture->After();
    if (!picture) return;
    const auto file = AskPngFile(m_window, m_texts);
    if (!file) return;
    m_worker->Post([this, picture, file = *file] {
        std::string error;
        try {
            SavePng(file, *picture);
        } catch (const SourceError& failure) {
            error = failure.what();
        } catch (const std::exception&) {
            error = text::kCannotWrite;
        }
        OnWorker([this, error, file] {
            OnExported({error.empty() ? ExportEnd::kDone : ExportEnd::kFailed, error}, file);
        });
    });
}

void MainWindow::SaveClip() {
    if (!m_isOpen) return;
    m_transport.Pause();
    const auto choice = AskClipFile(m_window, m_texts);
    if (!choice) return;
    ExportOrder order;
    order.file = choice->file;
    order.kind = choice->kind;
    if (order.kind == ClipKind::kAviCodec) {
        const auto codec = ChooseAviCodec(m_window, m_facts.size);
        if (!codec) return;
        order.codec = *codec;
    }
    order.effect = m_history.Now().effect;
    order.values = m_history.Now().Current();
    m_isCancelled = false;
    m_progress = std::make_unique<ProgressWindow>(
        m_window, m_theme, ProgressWindow::Labels{m_texts(text::kSaving), m_texts(text::kCancel)},
        m_facts.frames, m_isCancelled);
    m_worker->DropIdle();
    m_worker->Post([this, order = std::move(order)] {
        const ExportResult result = RunExport(*m_engine, order, m_isCancelled, [this](std::int64_t done) {
            OnWorker([this, done] {
                if (m_progress) m_progress->Show(done);
            });
        });
        OnWorker([this, result, file = order.file] { OnExported(result, file); });
    });
}

void MainWindow::OnExported(const ExportResult& result, const std::wstring& file) {
    m_progress.reset();
    m_note.clear();
    if (result.end == ExportEnd::kDone) m_note = m_texts(text::kSaved) + L": " + file;
    ShowStatus();
    if (result.end == ExportEnd::kFailed) Complain(file, result.error);
    RequestPreview();
}

void MainWindow::LoadPreset() {
    PresetRecord record = {};
    std::int32_t result = -1;
    const bool isDone = CallLibrary([&] {
        const auto saver = Reference<IPresetSaver>::Adopt(m_library.Object().CreatePresetSaver());
        if (!saver) return;
        result = saver->LoadPreset(m_window, &m_library.Object(), m_history.Now().effect, &record,
                                   m_texts.Language().c_str());
    });
    if (!isDone || result != 0 || record.count == 0) return;  // cancelled, or the user has been told
    Values values = m_history.Now().Current();
    for (std::size_t i = 0; i < values.size() && std::cmp_less(i, record.count); ++i) {
        if (Effect().params[i].HoldsValue()) values[i] = record.values[i].value;
    }
    m_history.SetAll(values);
    ShowSettings();
}

void MainWindow::SavePreset() {
    PresetRecord record = {};
    const Values& values = m_history.Now().Current();
    for (std::size_t i = 0; i < values.size() && i < kPresetCellCapacity; ++i) {
        record.values[i] = {values[i], 0, Effect().params[i].kind};
        record.count = static_cast<std::int32_t>(i) + 1;
    }
    CallLibrary([&] {
        const auto saver = Reference<IPresetSaver>::Adopt(m_library.Object().CreatePresetSaver());
        if (!saver) return;
        saver->SavePreset(m_window, &m_library.Object(), m_history.Now().effect, &record,
                          m_texts.Language().c_str());
    });
}

void MainWindow::PutOnClipboard(UINT format, const void* bytes, std::size_t size) {
    const HGLOBAL memory = GlobalAlloc(GMEM_MOVEABLE, size);
    if (memory == nullptr) return;
    std::memcpy(GlobalLock(memory), bytes, size);
    GlobalUnlock(memory);
    bool isTaken = false;
    if (OpenFreeClipboard(m_window)) {
        EmptyClipboard();
        isTaken = SetClipboardData(format, memory) != nullptr;
        CloseClipboard();
    }
    if (!isTaken) GlobalFree(memory);
    m_note = isTaken ? m_texts(text::kCopied) : std::wstring();
    ShowStatus();
}

void MainWindow::CopyFrame() {
    const SharedPicture picture = m_picture->After();
    if (!picture) return;
    BITMAPINFOHEADER header = {};
    header.biSize = sizeof header;
    header.biWidth = picture->size.width;
    header.biHeight = picture->size.height;  // many programs only read bottom-up bitmaps
    header.biPlanes = 1;
    header.biBitCount = 32;
    header.biCompression = BI_RGB;
    header.biSizeImage = static_cast<DWORD>(picture->pixels.size());
    std::vector<std::uint8_t> bytes(sizeof header + picture->pixels.size());
    std::memcpy(bytes.data(), &header, sizeof header);
    const std::size_t rowBytes = static_cast<std::size_t>(picture->size.width) * 4;
    for (std::size_t y = 0, height = static_cast<std::size_t>(picture->size.height); y < height; ++y) {
        std::memcpy(bytes.data() + sizeof header + (height - 1 - y) * rowBytes,
                    picture->pixels.data() + y * rowBytes, rowBytes);
    }
    PutOnClipboard(CF_DIB, bytes.data(), bytes.size());
}

void MainWindow::CopyCommand() {
    if (!m_isOpen) return;
    if (m_facts.isPictures && !m_facts.numbering) {
        m_note = m_texts(text::kNotNumbered);
        ShowStatus();
        return;
    }
    CommandInput input;
    input.path = Utf8Of(m_file);
    if (m_facts.numbering) {
        const std::u16string& pattern = m_facts.numbering->pattern;
        input = {Utf8Of({pattern.begin(), pattern.end()}), m_facts.rate, m_facts.numbering->first,
                 m_isPartOfSequence ? m_facts.frames : 0};
    }
    const std::string line = CommandText(input, Effect(), m_history.Now().Current());
    std::wstring wide(line.size() + 1, L'\0');
    wide.resize(static_cast<std::size_t>(MultiByteToWideChar(
        CP_UTF8, 0, line.data(), static_cast<int>(line.size()), wide.data(), static_cast<int>(wide.size()))));
    PutOnClipboard(CF_UNICODETEXT, wide.c_str(), (wide.size() + 1) * sizeof(wchar_t));
}

void MainWindow::ShowHelp(int topic) {
    CallLibrary([this, topic] { m_library.Object().ShowHelp(m_window, topic); });
}

void MainWindow::ShowAbout() {
    const std::wstring message =
        std::wstring(kProgramName) + L" " VELMORA_VERSION L"\n\n" +
        WideOf(m_library.Object().GetLibraryName()) +
        L"\nCopyright Velmora. MIT licence.\nhttps://www.velmora.example/reel-effects";
    MessageBoxW(m_window, message.c_str(), kProgramName, MB_OK | MB_ICONINFORMATION);
}

void MainWindow::ApplyPreset(std::uint32_t preset) {
    const std::vector<Values>& presets = m_presets[m_history.Now().effect];
    if (preset >= presets.size()) return;
    m_history.SetAll(presets[preset]);
    ShowSettings();
}

void MainWindow::OnValueChosen(std::uint32_t parameter, ValueWord value, std::uint32_t gesture) {
    m_history.Set(parameter, value, gesture);
    m_presetList->Select(PresetInUse());
    RequestPreview();
}

bool MainWindow::PanelKnobsDragVertical() {
    IShellServices* const services = m_library.Object().GetShellServices();
    return services != nullptr && services->KnobsDragVertical();
}

std::optional<std::uint32_t> MainWindow::PresetInUse() const {
    const std::vector<Values>& presets = m_presets[m_history.Now().effect];
    for (std::uint32_t i = 0; i < presets.size(); ++i) {
        if (ValuesAreEqual(presets[i], m_history.Now().Current())) return i;
    }
    return std::nullopt;
}

void MainWindow::ShowEffectParts() {
    m_shownEffect = m_history.Now().effect;
    SendMessageW(m_effectBox, CB_SETCURSEL, m_shownEffect, 0);
    m_panel->ShowEffect(Effect(), m_history.Now().Current());
    m_presetList->ShowNames(Effect().presets);
    LayOut();
}

void MainWindow::ShowSettings() {
    if (m_history.Now().effect != m_shownEffect) ShowEffectParts();
    m_panel->ShowValues(m_history.Now().Current());
    m_presetList->Select(PresetInUse());
    RequestPreview();
}

void MainWindow::ShowMarks() {
    MenuMarks marks;
    marks.isOpen = m_isOpen;
    marks.isFilm = m_isOpen && m_transport.Frames() > 1;
    marks.canUndo = m_history.CanUndo();
    marks.canRedo = m_history.CanRedo();
    marks.loops = m_transport.Loops();
    marks.zoom = kCommandFit + static_cast<int>(m_picture->State().zoom);
    marks.compare = kCommandAfter + static_cast<int>(m_picture->State().compare);
    m_menu->ShowMarks(marks);
}

}  // namespace velmora::reelview
