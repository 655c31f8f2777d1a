#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {

int CountGiven(const InputPtr& input, std::initializer_list<const char*> names) {
  int given = 0;
  for (const char* name : names) {
    if (input->HasParameter(name)) ++given;
  }
  return given;
}

bool KeyAndValueAreSound(const InputPtr& input, const OutputPtr& output) {
  if (input->HasParameter("key") && input->GetString("key").empty()) {
    output->ReportError(InvalidKeyMessage);
    return false;
  }
  if (input->HasParameter("value") && input->GetString("value").empty()) {
    output->ReportError(InvalidValueMessage);
    return false;
  }
  return true;
}

std::string NotSettableText(const std::string& key) { return "Parameter " + key + " is not settable.\n"; }

void SetInheritingParm(InheritingLevel& level, const iScsiCapabilities& capabilities, const std::string& key,
                       const InputPtr& input, const OutputPtr& output) {
  iScsiParms parms = level.GetParms();
  if (!IscsiTools::IsParmSettable(key, parms, capabilities.targetLevelHeaderDigestSupported,
                                  capabilities.targetLevelDataDigestSupported)) {
    return output->ReportError(NotSettableText(key));
  }
  if (input->HasParameter("value")) {
    const std::string value = input->GetString("value");
    IscsiTools::ParmSet(key, value, parms);
    level.SetParms(parms);
    // A word that is no digest is found out only now that the record is stored.
    if (key == "HeaderDigest") level.SetHeaderDigest(IscsiTools::GetDigestFromString(value));
    if (key == "DataDigest") level.SetDataDigest(IscsiTools::GetDigestFromString(value));
  } else if (input->GetFlag("inherit")) {
    IscsiTools::ParmInherit(key, parms);
    level.SetParms(parms);  // the mark alone, also for a digest
  } else if (input->HasParameter("default")) {
    if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
    IscsiTools::ParmDefault(key, parms);
    level.SetParms(parms);
    if (key == "HeaderDigest") level.SetHeaderDigest(iScsiDigestType::Prohibited);
    if (key == "DataDigest") level.SetDataDigest(iScsiDigestType::Prohibited);
  }
  PostSuccess(output);
}

}  // namespace TessaroCli::IscsiNamespace
