#include <algorithm>
#include <cstdio>
#include <new>
#include <utility>

#include "programs/reelview/library/guarded_call_win32.h"
#include "programs/reelview/window/commands.h"
#include "programs/reelview/window/main_window_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

constexpr double kSilence = 5.0;  // seconds without an answer before a message appears

std::wstring NameOf(const std::wstring& file) {
    return file.substr(file.find_last_of(L"\\/") + 1);
}

std::wstring Number(double value, int decimals) {
    wchar_t text[40];
    std::swprintf(text, 40, L"%.*f", decimals, value);
    return text;
}

}  // namespace

void MainWindow::OnWorker(std::function<void()> task) {
    auto* const sent = new std::function<void()>(std::move(task));
    if (!PostMessageW(m_window, kMessageRun, 0, reinterpret_cast<LPARAM>(sent))) delete sent;
}

void MainWindow::Open(ClipRequest request) {
    m_worker->Post([this, request = std::move(request)] {
        std::string error;
        try {
            const ClipFacts facts = m_engine->Open(request);
            OnWorker([this, facts, request] { OnOpened(facts, request); });
        } catch (const SourceError& failure) {
            error = failure.what();
        } catch (const std::bad_alloc&) {
            error = text::kNoMemory;
        } catch (const std::exception&) {
            error = text::kCannotOpen;
        }
        if (!error.empty()) OnWorker([this, error, file = request.files[0]] { Complain(file, error); });
    });
}

void MainWindow::OnOpened(const ClipFacts& facts, const ClipRequest& request) {
    ++m_clip;
    m_isOpen = true;
    m_facts = facts;
    m_file = request.files[0];
    m_isPartOfSequence = request.files.size() > 1;
    m_note.clear();
    m_error.clear();
    KillTimer(m_window, kTimerPlay);
    m_transport.Open(facts.frames, facts.rate);
    m_picture->Show(nullptr, nullptr, false);
    SetWindowTextW(m_window, (NameOf(m_file) + L" \u2013 " + kProgramName).c_str());
    m_recent.Add({m_file.begin(), m_file.end()});
    StoreRecentFiles(m_recent);
    m_menu->ShowRecent(m_recent.Files());
    RequestPreview();
}

// Only one frame is rendered at a time; a newer request replaces the waiting one.
void MainWindow::RequestPreview() {
    m_bar->Show(m_transport, m_isOpen);
    if (!m_isOpen) {
        ShowStatus();
        return;
    }
    if (!m_isRendering) m_askedAt = Now();
    m_isRendering = true;
    ++m_previewsAsked;
    ++*m_thumbnailRound;
    m_worker->DropIdle();
    const Settings& settings = m_history.Now();
    m_worker->PostPreview([this, clip = m_clip, asked = m_previewsAsked, frame = m_transport.Frame(),
                           seconds = m_transport.Seconds(), effect = settings.effect,
                           values = settings.Current()] {
        Preview preview;
        preview.clip = clip;
        try {
            preview.before = m_engine->Frame(frame);
            auto [picture, milliseconds] = m_engine->Render(effect, values, *preview.before, seconds);
            preview.after = std::move(picture);
            preview.milliseconds = milliseconds;
        } catch (const SourceError& failure) {
            preview.error = failure.what();
        } catch (const EngineError& failure) {
            preview.error = failure.what();
        } catch (const std::bad_alloc&) {
            preview.error = text::kNoMemory;
        } catch (const std::exception&) {
            preview.error = text::kCannotReadFrame;
        }
        OnWorker([this, asked, preview = std::move(preview)]() mutable {
            if (asked == m_previewsAsked) m_isRendering = false;
            OnPreview(std::move(preview));
        });
    });
    ShowStatus();
}

void MainWindow::OnPreview(Preview preview) {
    if (preview.clip != m_clip) return;
    m_askedAt = Now();
    m_error = preview.error;
    m_milliseconds = preview.milliseconds;
    if (preview.before) {
        m_picture->Show(std::move(preview.before), std::move(preview.after), m_transport.IsPlaying());
    }
    m_shownAt.push_back(m_askedAt);
    std::erase_if(m_shownAt, [&](double time) { return time < m_askedAt - 1.0; });
    SetTimer(m_window, kTimerIdle, kIdleMilliseconds, nullptr);
    ShowStatus();
    if (m_error == text::kLibraryFailed && !std::exchange(m_hasComplained, true))
        Complain(kProgramName, m_error);
}

