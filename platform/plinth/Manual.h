/// Manual pages and the reference to all commands: what the command tree and the guides say, laid out for man
/// and as Markdown.
#pragma once

#include <string>
#include <vector>

#include "plinth/Page.h"

namespace Plinth {

/// The commands under @p root in the order of the tree.
std::vector<Place> CommandPlaces(AutoCli::NamespaceNode& root);

/// "hcli-iscsi-adapter-list" for the path "iscsi adapter list"; "hcli" for the root.
std::string PageName(const std::string& path);

/// The page in the language of groff's man macros (groff_man(7)), in ASCII.
std::string RoffText(const Page& page);

/// The page as a part of a Markdown document. What all pages share stands in that of the root alone.
std::string MarkdownText(const Page& page);

}  // namespace Plinth
