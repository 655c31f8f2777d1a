/// How a command's file gives its class to the tree.
#pragma once

#include <Plinth/AutoCli.h>

namespace TessaroCli::IscsiNamespace {

using NodePtr = boost::shared_ptr<Plinth::AutoCli::NamespaceNode>;

/// A new object of the class @p CommandClass, which need not be known here: its own file instantiates this.
template <class CommandClass>
NodePtr Make();

}  // namespace TessaroCli::IscsiNamespace
