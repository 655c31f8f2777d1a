#include "status/Survey.h"

#include <CoreCtl/Storage.h>
#include <CoreCtl/Util.h>
#include <ima/ima_tsr.h>
#include <text/text.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <memory>
#include <new>
#include <span>

namespace TessaroCli::Status {

namespace {

using NodeCtl::Lib::NodeCtlException;

/// A call of the management API that failed: a sentence.
struct ImaFailure {
  std::string text;
};

void CheckIma(IMA_STATUS status, const char* what) {
  if (status == IMA_STATUS_SUCCESS) return;
  char number[16];
  std::snprintf(number, sizeof number, "0x%08x", static_cast<unsigned>(status));
  throw ImaFailure{std::string(what) + " cannot be read: the management API answers " + number + "."};
}

/// Objects that the API handed out, owned for as long as this lives.
class ImaObjects {
 public:
  template <class List, class... Arguments>
  ImaObjects(const char* what, List list, const Arguments&... arguments) {
    CheckIma(list(arguments..., &list_), what);
  }
  ImaObjects(const ImaObjects&) = delete;
  ImaObjects& operator=(const ImaObjects&) = delete;
  ~ImaObjects() {
    if (list_ != nullptr) IMA_FreeMemory(list_);
  }

  const IMA_OID* begin() const { return list_ == nullptr ? nullptr : &list_->oids[0]; }
  const IMA_OID* end() const { return list_ == nullptr ? nullptr : begin() + list_->oidCount; }
  std::size_t Size() const { return list_ == nullptr ? 0 : list_->oidCount; }

