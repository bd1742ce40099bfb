// The module in libobs, drawn by the processor on a hidden screen: what arrives on the canvas, byte for byte.
#include <gtest/gtest.h>
#include <util/bmem.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <memory>
#include <set>

#include "effects/effect_queries.h"
#include "effects/effect_session.h"
#include "tests/faces/obs/obs_host.h"

namespace velmora::test {
namespace {

using Source = std::unique_ptr<obs_source_t, ObsDeleter<obs_source_t, obs_source_release>>;
using Data = std::unique_ptr<obs_data_t, ObsDeleter<obs_data_t, obs_data_release>>;
using Properties = std::unique_ptr<obs_properties_t, ObsDeleter<obs_properties_t, obs_properties_destroy>>;

// Enough frames for a change to reach the canvas: the filter's delay and libobs' own.
constexpr int kSettled = 6;

std::string IdOf(const effects::EffectTable& effect) {
    return "velmora_" + effects::IdentifierOf(effect.name);
}

Picture Rendered(const effects::EffectTable& effect, const char* preset, std::uint32_t seed, double seconds,
                 Picture picture) {
    const auto session = effects::EffectSession::Create(effect);
    session->ApplyPreset(*effects::FindPreset(effect, preset));
    session->PinRandom(seed);
    const auto width = static_cast<std::int32_t>(picture.width),
               height = static_cast<std::int32_t>(picture.height);
    Picture result = picture;
    EXPECT_TRUE(session->Render({picture.pixels.data(), width, height, width * 4, 0, 0, 0},
                                {result.pixels.data(), width, height, width * 4, 0, 0, 0}, seconds));
    return result;
}

class ObsFilter : public testing::Test {
  protected:
    static void SetUpTestSuite() { StartObs(); }
    static void TearDownTestSuite() {
        EndObs();
        EXPECT_EQ(bnum_allocs(), 0) << "blocks that libobs or the module has not freed";
    }
    void SetUp() override {
        TheFilm().width = kCanvasWidth;
        TheFilm().height = kCanvasHeight;
        TheFilm().alpha = 0xFF;
        TheFilm().position = 0;
        Show("test_film");
    }
    void TearDown() override {
        obs_set_output_source(0, nullptr);
        if (m_filter) obs_source_filter_remove(m_source.get(), m_filter.get());
        m_filter.reset();
        m_source.reset();
        obs_wait_for_destroy_queue();
    }

    void Show(const char* id) {
        m_source.reset(obs_source_create(id, "source", nullptr, nullptr));
        obs_set_output_source(0, m_source.get());
    }
    void AddFilter(const effects::EffectTable& effect, const char* preset, int seed,
                   bool followsSource = true) {
        if (m_filter) obs_source_filter_remove(m_source.get(), m_filter.get());
        const Data settings(obs_data_create());
        obs_data_set_string(settings.get(), "preset", preset);
        obs_data_set_int(settings.get(), "seed", seed);
        obs_data_set_bool(settings.get(), "source_time", followsSource);
        m_filter.reset(obs_source_create(IdOf(effect).c_str(), "filter", settings.get(), nullptr));
        obs_source_filter_add(m_source.get(), m_filter.get());
    }
    Data Settings() { return Data(obs_source_get_settings(m_filter.get())); }
    Properties Panel() { return Properties(obs_source_properties(m_filter.get())); }
    bool Choose(obs_properties_t* panel, const char* key, const char* text) {
        const Data settings = Settings();
        obs_data_set_string(settings.get(), key, text);
        return obs_property_modified(obs_properties_get(panel, key), settings.get());
    }

