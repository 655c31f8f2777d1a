/// What the sweep runs: command lines of every command, on a host on which each makes all its library calls,
/// and what each command says of a call that fails.
#pragma once

#include <Plinth/AutoCli.h>

#include <functional>
#include <string>
#include <vector>

namespace sweep {

/// Stands for the text of the library's exception in the reports of a command.
inline constexpr char kReason[] = "the library's own reason";

/// What a command does about the iScsiStatus of a change.
enum class Statuses {
  Ignored,
  Shown,     ///< each at once: a report, or a reset
  Gathered,  ///< at the end: reboots as the text of the result, and one reset
};

using Texts = std::vector<std::string>;

struct SweptCommand {
  std::string name;   ///< the path below "iscsi", or the class
  std::string lines;  ///< options, a bar between command lines; FILE stands for an image file
  /// What is reported, a bar between the texts: of an exception, whose own text %REASON% stands for; behind
  /// the name of an IMA call and a colon, of its failure.
  std::string reports;
  /// Of a class that stands on no path.
  std::function<boost::shared_ptr<Plinth::AutoCli::Command>()> make = nullptr;
  Statuses statuses = Statuses::Ignored;
};

const std::vector<SweptCommand>& Commands();

/// What stands between the bars of @p text, without the blanks around it.
Texts Parts(const std::string& text);

/// The host; its secrets, and those of the command lines, begin with kSecret.
std::string HostDescription();
inline constexpr char kSecret[] = "s3cr3t";

/// What becomes of a run behind a failing call, where it is not the rule: that the command ends there, with
/// its reports and without a result.
enum class Behind {
  TheRule,
  GoesOn,       ///< as if the host had nothing there: a result, and no report of it
  KeepsRows,    ///< reported, and the rows that were there by then are the result
  AsksKind,     ///< the kind of the adapter is asked for first, as some may lack the call
  TakesBack,    ///< one more call takes back what was done
  ToFramework,  ///< the exception is none that the command's own handlers are for
};

/// What the command reports when @p operation fails; nothing where no text is known for it.
Texts ReportsOf(const SweptCommand& command, const std::string& operation);

/// The exceptions to the rule, each with its reason in the table.
Behind BehindOf(const SweptCommand& command, const std::string& operation, const std::string& thrown);

}  // namespace sweep
