#include "Support.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <nlohmann/json.hpp>

#include "simulator/Simulator.h"

/// Here and not in the environment, so that a finding that is replayed meets the same. Memory that is kept
/// back, and long histories of it, take most of the time otherwise.
extern "C" const char* __asan_default_options() {
  return "detect_leaks=1:strict_string_checks=1:quarantine_size_mb=16:malloc_context_size=8";
}
extern "C" const char* __ubsan_default_options() { return "print_stacktrace=1"; }

namespace fuzz {

void Fail(const std::string& text) {
  std::fprintf(stderr, "FINDING: %s\n", text.c_str());
  std::abort();
}

const std::string& TemporaryRoot() {
  static const std::string root = [] {
    std::string name = (std::filesystem::temp_directory_path() / "hcli-fuzz-XXXXXX").string();
    if (mkdtemp(name.data()) == nullptr) Fail("no temporary folder " + name);
    setenv("HCLI_ROOT", name.c_str(), 1);
    return name;
  }();
  static const int removed = std::atexit([] {
    std::error_code ignored;
    std::filesystem::remove_all(root, ignored);
  });
  Require(removed == 0, "the temporary folder would stay");
  return root;
}

void WriteFile(const std::string& path, const std::string& contents) {
  std::ofstream(path, std::ios::binary) << contents;
}

std::string FileContents(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

void RequireThatItReloads(host::Host& host) {
  static const std::unique_ptr<host::Host> again = simulator::HostOf("{}");
  const std::string shown = simulator::Show(true, host);
  try {
    simulator::Load(shown, *again);
  } catch (const host::Error& error) {
    Fail(std::string("the host that is shown is refused: ") + error.what() + "\n" + shown);
  }
  const std::string shownAgain = simulator::Show(true, *again);
  // Keys that were set later stand behind others, and mean the same.
  Require(nlohmann::json::parse(shown) == nlohmann::json::parse(shownAgain),
          "the host that is shown is another one after load:\n" + shown + shownAgain);
}

std::string TakeLine(std::string& text) {
  const std::size_t end = std::min(text.find('\n'), text.size());
  std::string line = text.substr(0, end);
  text.erase(0, end + 1);
  return line;
}

std::vector<std::string> Lines(std::string text) {
  std::vector<std::string> lines;
  while (!text.empty()) lines.push_back(TakeLine(text));
  return lines;
}

std::vector<std::string> TextsOf(const std::string& json) {
  std::vector<std::string> texts;
  const auto collect = [&](int, nlohmann::json::parse_event_t, nlohmann::json& value) {
    if (value.is_string()) texts.push_back(value.get<std::string>());
    return true;
  };
  static_cast<void>(nlohmann::json::parse(json, collect));
  std::sort(texts.begin(), texts.end());
  texts.erase(std::unique(texts.begin(), texts.end()), texts.end());
  return texts;
}

std::size_t HandOver(const std::string& text, std::uint8_t* data, std::size_t room) {
  return text.copy(reinterpret_cast<char*>(data), room);
}

}  // namespace fuzz