 private:
  IMA_OID_LIST* list_ = nullptr;
};

/// @p wide, up to its zero or its end, as UTF-8.
std::string Narrow(std::span<const IMA_WCHAR> wide) {
  const std::wstring characters(wide.begin(), std::find(wide.begin(), wide.end(), L'\0'));
  char* converted = nullptr;
  if (!CodeSet_UTF32ToUTF8(characters.c_str(), &converted)) return "?";
  const std::unique_ptr<char, decltype(&std::free)> text(converted, &std::free);
  return text.get();
}

/// The connections of the session that are not in full feature phase.
std::size_t BrokenConnections(const IMA_OID& session) {
  constexpr IMA_UINT32 kLoggedIn = 4;
  std::size_t broken = 0;
  for (const IMA_OID& oid : ImaObjects("The connections", IMA_GetConnectionOidList, session)) {
    IMA_TSR_CONNECTION_STATUS status{};
    CheckIma(IMA_TSR_GetConnectionStatus(oid, &status), "The state of a connection");
    if (status.state != kLoggedIn) ++broken;
  }
  return broken;
}

void SurveyTarget(const IMA_OID& oid, AdapterSurvey& survey) {
  IMA_TARGET_PROPERTIES properties{};
  CheckIma(IMA_GetTargetProperties(oid, &properties), "A target");
  const std::string name = Narrow(properties.name);
  IMA_UINT32 word = 0;
  // A host that keeps no such word has none to show.
  const bool hasWord = IMA_TSR_GetInternalConfigData(oid, IMA_TSR_CONFIG_LOGIN_STATUS, &word, sizeof word) ==
                       IMA_STATUS_SUCCESS;
  const ImaObjects sessions("The sessions", IMA_GetSessionOidList, oid);
  std::size_t broken = 0;
  for (const IMA_OID& session : sessions) broken += BrokenConnections(session);
  survey.sessions += sessions.Size();
  if (sessions.Size() > 0) survey.connected.push_back({name, sessions.Size()});
  if (sessions.Size() == 0) survey.unconnected.push_back(name);
  if (hasWord && word >> 16U != IMA_TSR_LOGIN_SOURCE_NONE) {
    survey.refused.push_back({name, sessions.Size(), word});
  }
  if (broken > 0) survey.broken.push_back({name, broken});
}

/// Runs @p step; where it fails, that is told and kept.
template <class Step>
void Attempt(AdapterSurvey& survey, const Tell& tell, Step step) {
  const auto failed = [&](const std::string& text) {
    survey.unread.push_back(text);
    tell((survey.name.empty() ? "An adapter" : survey.name) + ": " + text);
  };
  try {
    step();
  } catch (const NodeCtlException& failure) {
    failed(failure.GetDescription(0));
  } catch (const ImaFailure& failure) {
    failed(failure.text);
  }
}

NodeCtl::Storage::iScsiChapType ChapLevel(iScsiInterface& adapter, int direction) {
  NodeCtl::Storage::iScsiChapParameters chap;
  adapter.GetChapParameters(chap, direction);
  return chap.level;
}

AdapterSurvey SurveyAdapter(iScsiInterface& adapter, const Tell& tell) {
  AdapterSurvey survey;
  Attempt(survey, tell, [&] { survey.name = adapter.GetName(); });
  Attempt(survey, tell, [&] { survey.state = adapter.GetAdapterState(); });
  Attempt(survey, tell, [&] {
    survey.driver = adapter.GetDriverName();
    survey.description = adapter.GetPhysicalHbaProperties().description;
  });
  Attempt(survey, tell, [&] {
    survey.chap = ChapLevel(adapter, NodeCtl::Storage::ChapUni);
    survey.mutualChap = ChapLevel(adapter, NodeCtl::Storage::ChapMutual);
  });
  Attempt(survey, tell, [&] { survey.discovery = adapter.GetDiscoveryStatus(); });
  return survey;
}

/// The logical adapters of the management API by the names that users know them by.
std::map<std::string, IMA_OID> LogicalAdapters() {
  std::map<std::string, IMA_OID> adapters;
  for (const IMA_OID& oid : ImaObjects("The logical adapters", IMA_GetLhbaOidList)) {
    IMA_LHBA_PROPERTIES properties{};
    CheckIma(IMA_GetLhbaProperties(oid, &properties), "A logical adapter");
    adapters.emplace(Narrow(properties.osDeviceName), oid);
  }
  return adapters;
}

void SurveyTargets(const std::map<std::string, IMA_OID>& logical, AdapterSurvey& survey, const Tell& tell) {
  Attempt(survey, tell, [&] {
    const auto found = logical.find(survey.name);
    if (found == logical.end()) throw ImaFailure{"The management API does not know the adapter."};
    for (const IMA_OID& target : ImaObjects("The targets", IMA_GetTargetOidList, found->second)) {
      SurveyTarget(target, survey);
    }
    survey.hasTargets = true;
  });
}

}  // namespace

std::optional<std::vector<AdapterSurvey>> SurveyHost(const Tell& tell) {
  std::vector<AdapterSurvey> surveys;
  std::vector<iScsiInterface*> adapters;
  CoreCtl::Storage::StorageInfoImpl storage;
  try {
    adapters = storage.GetiScsiInterfaces();
  } catch (const NodeCtlException& failure) {
    tell("The adapters cannot be listed: " + failure.GetDescription(0));
    return std::nullopt;
  }
  // While they are held, all calls see one state of the host.
  const std::unique_ptr<std::vector<iScsiInterface*>, void (*)(std::vector<iScsiInterface*>*)> held(
      &adapters, [](std::vector<iScsiInterface*>* all) { CoreCtl::Util::DeleteVector(*all); });
  for (iScsiInterface* adapter : adapters) {
    if (adapter != nullptr) surveys.push_back(SurveyAdapter(*adapter, tell));
  }
  std::map<std::string, IMA_OID> logical;
  try {
    logical = LogicalAdapters();
  } catch (const ImaFailure& failure) {
    tell(failure.text);
    for (AdapterSurvey& survey : surveys) survey.unread.push_back(failure.text);
    return surveys;
  }
  for (AdapterSurvey& survey : surveys) {
    if (!survey.name.empty()) SurveyTargets(logical, survey, tell);
  }
  return surveys;
}

}  // namespace TessaroCli::Status
