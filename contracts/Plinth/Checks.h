/// How things stand around a program: how each part of a platform tells what is well, what is not, and what
/// mends it.
#pragma once

#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth {

enum class FindingState : int {
  Ok = 0,
  Warning = 1,  ///< it works, and somebody should know
  Fault = 2,    ///< something does not work
};

/// What came of one look. Texts are UTF-8 without line breaks, and no secret.
struct Finding {
  std::string check;  ///< what was looked at, in a few words, such as "host database"
  FindingState state = FindingState::Ok;
  std::string seen;  ///< what was seen, a sentence; never empty
  std::string mend;  ///< what mends it, a command line where there is one; empty where nothing is to be done
};

/// A text for somebody who is to help from afar: UTF-8, of any number of lines, and no secret.
struct Enclosure {
  std::string name;  ///< what it holds, in a few words; unique in its source
  std::string text;
};

/// A variable of the environment that a part of the platform reads.
struct Variable {
  std::string name;
  bool mayBeEmpty = false;  ///< empty is a value of its own
};

/// Implemented by each part of a platform. Whatever state things are in, the operations tell of it and change
/// nothing: they make, mend and convert no file. They throw nothing but std::bad_alloc.
class CheckSource {
 public:
  CheckSource() = default;
  CheckSource(const CheckSource&) = delete;
  CheckSource& operator=(const CheckSource&) = delete;
  virtual ~CheckSource() = default;

  /// All that there is to look at, which may take seconds. It may make further sources known, which are then
  /// asked behind this one.
  virtual std::vector<Finding> Check() = 0;
  /// What was set and is not in effect yet: a finding for each adapter with such changes, by its name as
  /// @p check, or for the host, with an empty one. For every look at the host, and so quick. Unlike the other
  /// operations it reads as library calls do, within the state that those see.
  virtual std::vector<Finding> Waiting() { return {}; }
  /// The parts of a report. Called behind Check.
  virtual std::vector<Enclosure> Describe() { return {}; }
  /// The variables that this part reads.
  virtual std::vector<Variable> Variables() { return {}; }
};

/// Makes @p source known. The caller keeps it to the end of the process.
void AddCheckSource(CheckSource& source);

/// All sources: the framework's own, and those that have been made known, in that order. The list stays where
/// it is and may grow.
const std::vector<CheckSource*>& CheckSources();

}  // namespace Plinth

#pragma GCC visibility pop
