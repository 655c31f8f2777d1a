#include "host/LevelSchema.h"

#include <algorithm>

#include "host/Formats.h"
#include "host/Storage.h"

namespace host {

std::string CanonicalHostFault(std::string_view text) {
  const auto bytes = ParseIpv6(text);
  if (!bytes || FormatIpv6(*bytes) == text) return HostFault(text);
  return "expected " + Quoted(FormatIpv6(*bytes)) + ", the same address in its canonical form";
}

namespace {

/// What is wrong with the value at @p path of @p record for a parameter that @p adapter has a range of.
std::string RangeFault(const Record& record, const std::string& path, const ParameterSpec& spec,
                       const Record& adapter) {
  const std::string own = "parameters/" + std::string(spec.name);
  const std::int64_t least = adapter.Has(own) ? adapter.GetInt64(own + "/min") : spec.least;
  const std::int64_t most = adapter.Has(own) ? adapter.GetInt64(own + "/max") : spec.most;
  const std::int64_t value = record.GetInt64(path);
  if (value >= least && value <= most) return {};
  std::string shown = path;
  std::replace(shown.begin(), shown.end(), '/', '.');
  return shown + ": " + std::to_string(value) + " is not from min, " + std::to_string(least) + ", to max, " +
         std::to_string(most);
}

}  // namespace

std::string ParameterFault(const Record& adapter) {
  for (const ParameterSpec& spec : kParameters) {
    const std::string path = "parameters/" + std::string(spec.name);
    if (spec.type != Type::Integer || !adapter.Has(path)) continue;
    for (const char* key : {"/current", "/default"}) {
      std::string fault = RangeFault(adapter, path + key, spec, adapter);
      if (!fault.empty()) return fault;
    }
  }
  return {};
}

std::string OverrideFault(const Record& place, const Record& adapter) {
  if (place.GetRecord("parameters") == Record()) return {};  // as most have nothing of their own
  for (const ParameterSpec& spec : kParameters) {
    const std::string path = "parameters/" + std::string(spec.name);
    if (spec.type != Type::Integer || !place.Has(path)) continue;
    std::string fault = RangeFault(place, path, spec, adapter);
    if (!fault.empty()) return fault;
  }
  return {};
}

}  // namespace host
