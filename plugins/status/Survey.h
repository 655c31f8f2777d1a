/// What there is to know of a host's storage at a glance, read in one walk.
#pragma once

#include <NodeCtl/iScsiInterface.h>
#include <ima/ima.h>

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace TessaroCli::Status {

using NodeCtl::Storage::iScsiInterface;

/// A target and how many of its sessions or connections are meant; or a login status word.
struct NamedTarget {
  std::string name;
  std::size_t count = 0;
  IMA_UINT32 loginStatus = 0;
};

/// An adapter; what could not be read is absent or missing in the lists, and was told.
struct AdapterSurvey {
  std::string name;
  std::string driver;
  std::string description;
  std::optional<iScsiInterface::iScsiAdapterState> state;
  std::optional<iScsiInterface::iScsiDiscoveryStatus> discovery;
  std::optional<NodeCtl::Storage::iScsiChapType> chap;
  std::optional<NodeCtl::Storage::iScsiChapType> mutualChap;
  bool hasTargets = false;               ///< its targets could be read
  std::size_t sessions = 0;              ///< with all its targets
  std::vector<NamedTarget> connected;    ///< with the number of sessions
  std::vector<std::string> unconnected;  ///< known, and without a session
  std::vector<NamedTarget> refused;      ///< the last login failed
  std::vector<NamedTarget> broken;       ///< with the number of connections that are not logged in
  std::vector<std::string> unread;       ///< what could not be read: a sentence each
};

/// Tells at once of what cannot be read: a sentence.
using Tell = std::function<void(const std::string& text)>;

/// The adapters in the host's order; nothing where they cannot be listed, which was told then.
std::optional<std::vector<AdapterSurvey>> SurveyHost(const Tell& tell);

}  // namespace TessaroCli::Status
