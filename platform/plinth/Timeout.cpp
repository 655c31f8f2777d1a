#include <Plinth/Patience.h>

#include <charconv>
#include <chrono>
#include <cmath>
#include <utility>
#include <vector>

#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using std::chrono::milliseconds;

constexpr double kMostSeconds = 86400;

std::vector<Patience*>& Patiences() {
  static std::vector<Patience*> patiences;
  return patiences;
}

/// The time that the option gives. Rounded up: only 0 is not to wait.
milliseconds LimitOf(const Given& given) {
  const std::string& text = given.texts.front();
  const char* const end = text.data() + text.size();
  double seconds = 0;
  const auto [rest, error] = std::from_chars(text.data(), end, seconds, std::chars_format::fixed);
  // The library would take "-0", "inf" and "nan" as well.
  const bool isPlain = text.find_first_not_of("0123456789.") == text.npos;
  if (!isPlain || error != std::errc() || rest != end || seconds > kMostSeconds) {
    throw UsageError("option --timeout: " + Quoted(text) +
                     " is not a number of seconds from 0 to 86400, such as 20 or 0.5");
  }
  return milliseconds(static_cast<milliseconds::rep>(std::ceil(seconds * 1000)));
}

/// Sets the limit of each; afterwards each is as it was.
class Limited {
 public:
  explicit Limited(milliseconds limit) {
    before_.reserve(Patiences().size());
    for (Patience* patience : Patiences()) before_.emplace_back(patience, patience->SetLimit(limit));
  }
  Limited(const Limited&) = delete;
  Limited& operator=(const Limited&) = delete;
  ~Limited() {
    for (const auto& [patience, limit] : before_) patience->SetLimit(limit);
  }

 private:
  std::vector<std::pair<Patience*, milliseconds>> before_;
};

}  // namespace

void AddPatience(Patience& patience) { Patiences().push_back(&patience); }

void CheckTimeout(Run&, const Given& given) { LimitOf(given); }

void LimitWaiting(Run&, const Given& given, const Rest& rest) {
  const Limited limited(LimitOf(given));
  rest();
}

}  // namespace Plinth
