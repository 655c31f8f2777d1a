#include <dirent.h>
#include <dlfcn.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/Failure.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::Child;
using AutoCli::Namespace;
using AutoCli::NodeData;

/// The names of the framework's own commands stay free, so that no plug-in can take them away.
constexpr std::string_view kReservedNames[] = {"catalogue", "completion"};

/// The "*.so" files of the folder by name. False, with errno, where it cannot be read.
bool ListPlugins(const std::string& folder, std::vector<std::string>& names) {
  const std::unique_ptr<DIR, int (*)(DIR*)> directory(opendir(folder.c_str()), closedir);
  if (!directory) return false;
  while (const dirent* entry = readdir(directory.get())) {
    const std::string_view name = entry->d_name;
    if (name.size() > 3 && name.substr(name.size() - 3) == ".so") names.emplace_back(name);
  }
  std::sort(names.begin(), names.end());
  return true;
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
    const bool reserved = std::find(std::begin(kReservedNames), std::end(kReservedNames), child.name) !=
                          std::end(kReservedNames);
    if (reserved || NodeData::FindChild(root, child.name)) {
      return "the name " + Quoted(child.name) + " is taken";
    }
  }
  return "";
}

}  // namespace

std::vector<std::string> LoadPlugins(Namespace& root, const std::string& folder, PluginFolder whose) {
  std::vector<std::string> troubles;
  std::vector<std::string> names;
  if (const std::string fault = StrangerFault(folder, whose); !fault.empty()) {
    troubles.push_back("the plug-in folder " + Quoted(folder) + " is left out: " + fault);
  } else if (!ListPlugins(folder, names)) {
    troubles.push_back("cannot read the plug-in folder " + Quoted(folder) + ": " + std::strerror(errno));
  }
  for (const std::string& name : names) {
    const std::string path = folder + '/' + name;
    // What a plug-in registers before it fails goes with this namespace.
    const auto scratch = Namespace::New();
    std::string trouble = StrangerFault(path, whose);
    if (trouble.empty()) trouble = LoadFile(path, scratch);
    if (trouble.empty()) trouble = FindClash(root, *scratch);
    if (!trouble.empty()) {
      troubles.push_back("plug-in " + Quoted(path) + " is left out: " + Visible(trouble));
      continue;
    }
    for (const Child& child : NodeData::Of(*scratch).children) {
      root.RegisterNamespaceNode(child.node, child.name);
    }
  }
  return troubles;
}

}  // namespace Plinth