    Source m_source;
    Source m_filter;
};

TEST_F(ObsFilter, ShowsTheRenderersFramesAtTheFilmsPosition) {
    const struct {
        std::int64_t position;
        double seconds;
    } times[] = {{0, 0.0}, {33, 1 / 30.0}, {5040, 5.04}, {3600066, 3600 + 2 / 30.0}};
    int seed = 0;
    for (const effects::EffectTable* effect : effects::kAllEffects) {
        const auto& time = times[seed % 4];
        const char* preset = effect->presetNames[3];
        TheFilm().position = time.position;
        AddFilter(*effect, preset, seed);
        EXPECT_EQ(CanvasAfter(kSettled),
                  Rendered(*effect, preset, static_cast<std::uint32_t>(seed), time.seconds, FilmPicture()))
            << effect->name;
        ++seed;
    }
    obs_source_set_enabled(m_filter.get(), false);
    EXPECT_EQ(CanvasAfter(kSettled), FilmPicture());
    AddFilter(effects::kFilmPro, "", 5);
    EXPECT_EQ(CanvasAfter(kSettled), FilmPicture()) << "defaults must change nothing";
}

TEST_F(ObsFilter, RunsWithTheClockOneFrameAfterTheOther) {
    AddFilter(effects::kFilmPro, "Super 8", 9, false);
    static_cast<void>(CanvasAfter(kSettled));
    const std::vector<Picture> canvases = Canvases(8);
    int frame = 0;
    const auto shows = [&](const Picture& canvas) {
        return canvas == Rendered(effects::kFilmPro, "Super 8", 9, frame / 30.0, FilmPicture());
    };
    while (!shows(canvases.front()) && frame < 300) ++frame;
    for (const Picture& canvas : canvases) {
        // A busy machine may make OBS show a frame twice or skip one.
        for (int tries = 0; !shows(canvas) && tries < 30; ++tries) ++frame;
        EXPECT_TRUE(shows(canvas));
    }
    EXPECT_GT(frame, 1);
    EXPECT_LT(frame, 300);
}

TEST_F(ObsFilter, TakesEveryFormatOfAsynchronousSources) {
    Show("test_camera");
    for (const video_format format :
         {VIDEO_FORMAT_BGRA, VIDEO_FORMAT_BGRX, VIDEO_FORMAT_RGBA, VIDEO_FORMAT_NV12, VIDEO_FORMAT_I420,
          VIDEO_FORMAT_YUY2, VIDEO_FORMAT_UYVY, VIDEO_FORMAT_Y800}) {
        OutputFrame(m_source.get(), format);
        const Picture plain = CanvasAfter(kSettled);
        ASSERT_GT(std::set(plain.pixels.begin(), plain.pixels.end()).size(), 50u) << "no picture";
        // Film Look draws no random numbers: any time gives the same picture.
        AddFilter(effects::kFilmLook, "Kodachrome", 1);
        EXPECT_EQ(CanvasAfter(kSettled), Rendered(effects::kFilmLook, "Kodachrome", 1, 0.0, plain))
            << get_video_format_name(format);
        obs_source_filter_remove(m_source.get(), m_filter.get());
        m_filter.reset();
    }
}

TEST_F(ObsFilter, SurvivesChangesOfSizeScenesAndVisibility) {
    AddFilter(effects::kFilmPro, "Oldie", 3);
    const auto showsTheFilm = [&] {
        const Picture canvas = CanvasAfter(kSettled);
        const Picture expected = Rendered(effects::kFilmPro, "Oldie", 3, 0.0, FilmPicture());
        for (std::uint32_t y = 0; y < expected.height; ++y) {
            const auto row = expected.pixels.begin() + y * expected.width;
            if (!std::equal(row, row + expected.width, canvas.pixels.begin() + y * kCanvasWidth))
                return false;
        }
        return true;
    };
    const std::pair<std::uint32_t, std::uint32_t> sizes[] = {{64, 32}, {157, 5}, {1, 1}, {160, 96}};
    for (const auto& [width, height] : sizes) {
        TheFilm().width = width;
        TheFilm().height = height;
        EXPECT_TRUE(showsTheFilm()) << width << "x" << height;
    }
    TheFilm().width = 0;
    static_cast<void>(CanvasAfter(kSettled));
    TheFilm().width = 40;
    EXPECT_TRUE(showsTheFilm()) << "after a time without a picture";

    obs_scene_t* scenes[] = {obs_scene_create("a"), obs_scene_create("b")};
    obs_sceneitem_t* item = nullptr;
    for (obs_scene_t* scene : scenes) item = obs_scene_add(scene, m_source.get());
    for (int i = 0; i < 10; ++i) {
        obs_set_output_source(0, i % 3 == 2 ? nullptr : obs_scene_get_source(scenes[i % 2]));
        obs_sceneitem_set_visible(item, i % 2 == 0);
        static_cast<void>(CanvasAfter(1 + i % 3));
    }
    obs_sceneitem_set_visible(item, true);
    obs_set_output_source(0, obs_scene_get_source(scenes[1]));
    EXPECT_TRUE(showsTheFilm()) << "in a scene";
    for (obs_scene_t* scene : scenes) obs_scene_release(scene);
}

TEST_F(ObsFilter, LeavesTransparentPartsTransparent) {
    TheFilm().alpha = 0;
    AddFilter(effects::kFilmPro, "Bleached", 3);
    const Picture canvas = CanvasAfter(kSettled);
    EXPECT_TRUE(std::ranges::all_of(canvas.pixels, [](std::uint32_t p) { return (p & 0xFFFFFFu) == 0; }));
}

TEST_F(ObsFilter, AllocatesNothingPerFrameAndLeaksNothing) {
    const auto handles = [] {
        const std::filesystem::directory_iterator folder("/proc/self/fd");
        return std::distance(begin(folder), end(folder));
    };
    TheFilm().position = 40;
    const auto addAndRemove = [&](int times) {
        for (int i = 0; i < times; ++i) {
            AddFilter(*effects::kAllEffects[static_cast<std::size_t>(i) % 5], "Bleached", i);
            if (i % 10 == 0) static_cast<void>(CanvasAfter(2));
        }
        obs_source_filter_remove(m_source.get(), m_filter.get());
        m_filter.reset();
        static_cast<void>(CanvasAfter(kSettled));
        obs_wait_for_destroy_queue();
    };
    addAndRemove(20);
    const long blocks = bnum_allocs();
    const auto files = handles();
    addAndRemove(200);
    EXPECT_EQ(bnum_allocs(), blocks);
    EXPECT_EQ(handles(), files);

    Show("test_camera");
    OutputFrame(m_source.get(), VIDEO_FORMAT_NV12);
    AddFilter(effects::kFilmPro, "Super 8", 1, false);
    static_cast<void>(CanvasAfter(20));
    const long before = GraphicsAllocations(), blocksBefore = bnum_allocs();
    static_cast<void>(CanvasAfter(30));
    EXPECT_EQ(GraphicsAllocations(), before);
    EXPECT_EQ(bnum_allocs(), blocksBefore);
}

TEST_F(ObsFilter, KeepsItsSettings) {
    AddFilter(effects::kFilmPro, "Super 8", 77);
    const Data saved(obs_save_source(m_filter.get()));
    // As text, as in a scene collection: the saved object shares the filter's settings.
    const Data read(obs_data_create_from_json(std::string(obs_data_get_json(saved.get())).c_str()));
    const Source loaded(obs_load_source(read.get()));
    const Data copy(obs_source_get_settings(loaded.get()));
    const std::string kept = obs_data_get_json(copy.get());
    EXPECT_EQ(kept, obs_data_get_json(Settings().get()));
    EXPECT_EQ(obs_data_get_double(copy.get(), "wear"), 30.0);
    EXPECT_EQ(obs_data_get_double(copy.get(), "y_jitter"), 0.6);
    EXPECT_STREQ(obs_data_get_string(copy.get(), "pattern"), "Grainy");
    EXPECT_EQ(obs_data_get_int(copy.get(), "tint_colour") & 0xFFFFFF, 0x398FE6);
    EXPECT_TRUE(obs_data_get_bool(copy.get(), "thick"));

    // The user's own change wins over the preset, also after loading.
    const Properties panel = Panel();
    obs_data_set_double(Settings().get(), "wear", 12.5);
    EXPECT_FALSE(obs_property_modified(obs_properties_get(panel.get(), "wear"), Settings().get()));
    EXPECT_STREQ(obs_data_get_string(Settings().get(), "preset"), "");
    EXPECT_TRUE(Choose(panel.get(), "preset", "Oldie"));
    EXPECT_EQ(obs_data_get_double(Settings().get(), "wear"), 22.0);
    EXPECT_FALSE(Choose(panel.get(), "preset", "Oldie")) << "opening the panel must not set anything again";
}

TEST_F(ObsFilter, ExchangesPresetFiles) {
    const std::filesystem::path folder = std::filesystem::temp_directory_path() / "velmora-obs-test-é";
    std::filesystem::create_directories(folder);
    const std::string file = (folder / "mine").string();
    AddFilter(effects::kFilmLook, "Rust", 0);
    const Properties panel = Panel();
    EXPECT_TRUE(Choose(panel.get(), "save_preset", file.c_str()));
    AddFilter(effects::kFilmLook, "", 0);
    const Properties other = Panel();
    EXPECT_TRUE(Choose(other.get(), "load_preset", (file + ".fxprelb").c_str()));
    EXPECT_EQ(CanvasAfter(kSettled), Rendered(effects::kFilmLook, "Rust", 0, 0.0, FilmPicture()));
    EXPECT_FALSE(obs_property_visible(obs_properties_get(other.get(), "message")));
    EXPECT_STREQ(obs_data_get_string(Settings().get(), "load_preset"), "");

    AddFilter(effects::kFilmPro, "Oldie", 0);
    const Properties wrong = Panel();
    EXPECT_TRUE(Choose(wrong.get(), "load_preset", (file + ".fxprelb").c_str()))
        << "a preset of another effect";
    EXPECT_TRUE(obs_property_visible(obs_properties_get(wrong.get(), "message")));
    EXPECT_EQ(obs_data_get_double(Settings().get(), "wear"), 22.0);
    EXPECT_TRUE(Choose(wrong.get(), "save_preset", (folder / "no such folder" / "x").c_str()));
    EXPECT_STREQ(obs_property_description(obs_properties_get(wrong.get(), "message")),
                 "Die Voreinstellungsdatei konnte nicht geschrieben werden.");
    std::filesystem::remove_all(folder);
}

// Walks the panel: every parameter has a control of its kind with its range and German name.
TEST_F(ObsFilter, ShowsEveryParameterInItsPanel) {
    for (const effects::EffectTable* effect : effects::kAllEffects) {
        AddFilter(*effect, "", 0);
        const Properties panel = Panel();
        EXPECT_EQ(obs_property_list_item_count(obs_properties_get(panel.get(), "preset")),
                  effect->presetNames.size() + 1);
        for (const effects::ParamRow& row : effect->params) {
            const std::string key = effects::IdentifierOf(effects::UniqueName(*effect, row));
            obs_property_t* p = obs_properties_get(
                panel.get(), effects::HoldsValue(row) ? key.c_str() : ("group_" + key).c_str());
            if (row.kind == kKindGroup && row.isGroupEnd) continue;
            ASSERT_NE(p, nullptr) << key;
            const obs_property_type type = obs_property_get_type(p);
            switch (row.kind) {
                case kKindSlider:
                    EXPECT_EQ(type, OBS_PROPERTY_FLOAT);
                    EXPECT_EQ(obs_property_float_min(p), double{row.minimum});
                    EXPECT_EQ(obs_property_float_max(p), double{row.maximum});
                    EXPECT_STREQ(obs_property_float_suffix(p), row.maximum < 100 ? nullptr : " %");
                    break;
                case kKindMenu:
                    EXPECT_EQ(obs_property_list_item_count(p), row.items.size());
                    EXPECT_STREQ(obs_property_list_item_name(p, 2), "Körnig");
                    break;
                default:
                    EXPECT_EQ(type, row.kind == kKindColour     ? OBS_PROPERTY_COLOR
                                    : row.kind == kKindCheckBox ? OBS_PROPERTY_BOOL
                                                                : OBS_PROPERTY_GROUP);
            }
        }
        EXPECT_STREQ(obs_property_description(obs_properties_get(panel.get(), "seed")), "Startwert");
        const long long seed = obs_data_get_int(Settings().get(), "seed");
        EXPECT_TRUE(obs_property_button_clicked(obs_properties_get(panel.get(), "new_seed"), nullptr));
        EXPECT_NE(obs_data_get_int(Settings().get(), "seed"), seed);
    }
}

}  // namespace
}  // namespace velmora::test
