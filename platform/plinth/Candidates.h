/// What may follow in a command line that is still being written.
#pragma once

#include <Plinth/AutoCli.h>

#include <string>
#include <vector>

namespace Plinth {

struct ValueSource;

struct Candidate {
  /// The whole word that may stand there.
  std::string word;
  /// One line, or empty.
  std::string description;
};

struct Candidates {
  /// In the order in which they are to be shown.
  std::vector<Candidate> list;
  enum class Files { None, All, Folders };
  /// Names of files may stand there, with which shells know how to help.
  Files files = Files::None;
  /// A word may go on behind a candidate, which has no blank behind it then.
  bool goesOn = false;
};

/// What may stand under @p root behind @p words in place of @p last, which is the beginning of a word, or
/// empty. Nothing where a secret has to stand, or where the words are wrong. Values that only the host knows
/// are asked for as ShownValues does.
Candidates CandidatesFor(AutoCli::Namespace& root, const std::vector<std::string>& words,
                         const std::string& last);

/// The values that the command of @p source shows of the host with @p options, each once. Nothing is changed
/// by that, and nobody waited for: a host that is locked, damaged or slow has no values.
[[gnu::visibility("default")]] std::vector<Candidate> ShownValues(AutoCli::Namespace& root,
                                                                  const std::vector<std::string>& options,
                                                                  const ValueSource& source);

}  // namespace Plinth
