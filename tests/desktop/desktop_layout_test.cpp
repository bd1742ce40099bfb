// The options dialog in every language of the language file: nothing is cut off and nothing overlaps.
#include <filesystem>
#include <fstream>
#include <iterator>
#include <regex>
#include <set>
#include <vector>

#include "desktop_fixture.h"
#include "api/reference.h"
#include "language/lang_parser.h"
#include "desktop/bit_button.h"
#include "desktop/options.h"
#include "desktop/resource_ids.h"

namespace velmora::support::test {
namespace {

// The texts of the real language module, as a library object returns them.
class RealTexts final : public Uncounted<IMultiLingual> {
  public:
    RealTexts() : m_module(LoadLibraryW(DesktopPath(L"VMLang.dll").c_str())) {
        const auto create = reinterpret_cast<GetLangXMLParserFunction>(
            reinterpret_cast<void*>(GetProcAddress(m_module, "GetLangXMLParser")));
        m_parser = Reference<LangXMLParser>::Adopt(create());
        const std::wstring file = DesktopPath(L"VMReelEffectsLang.xml");
        EXPECT_TRUE(m_parser->Load(reinterpret_cast<const char16_t*>(file.c_str())));
    }
    ~RealTexts() {
        m_parser.Reset();
        FreeLibrary(m_module);
    }
    RealTexts(const RealTexts&) = delete;
    RealTexts& operator=(const RealTexts&) = delete;

    Status VM_CALL QueryInterface(const Guid*, void** out) override {
        *out = static_cast<IMultiLingual*>(this);
        return kStatusOk;
    }
    std::int32_t VM_CALL LookUpText(const char*, std::int32_t, const char*, const char16_t*, char16_t*,
                                    std::int32_t, std::int32_t*) override {
        return 0;
    }
    std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override {
        return m_parser->GetText(languageCode, category, key, buffer, capacity);
    }

    static std::wstring DesktopPath(const wchar_t* name) {
        return std::wstring(L"" VELMORA_TEST_DIST) + L"/" + name;
    }

