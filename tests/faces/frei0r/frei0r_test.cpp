// The frei0r adapter alone, called as by a host. frei0r_hosts_test checks that real hosts show the frames of reelfx.
#include <frei0r.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <limits>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "effects/effect_session.h"
#include "faces/frei0r/frame_clock.h"
#include "faces/frei0r/instance.h"
#include "faces/frei0r/plugin_params.h"
#include "platform/platform.h"
#include "user_presets/file_access.h"
#include "user_presets/preset_file.h"

namespace velmora::hosts::frei0r {
namespace {

using Pixels = std::vector<std::uint32_t>;

Pixels Ramp(std::uint32_t width, std::uint32_t height) {
    Pixels pixels(std::size_t{width} * height);
    for (std::size_t i = 0; i < pixels.size(); ++i)
        pixels[i] = static_cast<std::uint32_t>(i * 0x01030507u) ^ 0x80406020u;
    return pixels;
}

int IndexOf(const PluginDescription& plugin, std::string_view name) {
    for (std::size_t i = 0; i < plugin.params.size(); ++i) {
        if (plugin.params[i].name == name) return static_cast<int>(i);
    }
    ADD_FAILURE() << plugin.name << " has no " << name;
    return -1;
}

// An instance, used as by a host.
class Host {
  public:
    Host(const effects::EffectTable& effect, std::uint32_t width, std::uint32_t height)
        : m_plugin(DescribePlugin(effect)), m_instance(m_plugin, width, height, TimeUnit::kSeconds) {}
    void Text(std::string_view name, const char* text) { m_instance.Set(IndexOf(m_plugin, name), &text); }
    void Number(std::string_view name, double number) { m_instance.Set(IndexOf(m_plugin, name), &number); }
    // Like hosts that store all values themselves and pass every one of them on.
    void SetAllToDefaults() {
        for (std::size_t i = 4; i < m_plugin.params.size(); ++i) {
            union {
                double number;
                f0r_param_color_t colour;
                char* text;
            } value;
            m_instance.Get(static_cast<int>(i), &value);
            const std::string copy = m_plugin.params[i].type == F0R_PARAM_STRING ? value.text : "";
            const char* text = copy.c_str();
            if (m_plugin.params[i].type == F0R_PARAM_STRING) {
                m_instance.Set(static_cast<int>(i), &text);
            } else {
                m_instance.Set(static_cast<int>(i), &value);
            }
        }
    }
    Pixels Update(double time, const Pixels& in) {
        Pixels out(in.size(), 0xCDCDCDCDu);
        m_instance.Update(time, in.data(), out.data());
        return out;
    }
    Instance& operator*() { return m_instance; }

