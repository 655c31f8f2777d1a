// Files of variables: a name, a line break, a value, a line break, and the file. Whatever is in it, it is
// refused and stays, or all of its lines stay but those of the variable that is set, which reads back.
#include <CoreCtl/Util.h>

#include "Support.h"
#include "host/EnvironmentText.h"
#include "host/Storage.h"

namespace {

using CoreCtl::Util::EnvironmentVarFile;
using NodeCtl::Lib::NodeCtlException;

/// False where @p step is refused.
template <class Step>
bool Works(Step step) {
  try {
    step();
    return true;
  } catch (const NodeCtlException& error) {
    fuzz::Require(!error.GetDescription(0).empty(), "refused without a text");
    return false;
  }
}

bool Assigns(const std::string& line, const std::string& name) {
  host::EnvironmentText text;
  text.Parse(line);
  return text.Get(name).has_value();
}

void RequireTheOtherLines(std::string before, std::string after, const std::string& name) {
  while (!before.empty()) {
    fuzz::Require(!after.empty(), "a line is lost");
    const std::string line = fuzz::TakeLine(before);
    const std::string now = fuzz::TakeLine(after);
    fuzz::Require(Assigns(line, name) ? Assigns(now, name) : line == now, "a line has become " + now);
  }
  if (after.empty()) return;
  fuzz::Require(Assigns(fuzz::TakeLine(after), name) && after.empty(), "there is more than the variable");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const std::string path = fuzz::TemporaryRoot() + "/variables";
  std::string before(reinterpret_cast<const char*>(data), size);
  const std::string name = fuzz::TakeLine(before);
  const std::string value = fuzz::TakeLine(before);
  fuzz::WriteFile(path, before);

  EnvironmentVarFile file("/variables");
  if (!Works([&] { file.Parse(); })) {
    fuzz::Require(fuzz::FileContents(path) == before, "a refused file has changed");
    return 0;
  }
  const bool set = Works([&] { file.Set(name, value); });
  file.Save();
  const std::string after = fuzz::FileContents(path);
  if (!set) {
    fuzz::Require(after == before, "a file in which nothing was set has changed");
    return 0;
  }
  host::EnvironmentText text;
  text.Parse(after);
  fuzz::Require(text.Get(name) == value, "the value reads back as another");
  RequireTheOtherLines(before, after, name);
  return 0;
}
