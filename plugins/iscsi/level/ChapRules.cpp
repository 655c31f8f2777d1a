#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {

std::optional<iScsiChapDirection> ChapDirectionFrom(const std::string& word, const OutputPtr& output) {
  if (word.empty() || word == "uni") return ChapUni;
  if (word == "mutual") return ChapMutual;
  output->ReportError(InvalidAuthDirectionMessage);
  return std::nullopt;
}

std::optional<iScsiChapParameters> ChapEntryFrom(const InputPtr& input, const OutputPtr& output) {
  if (input->HasParameter("default")) {
    if (input->GetFlag("default")) return ClearedChap();
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
  return entry.level == iScsiChapType::Prohibited ? ClearedChap() : entry;
}

bool IsMutualLevel(iScsiChapType level, const OutputPtr& output) {
  if (level == iScsiChapType::Prohibited || level == iScsiChapType::Required) return true;
  output->ReportError(InvalidAuthLevelMessage);
  return false;
}

bool MayStandOver(iScsiChapType uni, iScsiChapType mutual, const OutputPtr& output) {
  if (mutual != iScsiChapType::Required || uni == iScsiChapType::Required) return true;
  output->ReportError(InvalidChapCombinationMessage);
  return false;
}

iScsiChapParameters ClearedChap() {
  iScsiChapParameters entry;
  entry.name = "none";
  entry.secret = "none";
  entry.level = iScsiChapType::Prohibited;
  return entry;
}

void SetInheritingChap(InheritingLevel& level, const std::string& word, const InputPtr& input,
                       const OutputPtr& output) {
  iScsiParms parms = level.GetParms();
  if (input->GetFlag("inherit")) {  // no other option matters, and any word but "mutual" means uni
    (word == "mutual" ? parms.mutualChapInherited : parms.chapInherited) = true;
    level.SetParms(parms);
    return PostSuccess(output);
  }
  const auto entry = ChapEntryFrom(input, output);
  if (!entry) return;
  const auto direction = ChapDirectionFrom(word, output);
  if (!direction) return;

  // An entry of its own ends the inheritance: first the mark goes, then the entry comes.
  if (*direction == ChapUni) {
    parms.chapInherited = false;
    level.SetParms(parms);
    level.SetChap(*entry, ChapUni);
    // Mutual CHAP cannot stand without CHAP.
    if (entry->level == iScsiChapType::Prohibited) level.SetChap(ClearedChap(), ChapMutual);
  } else {
    if (!IsMutualLevel(entry->level, output)) return;
    const iScsiChapParameters uni = level.GetChap(ChapUni);
    if (!MayStandOver(uni.level, entry->level, output)) return;
    parms.mutualChapInherited = false;
    level.SetParms(parms);
    level.SetChap(*entry, ChapMutual);
  }
  PostSuccess(output);
}

}  // namespace TessaroCli::IscsiNamespace
