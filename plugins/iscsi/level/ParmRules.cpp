#include "level/ParmRules.h"

#include <optional>

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr FailureReport kGetFailure = {"Failed to get parameter configuration."};
constexpr FailureReport kSetFailure = {
    "Unable to set parameters. Please make sure parameter input is settable and within MAX/MIN range "
    "(integer takes numbers, bool takes [true/false,yes/no,y/n]). Digests will take {prohibited, "
    "discouraged, preferred, required} only."};

std::optional<Digest> DigestOf(const std::string& key) {
  if (key == "HeaderDigest") return Digest::Header;
  if (key == "DataDigest") return Digest::Data;
  return std::nullopt;
}

/// Tests what needs no adapter, and reports what is wrong.
bool OptionsAreSound(const LevelKind& kind, const InputPtr& input, const OutputPtr& output) {
  const int given = int{input->HasParameter("value")} + int{input->HasParameter("default")} +
                    int{kind.inherits && input->HasParameter("inherit")};
  const auto isEmpty = [&](const char* name) {
    return input->HasParameter(name) && input->GetString(name).empty();
  };
  const char* message = given != 1         ? kind.optionsMessage
                        : isEmpty("key")   ? InvalidKeyMessage
                        : isEmpty("value") ? InvalidValueMessage
                                           : nullptr;
  if (message != nullptr) output->ReportError(message);
  return message == nullptr;
}

/// Stores @p parms and, for the key of a digest, what @p digest yields. Both are asked for in the order of
/// the level, so that a word that is no digest fails only then.
template <class DigestValue>
void Store(const LevelKind& kind, Level& level, const std::string& key, const iScsiParms& parms,
           DigestValue&& digest, iScsiInterface& adapter, const OutputPtr& output) {
  const auto actOn = [&](iScsiInterface::iScsiStatus status) {
    if (kind.statusShown) IscsiTools::ProcessStatus(&adapter, status, output);
  };
  const auto storeDigest = [&] {
    if (const auto which = DigestOf(key)) actOn(level.SetDigest(*which, digest()));
  };
  if (kind.digestFirst) storeDigest();
  actOn(level.SetParms(parms));
  if (!kind.digestFirst) storeDigest();
}

}  // namespace

void ShowParms(const LevelKind& kind, const InputPtr& input, const OutputPtr& output) {
  WithAdapter(input, output, kGetFailure, [&](iScsiInterface& adapter) {
    const auto levels = kind.select(adapter, *input);
    const ListPtr list = NewList(kParm);
    const iScsiCapabilities capabilities = adapter.GetCapabilities();
    for (const LevelPtr& level : levels) {
      const iScsiParms parms = level->GetParms();
      const iScsiDigestType header = level->GetDigest(Digest::Header);
      const iScsiDigestType data = level->GetDigest(Digest::Data);
      IscsiTools::ParmFill(level->Id(), list, parms, header, data, capabilities.*kind.headerDigestSettable,
                           capabilities.*kind.dataDigestSettable);
    }
    Post(output, list);
  });
}

void SetParm(const LevelKind& kind, const InputPtr& input, const OutputPtr& output) {
  if (!OptionsAreSound(kind, input, output)) return;
  WithAdapter(input, output, kSetFailure, [&](iScsiInterface& adapter) {
    const LevelPtr level = kind.find(adapter, *input);
    const std::string key = input->GetString("key");
    const iScsiCapabilities capabilities = adapter.GetCapabilities();
    iScsiParms parms = level->GetParms();
    if (!IscsiTools::IsParmSettable(key, parms, capabilities.*kind.headerDigestSettable,
                                    capabilities.*kind.dataDigestSettable)) {
      return output->ReportError("Parameter " + key + " is not settable.\n");
    }
    const auto store = [&](auto&& digest) { Store(kind, *level, key, parms, digest, adapter, output); };
    if (input->HasParameter("value")) {
      const std::string value = input->GetString("value");
      IscsiTools::ParmSet(key, value, parms);
      store([&] { return IscsiTools::GetDigestFromString(value); });
    } else if (kind.inherits && input->GetFlag("inherit")) {
      IscsiTools::ParmInherit(key, parms);
      level->SetParms(parms);  // the mark alone, also for a digest
    } else if (input->HasParameter("default")) {
      if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
      IscsiTools::ParmDefault(key, parms);
      store([] { return iScsiDigestType::Prohibited; });
    }
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace
