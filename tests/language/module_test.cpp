// The module through its exports only, as the library loads it, with the shipped file. Both are in the current
// folder.

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <set>
#include <string>
#include <vector>

#if defined(_WIN32)
#include <windows.h>
#else
#include <dlfcn.h>
#endif

#include <gtest/gtest.h>

#include "language/lang_parser.h"

namespace velmora {
namespace {

constexpr const char16_t* kLanguageFile = u"VMReelEffectsLang.xml";
constexpr const char* kLanguages[] = {"en", "de", "fr", "es", "it", "pt", "nl", "sv",
                                      "pl", "cs", "tr", "ru", "ja", "zh", "ko"};

class Module {
  public:
#if defined(_WIN32)
    Module() : m_module(LoadLibraryW(L".\\VMLang.dll")) {}
    ~Module() {
        if (m_module) FreeLibrary(m_module);
    }
    void* Find(const char* name) const {
        return reinterpret_cast<void*>(GetProcAddress(m_module, name));
    }
#else
    Module() : m_module(dlopen("./VMLang.so", RTLD_NOW | RTLD_LOCAL)) {}
    ~Module() {
        if (m_module) dlclose(m_module);
    }
    void* Find(const char* name) const {
        return dlsym(m_module, name);
    }
#endif
    Module(const Module&) = delete;
    Module& operator=(const Module&) = delete;
    bool IsLoaded() const {
        return m_module != nullptr;
    }

  private:
    decltype(
#if defined(_WIN32)
        HMODULE()
#else
        static_cast<void*>(nullptr)
#endif
            ) m_module;
};

class LanguageModule : public testing::Test {
  protected:
    void SetUp() override {
        ASSERT_TRUE(m_module.IsLoaded());
        m_getParser = reinterpret_cast<GetLangXMLParserFunction>(m_module.Find("GetLangXMLParser"));
        m_canUnload = reinterpret_cast<CanUnloadDLLNowFunction>(m_module.Find("CanUnloadDLLNow"));
        ASSERT_TRUE(m_getParser && m_canUnload);
        ASSERT_TRUE(m_canUnload());
        m_parser = m_getParser();
        ASSERT_NE(m_parser, nullptr);
    }

    void TearDown() override {
        if (!m_parser) return;
        EXPECT_FALSE(m_canUnload());
        EXPECT_EQ(m_parser->Release(), 0u);
        EXPECT_TRUE(m_canUnload());
    }

    std::u16string Text(const char* language, std::int32_t category, const char* key) {
        char16_t buffer[2048];
        const std::int32_t length = m_parser->GetText(language, category, key, buffer, 2048);
        EXPECT_EQ(std::u16string(buffer).size(), static_cast<std::size_t>(length));
        return buffer;
    }

