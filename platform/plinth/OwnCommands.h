/// The commands that the framework brings itself.
#pragma once

#include <Plinth/AutoCli.h>

#include <boost/shared_ptr.hpp>
#include <string>

#include "plinth/Declarations.h"

namespace Plinth {

/// Shows every node under @p root, which holds the command and so outlives it.
boost::shared_ptr<AutoCli::NamespaceNode> NewCatalogue(AutoCli::Namespace& root);
/// Writes the scripts by which shells complete command lines.
boost::shared_ptr<AutoCli::NamespaceNode> NewCompletion(AutoCli::Namespace& root);
/// Answers those scripts, for the tree under @p root, which outlives the command.
boost::shared_ptr<AutoCli::NamespaceNode> NewProposal(AutoCli::Namespace& root);
/// Tells what result fields mean, for the tree under @p root, which outlives the command.
boost::shared_ptr<AutoCli::NamespaceNode> NewExplain(AutoCli::Namespace& root);
/// Writes manual pages of the tree under @p root, which outlives the command.
boost::shared_ptr<AutoCli::NamespaceNode> NewManual(AutoCli::Namespace& root);
/// Shows the same as one Markdown document.
boost::shared_ptr<AutoCli::NamespaceNode> NewReference(AutoCli::Namespace& root);
/// Stands in the tree for what is read as --help.
boost::shared_ptr<AutoCli::NamespaceNode> NewHelp(AutoCli::Namespace& root);

/// In front of other words, what is read as --help.
inline constexpr const char* kHelpWord = "help";
/// Alone, the same as behind kHelpWord.
inline constexpr const char* kExplainWord = "explain";

/// Which plug-ins have to be loaded for one of them: all, none, or what the line needs that a
/// shell is asking about.
enum class Needs { AllPlugins, PluginsOfLineAtCursor, NoPlugins };

struct OwnCommand {
  const char* name;
  boost::shared_ptr<AutoCli::NamespaceNode> (*make)(AutoCli::Namespace& root);
  Needs needs = Needs::AllPlugins;
};

/// In the order in which they hang under the root. No plug-in gets one of these names.
inline constexpr OwnCommand kOwnCommands[] = {{"catalogue", NewCatalogue},
                                              {"completion", NewCompletion, Needs::NoPlugins},
                                              {"propose", NewProposal, Needs::PluginsOfLineAtCursor},
                                              {kExplainWord, NewExplain},
                                              {kHelpWord, NewHelp},
                                              {"manual", NewManual},
                                              {"reference", NewReference}};

/// The row of that name, or null.
const OwnCommand* FindOwnCommand(const std::string& name);

/// Calls @p visit(path, node) for each node under @p node in order of registration, a namespace ahead of
/// its children. @p path leads to @p node.
template <class Visitor>
void WalkTree(const AutoCli::NamespaceNode& node, const std::string& path, Visitor&& visit) {
  for (const AutoCli::Child& child : AutoCli::NodeData::Of(node).children) {
    const std::string childPath = path.empty() ? child.name : path + ' ' + child.name;
    visit(childPath, *child.node);
    WalkTree(*child.node, childPath, visit);
  }
}

}  // namespace Plinth
