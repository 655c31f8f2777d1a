/// The walk of the listings: adapters, their targets, the targets' sessions, in the order of the API.
#pragma once

#include <string>

#include "CommandFrame.h"
#include "IscsiUtil/Ima.h"

namespace TessaroCli::IscsiNamespace {

using IscsiUtil::AddressText;
using IscsiUtil::CheckIma;
using IscsiUtil::CutText;
using IscsiUtil::FindIma;
using IscsiUtil::ImaAddressKeys;
using IscsiUtil::ImaList;
using IscsiUtil::IsidText;
using IscsiUtil::kNameSize;
using IscsiUtil::kTextSize;
using IscsiUtil::NarrowText;
using IscsiUtil::ReadIma;
using IscsiUtil::ReportingImaFailures;

/// What a listing reports when the calls for sessions fail. Those above them report the same in all listings.
struct SessionTexts {
  const char* list;
  const char* properties;
};

/// False where the option @p option, which limits a listing, was given and is not @p text.
inline bool Passes(const Plinth::CallSpec::Input& input, const char* option, const std::string& text) {
  return !input.HasParameter(option) || input.GetString(option) == text;
}

/// Each operation visits one level: what passes the filters `adapter`, `name` and `isid` of that level and
/// those above it. Nothing below an object that does not pass is read. A failed call throws ImaFailure.
class ImaWalk {
 public:
  struct Adapter {
    IMA_OID oid;
    std::string name;
  };
  struct Target {
    const Adapter& adapter;
    IMA_OID oid;
    IMA_TARGET_PROPERTIES properties;
    std::string name;

    std::string Id() const { return CutText(adapter.name + ',' + name, kTextSize); }
  };
  struct Session {
    const Target& target;
    IMA_OID oid;
    IMA_SESSION_PROPERTIES properties;
    std::string isid;

    std::string Id() const { return CutText(target.Id() + ',' + isid, kTextSize); }
  };

  explicit ImaWalk(InputPtr input) : input_(std::move(input)) {}

  template <class Visit>
  void Adapters(Visit&& visit) const {
    for (const IMA_OID& oid : ImaList("Unable to get logical adapter list.", IMA_GetLhbaOidList)) {
      const auto properties = ReadIma(IMA_GetLhbaProperties, oid, kPropertiesFailure);
      const Adapter adapter{oid, NarrowText(properties.osDeviceName, kNameSize)};
      if (Passes(*input_, "adapter", adapter.name)) visit(adapter);
    }
  }

  template <class Visit>
  void Targets(Visit&& visit) const {
    Adapters([&](const Adapter& adapter) {
      for (const IMA_OID& oid : ImaList("Unable to get target list.", IMA_GetTargetOidList, adapter.oid)) {
        Target target{adapter, oid, ReadIma(IMA_GetTargetProperties, oid, kPropertiesFailure), {}};
        target.name = NarrowText(target.properties.name, kNameSize);
        if (Passes(*input_, "name", target.name)) visit(target);
      }
    });
  }

  template <class Visit>
  void Sessions(const SessionTexts& texts, Visit&& visit) const {
    Targets([&](const Target& target) {
      for (const IMA_OID& oid : ImaList(texts.list, IMA_GetSessionOidList, target.oid)) {
        Session session{target, oid, ReadIma(IMA_GetSessionProperties, oid, texts.properties), {}};
        session.isid = IsidText(session.properties.isid);
        if (Passes(*input_, "isid", session.isid)) visit(session);
      }
    });
  }

 private:
  /// Of targets too.
  static constexpr char kPropertiesFailure[] = "Unable to get logical adapter properties.";

  InputPtr input_;
};

/// Posts the list of structures such as @p element that @p fill appends its rows to; a failed call drops it
/// and is reported instead.
template <class Fill>
void PostImaList(const OutputPtr& output, const StructPtr& element, Fill&& fill) {
  const ListPtr list = NewList(element);
  ReportingImaFailures(*output, [&] {
    fill(*list);
    Post(output, list);
  });
}

}  // namespace TessaroCli::IscsiNamespace