    Module m_module;
    GetLangXMLParserFunction m_getParser = nullptr;
    CanUnloadDLLNowFunction m_canUnload = nullptr;
    LangXMLParser* m_parser = nullptr;
};

TEST_F(LanguageModule, CountsReferencesAndParsers) {
    EXPECT_EQ(m_parser->AddRef(), 2u);
    EXPECT_EQ(m_parser->Release(), 1u);
    void* found = nullptr;
    EXPECT_EQ(m_parser->QueryInterface(&kIidUnknown, &found), kStatusOk);
    EXPECT_EQ(found, m_parser);
    EXPECT_EQ(m_parser->Release(), 1u);
    found = m_parser;
    EXPECT_EQ(m_parser->QueryInterface(&kIidMultiLingual, &found), kStatusNoInterface);
    EXPECT_EQ(found, nullptr);
    EXPECT_EQ(m_parser->QueryInterface(&kIidUnknown, nullptr), kStatusFailure);
    EXPECT_EQ(m_parser->Reserved3(), 0);

    LangXMLParser* const second = m_getParser();
    ASSERT_NE(second, nullptr);
    EXPECT_EQ(second->Release(), 0u);
    EXPECT_FALSE(m_canUnload()) << "the first is still there";
}

TEST_F(LanguageModule, HasEveryTextInEveryLanguage) {
    const struct {
        std::int32_t category;
        const char* key;
    } keys[] = {
        {4, "Save Preset As"}, {4, "Open Preset"}, {4, "Preset Files"}, {5, "ProductName"},
        {5, "Version"},        {5, "Title"},       {5, "Options"},      {5, "Up/Down Knobs Control"},
        {8, "Cancel"},         {8, "OK"},          {8, "Help"},
    };
    ASSERT_TRUE(m_parser->Load(kLanguageFile));
    std::set<std::u16string> titles;
    for (const char* language : kLanguages) {
        SCOPED_TRACE(language);
        for (const auto& [category, key] : keys) {
            const std::u16string text = Text(language, category, key);
            EXPECT_FALSE(text.empty()) << key;
            EXPECT_EQ(text.find(u'%'), text.npos) << key << ": texts are shown as they stand";
            EXPECT_EQ(text.find(u'@'), text.npos) << key << ": a name that the build left in place";
        }
        EXPECT_EQ(Text(language, 5, "ProductName"), u"Velmora Reel Effects");
        EXPECT_EQ(Text(language, 5, "Title"), u"Velmora Reel Effects");
        EXPECT_TRUE(Text(language, 5, "Version").ends_with(u" 1.0"));
        titles.insert(Text(language, 4, "Open Preset"));
    }
    EXPECT_EQ(titles.size(), std::size(kLanguages)) << "a language was left untranslated";
    EXPECT_EQ(Text("ru", 5, "Version"), u"Версия 1.0");
    EXPECT_EQ(Text("ja", 8, "Cancel"), u"キャンセル");
    EXPECT_EQ(Text("xx", 8, "Cancel"), u"");
}

TEST_F(LanguageModule, LooksUpSevenWords) {
    ASSERT_TRUE(m_parser->Load(kLanguageFile));
    const struct {
        const char* name;
        const char* language;
        const char16_t* fallback;
        std::int32_t capacity;
        std::int32_t found;
        std::u16string written;
    } rows[] = {
        {"hit", "de", u"Cancel", 32, 1, u"Abbrechen"},
        {"hit, cut", "de", u"Cancel", 6, 1, u"Abbre"},
        {"miss", "xx", u"Cancel", 32, 0, u"Cancel"},
        {"miss, cut inside a pair", "xx", u"C\U0001F3A5", 3, 0, u"C"},
        {"miss without a fallback", "xx", nullptr, 32, 0, u""},
        {"null language", nullptr, u"Cancel", 32, 0, u"Cancel"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        char16_t buffer[32] = {0xCCCC};
        std::int32_t found = 7;
        const std::int32_t length =
            m_parser->LookUpText(row.language, 8, "Cancel", row.fallback, buffer, row.capacity, &found);
        EXPECT_EQ(std::u16string(buffer), row.written);
        EXPECT_EQ(length, static_cast<std::int32_t>(row.written.size()));
        EXPECT_EQ(found, row.found);
    }
    EXPECT_EQ(m_parser->LookUpText("de", 8, "OK", nullptr, nullptr, 32, nullptr), 0)
        << "neither buffer nor flag";
    char16_t buffer[3];
    EXPECT_EQ(m_parser->LookUpText("de", 8, "OK", nullptr, buffer, 3, nullptr), 2) << "no flag";
}

TEST_F(LanguageModule, KeepsItsTextsWhenALoadFails) {
    EXPECT_EQ(Text("en", 8, "OK"), u"") << "nothing was loaded yet";
    const std::filesystem::path folder = std::filesystem::temp_directory_path() / u"velmora Überfilm 映画 ф";
    std::filesystem::create_directories(folder);
    const std::filesystem::path path = folder / u"texts é.xml";
    const auto write = [&](const std::string& bytes) {
        std::ofstream(path, std::ios::binary | std::ios::trunc) << bytes;
    };
    const std::string start = "<texts version='1'><language code='en' name='E'><category id='8'>";
    const std::string end = "</category></language></texts>";

    write(start + "<text key='OK'>first</text>" + end);
    EXPECT_TRUE(m_parser->Load(path.u16string().c_str())) << "a folder of any name";
    EXPECT_EQ(Text("en", 8, "OK"), u"first");
    write(start + "<text key='OK'>second</text><text key='Help'>cut");
    EXPECT_FALSE(m_parser->Load(path.u16string().c_str()));
    EXPECT_EQ(Text("en", 8, "OK"), u"first");
    EXPECT_EQ(Text("en", 8, "Help"), u"");
    write(start + "<text key='Help'>third</text>" + end);
    EXPECT_TRUE(m_parser->Load(path.u16string().c_str()));
    EXPECT_EQ(Text("en", 8, "OK"), u"") << "a file replaces the one before as a whole";

    EXPECT_FALSE(m_parser->Load(nullptr));
    EXPECT_FALSE(m_parser->Load(u""));
    EXPECT_FALSE(m_parser->Load(folder.u16string().c_str())) << "a folder";
    EXPECT_FALSE(m_parser->Load((folder / u"missing.xml").u16string().c_str()));
    const char16_t halfPair[] = {u'a', 0xD800, 0};
    EXPECT_FALSE(m_parser->Load(halfPair));
    EXPECT_EQ(Text("en", 8, "Help"), u"third");
    std::filesystem::remove_all(folder);
}

}  // namespace
}  // namespace velmora
