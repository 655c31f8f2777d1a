#include "plinth/Manual.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <fstream>

#include "plinth/GlobalOptions.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaBool;
using MetaObj::MetaString;

constexpr const char* kFolder = "folder";

/// Reads every guide once more: one that is wrong is passed over by help, but must not become a page. Throws
/// GuideError.
void CheckGuides(const AutoCli::NamespaceNode& root) {
  std::vector<std::string> paths{""};
  for (const AutoCli::Child& child : AutoCli::NodeData::Of(root).children) paths.push_back(child.name);
  for (const std::string& path : paths) {
    const std::string file = GuideFile(root, path);
    if (!file.empty() && access(file.c_str(), F_OK) == 0) ReadGuide(file);
  }
}

/// The root and all commands.
std::vector<Place> Places(AutoCli::Namespace& root) {
  std::vector<Place> places{{root, root, ""}};
  for (const Place& command : CommandPlaces(root)) places.push_back(command);
  return places;
}

class Manual final : public virtual AutoCli::Command {
 public:
  explicit Manual(AutoCli::Namespace& root) : root_(root) {
    SetDescription("Write the manual pages, one a command, for man to read.");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto folder = CallSpec::ParameterSpec::New(kFolder, CallSpec::ParameterType::String);
    folder->SetHelp("The folder to write them to, such as share/man/man1.");
    folder->SetRequired(true);
    auto spec = CallSpec::InputSpec::New();
    spec->AddParameter(folder);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(MetaBool::New());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    CheckGuides(root_);
    for (const Place& place : Places(root_)) {
      if (IsRehearsing()) break;
      const std::string file = input->GetString(kFolder) + '/' + PageName(place.path) + ".1";
      errno = 0;
      std::ofstream stream(file, std::ios::binary);
      stream << RoffText(ManualPage(place));
      stream.close();
      if (stream) continue;
      return output->ReportError("cannot write " + Quoted(file) + ": " + std::strerror(errno));
    }
    output->SetResult(MetaBool::New(true));
    output->Close();
  }

  AutoCli::Namespace& root_;
};

class Reference final : public virtual AutoCli::Command {
 public:
  explicit Reference(AutoCli::Namespace& root) : root_(root) {
    SetDescription("Show the reference to all commands, as Markdown.");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    return CallSpec::InputSpec::New();
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(MetaString::New("# Reference"));
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input>,
                       boost::shared_ptr<CallSpec::Output> output) override {
    CheckGuides(root_);
    std::string text = "# Reference\n\nAll commands, as `hcli reference` tells them.\n";
    for (const Place& place : Places(root_)) text += MarkdownText(ManualPage(place));
    output->SetResult(MetaString::New(text));
    output->Close();
  }

  AutoCli::Namespace& root_;
};

}  // namespace

std::vector<Place> CommandPlaces(AutoCli::NamespaceNode& root) {
  std::vector<Place> places;
  WalkTree(root, "", [&](const std::string& path, AutoCli::NamespaceNode& node) {
    if (AutoCli::NodeData::Of(node).isCommand) places.push_back({root, node, path});
  });
  return places;
}

std::string PageName(const std::string& path) { return Join(Split(ProgramWith(path), ' '), "-"); }

boost::shared_ptr<AutoCli::NamespaceNode> NewManual(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Manual(root));
}

boost::shared_ptr<AutoCli::NamespaceNode> NewReference(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Reference(root));
}

}  // namespace Plinth
