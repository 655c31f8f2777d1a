#include "level/ChapRules.h"

#include <optional>

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::ChapMutual;
using NodeCtl::Storage::ChapUni;
using NodeCtl::Storage::iScsiChapType;

/// The entry that stands where CHAP is off.
iScsiChapParameters ClearedEntry() {
  iScsiChapParameters entry;
  entry.name = "none";
  entry.secret = "none";
  entry.level = iScsiChapType::Prohibited;
  return entry;
}

/// The direction that @p word names, uni where it is empty; another word is reported.
std::optional<iScsiChapDirection> DirectionFrom(const std::string& word, const OutputPtr& output) {
  if (word.empty() || word == "uni") return ChapUni;
  if (word == "mutual") return ChapMutual;
  output->ReportError(InvalidAuthDirectionMessage);
  return std::nullopt;
}

bool iScsiParms::*MarkOf(bool mutual) {
  return mutual ? &iScsiParms::mutualChapInherited : &iScsiParms::chapInherited;
}

/// The entry that the options describe; a combination that describes none is reported.
std::optional<iScsiChapParameters> EntryFrom(const InputPtr& input, const OutputPtr& output) {
  if (input->HasParameter("default")) {
    if (input->GetFlag("default")) return ClearedEntry();
    output->ReportError(InvalidDefaultUseMessage);
    return std::nullopt;
  }
  const bool isWhole =
      input->HasParameter("authname") && input->HasParameter("secret") && input->HasParameter("level");
  if (!isWhole && input->GetString("level") != "prohibited") {
    output->ReportError(InvalidChapInputMessage);
    return std::nullopt;
  }
  iScsiChapParameters entry;
  entry.name = input->GetString("authname");
  entry.secret = input->GetString("secret");
  entry.level = IscsiTools::GetChapTypeFromString(input->GetString("level"));
  return entry.level == iScsiChapType::Prohibited ? ClearedEntry() : entry;
}

/// What forbids @p entry as a mutual entry of @p level; null when nothing does.
const char* MutualFault(Level& level, const iScsiChapParameters& entry) {
  const bool required = entry.level == iScsiChapType::Required;
  if (!required && entry.level != iScsiChapType::Prohibited) return InvalidAuthLevelMessage;
  const iScsiChapParameters uni = level.GetChap(ChapUni);  // read at either level
  return required && uni.level != iScsiChapType::Required ? InvalidChapCombinationMessage : nullptr;
}

}  // namespace

void ShowChap(const LevelKind& kind, const Structure& structure, StructPtr (*row)(const ShownChap& shown),
              const InputPtr& input, const OutputPtr& output) {
  WithAdapter(input, output, {kind.chapGetFailure}, [&](iScsiInterface& adapter) {
    const auto levels = kind.select(adapter, *input);
    iScsiParms parms;
    if (kind.recordFirst) parms = levels.front()->GetParms();
    if (kind.hasMethod && input->HasParameter("method") && input->GetString("method") != "chap") {
      return output->ReportError(InvalidAuthMethodMessage);
    }
    const auto direction = DirectionFrom(input->GetString("direction"), output);
    if (!direction) return;

    const bool mutual = *direction == ChapMutual;
    const ListPtr list = NewList(structure);
    for (const LevelPtr& level : levels) {
      if (kind.inherits && !kind.recordFirst) parms = level->GetParms();
      list->Append(row({input->GetString("adapter"), *level, kDirections[*direction],
                        level->GetChap(*direction), parms.*MarkOf(mutual), parms.parent}));
    }
    Post(output, list);
  });
}

void SetChap(const LevelKind& kind, const InputPtr& input, const OutputPtr& output) {
  WithAdapter(input, output, {kind.chapSetFailure}, [&](iScsiInterface& adapter) {
    const LevelPtr level = kind.find(adapter, *input);
    const std::string word = input->GetString("direction");
    iScsiParms parms;
    if (kind.inherits) {
      parms = level->GetParms();
      if (input->GetFlag("inherit")) {  // looks at no other option, and takes any other word for uni
        parms.*MarkOf(word == "mutual") = true;
        level->SetParms(parms);
        return PostSuccess(output);
      }
    }

    const auto entry = EntryFrom(input, output);
    if (!entry) return;
    const auto direction = DirectionFrom(word, output);
    if (!direction) return;
    const bool mutual = *direction == ChapMutual;
    if (const char* fault = mutual ? MutualFault(*level, *entry) : nullptr) return output->ReportError(fault);

    if (kind.inherits) {
      parms.*MarkOf(mutual) = false;
      level->SetParms(parms);
    }
    level->SetChap(*entry, *direction);
    // Mutual CHAP cannot stand without CHAP.
    if (!mutual && entry->level == iScsiChapType::Prohibited) level->SetChap(ClearedEntry(), ChapMutual);
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace
