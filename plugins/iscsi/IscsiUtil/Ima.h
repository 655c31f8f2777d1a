/// The management API as the commands use it: what a call hands out frees itself, and a call that fails ends
/// the steps with the text that the command shows of it.
///
///     ReportingImaFailures(*output, [&] {
///       for (const IMA_OID& oid : ImaList("Unable to get plugin list.", IMA_GetPluginOidList)) {
///         const auto plugin = ReadIma(IMA_GetPluginProperties, oid, "Unable to get plugin properties.");
///         ...
///       }
///     });
#pragma once

#include <Plinth/CallSpec.h>
#include <ima/ima.h>
#include <ima/ima_tsr.h>

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <utility>

namespace IscsiUtil {

/// A call that failed: thrown to end the steps of a command. Never leaves ReportingImaFailures.
struct ImaFailure {
  const char* text;  ///< what the command shows of it
};

inline void CheckIma(IMA_STATUS status, const char* failure) {
  if (status != IMA_STATUS_SUCCESS) throw ImaFailure{failure};
}

/// Runs @p steps; a call that fails ends them and is reported.
template <class Steps>
void ReportingImaFailures(Plinth::CallSpec::Output& output, Steps&& steps) {
  try {
    steps();
  } catch (const ImaFailure& failure) {
    output.ReportError(failure.text);
  }
}

inline std::span<const IMA_OID> ElementsOf(const IMA_OID_LIST& list) {
  return {&list.oids[0], list.oidCount};
}
inline std::span<const IMA_ADDRESS_KEY> ElementsOf(const IMA_ADDRESS_KEYS& keys) {
  return {&keys.addressKeys[0], keys.addressKeyCount};
}

/// Elements that the API handed out, owned for as long as this lives.
template <class List>
class ImaOwned {
 public:
  /// What @p call(@p arguments..., &list) hands out.
  template <class Call, class... Arguments>
  ImaOwned(const char* failure, Call call, const Arguments&... arguments)
      : ImaOwned([&] {
          List* list = nullptr;
          CheckIma(call(arguments..., &list), failure);
          return list;
        }()) {}
  /// Takes over @p list, which may be null.
  explicit ImaOwned(List* list) : list_(list) {
    if (list_ != nullptr) elements_ = ElementsOf(*list_);
  }
  ImaOwned(const ImaOwned&) = delete;
  ImaOwned& operator=(const ImaOwned&) = delete;
  ~ImaOwned() {
    if (list_ != nullptr) IMA_FreeMemory(list_);
  }

  auto begin() const { return elements_.begin(); }
  auto end() const { return elements_.end(); }

 private:
  List* list_;
  decltype(ElementsOf(std::declval<const List&>())) elements_;
};

using ImaList = ImaOwned<IMA_OID_LIST>;
using ImaAddressKeys = ImaOwned<IMA_ADDRESS_KEYS>;

/// The record of the object @p oid.
template <class Record>
Record ReadIma(IMA_STATUS (*read)(IMA_OID, Record*), const IMA_OID& oid, const char* failure) {
  Record record{};
  CheckIma(read(oid, &record), failure);
  return record;
}

/// The first of @p objects whose record @p matches. Those behind it are not read.
template <class Record, class Matches>
std::optional<IMA_OID> FindIma(const ImaList& objects, IMA_STATUS (*read)(IMA_OID, Record*),
                               const char* failure, Matches&& matches) {
  for (const IMA_OID& oid : objects) {
    if (matches(ReadIma(read, oid, failure))) return oid;
  }
  return std::nullopt;
}

// Texts. A size is that of a buffer with its terminator: a text of that many bytes or more is cut, never
// inside a UTF-8 character.

inline constexpr std::size_t kNameSize = 224;        ///< names of adapters and targets
inline constexpr std::size_t kDeviceNameSize = 256;  ///< names of adapters where firmware is concerned
inline constexpr std::size_t kTextSize = 1024;       ///< all other texts

std::string CutText(std::string text, std::size_t size);
/// @p wide up to its zero as UTF-8, in any locale. A number that is no character gives "?".
std::string NarrowText(std::span<const IMA_WCHAR> wide, std::size_t size);
/// @p address as text; empty where it has none.
std::string AddressText(const IMA_IP_ADDRESS& address);
/// Twelve lower-case hexadecimal digits.
std::string IsidText(const IMA_INITIATOR_SESSION_ID& isid);

/// The first of the logical @p adapters with this name, which is cut at @p size.
std::optional<IMA_OID> FindLogicalAdapter(const ImaList& adapters, const std::string& name,
                                          const char* failure, std::size_t size = kNameSize);

}  // namespace IscsiUtil