void MainWindow::RequestThumbnails() {
    if (!m_isOpen || m_isRendering || m_transport.IsPlaying() || m_progress || !m_error.empty()) return;
    const ThumbnailKey key = {m_clip, m_history.Now().effect, m_transport.Frame(), m_theme.Dpi()};
    if (key == m_thumbnails) return;
    const std::uint32_t round = ++*m_thumbnailRound;
    const std::vector<Values>& presets = m_presets[key.effect];
    // Stored only when the last one is done, so that an interrupted round starts again.
    const auto small = std::make_shared<Picture>();
    for (std::uint32_t i = 0; i < presets.size(); ++i) {
        m_worker->PostIdle([this, key, round, current = m_thumbnailRound, i, small,
                            isLast = i + 1 == presets.size(), values = presets[i],
                            seconds = m_transport.Seconds(), size = m_presetList->PictureSize()] {
            if (*current != round) return;
            try {
                if (small->pixels.empty()) *small = Reduced(*m_engine->Frame(key.frame), size);
                const SharedPicture picture = m_engine->Render(key.effect, values, *small, seconds).picture;
                OnWorker([this, key, round, i, isLast, picture] {
                    if (*m_thumbnailRound != round) return;
                    m_presetList->ShowPicture(i, *picture);
                    if (isLast) m_thumbnails = key;
                });
            } catch (const std::exception&) {
                // The entry stays empty: a thumbnail is not worth a message.
            }
        });
    }
}

void MainWindow::ShowStatus() {
    std::wstring status;
    if (m_isOpen) {
        const std::string time = TimeText(m_transport.Seconds());
        const double rate = static_cast<double>(m_facts.rate.numerator) / m_facts.rate.denominator;
        status = m_texts(text::kFrame) + L' ' + std::to_wstring(m_transport.Frame() + 1) + L" / " +
                 std::to_wstring(m_transport.Frames()) + L"     " + std::wstring(time.begin(), time.end()) +
                 L"     " + std::to_wstring(m_facts.size.width) + L" \u00D7 " +
                 std::to_wstring(m_facts.size.height);
        if (m_transport.Frames() > 1) {
            const std::wstring shown =
                m_transport.IsPlaying() ? std::to_wstring(m_shownAt.size()) + L" / " : std::wstring();
            status += L"     " + shown + Number(rate, rate == static_cast<int>(rate) ? 0 : 2) + L' ' +
                      m_texts(text::kFramesPerSecond);
        }
        if (m_milliseconds > 0.0)
            status += L"     " + Number(m_milliseconds, 1) + L' ' + m_texts(text::kMilliseconds);
        if (!m_note.empty()) status += L"     " + m_note;
    }
    const bool isSilent = m_isRendering && Now() - m_askedAt > kSilence && !m_progress;
    if (!m_error.empty()) status = m_texts(m_error.c_str());
    if (isSilent) status = m_texts(text::kLibrarySilent);
    wchar_t before[512] = {};
    GetWindowTextW(m_status, before, 512);
    if (status != before) SetWindowTextW(m_status, status.c_str());
}

void MainWindow::Complain(const std::wstring& about, const std::string& key) {
    const std::wstring message = NameOf(about) + L"\n\n" + m_texts(key.c_str());
    MessageBoxW(m_progress ? m_progress->m_window : m_window, message.c_str(), kProgramName,
                MB_OK | MB_ICONEXCLAMATION);
}

bool MainWindow::CallLibrary(std::function<void()> call) {
    if (!m_hasLibraryFailed) {
        m_hasLibraryFailed = !RunGuarded(call);
        // A dialog that was abandoned has left the window disabled.
        if (m_hasLibraryFailed) EnableWindow(m_window, TRUE);
    }
    if (m_hasLibraryFailed) Complain(kProgramName, text::kLibraryFailed);
    return !m_hasLibraryFailed;
}

}  // namespace velmora::reelview
