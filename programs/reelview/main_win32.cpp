// reelview: applies the library's effects to a picture or a film, with all their controls.

#include <windows.h>
#include <commctrl.h>
#include <shellapi.h>

#include <exception>
#include <memory>
#include <vector>

#include "programs/common/effect_library.h"
#include "programs/reelview/library/guarded_call_win32.h"
#include "programs/reelview/base/com_win32.h"
#include "programs/reelview/window/main_window_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

std::vector<std::u16string> Arguments() {
    std::vector<std::u16string> arguments;
    int count = 0;
    wchar_t** const words = CommandLineToArgvW(GetCommandLineW(), &count);
    for (int i = 1; i < count; ++i) arguments.emplace_back(words[i], words[i] + lstrlenW(words[i]));
    LocalFree(words);
    return arguments;
}

// Without a library the only texts are the English ones.
int Complain(const char* key) {
    const Texts texts(nullptr, "en");
    MessageBoxW(nullptr, texts(key).c_str(), kProgramName, MB_OK | MB_ICONERROR);
    return 1;
}

int Run(int show) {
    INITCOMMONCONTROLSEX controls = {sizeof controls,
                                     ICC_LISTVIEW_CLASSES | ICC_BAR_CLASSES | ICC_PROGRESS_CLASS};
    InitCommonControlsEx(&controls);
    const ComThread com(COINIT_APARTMENTTHREADED);
    const ViewOptions options = ReadViewOptions(Arguments());
    if (!options.isValid) return Complain("reelview [--library PATH] [--effect NAME] [--sequence] [FILE]");
    std::unique_ptr<hosts::EffectLibrary> library;
    auto load = [&] {
        try {
            const std::wstring file =
                hosts::LibraryFile(std::wstring(options.library.begin(), options.library.end()));
            // Watched before its first function is called; never unloaded, because a call may have been abandoned.
            if (const HMODULE module = LoadLibraryW(file.c_str())) WatchEndings(module);
            library = std::make_unique<hosts::EffectLibrary>(file);
        } catch (const std::exception&) {
            library.reset();
        }
    };
    const bool isSound = RunGuarded(load);
    if (!isSound) return Complain(text::kLibraryFailed);
    if (!library || library->Effects().empty()) return Complain("The effect library cannot be loaded.");
    MainWindow(*library, options).Run(show);
    auto unload = [&] { library.reset(); };
    static_cast<void>(RunGuarded(unload));
    return 0;
}

}  // namespace
}  // namespace velmora::reelview

int WINAPI wWinMain(HINSTANCE, HINSTANCE, LPWSTR, int show) {
    const int result = velmora::reelview::Run(show);
    // A library that failed may hold threads or locks, and there is nothing left to clean up.
    ExitProcess(static_cast<UINT>(result));
}
