/// Running other programs of this machine, for as long as one is willing to wait.
#pragma once

#include <chrono>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

struct Ended {
  bool timedOut = false;  // it was killed when its time was over
  int status = 0;         // its exit status; 128 and the signal's number where one ended it
  std::string output;
  std::string complaints;  // what it wrote to standard error
};

/// Runs the program at @p words[0], a path of the host, with no input and in the C locale. Everyone can see
/// the words: no secret may be among them. Of either text at most 16 MiB are kept. An Error where it cannot
/// be started.
Ended RunProgram(std::vector<std::string> words, std::chrono::milliseconds limit);

}  // namespace linux

#pragma GCC visibility pop
