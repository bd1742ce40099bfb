// Films and pictures in files, and files that get their name only when they are complete.

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "programs/reelview/keeper/frame_sink.h"
#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {
namespace {

namespace fs = std::filesystem;

class Files : public testing::Test {
  protected:
    Files() { fs::create_directories(m_folder); }
    ~Files() override { fs::remove_all(m_folder); }

    [[nodiscard]] fs::path Write(const char* name, const std::string& bytes) const {
        std::ofstream(m_folder / name, std::ios::binary) << bytes;
        return m_folder / name;
    }
    [[nodiscard]] std::size_t Count() const {
        return static_cast<std::size_t>(std::distance(fs::directory_iterator(m_folder), {}));
    }

    fs::path m_folder = fs::temp_directory_path() / "reelview-files-test";
};

std::string GreyFilm(int frames) {
    std::string film = "YUV4MPEG2 W2 H2 F10:1 Cmono\n";
    for (int i = 0; i < frames; ++i)
        film += (i % 2 ? "FRAME Ixyz\n" : "FRAME\n") + std::string(4, static_cast<char>(16 + i));
    return film;
}

TEST_F(Files, Y4mFramesInAnyOrder) {
    const auto clip = OpenY4mClip(Write("a.y4m", GreyFilm(5) + "FRAME\nxx"));
    EXPECT_EQ(clip->Facts().frames, 5) << "the last frame is not whole";
    for (const int frame : {4, 0, 3}) {
        // Luma 16 is black, and a step of it is 255 / 219.
        EXPECT_EQ(clip->Read(frame).pixels[0], static_cast<int>(frame * 255.0 / 219.0 + 0.5)) << frame;
    }
}

TEST_F(Files, RefusesBrokenFilms) {
    for (const char* film : {"", "YUV4MPEG2", "YUV4MPEG2 W2 H2\n", "YUV4MPEG2 W99999 H9\nFRAME\n",
                             "YUV4MPEG2 W30000 H30000\nFRAME\n", "YUV4MPEG2 W2 H2 Cmono\nFRAMES"}) {
        const fs::path file = Write("b.y4m", film);
        EXPECT_THROW(static_cast<void>(OpenY4mClip(file)), SourceError) << film;
    }
}

TEST_F(Files, Y4mSinkWritesWhatTheClipHeld) {
    const fs::path source = Write("a.y4m", GreyFilm(3)), target = m_folder / "b.y4m";
    const auto clip = OpenY4mClip(source);
    {
        const auto sink = MakeY4mSink(target, clip->Facts());
        for (int i = 0; i < 3; ++i) sink->Write(clip->Read(i));
        EXPECT_FALSE(fs::exists(target)) << "not before it is whole";
        sink->Finish();
    }
    const auto copy = OpenY4mClip(target);
    EXPECT_EQ(copy->Facts().rate.numerator, 10);
    for (int i = 0; i < 3; ++i) EXPECT_EQ(copy->Read(i).pixels, clip->Read(i).pixels);
    static_cast<void>(MakeY4mSink(m_folder / "c.y4m", clip->Facts()));
    EXPECT_EQ(Count(), 2u) << "what was given up leaves nothing";
}

TEST_F(Files, SafeFileKeepsTheOldOne) {
    const fs::path target = Write("keep.txt", "old");
    {
        const SafeFile given(target);
        std::ofstream(given.Place()) << "new";
    }
    EXPECT_EQ(fs::file_size(target), 3u);
    EXPECT_EQ(Count(), 1u);
    SafeFile kept(target);
    std::ofstream(kept.Place()) << "newer";
    kept.Finish();
    EXPECT_EQ(fs::file_size(target), 5u);
}

TEST(SequenceNames, ContinueTheNumber) {
    using Names = std::vector<std::u16string>;
    const Names folder = {u"f8.png", u"f9.png", u"f10.png", u"f12.png", u"g9.png", u"f9.jpg", u"notes.txt"};
    EXPECT_EQ(SequenceOf(u"f9.png", folder), (Names{u"f8.png", u"f9.png", u"f10.png"}));
    EXPECT_EQ(SequenceOf(u"f12.png", folder), (Names{u"f12.png"}));
    EXPECT_EQ(SequenceOf(u"notes.txt", folder), (Names{u"notes.txt"}));
    EXPECT_EQ(SequenceOf(u"99999999999999999999.png", folder), (Names{u"99999999999999999999.png"}));
}

TEST(Orientation, IsReadFromBothByteOrders) {
    const auto stored = [](const std::string& bytes) {
        std::istringstream file(bytes);
        return StoredOrientation(file);
    };
    using namespace std::string_literals;
    const std::string big = "MM\0*\0\0\0\x0A\0\0\0\1\1\x12\0\3\0\0\0\1\0\x06\0\0"s;
    const std::string little = "II*\0\x08\0\0\0\1\0\x12\1\3\0\1\0\0\0\x08\0\0\0"s;
    EXPECT_EQ(stored(big), 6);
    EXPECT_EQ(stored(little), 8);
    const std::string jpeg = "\xFF\xD8\xFF\xE0\0\4\0\0\xFF\xE1\0\x22"s + "Exif\0\0"s;
    EXPECT_EQ(stored(jpeg + big), 6);
    EXPECT_EQ(stored("\xFF\xD8\xFF\xDA\0\4\0\0\xFF\xE1\0\x22"s + "Exif\0\0"s + big), 1)
        << "behind the pixels";
    std::string odd = little;
    odd[18] = 9;
    for (const std::string& bytes : {odd, ""s, "\xFF\xD8"s, "\xFF\xD8\xFF\xE1\0\0"s, big.substr(0, 20)}) {
        EXPECT_EQ(stored(bytes), 1);
    }
}

TEST(SequenceNames, PatternsNameThemAll) {
    using Names = std::vector<std::u16string>;
    const auto pattern = [](const Names& names) {
        const auto numbering = NumberingOf(names);
        return numbering ? numbering->pattern + (numbering->first == 9 ? u" 9" : u" other")
                         : std::u16string();
    };
    EXPECT_EQ(pattern({u"C:\\v2\\f008.png", u"C:\\v2\\f009.png", u"C:\\v2\\f010.png"}),
              u"C:\\v2\\f%03d.png other");
    EXPECT_EQ(pattern({u"f9.png", u"f10.png"}), u"f%d.png 9");
    EXPECT_EQ(pattern({u"50%f98", u"50%f99", u"50%f100"}), u"50%%f%02d other");
    for (const Names& names : {Names{u"f8.png", u"f010.png"}, Names{u"f8.png", u"f09.png"}, Names{u"a.png"},
                               Names{u"a1.png", u"b2.png"}, Names{}}) {
        EXPECT_EQ(pattern(names), u"");
    }
}

}  // namespace
}  // namespace velmora::reelview
