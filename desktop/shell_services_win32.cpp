#include <windows.h>

#include <cstring>
#include <new>

#include "platform/float_guard.h"
#include "desktop/bit_button.h"
#include "desktop/options.h"
#include "desktop/resource_ids.h"
#include "desktop/shell_services.h"
#include "platform/win32.h"

namespace velmora::support {
namespace {

constexpr char16_t kResourceModule[] = u"resources.dll";
constexpr std::size_t kLongestHelpFileName = 259;

// The two-letter code of the system's display language; the translations decide how to treat an unknown or longer code.
std::string UserInterfaceLanguage() {
    char code[16] = {};
    const LCID locale = MAKELCID(GetUserDefaultUILanguage(), SORT_DEFAULT);
    GetLocaleInfoA(locale, LOCALE_SISO639LANGNAME, code, static_cast<int>(sizeof code));
    return code;
}

class WindowsShellServices final : public IShellServices {
  public:
    bool VM_CALL Start(void* moduleHandle, com::IUnknown* textSource, const char* helpFileName,
                       std::int32_t dialogs) override;
    bool VM_CALL KnobsDragVertical() override { return m_preferences.KnobsDragVertical(); }
    std::int32_t VM_CALL ShowOptions(void* owner) override;
    void VM_CALL ShutDown() override;
    std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic, std::int32_t externalViewer) override;

    void Offer(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept;
    void Withdraw(com::IUnknown* library) noexcept;

  private:
    void LoadDialogParts(const std::u16string& folder);
    void UseTextSource(com::IUnknown* source, const char* languageCode) noexcept;

    HMODULE m_module = nullptr;  // its folder holds the library's files; null: not started
    win32::Module m_resources;
    win32::Bitmap m_logo;
    HMODULE m_buttonModule = nullptr;  // for which the button class is registered; null: not registered
    Preferences m_preferences;
    TranslationHelper m_texts;
    com::IUnknown* m_textSource = nullptr;  // not owned
    HelpLauncher m_help;
    TextSources m_libraries;
    OptionsDialog* m_dialog = nullptr;  // while one is shown
};

void WindowsShellServices::UseTextSource(com::IUnknown* source, const char* languageCode) noexcept {
    m_textSource = source;
    m_texts.SetContext(source, languageCode);
}

bool VM_CALL WindowsShellServices::Start(void* moduleHandle, com::IUnknown* textSource,
                                         const char* helpFileName, std::int32_t dialogs) try {
    const FloatGuard guard;
    if (m_module != nullptr || moduleHandle == nullptr) return false;
    m_module = static_cast<HMODULE>(moduleHandle);
    UseTextSource(textSource, nullptr);
    const std::u16string folder = ModuleFolder(moduleHandle);
    if (dialogs != 0) LoadDialogParts(folder);
    m_preferences.Read();
    const char* const name = helpFileName != nullptr ? helpFileName : "";
    m_help.SetFile(folder, std::string(name, strnlen(name, kLongestHelpFileName)));
    return true;
} catch (...) {
    return m_module != nullptr;  // not enough memory: started with what there is
}

// The resource module owns the bitmap and the button class; without it the library registers the class itself and the
// buttons have no bitmap.
void WindowsShellServices::LoadDialogParts(const std::u16string& folder) {
    if (!folder.empty()) {
        m_resources.reset(static_cast<HMODULE>(LoadModule((folder + kResourceModule).c_str())));
    }
    if (m_resources != nullptr) {
        m_logo.reset(static_cast<HBITMAP>(LoadImageW(m_resources.get(), MAKEINTRESOURCEW(VM_BITMAP_OPTIONS),
                                                     IMAGE_BITMAP, 0, 0, LR_CREATEDIBSECTION)));
    }
    const HMODULE owner = m_resources != nullptr ? m_resources.get() : m_module;
    if (RegisterBitButtonClass(owner)) m_buttonModule = owner;
}

std::int32_t VM_CALL WindowsShellServices::ShowOptions(void* owner) try {
    const FloatGuard guard;
    if (m_module == nullptr) return 0;
    if (m_dialog != nullptr) {
        m_dialog->ToFront();
        return 0;
    }
    UseTextSource(m_textSource, UserInterfaceLanguage().c_str());
    // This module holds the dialog templates, whichever module a host starts the services for.
    OptionsDialog dialog({.templates = static_cast<HMODULE>(OwnModule()),
                          .buttonModule = m_buttonModule,
                          .logo = m_logo.get(),
                          .texts = &m_texts,
                          .help = &m_help,
                          .preferences = &m_preferences});
    m_dialog = &dialog;
    const bool accepted = dialog.Show(static_cast<HWND>(owner));
    m_dialog = nullptr;
    return accepted ? 1 : 0;
} catch (...) {
    return 0;
}

void VM_CALL WindowsShellServices::ShutDown() {
    const FloatGuard guard;
    if (m_dialog != nullptr) m_dialog->Abandon();  // its logo uses what is released below
    m_logo.reset();
    if (m_buttonModule != nullptr) UnregisterBitButtonClass(m_buttonModule);
    m_buttonModule = nullptr;
    m_resources.reset();
    UseTextSource(nullptr, nullptr);
    m_help = {};
    m_module = nullptr;
}

std::int32_t VM_CALL WindowsShellServices::ShowHelp(void* owner, std::int32_t topic,
                                                    std::int32_t externalViewer) try {
    const FloatGuard guard;
    return m_module != nullptr ? m_help.Show(owner, topic, externalViewer != 0) : 0;
} catch (...) {
    return 0;
}

void WindowsShellServices::Offer(ModuleHandle module, com::IUnknown* library,
                                 const char* helpFileName) noexcept {
    constexpr std::int32_t kShowsDialogs = 1;
    m_libraries.Add(library);
    if (!Start(module, library, helpFileName, kShowsDialogs) && m_textSource == nullptr) {
        UseTextSource(library, nullptr);
    }
}

void WindowsShellServices::Withdraw(com::IUnknown* library) noexcept {
    m_libraries.Remove(library);
    if (m_libraries.Count() == 0) {
        ShutDown();
    } else if (m_textSource == library) {
        UseTextSource(m_libraries.Current(), nullptr);
    }
}

// Never destroyed: the last library object has already shut it down, and during the unloading of a module it is too
// late to free other modules.
WindowsShellServices& Services() noexcept {
    alignas(WindowsShellServices) static unsigned char storage[sizeof(WindowsShellServices)];
    static WindowsShellServices* const services = new (storage) WindowsShellServices;
    return *services;
}

}  // namespace

IShellServices& ShellServices() noexcept {
    return Services();
}

void OfferTextSource(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept {
    Services().Offer(module, library, helpFileName);
}

void WithdrawTextSource(com::IUnknown* library) noexcept {
    Services().Withdraw(library);
}

}  // namespace velmora::support
