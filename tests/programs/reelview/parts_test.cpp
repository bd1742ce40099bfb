// Parts that need no window and no file: panels, knobs, values, settings, time and the picture's position.

#include <gtest/gtest.h>

#include <fstream>
#include <future>
#include <iterator>
#include <regex>
#include <string>
#include <vector>

#include "language/language_table.h"
#include "programs/reelview/base/texts.h"
#include "programs/reelview/document/command_line.h"
#include "programs/reelview/document/settings_history.h"
#include "programs/reelview/library/worker.h"
#include "programs/reelview/panel/knob.h"
#include "programs/reelview/panel/panel_layout.h"
#include "programs/reelview/view/transport.h"
#include "programs/reelview/view/view_geometry.h"

namespace velmora::reelview {
namespace {

hosts::ParamInfo Slider(const char* name, float minimum, float maximum, Box place = {}) {
    hosts::ParamInfo param;
    param.name = name;
    param.kind = kKindSlider;
    param.minimum = minimum;
    param.maximum = maximum;
    param.x = place.left;
    param.y = place.top;
    param.width = place.right;
    param.height = place.bottom;
    return param;
}

ValueWord Value(float number) {
    ValueWord word{};
    word.number = number;
    return word;
}

TEST(PanelLayout, SlidersAreBarsWhereTheyFit) {
    const auto shapeOf = [](const std::vector<hosts::ParamInfo>& params) {
        return LayOutPanel(params, {1.0, 1.0}).items.at(0).shape;
    };
    const auto at = [](std::int32_t x, std::int32_t y) { return Slider("a", 0, 1, {x, y, 198, 30}); };
    EXPECT_EQ(shapeOf({at(0, 0), at(0, 30)}), PanelShape::kBar);
    EXPECT_EQ(shapeOf({at(0, 0), at(66, 0)}), PanelShape::kKnob) << "bars would lie on one another";
    EXPECT_EQ(shapeOf({Slider("a", 0, 1)}), PanelShape::kKnob) << "no size is stated";
}

TEST(PanelLayout, HoldsWhatACarelessLibraryGives) {
    std::vector<hosts::ParamInfo> params = {Slider("far", 0, 1, {2147483647, -5, -2147483647, 7})};
    hosts::ParamInfo end;
    end.kind = kKindGroup;
    end.isGroupEnd = true;
    end.width = 2147483647;
    end.height = 2147483647;
    params.push_back(end);
    const PanelLayout layout = LayOutPanel(params, {3.5, 3.5});
    EXPECT_GT(layout.width, 0);
    EXPECT_LT(layout.width, 32767);
    EXPECT_LT(layout.height, 32767);
    params[0].isVisible = false;
    EXPECT_EQ(LayOutPanel(params, {}).items.size(), 1u);
}

TEST(KnobMotion, FollowsTheMouse) {
    EXPECT_DOUBLE_EQ(KnobAngle(0.0), -135.0);
    EXPECT_DOUBLE_EQ(KnobAngle(0.5), 0.0);
    KnobDrag drag;
    drag.Begin(DragWay::kCircle, 0.5, 0.0, -20.0, 200.0);
    EXPECT_NEAR(drag.Move(20.0, 0.0, false), 0.5 + 90.0 / 270.0, 1e-9) << "a quarter turn clockwise";
    EXPECT_DOUBLE_EQ(drag.Move(0.0, 20.0, false), 1.0) << "held at the end";
    EXPECT_DOUBLE_EQ(drag.Move(0.5, 0.5, false), 1.0) << "the centre says nothing";
    drag.Begin(DragWay::kCircle, 0.0, -1.0, 20.0, 200.0);
    EXPECT_LT(drag.Move(-5.0, 19.0, false), 0.1) << "no jump through the gap below";
    drag.Begin(DragWay::kVertical, 0.5, 0.0, 0.0, 200.0);
    EXPECT_DOUBLE_EQ(drag.Move(50.0, -50.0, false), 0.75);
    EXPECT_DOUBLE_EQ(drag.Move(50.0, -100.0, true), 0.775);
    EXPECT_DOUBLE_EQ(AfterKey(0.5, KnobKey::kPageDown, false), 0.4);
    EXPECT_DOUBLE_EQ(AfterKey(0.995, KnobKey::kUp, false), 1.0);
    EXPECT_DOUBLE_EQ(AfterWheel(0.5, -2.0, true), 0.498);
}

TEST(KnobPicture, PointsWhereTheValueIs) {
    KnobColours colours;
    const auto isPointer = [&](double value, int x, int y) {
        KnobLook look;
        look.value = value;
        const Picture picture = DrawKnob(64, look, colours);
        const std::uint8_t* const pixel = picture.pixels.data() + (y * 64 + x) * 4;
        return pixel[0] < 0x60 && pixel[1] < 0x60 && pixel[2] < 0x60;
    };
    EXPECT_TRUE(isPointer(0.5, 32, 19));
    EXPECT_FALSE(isPointer(0.5, 45, 32));
    EXPECT_TRUE(isPointer(0.5 + 90.0 / 270.0, 45, 32)) << "a quarter turn to the right";
}

TEST(ValueText, ShowsAndReads) {
    struct Row {
        float minimum, maximum;
        double value;
        const char* shown;
    };
    for (const Row& row : {Row{0, 100, 0.245, "24.5"}, Row{-100, 100, 0.5, "0"}, Row{-100, 100, 0.0, "-100"},
                           Row{0, 10, 0.025, "0.25"}, Row{0, 1, 0.5, "0.5"}, Row{0, 5000, 0.5, "2500"}}) {
        const hosts::ParamInfo param = Slider("p", row.minimum, row.maximum);
        EXPECT_EQ(SliderText(param, row.value, '.'), row.shown);
        EXPECT_NEAR(TypedSlider(param, row.shown).value_or(9.0), row.value, 1e-9);
    }
    const hosts::ParamInfo param = Slider("p", -100, 100);
    EXPECT_EQ(SliderText(param, 0.6125, ','), "22,5");
    EXPECT_DOUBLE_EQ(TypedSlider(param, " 22,5 ").value_or(9.0), 0.6125);
    EXPECT_DOUBLE_EQ(TypedSlider(param, "1e9").value_or(9.0), 1.0);
    for (const char* text : {"", "abc", "1.2.3", "nan", "--1"})
        EXPECT_FALSE(TypedSlider(param, text)) << text;
    EXPECT_EQ(TypedColour("#102030"), 0x302010u);
    EXPECT_FALSE(TypedColour("#10203"));
    EXPECT_FALSE(TypedSlider(Slider("flat", 1, 1), "1"));
}

TEST(SettingsHistory, UndoesDragsAtOnce) {
    hosts::EffectInfo effect;
    effect.params = {Slider("a", 0, 1), Slider("b", 0, 1)};
    SettingsHistory history({effect, effect});
    history.Set(0, Value(0.1f), 7);
    history.Set(0, Value(0.2f), 7);
    history.Set(0, Value(0.3f), 0);
    history.ChooseEffect(1);
    history.Undo();
    EXPECT_EQ(history.Now().effect, 0u);
    history.Undo();
    EXPECT_EQ(history.Now().Current()[0].number, 0.2f);
    history.Undo();
    EXPECT_FALSE(history.CanUndo());
    history.Redo();
    history.Set(1, Value(0.5f), 7);
    EXPECT_FALSE(history.CanRedo());
    EXPECT_EQ(history.Now().Current()[0].number, 0.2f);
}

TEST(CommandText, WritesWhatIsSet) {
    hosts::EffectInfo effect;
    effect.name = "Film Look";
    effect.params = {Slider("Tint", -100, 100), Slider("Film Gamma", 0, 100)};
    const Values values = {Value(0.25f), Value(0.0f)};
    EXPECT_EQ(CommandText({"C:\\a b\\in.mp4", {}, 0, 0}, effect, values),
              "reelfx render \"C:\\a b\\in.mp4\" \"C:\\a b\\in-film.mp4\" --effect \"Film Look\" --set "
              "\"Tint=-50\"");
    const Values defaults = DefaultsOf(effect);
    EXPECT_EQ(CommandText({"f%03d.png", hosts::FrameRate{25, 1}, 1, 0}, effect, defaults),
              "reelfx render \"f%03d.png\" \"f%03d-film.png\" --rate 25 --effect \"Film Look\"");
    EXPECT_EQ(CommandText({"f%d.png", hosts::FrameRate{30000, 1001}, 98, 12}, effect, defaults),
              "reelfx render \"f%d.png\" \"f%d-film.png\" --rate 30000/1001 --start-number 98 --frames 0:12 "
              "--effect "
              "\"Film Look\"");
}

// Two pixels, a before b, as each Exif orientation shows them: in a row (a then b or b then a) or in a column.
TEST(Picture, TurnsAsExifSays) {
    Picture picture{{2, 1}, {'a', 0, 0, 0, 'b', 0, 0, 0}};
    struct Row {
        int orientation;
        std::int32_t width;
        char first;
    };
    for (const Row& row : {Row{1, 2, 'a'}, Row{2, 2, 'b'}, Row{3, 2, 'b'}, Row{4, 2, 'a'}, Row{5, 1, 'a'},
                           Row{6, 1, 'a'}, Row{7, 1, 'b'}, Row{8, 1, 'b'}, Row{0, 2, 'a'}, Row{9, 2, 'a'}}) {
        const Picture turned = Turned(picture, row.orientation);
        EXPECT_EQ(turned.size.width, row.width) << row.orientation;
        EXPECT_EQ(turned.pixels[0], row.first) << row.orientation;
    }
    // A column of two shows what mirrors the rows.
    picture.size = {1, 2};
    for (const Row& row : {Row{1, 1, 'a'}, Row{2, 1, 'a'}, Row{3, 1, 'b'}, Row{4, 1, 'b'}, Row{5, 2, 'a'},
                           Row{6, 2, 'b'}, Row{7, 2, 'b'}, Row{8, 2, 'a'}}) {
        EXPECT_EQ(Turned(picture, row.orientation).pixels[0], row.first) << row.orientation;
    }
}

TEST(ViewOptions, Reads) {
    const ViewOptions options =
        ReadViewOptions({u"--library", u"x.dll", u"film.y4m", u"--effect", u"Film Pro"});
    EXPECT_TRUE(options.isValid && !options.isSequence);
    EXPECT_EQ(options.library, u"x.dll");
    EXPECT_EQ(options.file, u"film.y4m");
    EXPECT_FALSE(ReadViewOptions({u"--library"}).isValid);
    EXPECT_FALSE(ReadViewOptions({u"--wrong"}).isValid);
    EXPECT_FALSE(ReadViewOptions({u"a", u"b"}).isValid);
}

TEST(Transport, PlaysAtTheClipsRate) {
    Transport transport;
    transport.Open(10, {25, 1});
    transport.Play(100.0);
    EXPECT_FALSE(transport.Advance(100.039));
    EXPECT_TRUE(transport.Advance(100.04));
    EXPECT_EQ(transport.Frame(), 1);
    EXPECT_TRUE(transport.Advance(100.2));
    EXPECT_EQ(transport.Frame(), 5) << "late frames are left out";
    EXPECT_TRUE(transport.Advance(100.44));
    EXPECT_EQ(transport.Frame(), 1) << "from the start again";
    transport.SetLoop(false);
    transport.Advance(109.0);
    EXPECT_EQ(transport.Frame(), 9);
    EXPECT_FALSE(transport.IsPlaying());
    transport.Step(5);
    EXPECT_EQ(transport.Frame(), 9);
    EXPECT_EQ(TimeText(3725.0005), "01:02:05.001");
}

TEST(ViewGeometry, PlacesThePicture) {
    ViewState state;
    const ViewPlaces fit = PlacePicture(state, {1600, 900}, 816, 616, 1.0);
    EXPECT_EQ(fit.after.Width(), 800);
    EXPECT_EQ(fit.after.Height(), 450);
    EXPECT_EQ(fit.divider, fit.before.left + 400);
    EXPECT_DOUBLE_EQ(DividerAt(fit, fit.before.left + 200), 0.25);
    EXPECT_DOUBLE_EQ(DividerAt(fit, -50), 0.0);
    state.compare = Compare::kSideBySide;
    const ViewPlaces beside = PlacePicture(state, {1600, 900}, 824, 616, 1.0);
    EXPECT_FALSE(beside.before.Meets(beside.after));
    EXPECT_EQ(beside.before.Width(), beside.after.Width());
    state = {};
    state.zoom = Zoom::kDouble;
    state.panX = 100000;
    const ViewPlaces large = PlacePicture(state, {1000, 100}, 500, 500, 2.0);
    EXPECT_EQ(large.after.Width(), 2000);
    EXPECT_EQ(large.after.left, 0) << "the left edge stops at the window's";
}

TEST(Worker, NewerPreviewsReplaceWaitingOnes) {
    std::vector<int> done;
    {
        std::promise<void> started, go;
        std::promise<void> last;
        Worker worker([] {}, [&] { done.push_back(9); });
        worker.Post([&] {
            started.set_value();
            go.get_future().wait();
        });
        started.get_future().wait();
        worker.PostIdle([&] {
            done.push_back(3);
            last.set_value();
        });
        worker.PostPreview([&] { done.push_back(0); });
        worker.PostPreview([&] { done.push_back(2); });
        worker.Post([&] { done.push_back(1); });
        go.set_value();
        last.get_future().wait();
        EXPECT_TRUE(worker.Stop(10.0));
        worker.PostPreview([&] { done.push_back(0); });
    }
    EXPECT_EQ(done, (std::vector<int>{1, 2, 3, 9}));
}

// Every text exists in every language, and menu letters are unique within their menu.
TEST(Texts, AreInTheLanguageFile) {
    const auto read = [](const char* name) {
        std::ifstream file(std::string(VELMORA_SOURCE) + name, std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(file), {});
    };
    const auto table = language::LanguageTable::Read(read("/language/VMReelEffectsLang.xml.in"));
    ASSERT_TRUE(table);
    const std::string header = read("/programs/reelview/base/texts.h");
    const std::regex constant("inline constexpr char k\\w+\\[\\] = \"(.*)\";");
    std::vector<std::string> keys;
    for (std::sregex_iterator match(header.begin(), header.end(), constant), none; match != none; ++match) {
        keys.push_back((*match)[1]);
    }
    ASSERT_GT(keys.size(), 60u);
    for (const char* code :
         {"en", "de", "fr", "es", "it", "pt", "nl", "sv", "pl", "cs", "tr", "ru", "ja", "zh", "ko"}) {
        for (const std::string& key : keys) {
            const char16_t* const text = table->Find(code, text::kCategory, key.c_str());
            ASSERT_NE(text, nullptr) << code << ": " << key;
            const bool hasLetter = key.find('&') != std::string::npos;
            EXPECT_EQ(std::u16string(text).find(u'&') != std::u16string::npos, hasLetter)
                << code << ": " << key;
        }
    }
}

}  // namespace
}  // namespace velmora::reelview
