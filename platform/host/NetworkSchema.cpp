#include "host/NetworkSchema.h"

#include <algorithm>
#include <charconv>
#include <map>

#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/Storage.h"

namespace host {

std::string MacOrNoneFault(std::string_view text) { return text.empty() ? "" : MacFault(text); }
std::string CanonicalHostOrNoneFault(std::string_view text) {
  return text.empty() ? "" : CanonicalHostFault(text);
}
std::string IpOrNoneFault(std::string_view text) { return text.empty() ? "" : IpFault(text); }

std::string LunFault(std::string_view text) {
  // Beyond the signed numbers no command could show it.
  std::int64_t number = -1;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error == std::errc() && end == text.data() + text.size() && number >= 0 && text[0] != '-') return {};
  return "expected a whole number from 0 to 9223372036854775807, in quotes";
}

std::string AddressListFault(const Record& record, const std::string& path) {
  std::string list = path;
  std::replace(list.begin(), list.end(), '.', '/');
  const auto element = [&](std::size_t i) { return path + '[' + std::to_string(i) + ']'; };
  const auto address = [&](std::size_t i) {
    return record.GetString(list + '/' + std::to_string(i) + "/address");
  };
  std::map<Ipv6Bytes, std::size_t> places;
  for (std::size_t i = 0; i < record.GetSize(list); ++i) {
    const auto [first, isNew] = places.emplace(*ParseIpv6(address(i)), i);
    if (isNew) continue;
    return element(i)
        .append(".address: ")
        .append(Quoted(address(i)))
        .append(" is taken by ")
        .append(element(first->second));
  }
  return {};
}

std::string NicFault(const Record& nic) { return AddressListFault(nic, "ipv6Addresses"); }

std::string IsnsServerFault(const Record& server) {
  const bool isStatic = server.GetString("method") == "static";
  if (isStatic != server.GetString("address").empty()) return {};
  return isStatic ? "address: missing, and required of a static server"
                  : "address: only a static server has one";
}

}  // namespace host
