#include <dirent.h>
#include <dlfcn.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"

namespace {

bool foldersFail = false;

}  // namespace

/// Stands in front of the C library's.
extern "C" __attribute__((visibility("default"))) dirent* readdir(DIR* folder) {
  static const auto real = reinterpret_cast<dirent* (*)(DIR*)>(dlsym(RTLD_NEXT, "readdir"));
  if (!foldersFail) return real(folder);
  errno = EIO;
  return nullptr;
}

namespace Plinth::Test {
namespace {

using testing::ElementsAre;

/// What the build made of tests/plugins.
std::string BuiltPlugins() {
  return std::filesystem::read_symlink("/proc/self/exe").parent_path() / "../tests/plugins";
}

TEST(PlinthLoader, TakesInWhatWorksAndNamesTheRest) {
  const auto root = AutoCli::Namespace::New();
  const std::string folder = BuiltPlugins();
  const auto begin = [&](const char* file) {
    return "plug-in \"" + folder + '/' + file + "\" is left out: ";
  };
  const std::string broken = begin("e-broken.so");
  EXPECT_THAT(LoadPlugins(*root, folder, PluginFolder::BuiltIn),
              ElementsAre(begin("b-throws.so") + "it failed to register its commands: out of order",
                          begin("c-clash.so") + "the name \"alpha\" is taken",
                          begin("d-reserved.so") + "the name \"catalogue\" is taken",
                          testing::AllOf(testing::StartsWith(broken),
                                         testing::Ne(broken)),  // the words are the dynamic loader's
                          begin("f-no-entry.so") + "it has no entry point AutoCli_RegisterNamespaces"));
  EXPECT_THAT(AutoCli::NodeData::ChildNames(*root), ElementsAre("alpha", "gamma"));
  EXPECT_EQ(AutoCli::NodeData::Of(*AutoCli::NodeData::FindChild(*root, "alpha")).description, "a-first");
}

TEST(PlinthLoader, LoadsTheFileOfTheFirstWordAloneWhereItHasThatWord) {
  const std::tuple<const char*, std::size_t, std::vector<std::string>> cases[] = {
      {"a-first", 5, {"alpha", "gamma"}}, {"none", 5, {"alpha", "gamma"}}, {"gamma", 0, {"gamma"}}};
  for (const auto& [word, troubles, names] : cases) {
    const auto root = AutoCli::Namespace::New();
    const auto found = LoadPlugins(*root, BuiltPlugins(), PluginFolder::BuiltIn, word);
    EXPECT_EQ(found.size(), troubles) << word;
    EXPECT_EQ(AutoCli::NodeData::ChildNames(*root), names) << word;
  }
}

TEST(PlinthLoader, NamesAFolderThatCannotBeRead) {
  const auto root = AutoCli::Namespace::New();
  const auto trouble = [&](const std::string& folder, PluginFolder whose) {
    return testing::PrintToString(LoadPlugins(*root, folder, whose));
  };
  EXPECT_EQ(trouble("/nowhere/plugins", PluginFolder::Named),
            R"({ "cannot read the plug-in folder \"/nowhere/plugins\": No such file or directory" })");
  EXPECT_EQ(trouble("", PluginFolder::BuiltIn),
            R"({ "no plug-ins are loaded: where the program lies cannot be told without /proc; )"
            R"(give their folder with --plugins" })");
  foldersFail = true;
  EXPECT_EQ(trouble("/", PluginFolder::BuiltIn),
            R"({ "cannot read the plug-in folder \"/\": Input/output error" })");
  foldersFail = false;
}

// Each would end the process, or keep it waiting for ever, were it handed to the dynamic loader.
TEST(PlinthLoader, LooksAtFilesBeforeItLoadsThem) {
  namespace fs = std::filesystem;
  const fs::path folder = fs::path(testing::TempDir()) / ("hcli-plugins-" + std::to_string(getpid()));
  fs::create_directories(folder / "folder.so");
  ASSERT_EQ(mkfifo((folder / "pipe.so").c_str(), 0600), 0);
  const fs::path whole = fs::path(BuiltPlugins()) / "a-first.so";
  const auto size = fs::file_size(whole);
  for (const auto length : {std::uintmax_t{0}, std::uintmax_t{64}, std::uintmax_t{4096}, size - 1, size}) {
    const fs::path cut = folder / ("of-" + std::to_string(100000 + length) + ".so");
    fs::copy_file(whole, cut);
    fs::resize_file(cut, length);
  }
  const auto root = AutoCli::Namespace::New();
  EXPECT_THAT(LoadPlugins(*root, folder, PluginFolder::BuiltIn),
              ElementsAre(testing::EndsWith("folder.so\" is left out: it is no regular file"),
                          testing::EndsWith("100000.so\" is left out: it is no shared library"),
                          testing::EndsWith("is left out: it is cut short"),
                          testing::EndsWith("is left out: it is cut short"),
                          testing::EndsWith("is left out: it is cut short"),
                          testing::EndsWith("pipe.so\" is left out: it is no regular file")));
  EXPECT_THAT(AutoCli::NodeData::ChildNames(*root), ElementsAre("alpha"));
  fs::remove_all(folder);
}

}  // namespace
}  // namespace Plinth::Test
