/// The record files of open-iscsi: interfaces, nodes and portals that are asked for targets, as iscsiadm(8)
/// has them.
///
/// A record is a text file of lines "name = value". What a record does not name has the value that
/// iscsid.conf gives it, or else open-iscsi's own. Each file is whole at any time; open-iscsi's lock is not
/// taken, so of what two write at once one is lost.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

/// Names and values in the order of the file.
using Record = std::vector<std::pair<std::string, std::string>>;

/// Comments and lines without "=" say nothing.
Record ParseRecord(std::string_view text);
/// An Error where a value cannot stand in a line of its own.
std::string RecordText(const Record& record);
/// The value of the last line with @p name; empty where there is none.
std::string ValueOf(const Record& record, std::string_view name);

/// The record at @p path of the host; nothing where there is none.
std::optional<Record> ReadRecord(std::string_view path);
/// Puts the record in the place of what is at @p path of the host, in one step. The file has mode 0600, and
/// so do secrets in it; folders that are missing are made for the owner alone.
void WriteRecord(std::string_view path, const Record& record);
/// Where there is no such record, nothing happens. Folders that are empty then go too, up to @p top.
void RemoveRecord(std::string_view path, std::string_view top);

/// Where iscsiadm(8) says that interface records are.
std::string InterfacePath(std::string_view interface);
/// The same of a node record: one for a target, a portal of it and an interface. @p address is without
/// brackets.
std::string NodePath(std::string_view target, std::string_view address, std::int64_t port, int group,
                     std::string_view interface);
/// The same of a portal that is asked for targets.
std::string SendTargetsPath(std::string_view address, std::int64_t port);

inline constexpr std::string_view kInterfaces = "/etc/iscsi/ifaces";
inline constexpr std::string_view kNodes = "/etc/iscsi/nodes";
inline constexpr std::string_view kSendTargets = "/etc/iscsi/send_targets";

}  // namespace linux

#pragma GCC visibility pop
