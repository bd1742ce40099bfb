// A user's presets survive any failure while a new one is written.
#include <gtest/gtest.h>

#include <filesystem>

#include "user_presets/file_access.h"
#include "tests/user_presets/temporary_folder.h"
#ifdef _WIN32
#include <windows.h>
#else
#include <sys/stat.h>
#include <unistd.h>
#endif

namespace velmora {
namespace {

namespace fs = std::filesystem;
using tests::TemporaryFolder;

bool WriteHello(std::FILE* file) {
    return std::fputs("hello\n", file) >= 0;
}
bool WriteHalf(std::FILE* file) {
    std::fputs("he", file);
    return false;
}

#ifdef _WIN32
constexpr const char* kHello = "hello\r\n";
#else
constexpr const char* kHello = "hello\n";
#endif

TEST(ReplaceTextFile, CreatesAndReplaces) {
    const TemporaryFolder folder;
    ASSERT_TRUE(ReplaceTextFile(folder.File("a").c_str(), WriteHello));
    EXPECT_EQ(folder.Read("a"), kHello);
    folder.Write("a", "much longer than what comes");
    ASSERT_TRUE(ReplaceTextFile(folder.File("a").c_str(), WriteHello));
    EXPECT_EQ(folder.Read("a"), kHello);
    EXPECT_EQ(folder.Count(), 1u);
}

TEST(ReplaceTextFile, KeepsTheOldFileWhenWritingFails) {
    const TemporaryFolder folder;
    folder.Write("a", "old");
    EXPECT_FALSE(ReplaceTextFile(folder.File("a").c_str(), WriteHalf));
    EXPECT_EQ(folder.Read("a"), "old");
    EXPECT_FALSE(ReplaceTextFile(folder.File("b").c_str(), WriteHalf));
    EXPECT_EQ(folder.Count(), 1u);
}

TEST(ReplaceTextFile, FailsWhereNothingCanBeWritten) {
    const TemporaryFolder folder;
    fs::create_directory(folder.Path() / "sub");
    EXPECT_FALSE(ReplaceTextFile(folder.File("sub").c_str(), WriteHello));
    EXPECT_FALSE(ReplaceTextFile(folder.File("missing/a").c_str(), WriteHello));
    EXPECT_FALSE(ReplaceTextFile("", WriteHello));
    EXPECT_EQ(folder.Count(), 1u);
}

#ifndef _WIN32
TEST(ReplaceTextFile, ReportsAFullDisk) {
    EXPECT_FALSE(ReplaceTextFile("/dev/full", WriteHello));
}

TEST(ReplaceTextFile, KeepsLinksAndPermissions) {
    const TemporaryFolder folder;
    const std::string name = folder.Write("a", "old");
    ::chmod(name.c_str(), 0640);
    fs::create_symlink("a", folder.Path() / "link");
    ASSERT_TRUE(ReplaceTextFile(folder.File("link").c_str(), WriteHello));
    EXPECT_TRUE(fs::is_symlink(folder.Path() / "link"));
    EXPECT_EQ(folder.Read("a"), kHello);
    EXPECT_EQ(fs::status(name).permissions(), fs::perms{0640});
}
#endif

#ifdef _WIN32
TEST(ReplaceTextFile, WritesInPlaceWhereTheFileCannotBeRenamedOver) {
    const TemporaryFolder folder;
    const std::ifstream reader(
        folder.Write("a", "old"));  // opened as programs do: shared, but not for deletion
    EXPECT_TRUE(ReplaceTextFile(folder.File("a").c_str(), WriteHello));
    EXPECT_EQ(folder.Read("a"), kHello);
    EXPECT_EQ(folder.Count(), 1u);
}

TEST(ReplaceTextFile, KeepsAWriteProtectedFile) {
    const TemporaryFolder folder;
    const std::string name = folder.Write("a", "old");
    ASSERT_NE(SetFileAttributesA(name.c_str(), FILE_ATTRIBUTE_READONLY), 0);
    EXPECT_FALSE(ReplaceTextFile(name.c_str(), WriteHello));
    SetFileAttributesA(name.c_str(), FILE_ATTRIBUTE_NORMAL);
    EXPECT_EQ(folder.Read("a"), "old");
    EXPECT_EQ(folder.Count(), 1u);
}
#else
// Root may write everywhere, so for its lifetime the process becomes another user, who owns these files.
class PlainUser {
  public:
    explicit PlainUser(std::initializer_list<std::string> owned) {
        if (::getuid() != 0) return;
        for (const std::string& name : owned) EXPECT_EQ(::chown(name.c_str(), kNobody, kNobody), 0);
        EXPECT_EQ(::seteuid(kNobody), 0);
    }
    ~PlainUser() {
        if (::getuid() == 0) {
            EXPECT_EQ(::seteuid(0), 0);
        }
    }
    PlainUser(const PlainUser&) = delete;
    PlainUser& operator=(const PlainUser&) = delete;

  private:
    static constexpr uid_t kNobody = 65534;
};

TEST(ReplaceTextFile, WritesInPlaceWhereTheFolderTakesNoNewFiles) {
    const TemporaryFolder folder;
    const std::string name = folder.Write("a", "old");
    ASSERT_EQ(::chmod(folder.Path().c_str(), 0555), 0);
    {
        const PlainUser user({name});
        EXPECT_TRUE(ReplaceTextFile(name.c_str(), WriteHello));
        EXPECT_FALSE(ReplaceTextFile(folder.File("b").c_str(), WriteHello));
    }
    ::chmod(folder.Path().c_str(), 0755);
    EXPECT_EQ(folder.Read("a"), kHello);
    EXPECT_EQ(folder.Count(), 1u);
}

TEST(ReplaceTextFile, KeepsAWriteProtectedFile) {
    const TemporaryFolder folder;
    const std::string name = folder.Write("a", "old");
    ::chmod(name.c_str(), 0444);
    {
        const PlainUser user({folder.Path().string(), name});
        EXPECT_FALSE(ReplaceTextFile(name.c_str(), WriteHello));
    }
    EXPECT_EQ(folder.Read("a"), "old");
    EXPECT_EQ(folder.Count(), 1u);
}
#endif

}  // namespace
}  // namespace velmora
