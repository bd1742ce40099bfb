// The options dialog as the user sees it: texts, keyboard, logo.
#include <filesystem>

#include "desktop_fixture.h"
#include "desktop/bit_button.h"
#include "desktop/resource_ids.h"

namespace velmora::support::test {
namespace {

class DialogTest : public DesktopTest {
  protected:
    void SetUp() override {
        DesktopTest::SetUp();
        m_services.emplace(m_modulePath);
        m_services->Offer(m_library);
    }
    void TearDown() override {
        m_services->Withdraw(m_library);
        EXPECT_EQ(m_library.references, 1u);
        m_services.reset();
        DesktopTest::TearDown();
    }
    std::int32_t Show(const std::function<void(HWND)>& user) { return ShowOptionsTo(**m_services, user); }

    FakeLibrary m_library{u""};
    std::optional<ServicesModule> m_services;
};

TEST_F(DialogTest, SpeaksEnglishWithoutTranslations) {
    const struct {
        int control;
        const wchar_t* text;
    } rows[] = {
        {VM_TEXT_PRODUCT, L"Velmora Reel Effects"},
        {VM_TEXT_VERSION, L"Version 1.0"},
        {VM_TEXT_OPTIONS, L"Options"},
        {VM_CHECK_KNOBS_VERTICAL, L"Up / Down mouse control of circular knobs"},
        {VM_BUTTON_OK, L"OK"},
        {VM_BUTTON_CANCEL, L"Cancel"},
        {VM_BUTTON_HELP, L"Help"},
    };
    Show([&](HWND dialog) {
        EXPECT_EQ(TextOf(dialog), L"Velmora Reel Effects");
        for (const auto& row : rows)
            EXPECT_EQ(TextOf(GetDlgItem(dialog, row.control)), row.text) << row.control;
    });
    // The library was asked for the user's language by its two-letter code.
    EXPECT_EQ(m_library.language.size(), 2u);
}

TEST_F(DialogTest, AsksAnotherLivingLibraryWhenItsOwnIsGone) {
    FakeLibrary other(u"Hjälp");
    m_services->Offer(other);
    Show([](HWND dialog) { EXPECT_EQ(TextOf(GetDlgItem(dialog, VM_BUTTON_HELP)), L"Help"); });
    m_services->Withdraw(m_library);
    Show([](HWND dialog) { EXPECT_EQ(TextOf(GetDlgItem(dialog, VM_BUTTON_HELP)), L"Hjälp"); });
    EXPECT_EQ(other.references, 1u);
    m_services->Offer(m_library);
    m_services->Withdraw(other);
}

TEST_F(DialogTest, IsUsableWithoutAMouse) {
    const int tabOrder[] = {VM_CHECK_KNOBS_VERTICAL, VM_BUTTON_OK, VM_BUTTON_CANCEL, VM_BUTTON_HELP,
                            VM_CHECK_KNOBS_VERTICAL};
    FakeLibrary marked(u"", u"&Up");
    m_services->Offer(marked);
    m_services->Withdraw(m_library);
    const std::int32_t result = Show([&](HWND dialog) {
        for (const int control : tabOrder) {
            EXPECT_EQ(FocusedControl(dialog), control);
            Type(dialog, VK_TAB);
        }
        const auto isChecked = [&] {
            return IsDlgButtonChecked(dialog, VM_CHECK_KNOBS_VERTICAL) == BST_CHECKED;
        };
        EXPECT_FALSE(isChecked());
        TypeWithAlt(dialog, L'u');
        EXPECT_TRUE(isChecked());
        EXPECT_EQ(FocusedControl(dialog), VM_CHECK_KNOBS_VERTICAL);
        Type(dialog, VK_SPACE);
        EXPECT_FALSE(isChecked());
        Type(dialog, VK_SPACE);
        Type(dialog, VK_RETURN);
        EXPECT_FALSE(IsWindow(dialog));
    });
    m_services->Offer(m_library);
    m_services->Withdraw(marked);
    EXPECT_EQ(result, 1);
    EXPECT_TRUE((**m_services).KnobsDragVertical());
}

TEST_F(DialogTest, IsShownWhicheverModuleTheServicesAreStartedFor) {
    IShellServices& services = **m_services;
    services.ShutDown();
    EXPECT_TRUE(services.Start(GetModuleHandleW(L"kernel32.dll"), nullptr, nullptr, 1));
    bool isShown = false;
    EXPECT_EQ(Show([&](HWND dialog) {
                  isShown = true;
                  EXPECT_EQ(TextOf(GetDlgItem(dialog, VM_BUTTON_HELP)), L"Help");
                  Type(dialog, VK_RETURN);
              }),
              1);
    EXPECT_TRUE(isShown);
}

TEST_F(DialogTest, SecondDialogIsNotShown) {
    Show([&](HWND dialog) {
        std::int32_t inner = -1;
        inner = (**m_services).ShowOptions(nullptr);
        EXPECT_EQ(inner, 0);
        EXPECT_TRUE(IsWindow(dialog));
    });
}

// The colour of a pixel of a window, as displayed.
COLORREF ShownColour(HWND window, int x, int y) {
    const HDC dc = GetDC(window);
    UpdateWindow(window);
    const COLORREF colour = GetPixel(dc, x, y);
    ReleaseDC(window, dc);
    return colour;
}

TEST_F(DialogTest, LogoIsAsLargeAsItsBitmapAndFitsTheDialog) {
    Show([](HWND dialog) {
        const HWND logo = GetDlgItem(dialog, VM_BUTTON_LOGO);
        ASSERT_NE(logo, nullptr);
        EXPECT_NE(GetWindowLongW(logo, GWL_EXSTYLE) & WS_EX_NOPARENTNOTIFY, 0);
        RECT size = {};
        GetClientRect(logo, &size);
        EXPECT_EQ(size.right, 220);
        EXPECT_EQ(size.bottom, 48);
        RECT place = {};
        RECT below = {};
        GetWindowRect(logo, &place);
        GetWindowRect(GetDlgItem(dialog, VM_TEXT_PRODUCT), &below);
        EXPECT_LT(place.bottom, below.top);
    });
}

TEST_F(DialogTest, WithoutResourcesTheLogoIsEmptyAndTheRestWorks) {
    m_services->Withdraw(m_library);
    std::filesystem::remove(m_folder + L"resources.dll");
    m_services->Offer(m_library);
    const std::int32_t result = Show([](HWND dialog) {
        RECT size = {};
        GetClientRect(GetDlgItem(dialog, VM_BUTTON_LOGO), &size);
        EXPECT_EQ(size.right, 74);
        EXPECT_EQ(size.bottom, 32);
        Click(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL));
        Type(dialog, VK_RETURN);
    });
    EXPECT_EQ(result, 1);
    EXPECT_TRUE((**m_services).KnobsDragVertical());
}

TEST_F(DialogTest, LogoOpensTheMakersPage) {
    // What the system starts for such addresses during this test.
    const RegisteredText handler(L"Software\\Classes\\https\\shell\\open\\command",
                                 L"\"" + BesideProgram(L"command_line_recorder.exe") + L"\" \"%1\"");
    Show([](HWND dialog) { Click(GetDlgItem(dialog, VM_BUTTON_LOGO)); });
    const std::wstring line = RecordedCommandLine();
    EXPECT_NE(line.find(L"https://www.velmora.example/reel-effects"), std::wstring::npos)
        << testing::PrintToString(line);
}

// A parent window on this thread that records the commands it receives.
class CommandWindow {
  public:
    CommandWindow() {
        WNDCLASSW description = {};
        description.lpfnWndProc = Procedure;
        description.hInstance = GetModuleHandleW(nullptr);
        description.lpszClassName = L"Command Window";
        RegisterClassW(&description);
        m_window = CreateWindowExW(0, L"Command Window", L"", WS_POPUP | WS_VISIBLE, 50, 50, 200, 100,
                                   nullptr, nullptr, description.hInstance, nullptr);
        commands = 0;
    }
    ~CommandWindow() {
        DestroyWindow(m_window);
        UnregisterClassW(L"Command Window", GetModuleHandleW(nullptr));
    }
    CommandWindow(const CommandWindow&) = delete;
    CommandWindow& operator=(const CommandWindow&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    // The commands received once everything posted so far has been processed.
    int Commands(WORD id) const {
        MSG message;
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE)) DispatchMessageW(&message);
        EXPECT_TRUE(commands == 0 || lastId == id);
        return commands;
    }