  private:
    PluginDescription m_plugin;
    Instance m_instance;
};

// The core's result, in a frei0r host's byte order.
Pixels Expected(effects::EffectSession& session, std::int32_t width, std::int32_t height, Pixels in,
                double seconds) {
    const auto swap = [](Pixels& pixels) {
        for (std::uint32_t& p : pixels) {
            auto* bytes = reinterpret_cast<std::uint8_t*>(&p);
            std::swap(bytes[0], bytes[2]);
        }
    };
    swap(in);
    Pixels out(in.size());
    EXPECT_TRUE(session.Render({in.data(), width, height, width * 4, 0, 0, 0},
                               {out.data(), width, height, width * 4, 0, 0, 0}, seconds));
    swap(out);
    return out;
}

TEST(Frei0rParams, HaveNamesThatStayApartAsPropertyNames) {
    for (const effects::EffectTable* effect : effects::kAllEffects) {
        std::set<std::string> names;
        for (const PluginParam& param : DescribePlugin(*effect).params) {
            std::string name = param.name;
            for (char& c : name) c = c == ' ' ? '-' : static_cast<char>(std::tolower(c));
            EXPECT_TRUE(names.insert(name).second) << effect->name << ": " << name;
            EXPECT_EQ(name.find_first_not_of("abcdefghijklmnopqrstuvwxyz-"), std::string::npos) << name;
        }
    }
    const PluginDescription look = DescribePlugin(effects::kFilmLook);
    EXPECT_EQ(look.params[static_cast<std::size_t>(IndexOf(look, "Tint Colour"))].type, F0R_PARAM_COLOR);
    EXPECT_EQ(look.params[static_cast<std::size_t>(IndexOf(look, "Tint Amount"))].type, F0R_PARAM_DOUBLE);
    EXPECT_EQ(look.fileName, "velmora_film_look");
}

TEST(Frei0rParams, FindPresetsWithoutTheirPunctuation) {
    EXPECT_EQ(FindPreset(effects::kFilmExpress, "60s-memories"), 0u);
    EXPECT_EQ(FindPreset(effects::kFilmExpress, "60's Memories"), 0u);
    EXPECT_FALSE(FindPreset(effects::kFilmExpress, "60s"));
    EXPECT_FALSE(FindPreset(effects::kFilmExpress, ""));
}

TEST(Frei0rInstance, ShowsPresetSeedAndFrameAsTheCoreDoes) {
    constexpr std::uint32_t kWidth = 37, kHeight = 23;
    const Pixels in = Ramp(kWidth, kHeight);
    for (const effects::EffectTable* effect : effects::kAllEffects) {
        const auto session = effects::EffectSession::Create(*effect);
        session->ApplyPreset(1);
        session->PinRandom(4294967295u);
        Host host(*effect, kWidth, kHeight);
        host.Text("preset", effect->presetNames[1]);
        host.Text("seed", "4294967295");
        host.Text("frame rate", "24");
        host.Text("start frame", "5");
        EXPECT_EQ(host.Update(2 / 24.0, in), Expected(*session, kWidth, kHeight, in, 7 / 24.0))
            << effect->name;
    }
}

TEST(Frei0rInstance, LetsValuesOverrideThePresetAlsoByTheirDefaults) {
    const Pixels in = Ramp(40, 30);
    const auto& effect = effects::kFilmLook;
    const auto session = effects::EffectSession::Create(effect);
    session->ApplyPreset(*FindPreset(effect, "Sepia"));
    Host host(effect, 40, 30);
    host.Text("preset", "sepia");
    const Pixels sepia = Expected(*session, 40, 30, in, 0.0);
    EXPECT_EQ(host.Update(0.0, in), sepia);

    // When a host passes every value on, those that the user left alone must not override the preset.
    host.SetAllToDefaults();
    EXPECT_EQ(host.Update(0.0, in), sepia);
    session->SetValue(2, {.number = 0.75f});  // Saturation
    host.Number("Saturation", 0.75);
    EXPECT_EQ(host.Update(0.0, in), Expected(*session, 40, 30, in, 0.0));

    Host sparing(effect, 40, 30);
    sparing.Text("preset", "sepia");
    sparing.Number("Saturation", 0.5);  // the default, not the preset's value
    session->SetValue(2, {.number = 0.5f});
    EXPECT_EQ(sparing.Update(0.0, in), Expected(*session, 40, 30, in, 0.0));
}

TEST(Frei0rInstance, ReadsAPresetFileOnceAndOnlyOfItsEffect) {
    const auto& effect = effects::kFilmLook;
    const std::string path = testing::TempDir() + "/a look \xC3\xA9.preset";
    PresetRecord record{};
    std::snprintf(record.name, sizeof(record.name), "Mine");
    std::snprintf(record.libraryName, sizeof(record.libraryName), "%s", kLibraryName);
    std::snprintf(record.effectName, sizeof(record.effectName), "%s", effect.name);
    const auto session = effects::EffectSession::Create(effect);
    session->ApplyPreset(*FindPreset(effect, "Rust"));
    session->SetValue(2, {.number = 0.25f});
    for (std::uint32_t i = 0; i < effect.params.size(); ++i) {
        record.values[i] = {session->Value(i), 0, effect.params[i].kind};
        ++record.count;
    }
    const auto name = FileNameFromUtf8(path);
    ASSERT_TRUE(name && WritePreset(name->c_str(), &record));

    const Pixels in = Ramp(200, 120);
    const Pixels rust = Expected(*session, 200, 120, in, 0.0);
    Host host(effect, 200, 120);
    host.Text("preset", path.c_str());
    EXPECT_EQ(host.Update(0.0, in), rust);
    // Hosts set their parameters for every frame.
    std::filesystem::remove(std::u8string(path.begin(), path.end()));
    host.Text("preset", path.c_str());
    EXPECT_EQ(host.Update(0.0, in), rust);
    host.Text("preset", "sepia");
    host.Text("preset", path.c_str());
    EXPECT_NE(host.Update(0.0, in), rust) << "the file is gone";

    ASSERT_TRUE(WritePreset(name->c_str(), &record));
    Host other(effects::kFilmDamage, 200, 120);
    const Pixels plain = other.Update(0.0, in);
    other.Text("preset", path.c_str());
    EXPECT_NE(other.Update(0.0, in), plain) << "an error is shown";
    std::filesystem::remove(std::u8string(path.begin(), path.end()));
}

TEST(Frei0rInstance, TakesEachKindOfValueAndGivesItBack) {
    Host host(effects::kFilmDamage, 8, 8);
    const PluginDescription plugin = DescribePlugin(effects::kFilmDamage);
    char* text = nullptr;
    (*host).Get(IndexOf(plugin, "Pattern"), &text);
    EXPECT_STREQ(text, "Blotchy");
    host.Text("Pattern", "crackly");
    (*host).Get(IndexOf(plugin, "Pattern"), &text);
    EXPECT_STREQ(text, "crackly");
    double number = -1.0;
    host.Number("Black", 0.0);
    (*host).Get(IndexOf(plugin, "Black"), &number);
    EXPECT_EQ(number, 0.0);

    Host look(effects::kFilmLook, 8, 8);
    const int tint = IndexOf(DescribePlugin(effects::kFilmLook), "Tint Colour");
    for (int byte = 0; byte < 256; ++byte) {
        const f0r_param_color_t given = {static_cast<float>(byte) / 255.0f, 1.0f, 0.0f};
        f0r_param_color_t back = {};
        (*look).Set(tint, &given);
        (*look).Get(tint, &back);
        EXPECT_EQ(back.r, given.r);
        EXPECT_EQ(back.g, 1.0f);
        EXPECT_EQ(back.b, 0.0f);
    }
}

TEST(Frei0rInstance, ShowsWhatItCannotRead) {
    const struct {
        const char *name, *text;
        bool isRead;
    } rows[] = {
        {"preset", "Sepa", false},       {"preset", "sepia", true},     {"preset", "Fluorescent Light", true},
        {"preset", "none", true},        {"preset", "", true},          {"seed", "-1", false},
        {"seed", "many", false},         {"seed", "4294967296", false}, {"seed", "7.000000", true},
        {"start frame", "first", false}, {"start frame", "-3", true},   {"frame rate", "fast", false},
        {"frame rate", "25 ms", true},   {"frame rate", "none", true},  {"frame rate", "", true},
    };
    const Pixels in = Ramp(200, 120);
    for (const auto& row : rows) {
        Host host(effects::kFilmLook, 200, 120);
        const Pixels plain = host.Update(0.0, in);
        host.Text(row.name, row.text);
        const Pixels shown = host.Update(0.0, in);
        // Either film, or a picture that has nothing of it.
        std::size_t same = 0;
        for (std::size_t i = 0; i < in.size(); ++i) same += shown[i] == in[i] ? 1 : 0;
        EXPECT_EQ(same == 0 && std::set(shown.begin(), shown.end()).size() == 3, !row.isRead)
            << row.name << " " << row.text;
        host.Text(row.name, row.name == std::string_view("preset") ? "none" : "0");
        EXPECT_EQ(host.Update(0.0, in) == plain, row.name != std::string_view("frame rate"))
            << "the host has corrected it";
    }
    for (const std::uint32_t side : {1u, 2u, 9u}) {
        Host host(effects::kFilmDamage, side, side);
        host.Text("Pattern", "Blotchi");
        Pixels out(std::size_t{side} * side + 8, 0xABABABABu);
        const Pixels source(std::size_t{side} * side, 1u);
        (*host).Update(0.0, source.data(), out.data());
        EXPECT_EQ(std::count(out.begin(), out.end(), 0xABABABABu), 8) << side;
    }
}

TEST(Frei0rInstance, LeavesThePictureAloneByDefault) {
    const Pixels in = Ramp(33, 9);
    for (const effects::EffectTable* effect : effects::kAllEffects) {
        EXPECT_EQ(Host(*effect, 33, 9).Update(1.0, in), in) << effect->name;
    }
}

TEST(Frei0rInstance, RendersAnySizeInPlaceAndWritesNothingBehindThePicture) {
    for (const std::uint32_t width : {1u, 2u, 3u, 5u, 17u, 64u, 853u}) {
        for (const std::uint32_t height : {1u, 2u, 7u, 31u}) {
            const Pixels in = Ramp(width, height);
            Host host(effects::kFilmPro, width, height);
            host.Text("preset", "Very Old Footage");
            Pixels out = in;
            out.resize(in.size() + 64, 0xABABABABu);
            (*host).Update(0.2, out.data(), out.data());
            for (std::size_t i = in.size(); i < out.size(); ++i) ASSERT_EQ(out[i], 0xABABABABu);
            out.resize(in.size());
            EXPECT_EQ(out, host.Update(0.2, in)) << width << "x" << height;
        }
    }
}

TEST(Frei0rInstance, BearsSeveralThreadsAtOnce) {
    const Pixels in = Ramp(64, 48);
    Host host(effects::kFilmPro, 64, 48);
    host.Text("preset", "Oldie");
    const Pixels expected = host.Update(0.5, in);
    std::atomic<int> wrong = 0;
    std::vector<std::thread> threads;
    threads.reserve(4);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&] {
            for (int n = 0; n < 20; ++n) {
                if (host.Update(0.5, in) != expected) ++wrong;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(wrong, 0);
}

TEST(Frei0rTimeUnit, FollowsTheCallingModule) {
    const struct {
        const char* module;
        TimeUnit unit;
    } rows[] = {
        {"/usr/lib/x86_64-linux-gnu/libavfilter.so.8", TimeUnit::kMilliseconds},
        {R"(C:\Program Files\Player\avfilter-9.dll)", TimeUnit::kMilliseconds},
        {"/opt/static/ffmpeg", TimeUnit::kMilliseconds},
        {R"(C:\Tools\FFmpeg.exe)", TimeUnit::kMilliseconds},
        {"/usr/lib/x86_64-linux-gnu/mlt-7/libmltfrei0r.so", TimeUnit::kSeconds},
        {"/usr/lib/x86_64-linux-gnu/gstreamer-1.0/libgstfrei0r.so", TimeUnit::kSeconds},
        {"/opt/ffmpeg/bin/editor", TimeUnit::kUnknown},
        {"", TimeUnit::kUnknown},
    };
    for (const auto& row : rows) EXPECT_EQ(UnitOfModule(row.module), row.unit) << row.module;
    static const int here = 0;
    EXPECT_NE(support::ModuleAt(&here).find("frei0r_test"), std::string::npos);
}

TEST(Frei0rClock, FindsTheNearestFrame) {
    const struct {
        TimeUnit unit;
        const char* rate;
        std::int64_t start;
        double time, seconds;
    } rows[] = {
        {TimeUnit::kSeconds, "25", 0, 40.0, 40.0},                         // frame 1000
        {TimeUnit::kMilliseconds, "25", 0, 40.0, 1.0 / 25},                // frame 1
        {TimeUnit::kSeconds, "25", 100, 0.04, 101.0 / 25},                 // a segment starting at frame 100
        {TimeUnit::kMilliseconds, "30000/1001", 0, 67.0, 2002.0 / 30000},  // rounded to milliseconds
        {TimeUnit::kSeconds, "29.97", 0, 0.0333, 1001.0 / 30000},
        {TimeUnit::kMilliseconds, "24 s", 0, 1.0, 1.0},  // set by the user
        {TimeUnit::kSeconds, "24ms", 0, 1000.0, 1.0},
        {TimeUnit::kMilliseconds, "", 0, 1500.0, 1.5},  // no rate: the host's time is used
        {TimeUnit::kSeconds, "nonsense", 30, 1.01, 2.01},
        {TimeUnit::kSeconds, "25", 3, std::numeric_limits<double>::quiet_NaN(), 3.0 / 25},
    };
    for (const auto& row : rows) {
        FrameClock clock(row.unit);
        clock.SetFrameRate(row.rate);
        clock.SetStartFrame(row.start);
        EXPECT_DOUBLE_EQ(clock.ClipSeconds(row.time), row.seconds) << row.rate << " at " << row.time;
    }
}

TEST(Frei0rClock, LearnsAnUnknownHostsUnitFromItsFirstStep) {
    FrameClock milliseconds(TimeUnit::kUnknown);
    milliseconds.SetFrameRate("25");
    EXPECT_EQ(milliseconds.ClipSeconds(0.0), 0.0);
    EXPECT_DOUBLE_EQ(milliseconds.ClipSeconds(40.0), 1.0 / 25);
    EXPECT_DOUBLE_EQ(milliseconds.ClipSeconds(40.0), 1.0 / 25);

    FrameClock seconds(TimeUnit::kUnknown);
    seconds.SetFrameRate("25");
    EXPECT_DOUBLE_EQ(seconds.ClipSeconds(40.0), 40.0);  // a render that starts in the middle
    EXPECT_DOUBLE_EQ(seconds.ClipSeconds(40.04), 40.04);
    EXPECT_DOUBLE_EQ(seconds.ClipSeconds(80.0), 80.0);  // a jump once the unit is known
}

}  // namespace
}  // namespace velmora::hosts::frei0r
