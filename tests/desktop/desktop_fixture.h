// Shared by the desktop tests: the services' module in a folder whose name no 8-bit text can hold, the registry
// around the settings, and a second thread that uses the options dialog like a user.
#pragma once

#include <gtest/gtest.h>
#include <windows.h>

#include <functional>
#include <optional>
#include <string>

#include "api/host_api.h"

namespace velmora::support::test {

// A registry text as it is stored, with its terminator.
using Stored = std::optional<std::string>;

inline constexpr char kSettingsKey[] = "Software\\Velmora\\Common";
inline constexpr char kKnobs[] = "Knobs Drag Vertical";

[[nodiscard]] Stored ReadStored(HKEY root, const char* key, const char* name);
void Store(HKEY root, const char* key, const char* name, const std::string& bytes, DWORD type = REG_SZ);

// Sets the default text of a key in the machine's registry for its lifetime, then restores the old one.
class RegisteredText {
  public:
    RegisteredText(const wchar_t* key, const std::wstring& text);
    ~RegisteredText();
    RegisteredText(const RegisteredText&) = delete;
    RegisteredText& operator=(const RegisteredText&) = delete;

    void Set(const std::wstring& text) const;

  private:
    const wchar_t* m_key;
    wchar_t m_before[1024] = {};
    bool m_hadOne;
};

// A library object as the services see it. Translates "Help" to its own name when it has texts.
class FakeLibrary final : public Uncounted<IMultiLingual> {
  public:
    explicit FakeLibrary(const char16_t* help, const char16_t* knobs = u"") noexcept
        : m_help(help), m_knobs(knobs) {}
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override { return ++references; }
    std::uint32_t VM_CALL Release() override { return --references; }
    std::int32_t VM_CALL LookUpText(const char*, std::int32_t, const char*, const char16_t*, char16_t*,
                                    std::int32_t, std::int32_t*) override {
        return 0;
    }
    std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override;

    std::uint32_t references = 1;
    std::string language;  // of the last lookup

  private:
    const char16_t* m_help;
    const char16_t* m_knobs;
};

// Loads the services' module, and frees it at the end.
class ServicesModule {
  public:
    explicit ServicesModule(const std::wstring& path);
    ~ServicesModule();
    ServicesModule(const ServicesModule&) = delete;
    ServicesModule& operator=(const ServicesModule&) = delete;

    IShellServices& operator*() const { return *m_services; }
    IShellServices* operator->() const { return m_services; }
    [[nodiscard]] HMODULE Module() const { return m_module; }
    void Offer(com::IUnknown& library) const { m_offer(&library); }
    void Withdraw(com::IUnknown& library) const { m_withdraw(&library); }

  private:
    using ServicesFunction = IShellServices*(VM_CALL*)();
    using LibraryFunction = void(VM_CALL*)(com::IUnknown*);

    HMODULE m_module;
    IShellServices* m_services = nullptr;
    LibraryFunction m_offer = nullptr;
    LibraryFunction m_withdraw = nullptr;
};

// Shows the options dialog on this thread while `user` works with it on another. Cancels the dialog if the user
// leaves it open. Returns the dialog's result.
std::int32_t ShowOptionsTo(IShellServices& services, const std::function<void(HWND dialog)>& user,
                           HWND owner = nullptr);

// Keys sent through the dialog's message loop, as when a user types. Both return once the dialog has processed the
// key.
void Type(HWND dialog, WPARAM key);
void TypeWithAlt(HWND dialog, wchar_t letter);
// Presses and releases the left button at a point of a control.
void Click(HWND control, int x = 4, int y = 4);
[[nodiscard]] int FocusedControl(HWND dialog);
[[nodiscard]] std::wstring TextOf(HWND window);

class DesktopTest : public testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;

    // Waits for the command line that the recorder writes; empty when none arrives.
    [[nodiscard]] std::wstring RecordedCommandLine() const;
    // Copies a file from this program's folder to the library's folder.
    void CopyToFolder(const wchar_t* name, const wchar_t* as = nullptr) const;
    static void ForgetSettings();
    [[nodiscard]] static std::wstring BesideProgram(const wchar_t* name);

    std::wstring m_folder;      // with a trailing separator
    std::wstring m_modulePath;  // in m_folder
    std::wstring m_recordPath;

  private:
    Stored m_userSetting;  // the machine's values before the test
    Stored m_machineSetting;
};

}  // namespace velmora::support::test
