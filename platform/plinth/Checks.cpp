#include <Plinth/Checks.h>

#include "plinth/Declarations.h"
#include "plinth/OwnChecks.h"
#include "plinth/OwnCommands.h"

namespace Plinth {

namespace {

std::string CommandsText(const AutoCli::Namespace& root) {
  std::string text;
  WalkTree(root, "", [&](const std::string& path, const AutoCli::NamespaceNode& node) {
    if (AutoCli::NodeData::Of(node).isCommand) text += path + '\n';
  });
  return text;
}

class FrameworkChecks final : public CheckSource {
 public:
  std::vector<Finding> Check() override {
    std::vector<Finding> findings;
    plugins_ = AutoCli::Namespace::New();
    CheckPlugins(*plugins_, findings);
    CheckGuides(findings);
    CheckTerminal(findings);
    return findings;
  }

  std::vector<Enclosure> Describe() override {
    return {{"version", "hcli " HCLI_VERSION "\n"},
            {"commands of plug-ins", plugins_ ? CommandsText(*plugins_) : ""}};
  }

  std::vector<Variable> Variables() override {
    return {{"HCLI_PLUGINS", true}, {"HCLI_PAGER", true}, {"HCLI_EXIT_CODES", true}};
  }

 private:
  /// What plug-ins bring; null ahead of Check, which most runs never come to.
  boost::shared_ptr<AutoCli::Namespace> plugins_;
};

std::vector<CheckSource*>& Sources() {
  // To the end of the process, as what plug-ins have registered.
  static auto& sources = *new std::vector<CheckSource*>{new FrameworkChecks};
  return sources;
}

}  // namespace

void AddCheckSource(CheckSource& source) { Sources().push_back(&source); }

const std::vector<CheckSource*>& CheckSources() { return Sources(); }

}  // namespace Plinth
