/// Given this host, when this command line, then these texts, this result, these calls.
///
///     Harness host(R"({"adapters": [{"name": "hba0", "kind": "software"}]})");
///     const Outcome run = host("iscsi adapter get -A hba0");
///     EXPECT_EQ(run.result[0]["Name"], "...");
///     EXPECT_THAT(run.Calls(), ElementsAre("GetScsiInterface", ...));
///
/// The host lives in memory and is the one of the process while the harness lives. Results are held against
/// their declarations, and a run that leaks memory of the management API fails its test.
#pragma once

#include <Plinth/AutoCli.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "plinth/CommandLine.h"

/// All that came out of a run.
struct Outcome {
  int status = 0;                       ///< as the process would exit
  std::vector<std::string> messages;    ///< what was reported, in order and to the letter
  std::vector<Plinth::Reason> reasons;  ///< of the reports
  std::vector<std::string> notes;       ///< what was done besides
  nlohmann::json result;                ///< what was posted; null where nothing was
  bool closed = false;
  std::string failure;             ///< of a usage error or an escaped exception
  std::vector<std::string> trace;  ///< a line for each call of the library, in order
  std::string out;                 ///< standard output
  std::string err;                 ///< standard error

  /// The names of the operations in the trace.
  std::vector<std::string> Calls() const;
  /// The texts of a field in each row of the result.
  std::vector<std::string> Column(const char* field) const;
};

/// @p json as a host description with @p answers, JSON objects with commas between, added.
std::string WithAnswers(const std::string& json, const std::string& answers);

class Harness {
 public:
  /// @p description is a host description.
  explicit Harness(const std::string& description);
  Harness(const Harness&) = delete;
  Harness& operator=(const Harness&) = delete;
  ~Harness();

  /// @p line is split as SplitWords does.
  Outcome operator()(const std::string& line);
  Outcome operator()(const std::vector<std::string>& words);
  /// Runs a command that stands on no path.
  Outcome operator()(const boost::shared_ptr<Plinth::AutoCli::NamespaceNode>& command,
                     const std::string& options);

  /// The host as it is now, secrets included.
  nlohmann::json Show() const;
  /// The part of it at a JSON pointer such as "/adapters/0/name".
  nlohmann::json Show(const std::string& pointer) const;

  /// What the next commands read from standard input.
  std::string input;
  /// What was called on the host since the last run began.
  std::vector<std::string> trace;

 private:
  Outcome Finish(Plinth::RunRecord record, Plinth::TextConsole& console);
};

/// Expects the file @p name of the source tree to be @p text. With UPDATE_GOLDEN in the environment it is
/// from now on.
void ExpectFile(const std::string& name, const std::string& text);

/// The command tree as the plug-in registers it, with the framework's own commands behind it.
Plinth::AutoCli::Namespace& CommandTree();

/// A folder of its own that stands for the host's "/" while the object lives.
class TemporaryRoot {
 public:
  TemporaryRoot();
  TemporaryRoot(const TemporaryRoot&) = delete;
  TemporaryRoot& operator=(const TemporaryRoot&) = delete;
  ~TemporaryRoot();

  const std::string& Path() const { return path_; }
  /// The contents of a file below it; empty where there is none.
  std::string Read(const std::string& file) const;

 private:
  std::string path_;
  std::string before_;
};
