#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"

namespace Plinth::Test {
namespace {

using testing::ElementsAre;

TEST(PlinthLoader, TakesInWhatWorksAndNamesTheRest) {
  const auto root = AutoCli::Namespace::New();
  // What the build made of tests/plugins.
  const std::string folder =
      std::filesystem::read_symlink("/proc/self/exe").parent_path() / "../tests/plugins";
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

TEST(PlinthLoader, NamesAFolderThatIsNotThere) {
  const auto root = AutoCli::Namespace::New();
  EXPECT_THAT(LoadPlugins(*root, "/nowhere/plugins", PluginFolder::Named),
              ElementsAre("cannot read the plug-in folder \"/nowhere/plugins\": No such file or directory"));
}

}  // namespace
}  // namespace Plinth::Test
