/// What the fuzzing programs share.
#pragma once

#include <cstddef>
#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include "host/Host.h"

namespace fuzz {

/// Ends the process as a finding.
[[noreturn]] void Fail(const std::string& text);

inline void Require(bool holds, const std::string& text) {
  if (!holds) Fail(text);
}

/// The folder that stands for the host's "/" from the first call on. It goes away with the process; what a
/// finding leaves of it lies in the folder for temporary files.
const std::string& TemporaryRoot();

void WriteFile(const std::string& path, const std::string& contents);
std::string FileContents(const std::string& path);

/// What @p host shows loads, and shows as the same again.
void RequireThatItReloads(host::Host& host);

/// The first line of @p text, which loses it.
std::string TakeLine(std::string& text);
std::vector<std::string> Lines(std::string text);

/// Each text, and each name of a key, in a JSON document.
std::vector<std::string> TextsOf(const std::string& json);

/// Decides what a mutator does.
class Random {
 public:
  explicit Random(unsigned seed) : engine_(seed) {}
  std::size_t Below(std::size_t limit) { return engine_() % limit; }
  bool OneIn(std::size_t count) { return Below(count) == 0; }
  template <class List>
  const auto& Of(const List& list) {
    return list[Below(std::size(list))];
  }

 private:
  std::minstd_rand engine_;
};

/// Hands @p text to the fuzzer, cut where it has no room.
std::size_t HandOver(const std::string& text, std::uint8_t* data, std::size_t room);

}  // namespace fuzz

/// The fuzzer's own mutations of bytes.
extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t room);
