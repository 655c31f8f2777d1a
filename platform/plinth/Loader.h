/// The steps of LoadPlugins, for who looks at the plug-ins one by one.
#pragma once

#include <Plinth/AutoCli.h>

#include <string>
#include <vector>

#include "plinth/CommandLine.h"

namespace Plinth {

struct PluginPlace {
  std::string folder;
  PluginFolder whose;
};

/// Where LoadPlugins was told to look last; null where it was never called.
const PluginPlace* PluginPlaceInUse();

/// The "*.so" files of the folder by name. Returns the trouble with the folder as a whole, or "".
std::string FindPlugins(const PluginPlace& place, std::vector<std::string>& names);

/// Hangs under @p root what the file @p name registers, whole or not at all. Returns the trouble, or "".
std::string TakeInPlugin(AutoCli::Namespace& root, const PluginPlace& place, const std::string& name);

}  // namespace Plinth
