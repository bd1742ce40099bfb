// How the library finds, loads, uses and releases its language module, with a stand-in for the module. The library is
// in a folder whose name no 8-bit code page can represent.

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>

#include "tests/common/library_under_test.h"

namespace velmora {
namespace {

namespace fs = std::filesystem;
using testing::LoadedLibrary;

class LanguageModule : public ::testing::Test {
  protected:
    LanguageModule() {
        fs::create_directories(m_folder);
        fs::create_directories(m_elsewhere);
        fs::copy_file(L"" VELMORA_DLL, m_folder / L"VMReelEffects.dll", fs::copy_options::overwrite_existing);
        Behave("1", nullptr);
    }
    ~LanguageModule() override {
        SetDllDirectoryW(nullptr);
        Behave(nullptr, nullptr);
        while (HMODULE kept = GetModuleHandleW(L"VMLang.dll")) FreeLibrary(kept);
        std::error_code ignored;
        fs::remove_all(m_root, ignored);
    }

    // The module reads its C library's copy of the environment, which test and module share here (msvcrt).
    static void Behave(const char* accept, const char* keep) {
        _putenv_s("VM_TEST_ACCEPT", accept == nullptr ? "" : accept);
        _putenv_s("VM_TEST_KEEP", keep == nullptr ? "" : keep);
    }
    static void PutModule(const fs::path& folder) {
        fs::copy_file(L"" STAND_IN_LANGUAGE, folder / L"VMLang.dll", fs::copy_options::overwrite_existing);
    }
    static std::wstring Log() {
        HMODULE module = GetModuleHandleW(L"VMLang.dll");
        if (module == nullptr) return L"(not loaded)";
        using TestLog = const wchar_t*(VM_CALL*)();
        return reinterpret_cast<TestLog>(reinterpret_cast<void*>(GetProcAddress(module, "TestLog")))();
    }
    [[nodiscard]] std::wstring LoadLine(const fs::path& path) const {
        return L"load " + path.wstring() + L"\n";
    }

    struct Opened {
        LoadedLibrary dll;
        IEffectLibrary* library;

        explicit Opened(const fs::path& folder)
            : dll((folder / L"VMReelEffects.dll").c_str()), library(dll.getEffectsLibrary()) {}
        IMultiLingual* Texts() const {
            void* texts = nullptr;
            library->QueryInterface(&kIidMultiLingual, &texts);
            return static_cast<IMultiLingual*>(texts);
        }
    };

    const fs::path m_root =
        fs::temp_directory_path() / (L"vm-language-" + std::to_wstring(GetCurrentProcessId()));
    const fs::path m_folder = m_root / L"Über Ж 映画";
    const fs::path m_elsewhere = m_root / L"elsewhere";
};

constexpr wchar_t kLanguageFile[] = L"VMReelEffectsLang.xml";

TEST_F(LanguageModule, MissingGivesNoTexts) {
    Opened opened(m_folder);
    EXPECT_EQ(opened.Texts(), nullptr);
    void* found = nullptr;
    EXPECT_EQ(opened.library->QueryInterface(&kIidMultiLingual, &found), kStatusNoInterface);
    EXPECT_EQ(opened.library->QueryInterface(&kIidEffectLibrary, &found), kStatusOk);
    opened.library->Release();
    EXPECT_EQ(opened.library->Release(), 0u);
}

TEST_F(LanguageModule, BesideTheLibraryGivesItsTexts) {
    PutModule(m_folder);
    {
        Opened opened(m_folder);
        EXPECT_EQ(Log(), LoadLine(m_folder / kLanguageFile));
        IMultiLingual* texts = opened.Texts();
        ASSERT_NE(texts, nullptr);
        char16_t buffer[8] = {};
        EXPECT_EQ(texts->GetText("xx", 4, "K", buffer, 8), 1);
        EXPECT_EQ(buffer[0], u'!');
        // Arbitrary words, as hosts of the first version passed them; the library ignores them.
        const auto lookUp = reinterpret_cast<std::int32_t(VM_CALL*)(
            void*, std::intptr_t, std::intptr_t, std::intptr_t, std::intptr_t, std::intptr_t, std::intptr_t,
            std::intptr_t)>((*reinterpret_cast<void***>(texts))[3]);
        EXPECT_EQ(lookUp(texts, 1, 2, 3, 4, 5, 6, 7), 7654321) << "seven words in their order";
        EXPECT_EQ(texts->Release(), 1u) << "the interface shares the library's count";
        opened.library->Release();
        EXPECT_EQ(Log(), L"(not loaded)") << "freed with the library object";
    }
}

TEST_F(LanguageModule, FileIsAskedForAgainByItsBareName) {
    PutModule(m_folder);
    Behave("2", nullptr);
    Opened opened(m_folder);
    EXPECT_EQ(Log(), LoadLine(m_folder / kLanguageFile) + LoadLine(kLanguageFile));
    EXPECT_NE(opened.Texts(), nullptr);
    opened.library->Release();
    opened.library->Release();
}

TEST_F(LanguageModule, RefusedFileGivesNoTextsButIsReleased) {
    PutModule(m_folder);
    Behave("0", "1");
    {
        Opened opened(m_folder);
        EXPECT_EQ(opened.Texts(), nullptr);
        opened.library->Release();
    }
    EXPECT_EQ(Log(), LoadLine(m_folder / kLanguageFile) + LoadLine(kLanguageFile) + L"release\n");
}

TEST_F(LanguageModule, IsFoundByItsBareNameOnTheSearchPath) {
    PutModule(m_elsewhere);
    SetDllDirectoryW(m_elsewhere.c_str());
    Opened opened(m_folder);
    EXPECT_NE(opened.Texts(), nullptr);
    opened.library->Release();
    opened.library->Release();
}

TEST_F(LanguageModule, GoesWithTheLastLibraryObject) {
    PutModule(m_folder);
    Behave("1", "1");
    Opened opened(m_folder);
    IEffectLibrary* other = opened.dll.getEffectsLibrary();
    opened.library->Release();
    EXPECT_NE(GetModuleHandleW(L"VMLang.dll"), nullptr);
    Behave("1", nullptr);
    other->Release();
    EXPECT_EQ(GetModuleHandleW(L"VMLang.dll"), nullptr);
}

TEST_F(LanguageModule, StaysLoadedWhenItAsksToBeKept) {
    PutModule(m_folder);
    Behave("1", "1");
    {
        Opened opened(m_folder);
        opened.library->Release();
        EXPECT_TRUE(opened.dll.canUnload()) << "the library itself may go";
    }
    EXPECT_NE(GetModuleHandleW(L"VMLang.dll"), nullptr);
}

}  // namespace
}  // namespace velmora