    // The codes of all languages in the file.
    static std::vector<std::string> Languages() {
        std::ifstream file{std::filesystem::path(DesktopPath(L"VMReelEffectsLang.xml"))};
        const std::string text((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
        const std::regex code("<language code=\"([a-z]{2})\"");
        std::vector<std::string> codes;
        for (std::sregex_iterator i(text.begin(), text.end(), code), end; i != end; ++i)
            codes.push_back((*i)[1]);
        return codes;
    }

  private:
    HMODULE m_module;
    Reference<LangXMLParser> m_parser;
};

// The size of a window's text in its own font, broken into lines of `width` pixels; 0 for one line.
SIZE TextSize(HWND window, int width) {
    const HDC dc = GetDC(window);
    const HGDIOBJ before = SelectObject(dc, reinterpret_cast<HFONT>(SendMessageW(window, WM_GETFONT, 0, 0)));
    const std::wstring text = TextOf(window);
    RECT area = {0, 0, width, 0};
    const bool isStatic =
        GetDlgCtrlID(window) >= VM_TEXT_PRODUCT && GetDlgCtrlID(window) != VM_CHECK_KNOBS_VERTICAL;
    DrawTextW(dc, text.c_str(), -1, &area,
              DT_CALCRECT | (width == 0 ? DT_SINGLELINE : DT_WORDBREAK) | (isStatic ? DT_NOPREFIX : 0u));
    SelectObject(dc, before);
    ReleaseDC(window, dc);
    return {area.right, area.bottom};
}

char16_t AltLetter(const std::wstring& text) {
    const std::size_t mark = text.find(L'&');
    return mark == std::wstring::npos ? u'\0' : static_cast<char16_t>(towlower(text[mark + 1]));
}

void CheckLayout(HWND dialog) {
    RECT client = {};
    GetClientRect(dialog, &client);
    std::vector<RECT> places;
    for (HWND child = GetWindow(dialog, GW_CHILD); child != nullptr; child = GetWindow(child, GW_HWNDNEXT)) {
        const int id = GetDlgCtrlID(child);
        SCOPED_TRACE(testing::Message() << "control " << id << " " << testing::PrintToString(TextOf(child)));
        RECT place = {};
        GetWindowRect(child, &place);
        MapWindowPoints(nullptr, dialog, reinterpret_cast<POINT*>(&place), 2);
        const SIZE field = {place.right - place.left, place.bottom - place.top};
        EXPECT_TRUE(place.left >= 0 && place.top >= 0 && place.right <= client.right &&
                    place.bottom <= client.bottom);
        for (const RECT& other : places) {
            RECT both = {};
            EXPECT_FALSE(IntersectRect(&both, &place, &other)) << both.left << "," << both.top;
        }
        places.push_back(place);
        constexpr int kButtonBorders = 12;
        const int box = GetSystemMetrics(SM_CXMENUCHECK) + 8;
        const bool isCheckBox = id == VM_CHECK_KNOBS_VERTICAL;
        const SIZE text = TextSize(child, isCheckBox ? field.cx - box : 0);
        if (text.cx == 0) continue;
        const int borders = isCheckBox ? box
                            : id == VM_BUTTON_OK || id == VM_BUTTON_CANCEL || id == VM_BUTTON_HELP
                                ? kButtonBorders
                                : 0;
        EXPECT_LE(text.cx + borders, field.cx);
        EXPECT_LE(text.cy, field.cy);
    }
    const char16_t knobs = AltLetter(TextOf(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL)));
    const char16_t help = AltLetter(TextOf(GetDlgItem(dialog, VM_BUTTON_HELP)));
    EXPECT_TRUE(knobs != 0 && help != 0 && knobs != help)
        << "Alt letters " << int{knobs} << " and " << int{help};
}

int checkedDialogs = 0;

// Checks a dialog as soon as it is set up, which is before it is shown, and cancels it.
LRESULT CALLBACK CheckDialog(int code, WPARAM wParam, LPARAM data) {
    const auto& call = *reinterpret_cast<const CWPRETSTRUCT*>(data);
    if (code == HC_ACTION && call.message == WM_INITDIALOG) {
        ++checkedDialogs;
        CheckLayout(call.hwnd);
        PostMessageW(call.hwnd, WM_COMMAND, IDCANCEL, 0);
    }
    return CallNextHookEx(nullptr, code, wParam, data);
}

TEST(DialogLayout, ReadsWellInEveryLanguage) {
    RealTexts source;
    const std::vector<std::string> languages = RealTexts::Languages();
    EXPECT_GE(languages.size(), 13u);
    const HMODULE module = GetModuleHandleW(nullptr);
    const HMODULE resources = LoadLibraryW(RealTexts::DesktopPath(L"resources.dll").c_str());
    const HANDLE logo =
        LoadImageW(resources, MAKEINTRESOURCEW(VM_BITMAP_OPTIONS), IMAGE_BITMAP, 0, 0, LR_CREATEDIBSECTION);
    ASSERT_NE(logo, nullptr);
    ASSERT_TRUE(RegisterBitButtonClass(module));
    const HHOOK hook = SetWindowsHookExW(WH_CALLWNDPROCRET, CheckDialog, nullptr, GetCurrentThreadId());
    const HelpLauncher help;
    Preferences preferences;
    std::set<std::u16string> helpTexts;
    for (const std::string& language : languages) {
        SCOPED_TRACE(language);
        TranslationHelper texts;
        texts.SetContext(&source, language.c_str());
        helpTexts.insert(texts.Translate(kTextsOfButtons, "Help"));
        OptionsDialog dialog({.templates = module,
                              .buttonModule = module,
                              .logo = static_cast<HBITMAP>(logo),
                              .texts = &texts,
                              .help = &help,
                              .preferences = &preferences});
        EXPECT_FALSE(dialog.Show(nullptr));
    }
    EXPECT_GT(helpTexts.size(), languages.size() / 2) << "the languages differ";
    EXPECT_EQ(checkedDialogs, static_cast<int>(languages.size()));
    UnhookWindowsHookEx(hook);
    EXPECT_TRUE(UnregisterBitButtonClass(module));
    DeleteObject(logo);
    FreeLibrary(resources);
}

}  // namespace
}  // namespace velmora::support::test
