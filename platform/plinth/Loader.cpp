#include "plinth/Loader.h"

#include <dirent.h>
#include <dlfcn.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <optional>
#include <string_view>

#include "plinth/Declarations.h"
#include "plinth/Failure.h"
#include "plinth/LibraryFile.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::Child;
using AutoCli::Namespace;
using AutoCli::NodeData;

/// The "*.so" files of the folder by name. False, with errno, where it cannot be read.
bool ListPlugins(const std::string& folder, std::vector<std::string>& names) {
  const std::unique_ptr<DIR, int (*)(DIR*)> directory(opendir(folder.c_str()), closedir);
  if (!directory) return false;
  errno = 0;  // how a folder that cannot be read on is told from one that has ended
  while (const dirent* entry = readdir(directory.get())) {
    const std::string_view name = entry->d_name;
    if (name.size() > 3 && name.substr(name.size() - 3) == ".so") names.emplace_back(name);
    errno = 0;
  }
  const bool isWhole = errno == 0;
  std::sort(names.begin(), names.end());
  return isWhole;
}

/// Who else than root could have put code into the file or folder @p path; "" where nobody could, or where it
/// is not root who would run it.
std::string StrangerFault(const std::string& path, PluginFolder folder) {
  struct stat status;
  if (folder == PluginFolder::BuiltIn || geteuid() != 0 || stat(path.c_str(), &status) != 0) return "";
  char fault[64] = "";
  if (status.st_uid != 0) {
    std::snprintf(fault, sizeof fault, "it belongs to user %u", static_cast<unsigned>(status.st_uid));
  } else if ((status.st_mode & (S_IWGRP | S_IWOTH)) != 0) {
    std::snprintf(fault, sizeof fault, "others can write to it, its mode is %04o",
                  static_cast<unsigned>(status.st_mode & 07777));
  } else {
    return "";
  }
  return std::string(fault) + "; run by root, it has to belong to root and be writable by root alone";
}

/// Lets the file register its nodes under @p scratch. Returns the trouble, or "".
std::string LoadFile(const std::string& path, const boost::shared_ptr<Namespace>& scratch) {
  // Bound at once: a library that lacks something must fail here, and not in the middle of a command.
  void* handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
  if (!handle) return dlerror();
  using EntryPoint = void (*)(boost::shared_ptr<Namespace>);
  const auto entry = reinterpret_cast<EntryPoint>(dlsym(handle, "AutoCli_RegisterNamespaces"));
  if (!entry) return "it has no entry point AutoCli_RegisterNamespaces";
  try {
    entry(scratch);
  } catch (...) {
    return "it failed to register its commands: " + CurrentExceptionText();
  }
  return "";
}

std::string FindClash(const Namespace& root, const Namespace& scratch) {
  for (const Child& child : NodeData::Of(scratch).children) {
    if (FindOwnCommand(child.name) || NodeData::FindChild(root, child.name)) {
      return "the name " + Quoted(child.name) + " is taken";
    }
  }
  return "";
}

std::optional<PluginPlace>& PlaceInUse() {
  static std::optional<PluginPlace> place;
  return place;
}

/// Why nothing is loaded from the folder, or "".
std::string FolderFault(const PluginPlace& place) {
  if (place.folder.empty() && place.whose == PluginFolder::BuiltIn) {
    return "no plug-ins are loaded: where the program lies cannot be told without /proc; give their folder "
           "with "
           "--plugins";
  }
  const std::string fault = StrangerFault(place.folder, place.whose);
  return fault.empty() ? "" : "the plug-in folder " + Quoted(place.folder) + " is left out: " + fault;
}

/// As FindPlugins, of a folder without a fault.
std::string ListFolder(const std::string& folder, std::vector<std::string>& names) {
  if (ListPlugins(folder, names)) return "";
  return "cannot read the plug-in folder " + Quoted(folder) + ": " + std::strerror(errno);
}

}  // namespace

const PluginPlace* PluginPlaceInUse() { return PlaceInUse() ? &*PlaceInUse() : nullptr; }

std::string FindPlugins(const PluginPlace& place, std::vector<std::string>& names) {
  const std::string fault = FolderFault(place);
  return fault.empty() ? ListFolder(place.folder, names) : fault;
}

std::string TakeInPlugin(Namespace& root, const PluginPlace& place, const std::string& name) {
  const std::string path = place.folder + '/' + name;
  // What a plug-in registers before it fails goes with this namespace.
  const auto scratch = Namespace::New();
  std::string trouble = StrangerFault(path, place.whose);
  if (trouble.empty()) trouble = LibraryFault(path);
  if (trouble.empty()) trouble = LoadFile(path, scratch);
  if (trouble.empty()) trouble = FindClash(root, *scratch);
  if (!trouble.empty()) return "plug-in " + Quoted(path) + " is left out: " + Visible(trouble);
  for (const Child& child : NodeData::Of(*scratch).children) {
    NodeData::Of(*child.node).plugin = name.substr(0, name.size() - 3);
    root.RegisterNamespaceNode(child.node, child.name);
  }
  return "";
}

std::vector<std::string> LoadPlugins(Namespace& root, const std::string& folder, PluginFolder whose,
                                     const std::string& first) {
  const PluginPlace place{folder, whose};
  PlaceInUse() = place;
  if (const std::string fault = FolderFault(place); !fault.empty()) return {fault};
  std::vector<std::string> troubles;
  const auto note = [&](const std::string& trouble) {
    if (!trouble.empty()) troubles.push_back(trouble);
  };
  // Each costs a tenth of a short command, so none is loaded for the sake of another one's words.
  const std::string own = first.find('/') == first.npos ? first + ".so" : "";
  const bool hasOwn = own.size() > 3 && access((folder + '/' + own).c_str(), F_OK) == 0;
  if (hasOwn) note(TakeInPlugin(root, place, own));
  if (hasOwn && NodeData::FindChild(root, first)) return troubles;
  std::vector<std::string> names;
  note(ListFolder(folder, names));
  for (const std::string& name : names) {
    if (!hasOwn || name != own) note(TakeInPlugin(root, place, name));
  }
  return troubles;
}

}  // namespace Plinth
