/// What there is to say of a place in the command tree, before it is laid out as help, a manual page or
/// Markdown.
#pragma once

#include <Plinth/AutoCli.h>

#include <functional>
#include <string>
#include <vector>

#include "plinth/Declarations.h"
#include "plinth/Guide.h"

namespace Plinth {

/// A name with what it stands for, or an example's purpose with its line.
struct PageItem {
  std::string term;
  std::string text;
};

struct PageSection {
  enum class Form {
    Options,   ///< each text below its term
    Columns,   ///< each text beside its term
    Examples,  ///< the terms are sentences, the texts command lines
  };

  std::string heading;
  /// Ahead of the items; may be empty.
  std::string text;
  Form form = Form::Columns;
  std::vector<PageItem> items = {};
};

struct Page {
  /// The words that lead to the place, blanks between; empty for the root.
  std::string path;
  /// What a command line there consists of: the words, and a part for each of what follows.
  std::vector<std::string> synopsis;
  /// The node's description; may be empty.
  std::string description;
  std::vector<PageSection> sections;
};

/// A place in the tree.
struct Place {
  AutoCli::NamespaceNode& root;
  AutoCli::NamespaceNode& node;
  /// The words that lead from the root to the node.
  std::string path;
  /// May the host be asked which values options can have?
  bool isAsking = false;
  /// Options that the line has, as "--name=value".
  std::vector<std::string> options = {};

  /// Null for a namespace.
  AutoCli::Command* Command() const { return dynamic_cast<AutoCli::Command*>(&node); }
  const Guide& OwnGuide() const { return GuideTo(root, path); }
};

/// What --help tells: in short, with values that the host has now.
Page HelpPage(const Place& place);
/// What a manual page tells of the root or of a command.
Page ManualPage(const Place& place);

// What both are made of.

/// "hcli" and the words of @p path.
std::string ProgramWith(const std::string& path);
/// Synopsis and description.
Page BeginPage(const Place& place);
/// What @p more tells of a parameter stands behind its help, unless it is empty.
PageSection OptionsSection(const std::string& heading, const std::vector<Parameter>& parameters,
                           const std::function<std::string(const Parameter&)>& more);
/// Which command shows the values of the parameter, and @p values where some are known; empty where no
/// command is.
std::string SourceText(const Place& place, const Parameter& parameter,
                       const std::vector<std::string>& values = {});
/// What the command gives: no items where it has no fields.
PageSection ResultSection(const Place& place);
PageSection ExamplesSection(const Place& place);
/// The exit statuses as items.
PageSection ExitSection();
/// The variables, or the files, that the framework's guide and that of the place tell of: all guides for the
/// root.
std::vector<PageItem> GuideItems(const Place& place, KeyValues Guide::*part);

}  // namespace Plinth
