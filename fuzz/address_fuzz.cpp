// Target addresses as users type them: whatever the text, it is an address or refused, and what is shown of
// an address reads back as the same.
#include "IscsiUtil/IscsiTools.h"
#include "Support.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using IscsiUtil::IscsiTools;
  const std::string text(reinterpret_cast<const char*>(data), size);
  try {
    const auto address = IscsiTools::GetTargetAddressFromString(text);
    const std::string shown = IscsiTools::GetStringFromTargetAddress(address);
    const auto again = IscsiTools::GetTargetAddressFromString(shown);
    fuzz::Require(again.host == address.host && again.port == address.port, shown + " is another address");
  } catch (const NodeCtl::Lib::NodeCtlException&) {
  }
  return 0;
}