  private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
        if (message == WM_COMMAND) {
            ++commands;
            lastId = LOWORD(wParam);
        }
        return DefWindowProcW(window, message, wParam, lParam);
    }
    static inline int commands = 0;
    static inline WORD lastId = 0;
    HWND m_window;
};

class ButtonTest : public testing::Test {
  protected:
    static constexpr WORD kId = 232;
    void SetUp() override { ASSERT_TRUE(RegisterBitButtonClass(m_module)); }
    void TearDown() override {
        m_parent.reset();
        EXPECT_TRUE(UnregisterBitButtonClass(m_module));
    }
    HWND Create(HBITMAP bitmap, bool notify = true, bool plain = false) {
        m_parent.emplace();
        return CreateBitButton({.owner = m_parent->Window(),
                                .module = m_module,
                                .bitmap = bitmap,
                                .command = kId,
                                .position = {10, 10},
                                .notify = notify,
                                .plain = plain});
    }
    HMODULE m_module = GetModuleHandleW(nullptr);
    std::optional<CommandWindow> m_parent;
};

// A bitmap of three images, 8 x 4 pixels each: opaque red, half transparent black, fully transparent.
HBITMAP ThreeImages() {
    BITMAPINFO info = {};
    info.bmiHeader = {sizeof info.bmiHeader, 8, -12, 1, 32, BI_RGB, 0, 0, 0, 0, 0};
    void* bits = nullptr;
    const HBITMAP bitmap = CreateDIBSection(nullptr, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    auto* pixels = static_cast<std::uint32_t*>(bits);
    for (int i = 0; i < 8 * 12; ++i) pixels[i] = i < 32 ? 0xFFFF0000u : i < 64 ? 0x80000000u : 0u;
    return bitmap;
}

TEST_F(ButtonTest, ShowsTheImageOfItsStateBlendedOverTheDialog) {
    const HBITMAP bitmap = ThreeImages();
    const HWND button = Create(bitmap);
    RECT size = {};
    GetClientRect(button, &size);
    EXPECT_EQ(size.right, 8);
    EXPECT_EQ(size.bottom, 4);
    const COLORREF face = GetSysColor(COLOR_3DFACE);
    EXPECT_EQ(ShownColour(button, 3, 1), face);
    SendMessageW(button, WM_MOUSEMOVE, 0, MAKELPARAM(3, 1));
    // Half transparent black halves the colour; the system may round by one step.
    EXPECT_NEAR(GetRValue(ShownColour(button, 3, 1)), GetRValue(face) * 127 / 255, 1);
    SendMessageW(button, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(3, 1));
    EXPECT_EQ(ShownColour(button, 3, 1), RGB(255, 0, 0));
    SendMessageW(button, WM_LBUTTONUP, 0, MAKELPARAM(3, 1));
    // Releasing the capture counts as losing it: the button returns to rest until the mouse moves again.
    EXPECT_EQ(ShownColour(button, 3, 1), face);
    EXPECT_EQ(m_parent->Commands(kId), 1);
    DestroyWindow(button);
    DeleteObject(bitmap);
}

TEST_F(ButtonTest, PostsOnlyWhenReleasedInside) {
    const struct {
        const char* name;
        bool notify;
        int releaseX;
        int commands;
    } rows[] = {{"inside", true, 5, 1}, {"outside", true, 500, 0}, {"silent", false, 5, 0}};
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        const HWND button = Create(nullptr, row.notify);
        SendMessageW(button, WM_MOUSEMOVE, 0, MAKELPARAM(5, 5));
        SendMessageW(button, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(5, 5));
        EXPECT_EQ(GetCapture(), button);
        SendMessageW(button, WM_MOUSEMOVE, MK_LBUTTON, MAKELPARAM(row.releaseX, 5));
        SendMessageW(button, WM_LBUTTONUP, 0, MAKELPARAM(row.releaseX, 5));
        EXPECT_EQ(GetCapture(), nullptr);
        EXPECT_EQ(m_parent->Commands(kId), row.commands);
    }
}

TEST_F(ButtonTest, PlainModeHandsItsWorkToAStandardButton) {
    for (const bool notify : {true, false}) {
        const HWND button = Create(nullptr, notify, true);
        const HWND child = GetDlgItem(button, kId);
        ASSERT_NE(child, nullptr);
        RECT size = {};
        GetClientRect(child, &size);
        EXPECT_EQ(size.right, 74);
        EXPECT_EQ(size.bottom, 24);
        POINT corner = {0, 0};
        MapWindowPoints(child, button, &corner, 1);
        EXPECT_EQ(corner.y, 4);
        EXPECT_EQ(reinterpret_cast<HGDIOBJ>(SendMessageW(child, WM_GETFONT, 0, 0)),
                  GetStockObject(DEFAULT_GUI_FONT));
        SendMessageW(child, BM_CLICK, 0, 0);
        EXPECT_EQ(m_parent->Commands(kId), notify ? 1 : 0);
        SendMessageW(button, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(1, 1));
        EXPECT_NE(GetCapture(), button);
    }
}

}  // namespace
}  // namespace velmora::support::test
