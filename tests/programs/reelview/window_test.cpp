// The program driven through its windows. REELVIEW is the program, REELVIEW_MEDIA a folder of films and pictures,
// REELVIEW_RECORDER the library that records its input.

#include <windows.h>
#include <commctrl.h>
#include <oleacc.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <optional>
#include <string>
#include <vector>

#include "driver.h"
#include "record.h"
#include "programs/common/effect_info.h"
#include "programs/common/effect_library.h"
#include "programs/reelview/document/settings_history.h"
#include "programs/reelview/panel/panel_window_win32.h"
#include "programs/reelview/view/transport_bar_win32.h"
#include "programs/reelview/window/commands.h"

namespace velmora::reelview::test {
namespace {

std::wstring Variable(const wchar_t* name) {
    wchar_t text[MAX_PATH] = {};
    GetEnvironmentVariableW(name, text, MAX_PATH);
    return text;
}

std::wstring Quoted(const std::wstring& text) {
    return L'"' + text + L'"';
}

std::wstring Wide(const std::string& text) {
    return {text.begin(), text.end()};
}

Record& Shared() {
    static const std::string name = "reelview-record-" + std::to_string(GetCurrentProcessId());
    static Record& record = []() -> Record& {
        SetEnvironmentVariableA("REELVIEW_RECORD", name.c_str());
        return *OpenRecord(name.c_str(), true);
    }();
    return record;
}

// The values last passed to the library, and the effect's name.
struct Recorded {
    std::string effect;
    std::vector<std::uint32_t> values;
};

std::optional<Recorded> LastRecorded() {
    for (;;) {
        const LONG turn = Shared().turn;
        if (turn == 0) return std::nullopt;
        MemoryBarrier();
        const Recorded recorded = {Shared().effect, {Shared().values, Shared().values + Shared().count}};
        MemoryBarrier();
        if (turn % 2 == 0 && turn == Shared().turn) return recorded;
    }
}

bool Becomes(std::uint32_t parameter, const std::function<bool(ValueWord)>& isRight) {
    return WaitFor([&] {
        const auto recorded = LastRecorded();
        if (!recorded || recorded->values.size() <= parameter) return false;
        ValueWord word{};
        word.bits = recorded->values[parameter];
        return isRight(word);
    });
}

bool BecomesNumber(std::uint32_t parameter, double value) {
    return Becomes(parameter, [&](ValueWord word) { return std::abs(word.number - value) < 1e-5; });
}

std::wstring WithRecorder(const std::string& effect, const std::wstring& clip = L"wide.y4m") {
    Shared().turn = 0;
    return L"--library " + Quoted(Variable(L"REELVIEW_RECORDER")) + L" --effect " + Quoted(Wide(effect)) +
           L' ' + Quoted(Media(clip));
}

const std::vector<hosts::EffectInfo>& Effects() {
    static const hosts::EffectLibrary library(
        std::filesystem::path(Variable(L"REELVIEW")).parent_path().wstring() + L"\\VMReelEffects.dll");
    return library.Effects();
}

void UseSlider(const Program& program, const hosts::ParamInfo& param, std::uint32_t index) {
    const HWND knob = program.Control(kFirstControl + static_cast<int>(index));
    const HWND field = program.Control(kFirstField + static_cast<int>(index));
    ASSERT_NE(knob, nullptr) << param.name;
    const auto type = [&](const wchar_t* text) {
        SendMessageW(field, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(text));
        Key(field, VK_RETURN);
    };
    const bool isSmall = param.maximum < 50.0f;
    type(isSmall ? L"2,5" : L"25");
    const double typed = ((isSmall ? 2.5 : 25.0) - param.minimum) / (param.maximum - param.minimum);
    EXPECT_TRUE(BecomesNumber(index, typed)) << param.name << " typed";
    Key(knob, VK_UP);
    EXPECT_TRUE(BecomesNumber(index, typed + 0.01)) << param.name << " by a key";
    SendMessageW(knob, WM_MOUSEWHEEL, MAKEWPARAM(0, static_cast<WORD>(-WHEEL_DELTA)), 0);
    EXPECT_TRUE(BecomesNumber(index, typed)) << param.name << " by the wheel";
    SendMessageW(knob, WM_LBUTTONDBLCLK, MK_LBUTTON, MAKELPARAM(20, 20));
    EXPECT_TRUE(BecomesNumber(index, param.defaultValue.number)) << param.name << " by a double click";
    // A quarter turn from the left to the top is 90 of 270 degrees.
    RECT area = {};
    GetClientRect(knob, &area);
    type(isSmall ? L"2" : L"-1000");
    const double start = isSmall ? 0.2 : 0.0;
    ASSERT_TRUE(BecomesNumber(index, start)) << param.name;
    const LONG c = area.right / 2;
    Drag(knob, {{c - 24, c}, {c - 17, c - 17}, {c, c - 24}});
    EXPECT_TRUE(
        Becomes(index, [&](ValueWord word) { return std::abs(word.number - start - 1.0 / 3.0) < 0.02; }))
        << param.name << " by the mouse";
}

void UseControl(const Program& program, const hosts::ParamInfo& param, std::uint32_t index) {
    const HWND control = program.Control(kFirstControl + static_cast<int>(index));
    if (param.kind == kKindSlider) return UseSlider(program, param, index);
    ASSERT_NE(control, nullptr) << param.name;
    if (param.kind == kKindCheckBox) {
        SendMessageW(control, BM_CLICK, 0, 0);
        const std::uint32_t flipped = param.defaultValue.flag != 0 ? 0 : 1;
        EXPECT_TRUE(Becomes(index, [&](ValueWord word) { return word.bits == flipped; })) << param.name;
    } else if (param.kind == kKindMenu) {
        SendMessageW(control, WM_KEYDOWN, VK_END, 0);
        const auto last = static_cast<std::uint32_t>(param.items.size()) - 1;
        EXPECT_TRUE(Becomes(index, [&](ValueWord word) { return word.count == last; })) << param.name;
    } else if (param.kind == kKindColour) {
        const HWND field = program.Control(kFirstField + static_cast<int>(index));
        SendMessageW(field, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(L"#102030"));
        Key(field, VK_RETURN);
        EXPECT_TRUE(Becomes(index, [](ValueWord word) { return word.colour == 0x302010; })) << param.name;
        PostMessageW(control, BM_CLICK, 0, 0);
        const HWND dialog = program.Dialog();
        ASSERT_NE(dialog, nullptr) << "no colour dialog";
        PostMessageW(dialog, WM_COMMAND, IDCANCEL, 0);
        EXPECT_TRUE(WaitFor([&] { return !IsWindow(dialog); }));
    }
}

TEST(ReelView, EveryControlReachesTheLibrary) {
    for (const hosts::EffectInfo& effect : Effects()) {
        Program program(WithRecorder(effect.name));
        ASSERT_NE(program.Window(), nullptr);
        ASSERT_TRUE(WaitFor([&] { return LastRecorded() && LastRecorded()->effect == effect.name; }))
            << effect.name;
        for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
            if (effect.params[i].HoldsValue()) UseControl(program, effect.params[i], i);
        }
        EXPECT_EQ(program.Close(), 0u) << effect.name;
    }
}

TEST(ReelView, OpensWhatItCanAndSaysWhatItCannot) {
    struct Row {
        const wchar_t* file;
        const wchar_t* status;  // part of the status line; null: a message instead
        const wchar_t* message;
    };
    const Row rows[] = {
        {L"small.y4m", L"Frame 1 / 12", nullptr},
        {L"picture.png", L"64 \u00D7 48", nullptr},
        {L"picture.jpg", L"64 \u00D7 48", nullptr},
        {L"picture.bmp", L"64 \u00D7 48", nullptr},
        {L"picture.tif", L"64 \u00D7 48", nullptr},
        {L"turned.jpg", L"48 \u00D7 64", nullptr},
        {L"turned.tif", L"48 \u00D7 64", nullptr},
        {L"plain.avi", L"Frame 1 / 12", nullptr},
        {L"missing.png", nullptr, L"cannot be opened"},
        {L"empty.png", nullptr, L"damaged"},
        {L"text.mp4", nullptr, L"format"},
        {L"cut.png", nullptr, L"damaged"},
        {L"header.y4m", nullptr, L"no pictures"},
        {L"huge.y4m", nullptr, L"too large"},
        {L"cut.avi", nullptr, L""},
    };
    for (const Row& row : rows) {
        Program program(Quoted(Media(row.file)));
        ASSERT_NE(program.Window(), nullptr);
        if (row.status != nullptr) {
            EXPECT_TRUE(WaitFor([&] { return program.Status().find(row.status) != std::wstring::npos; }))
                << std::filesystem::path(row.file) << " shows " << std::filesystem::path(program.Status());
        } else {
            const std::wstring texts = program.CloseDialogs();
            EXPECT_NE(texts.find(row.message), std::wstring::npos)
                << std::filesystem::path(row.file) << " says " << std::filesystem::path(texts);
        }
        EXPECT_EQ(program.Close(), 0u) << std::filesystem::path(row.file);
    }
    Program program(L"--sequence " + Quoted(Media(L"seq03.png")));
    EXPECT_TRUE(WaitFor([&] { return program.Status().find(L"Frame 1 / 12") != std::wstring::npos; }));
}

TEST(ReelView, PresetsUndoAndFiles) {
    Program program(WithRecorder("Film Look"));
    ASSERT_TRUE(WaitFor([] { return LastRecorded().has_value(); }));
    const auto tint = [](double value) { return BecomesNumber(1, value); };
    // The first preset, "Black N White", has a saturation of -100, the second, "Bleached", a tint of 49.
    const HWND list = program.Control(kControlPresets);
    Press(list, 40, 20);
    EXPECT_TRUE(BecomesNumber(2, 0.0));
    Key(list, VK_RIGHT);
    EXPECT_TRUE(tint(0.745));
    program.Command(kCommandUndo);
    EXPECT_TRUE(tint(0.5));
    program.Command(kCommandRedo);
    EXPECT_TRUE(tint(0.745));
    // The library only accepts names in the system's code page.
    const std::filesystem::path folder = std::filesystem::temp_directory_path() / L"reelview-presets";
    std::filesystem::remove_all(folder);
    std::filesystem::create_directories(folder);
    ASSERT_TRUE(program.ChooseFile(kCommandSavePreset, (folder / L"mine").wstring()));
    program.Command(kCommandDefaults);
    EXPECT_TRUE(tint(0.5));
    std::wstring saved;
    ASSERT_TRUE(WaitFor([&] {
        for (const auto& entry : std::filesystem::directory_iterator(folder)) saved = entry.path().wstring();
        return !saved.empty();
    }));
    ASSERT_TRUE(program.ChooseFile(kCommandLoadPreset, saved));
    EXPECT_TRUE(tint(0.745));
    EXPECT_EQ(program.Close(), 0u);
}

TEST(ReelView, OptionsChangeHowKnobsTurn) {
    Program program(WithRecorder("Film Look"));
    ASSERT_TRUE(WaitFor([] { return LastRecorded().has_value(); }));
    const HWND knob = program.Control(kFirstControl + 5);  // film gamma, from 0
    for (const bool isVertical : {true, false}) {
        program.Command(kCommandOptions);
        const HWND dialog = program.Dialog();
        ASSERT_NE(dialog, nullptr);
        SendDlgItemMessageW(dialog, 230, BM_SETCHECK, isVertical ? BST_CHECKED : BST_UNCHECKED, 0);
        PostMessageW(dialog, WM_COMMAND, IDOK, 0);
        ASSERT_TRUE(WaitFor([&] { return !IsWindow(dialog) && IsWindowEnabled(program.Window()) != FALSE; }));
        ASSERT_TRUE(program.Answers());
        SendMessageW(knob, WM_LBUTTONDBLCLK, MK_LBUTTON, MAKELPARAM(20, 20));
        ASSERT_TRUE(BecomesNumber(5, 0.0)) << std::filesystem::path(program.Status());
        // Straight up through the centre: half the range for a 200-pixel travel, or no turn at all.
        RECT area = {};
        GetClientRect(knob, &area);
        const LONG c = area.right / 2;
        Drag(knob, {{c, c + 20}, {c, c - 80}});
        if (isVertical) {
            EXPECT_TRUE(BecomesNumber(5, 0.5));
        } else {
            EXPECT_TRUE(Becomes(5, [](ValueWord word) { return word.number < 0.01 || word.number > 0.6; }));
        }
    }
}

TEST(ReelView, PlaysAndSteps) {
    Program program(Quoted(Media(L"small.y4m")));
    const auto shows = [&](const wchar_t* text) {
        return WaitFor([&] { return program.Status().starts_with(text); }, 10.0);
    };
    ASSERT_TRUE(shows(L"Frame 1 / 12"));
    const HWND picture = program.Control(kControlPicture);
    Key(picture, VK_RIGHT);
    EXPECT_TRUE(shows(L"Frame 2 / 12"));
    Key(picture, VK_END);
    EXPECT_TRUE(shows(L"Frame 12 / 12"));
    Press(program.Control(kTransportPrevious), 5, 5);
    EXPECT_TRUE(shows(L"Frame 11 / 12"));
    SendMessageW(program.Control(kTransportScrub), WM_KEYDOWN, VK_HOME, 0);
    EXPECT_TRUE(shows(L"Frame 1 / 12"));
    Press(program.Control(kTransportLoop), 5, 5);
    Press(program.Control(kTransportPlay), 5, 5);
    EXPECT_TRUE(shows(L"Frame 12 / 12")) << "without loop it plays to the end";
    for (const int command :
         {kCommandAfter, kCommandSideBySide, kCommandFull, kCommandDouble, kCommandFit, kCommandDivider}) {
        program.Command(command);
        EXPECT_TRUE(program.Answers());
    }
    EXPECT_EQ(program.Close(), 0u);
}

TEST(ReelView, DividerShowsMoreOfBefore) {
    Program program(L"--effect \"Film Look\" " + Quoted(Media(L"white.png")));
    ASSERT_TRUE(WaitFor([&] { return program.Status().find(L"Frame") != std::wstring::npos; }));
    const HWND field = program.Control(kFirstField + 3), picture = program.Control(kControlPicture);
    SendMessageW(field, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(L"-100"));
    Key(field, VK_RETURN);
    RECT area = {};
    GetClientRect(picture, &area);
    const auto isWhite = [&](int percent) {
        // Another process's window can only be read from the screen.
        POINT place = {area.right * percent / 100, area.bottom / 2 + 40};
        ClientToScreen(picture, &place);
        const HDC dc = GetDC(nullptr);
        const COLORREF colour = GetPixel(dc, place.x, place.y);
        ReleaseDC(nullptr, dc);
        return colour == RGB(255, 255, 255);
    };
    EXPECT_TRUE(WaitFor([&] { return isWhite(40) && !isWhite(60); })) << "the divider stands in the middle";
    Drag(picture, {{area.right / 2, 100}, {area.right * 7 / 10, 100}});
    EXPECT_TRUE(WaitFor([&] { return isWhite(60) && !isWhite(80); })) << "the divider follows the mouse";
}

std::wstring CopiedText() {
    const std::vector<char> bytes = Clipboard(CF_UNICODETEXT);
    std::wstring text(bytes.size() / sizeof(wchar_t), L'\0');
    std::memcpy(text.data(), bytes.data(), text.size() * sizeof(wchar_t));
    return text.c_str();
}

TEST(ReelView, CopiesTheCommandForNumberedPictures) {
    Program program(L"--effect \"Film Look\"");
    struct Row {
        std::vector<std::wstring> files;
        const wchar_t* input;
        const wchar_t* output;
        const wchar_t* options;  // null: there is no such command
    };
    for (const Row& row : {Row{{L"seq02.png", L"seq03.png", L"seq04.png"},
                               L"seq%02d.png",
                               L"seq%02d-film.png",
                               L" --rate 25 --start-number 2 --frames 0:3"},
                           Row{{L"picture.png"}, L"picture.png", L"picture-film.png", L""},
                           Row{{L"seq02.png", L"seq04.png"}, L"", L"", nullptr}}) {
        std::vector<std::wstring> files;
        for (const std::wstring& name : row.files) files.push_back(Media(name));
        program.Drop(files);
        const std::wstring count = L"Frame 1 / " + std::to_wstring(files.size());
        ASSERT_TRUE(WaitFor([&] { return program.Status().starts_with(count + L' '); }));
        ASSERT_TRUE(OpenClipboard(nullptr) && EmptyClipboard() && CloseClipboard());
        program.Command(kCommandCopyCommand);
        if (row.options == nullptr) {
            EXPECT_TRUE(
                WaitFor([&] { return program.Status().find(L"without gaps") != std::wstring::npos; }));
            EXPECT_EQ(CopiedText(), L"");
            continue;
        }
        const std::wstring line = L"reelfx render " + Quoted(Media(row.input)) + L' ' +
                                  Quoted(Media(row.output)) + row.options + L" --effect \"Film Look\"";
        EXPECT_TRUE(WaitFor([&] { return CopiedText() == line; })) << std::filesystem::path(CopiedText());
    }
}

TEST(ReelView, SavesWithACodec) {
    Program program(L"--effect \"Film Look\" " + Quoted(Media(L"small.y4m")));
    ASSERT_TRUE(WaitFor([&] { return program.Status().starts_with(L"Frame 1 / 12"); }));
    const auto choose = [&](const wchar_t* codec, bool accepts) {
        ASSERT_TRUE(program.ChooseFile(kCommandSaveClip, Media(L"codec.avi"), 2));
        const HWND dialog = program.Dialog();
        ASSERT_NE(dialog, nullptr) << std::filesystem::path(program.Status());
        constexpr int kCodecs = 880;
        const HWND list = GetDlgItem(dialog, kCodecs);
        const LRESULT found =
            SendMessageW(list, CB_SELECTSTRING, static_cast<WPARAM>(-1), reinterpret_cast<LPARAM>(codec));
        ASSERT_NE(found, CB_ERR) << std::filesystem::path(codec) << " is not offered";
        SendMessageW(dialog, WM_COMMAND, MAKEWPARAM(kCodecs, CBN_SELCHANGE), reinterpret_cast<LPARAM>(list));
        PostMessageW(dialog, WM_COMMAND, accepts ? IDOK : IDCANCEL, 0);
        ASSERT_TRUE(WaitFor([&] { return !IsWindow(dialog); }));
    };
    choose(L"Wine Video 1", false);
    EXPECT_TRUE(program.Answers());
    EXPECT_EQ(program.Status().find(L"codec.avi"), std::wstring::npos);
    // Of Wine's codecs none compresses 24-bit pictures.
    choose(L"Wine Video 1", true);
    EXPECT_NE(program.CloseDialogs().find(L"codec does not accept"), std::wstring::npos);
    EXPECT_FALSE(std::filesystem::exists(Media(L"codec.avi")));
    choose(L"Full Frames", true);
    EXPECT_TRUE(WaitFor([&] { return program.Status().find(L"codec.avi") != std::wstring::npos; }))
        << std::filesystem::path(program.Status());
    EXPECT_EQ(program.Close(), 0u);
}

TEST(ReelView, SavesFramesAndClips) {
    Program program(L"--effect \"Film Look\" " + Quoted(Media(L"small.y4m")));
    ASSERT_TRUE(WaitFor([&] { return program.Status().starts_with(L"Frame 1 / 12"); }));
    Press(program.Control(kControlPresets), 40, 20);
    for (const wchar_t* name : {L"saved.y4m", L"saved.avi", L"saved.png"}) {
        ASSERT_TRUE(program.ChooseFile(kCommandSaveClip, Media(name)));
        EXPECT_TRUE(WaitFor([&] { return program.Status().find(name) != std::wstring::npos; }))
            << std::filesystem::path(program.Status());
    }
    ASSERT_TRUE(program.ChooseFile(kCommandSaveFrame, Media(L"frame.png")));
    EXPECT_TRUE(WaitFor([&] { return program.Status().find(L"frame.png") != std::wstring::npos; }));
    program.Command(kCommandCopyFrame);
    std::vector<char> copied;
    ASSERT_TRUE(WaitFor([&] { return !(copied = Clipboard(CF_DIB)).empty(); }));
    constexpr DWORD kHeads = sizeof(BITMAPFILEHEADER) + sizeof(BITMAPINFOHEADER);
    const BITMAPFILEHEADER head = {0x4D42, static_cast<DWORD>(copied.size() + sizeof head), 0, 0, kHeads};
    std::ofstream(std::filesystem::path(Media(L"copied.bmp")), std::ios::binary)
        .write(reinterpret_cast<const char*>(&head), sizeof head)
        .write(copied.data(), static_cast<std::streamsize>(copied.size()));
    program.Command(kCommandCopyCommand);
    ASSERT_TRUE(WaitFor([&] { return !Clipboard(CF_UNICODETEXT).empty(); }));
    const std::wstring command = CopiedText();
    EXPECT_TRUE(command.starts_with(L"reelfx render " + Quoted(Media(L"small.y4m")) + L' ' +
                                    Quoted(Media(L"small-film.y4m")) + L" --effect"));
    std::wofstream(std::filesystem::path(Media(L"command.txt"))) << command.substr(command.find(L"--"));
    // Saving the same pictures again would overwrite existing ones.
    ASSERT_TRUE(program.ChooseFile(kCommandSaveClip, Media(L"saved.png")));
    EXPECT_NE(program.CloseDialogs().find(L"already"), std::wstring::npos);
    EXPECT_EQ(program.Close(), 0u);
}

TEST(ReelView, ClosingAndCancellingLeaveNothing) {
    for (const bool closes : {false, true}) {
        Program program(L"--effect \"Film Pro\" " + Quoted(Media(L"long.y4m")));
        ASSERT_TRUE(WaitFor([&] { return program.Status().starts_with(L"Frame 1"); }));
        ASSERT_TRUE(program.ChooseFile(kCommandSaveClip, Media(L"given-up.y4m")));
        if (closes) {
            EXPECT_EQ(program.Close(), 0u);
        } else {
            HWND progress = nullptr;
            ASSERT_TRUE(WaitFor(
                [&] { return (progress = FindWindowW(L"Velmora Reel Progress", nullptr)) != nullptr; }));
            PostMessageW(progress, WM_COMMAND, IDCANCEL, 0);
            EXPECT_TRUE(WaitFor([&] { return !IsWindow(progress); }));
            EXPECT_TRUE(program.Answers());
        }
        for (const auto& entry : std::filesystem::directory_iterator(Media())) {
            EXPECT_FALSE(entry.path().filename().wstring().starts_with(L"given-up")) << entry.path();
        }
    }
}

TEST(ReelView, GrowsWithTheResolution) {
    Program program(Quoted(Media(L"picture.png")));
    const HWND knob = program.Control(kFirstControl);
    RECT before = {}, after = {}, place = {0, 0, 1600, 1100};
    GetClientRect(knob, &before);
    // The structure is read from the program's own memory, so it must be allocated there.
    void* const remote = VirtualAllocEx(program.Process(), nullptr, sizeof place, MEM_COMMIT, PAGE_READWRITE);
    WriteProcessMemory(program.Process(), remote, &place, sizeof place, nullptr);
    SendMessageW(program.Window(), WM_DPICHANGED, MAKEWPARAM(192, 192), reinterpret_cast<LPARAM>(remote));
    GetClientRect(program.Control(kFirstControl), &after);
    EXPECT_EQ(after.right, 2 * before.right);
    EXPECT_EQ(program.Close(), 0u);
}

TEST(ReelView, ScreenReadersSeeKnobs) {
    Program program(Quoted(Media(L"picture.png")) + L" --effect \"Film Look\"");
    CoInitialize(nullptr);
    IAccessible* knob = nullptr;
    ASSERT_EQ(AccessibleObjectFromWindow(program.Control(kFirstControl + 2), static_cast<DWORD>(OBJID_CLIENT),
                                         IID_IAccessible, reinterpret_cast<void**>(&knob)),
              S_OK);
    VARIANT self = {}, role = {};
    self.vt = VT_I4;
    BSTR name = nullptr, value = nullptr;
    EXPECT_EQ(knob->get_accName(self, &name), S_OK);
    EXPECT_STREQ(name, L"Saturation");
    EXPECT_EQ(knob->get_accRole(self, &role), S_OK);
    EXPECT_EQ(role.lVal, static_cast<LONG>(ROLE_SYSTEM_SLIDER));
    const BSTR typed = SysAllocString(L"42");
    EXPECT_EQ(knob->put_accValue(self, typed), S_OK);
    EXPECT_EQ(knob->get_accValue(self, &value), S_OK);
    EXPECT_STREQ(value, L"42");
    for (const BSTR text : {name, value, typed}) SysFreeString(text);
    knob->Release();
    CoUninitialize();
}

TEST(ReelView, SurvivesLibrariesThatFail) {
    struct Row {
        const wchar_t* fault;
        const wchar_t* message;  // in a box or, if there is no box, in the status line
    };
    for (const Row& row : {Row{L"crashes", L"failed"}, Row{L"refuses", L"cannot render"},
                           Row{L"describes-for-ever", L"Frame"}, Row{L"hangs", L"does not answer"},
                           Row{L"aborts", L"failed"}, Row{L"ends-the-process", L"failed"},
                           Row{L"raises", L"failed"}, Row{L"crashes-at-once", L"failed"}}) {
        SetEnvironmentVariableW(L"REELVIEW_FAULT", row.fault);
        Program program(WithRecorder("Film Look"));
        SetEnvironmentVariableW(L"REELVIEW_FAULT", nullptr);
        const std::wstring fault = row.fault;
        if (std::wstring(row.message) == L"failed") {
            EXPECT_NE(program.CloseDialogs().find(row.message), std::wstring::npos)
                << std::filesystem::path(fault);
        } else {
            EXPECT_TRUE(WaitFor([&] { return program.Status().find(row.message) != std::wstring::npos; }))
                << std::filesystem::path(fault);
        }
        if (fault == L"crashes-at-once") continue;
        EXPECT_TRUE(program.Answers()) << std::filesystem::path(fault);
        EXPECT_EQ(program.Close(), fault == L"hangs" ? 2u : 0u) << std::filesystem::path(fault);
    }
}

TEST(ReelView, SpeaksTheUsersLanguage) {
    Program program(L"");
    const std::wstring expected = Variable(L"REELVIEW_PRESETS_WORD");
    const HWND list = program.Control(kControlPresets);
    EXPECT_EQ(TextOf(list), expected);
}

}  // namespace
}  // namespace velmora::reelview::test
