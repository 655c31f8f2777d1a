#include <gtest/gtest.h>
#include <limits.h>
#include <stdlib.h>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"

namespace Plinth::Test {
namespace {

/// The folder that the build made of tests/plugins.
std::string PluginFolder() {
  char path[PATH_MAX] = "";
  EXPECT_NE(realpath("/proc/self/exe", path), nullptr);
  const std::string program = path;
  return program.substr(0, program.find_last_of('/')) + "/../tests/plugins";
}

TEST(PlinthLoader, TakesInWhatWorksAndNamesTheRest) {
  const auto root = AutoCli::Namespace::New();
  const std::string folder = PluginFolder();
  const std::vector<std::string> troubles = LoadPlugins(*root, folder, PluginFolder::BuiltIn);
  const struct {
    const char* file;
    const char* trouble;
  } expected[] = {
      {"b-throws.so", "it failed to register its commands: out of order"},
      {"c-clash.so", "the name \"alpha\" is taken"},
      {"d-reserved.so", "the name \"catalogue\" is taken"},
      {"e-broken.so", nullptr},  // the words are the dynamic loader's
      {"f-no-entry.so", "it has no entry point AutoCli_RegisterNamespaces"},
  };
  ASSERT_EQ(troubles.size(), std::size(expected));
  for (std::size_t index = 0; index < troubles.size(); ++index) {
    const std::string begin = "plug-in \"" + folder + '/' + expected[index].file + "\" is left out: ";
    EXPECT_EQ(troubles[index].substr(0, begin.size()), begin);
    EXPECT_GT(troubles[index].size(), begin.size());
    if (expected[index].trouble) {
      EXPECT_EQ(troubles[index], begin + expected[index].trouble);
    }
  }
  EXPECT_EQ(AutoCli::NodeData::ChildNames(*root), (std::vector<std::string>{"alpha", "gamma"}));
  EXPECT_EQ(AutoCli::NodeData::Of(*AutoCli::NodeData::FindChild(*root, "alpha")).description, "a-first");
}

TEST(PlinthLoader, NamesAFolderThatIsNotThere) {
  const auto root = AutoCli::Namespace::New();
  EXPECT_EQ(LoadPlugins(*root, "/nowhere/plugins", PluginFolder::Named),
            std::vector<std::string>{
                "cannot read the plug-in folder \"/nowhere/plugins\": No such file or directory"});
}

}  // namespace
}  // namespace Plinth::Test
