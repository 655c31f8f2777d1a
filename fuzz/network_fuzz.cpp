// Texts of network values: whatever the text, it is a value whose text reads back as the same, or refused
// with the text named.
#include <NodeCtl/Exception.h>
#include <NodeCtl/Network.h>

#include <optional>

#include "Support.h"
#include "host/Formats.h"

namespace {

using namespace NodeCtl::Network;

template <class Value>
std::optional<Value> Parsed(const std::string& text) {
  try {
    return Value(text);
  } catch (const NodeCtl::Lib::NodeCtlException& error) {
    fuzz::Require(error.GetDescription(0).find(host::Quoted(text)) != std::string::npos,
                  "refused without the text: " + error.GetDescription(0));
    return {};
  }
}

template <class Value>
void ReadsBack(const std::string& text) {
  const auto value = Parsed<Value>(text);
  if (!value) return;
  const std::string form = value->GetStringAddress();
  const auto again = Parsed<Value>(form);
  fuzz::Require(again && again->GetStringAddress() == form, host::Quoted(text) + " reads back as another");
  if constexpr (requires { *again == *value; }) {
    fuzz::Require(*again == *value, host::Quoted(text) + " reads back as another value");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  ReadsBack<Ipv4Address>(text);
  ReadsBack<Ipv6Address>(text);
  ReadsBack<HostAddress>(text);
  ReadsBack<MacAddress>(text);
  const auto network = Parsed<Ipv6Network>(text);
  fuzz::Require(network.has_value() == Ipv6Network::IsValidAddressAndNetmask(text),
                host::Quoted(text) + " is valid and refused, or neither");
  if (!network) return 0;
  const auto again = Parsed<Ipv6Network>(network->GetAddress().GetStringAddress() + '/' +
                                         std::to_string(network->GetNetmask()));
  fuzz::Require(again && again->GetAddress() == network->GetAddress() &&
                    again->GetNetmask() == network->GetNetmask() && network->GetNetmask() <= 128,
                host::Quoted(text) + " reads back as another network");
  return 0;
}
