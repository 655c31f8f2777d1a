#include <stdlib.h>

#include <optional>
#include <string>

#include "plinth/Run.h"

namespace Plinth {

namespace {

constexpr char kVariable[] = "HCLI_TRACE";

/// Sets the variable that libraries look at; afterwards it is as it was.
class TraceVariable {
 public:
  explicit TraceVariable(bool on) {
    if (const char* before = getenv(kVariable)) before_ = before;
    setenv(kVariable, on ? "1" : "0", 1);
  }
  TraceVariable(const TraceVariable&) = delete;
  TraceVariable& operator=(const TraceVariable&) = delete;
  ~TraceVariable() {
    if (before_) {
      setenv(kVariable, before_->c_str(), 1);
    } else {
      unsetenv(kVariable);
    }
  }

 private:
  std::optional<std::string> before_;
};

}  // namespace

void Trace(Run&, const Given& given, const Rest& rest) {
  const TraceVariable variable(given.truth);
  rest();
}

}  // namespace Plinth
