/// The walk of the listings: adapters, their targets, the targets' sessions, in the order of the API.
#pragma once

#include <optional>
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

/// What a listing reports when a call of the walk fails.
struct WalkTexts {
  const char* adapterList = "Unable to get logical adapter list.";
  const char* adapterProperties = "Unable to get logical adapter properties.";
  const char* targetList = "Unable to get target list.";
  const char* targetProperties = "Unable to get logical adapter properties.";
  const char* sessionList = nullptr;
  const char* sessionProperties = nullptr;
};

/// The value of an option that limits a listing, where it was given.
class Filter {
 public:
  Filter(const Plinth::CallSpec::Input& input, const char* option) {
    if (input.HasParameter(option)) only_ = input.GetString(option);
  }
  bool Passes(const std::string& text) const { return !only_ || *only_ == text; }

 private:
  std::optional<std::string> only_;
};

// What columns show of the member of a record: its number, or whether it is not 0.

template <auto member>
inline constexpr auto Number =
    [](const auto& listed) { return static_cast<long long>(listed.properties.*member); };
template <auto member>
inline constexpr auto Is = [](const auto& listed) { return listed.properties.*member != 0; };

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

  ImaWalk(InputPtr input, const WalkTexts& texts) : input_(std::move(input)), texts_(texts) {}

  template <class Visit>
  void Adapters(Visit&& visit) const {
    const Filter filter(*input_, "adapter");
    for (const IMA_OID& oid : ImaList(texts_.adapterList, IMA_GetLhbaOidList)) {
      const auto properties = ReadIma(IMA_GetLhbaProperties, oid, texts_.adapterProperties);
      const Adapter adapter{oid, NarrowText(properties.osDeviceName, kNameSize)};
      if (filter.Passes(adapter.name)) visit(adapter);
    }
  }

  template <class Visit>
  void Targets(Visit&& visit) const {
    const Filter filter(*input_, "name");
    Adapters([&](const Adapter& adapter) {
      for (const IMA_OID& oid : ImaList(texts_.targetList, IMA_GetTargetOidList, adapter.oid)) {
        Target target{adapter, oid, ReadIma(IMA_GetTargetProperties, oid, texts_.targetProperties), {}};
        target.name = NarrowText(target.properties.name, kNameSize);
        if (filter.Passes(target.name)) visit(target);
      }
    });
  }

  template <class Visit>
  void Sessions(Visit&& visit) const {
    const Filter filter(*input_, "isid");
    Targets([&](const Target& target) {
      for (const IMA_OID& oid : ImaList(texts_.sessionList, IMA_GetSessionOidList, target.oid)) {
        Session session{target, oid, ReadIma(IMA_GetSessionProperties, oid, texts_.sessionProperties), {}};
        session.isid = IsidText(session.properties.isid);
        if (filter.Passes(session.isid)) visit(session);
      }
    });
  }

 private:
  InputPtr input_;
  WalkTexts texts_;
};

/// Posts the list that @p fill appends its rows to; a failed call drops it and is reported instead.
template <class Fill>
void PostImaList(const OutputPtr& output, const Structure& structure, Fill&& fill) {
  const ListPtr list = NewList(structure);
  if (ReportingImaFailures(*output, [&] { fill(*list); })) Post(output, list);
}

}  // namespace TessaroCli::IscsiNamespace
