#include "plinth/Manual.h"

#include <Plinth/ChangeGroup.h>
#include <Plinth/Rehearsal.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

#include "plinth/Console.h"
#include "plinth/GlobalOptions.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaBool;
using MetaObj::MetaString;

constexpr const char* kFolder = "folder";

/// A guide that is wrong is passed over by help, but must not become a page. Throws GuideError.
void CheckGuides() {
  const std::vector<std::string> faults = GuideFaults();
  if (!faults.empty()) throw GuideError(faults.front());
}

/// Returns errno, or 0.
int WriteFile(const std::string& path, const std::string& text) {
  const int descriptor = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
  if (descriptor == -1) return errno;
  FileSink sink(descriptor);
  sink.Write(text);
  const int error = sink.Flush();
  return close(descriptor) == 0 || error != 0 ? error : errno;
}

/// Every page is written before the first takes the place of an earlier one: a full disk costs none. Returns
/// errno, or 0.
int WritePages(const std::vector<std::pair<std::string, std::string>>& pages) {
  const auto temporary = [](const std::string& path) { return path + ".new"; };
  int error = 0;
  for (const auto& [path, text] : pages) {
    if (error == 0) error = WriteFile(temporary(path), text);
  }
  for (const auto& [path, text] : pages) {
    if (error == 0 && rename(temporary(path).c_str(), path.c_str()) != 0) error = errno;
    if (error != 0) unlink(temporary(path).c_str());
  }
  return error;
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
    SetMetaDataField("type", "operation");
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
    CheckGuides();
    SettleChanges();  // pages are not undone with them
    const std::string folder = input->GetString(kFolder);
    std::vector<std::pair<std::string, std::string>> pages;
    for (const Place& place : Places(root_)) {
      pages.emplace_back(folder + '/' + PageName(place.path) + ".1", RoffText(ManualPage(place)));
    }
    const int error = IsRehearsing() ? 0 : WritePages(pages);
    if (error != 0) {
      return output->ReportError("The manual pages cannot be written to " + Quoted(folder) + ": " +
                                 std::strerror(error) + '.');
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
    CheckGuides();
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
