// Modules in folders with any name.

#include "platform/platform.h"

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <filesystem>

#include "tests/user_presets/temporary_folder.h"

namespace velmora::support {
namespace {

TEST(Platform, LoadsModulesByAnyName) {
    Dl_info library = {};
    double (*const cosine)(double) = std::cos;
    ASSERT_NE(dladdr(reinterpret_cast<void*>(cosine), &library), 0);
    const tests::TemporaryFolder parent;
    const std::filesystem::path folder = parent.Path() / u"é 映画 \U0001F3A5";
    std::filesystem::create_directory(folder);
    const std::filesystem::path name = folder / "module.so";
    std::filesystem::create_symlink(std::filesystem::canonical(library.dli_fname), name);
    ModuleHandle module = LoadModule(name.u16string().c_str());
    EXPECT_NE(module, nullptr);
    EXPECT_NE(FindExport(module, "cos"), nullptr);
    UnloadModule(module);
    EXPECT_EQ(LoadModule((name.u16string() + u"x").c_str()), nullptr);
    EXPECT_EQ(LoadModule(u"half a pair \xD83C"), nullptr);
}

TEST(Platform, KnowsTheProgramsFolder) {
    const std::filesystem::path folder(ModuleFolder(nullptr));
    EXPECT_TRUE(std::filesystem::exists(folder / "platform_test")) << folder;
    EXPECT_EQ(ModuleFolder(nullptr).back(), u'/');
}

TEST(Platform, ReadsTheLanguageFromTheFirstVariableThatIsSet) {
    struct Row {
        const char *all, *messages, *lang, *expected;
    };
    const Row rows[] = {
        {"de_DE.UTF-8", "fr_FR", "es", "de"}, {"", "fr_FR.UTF-8", "es", "fr"}, {"", "", "zh_CN.UTF-8", "zh"},
        {"C.UTF-8", "fr", "fr", "en"},        {"POSIX", "", "", "en"},         {"", "", "", "en"},
    };
    for (const Row& row : rows) {
        setenv("LC_ALL", row.all, 1);
        setenv("LC_MESSAGES", row.messages, 1);
        setenv("LANG", row.lang, 1);
        EXPECT_EQ(UserLanguage(), row.expected) << row.all << ' ' << row.messages << ' ' << row.lang;
    }
}

}  // namespace
}  // namespace velmora::support
