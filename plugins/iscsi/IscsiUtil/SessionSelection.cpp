#include "IscsiUtil/Ima.h"
#include "IscsiUtil/IscsiTools.h"

namespace IscsiUtil {
namespace {

/// The object that the options select, if it exists. Throws ImaFailure.
std::optional<IMA_OID> Select(const Plinth::CallSpec::Input& input) {
  const ImaList adapters("Unable to get logical adapter list.", IMA_GetLhbaOidList);
  const auto adapter =
      FindLogicalAdapter(adapters, input.GetString("adapter"), "Unable to get logical adapter properties.");
  if (!adapter || !input.HasParameter("name")) return adapter;

  const ImaList targets("Unable to get target list.", IMA_GetTargetOidList, *adapter);
  const auto target = FindIma(targets, IMA_GetTargetProperties, "Unable to get target properties.",
                              [name = input.GetString("name")](const IMA_TARGET_PROPERTIES& properties) {
                                return NarrowText(properties.name, kNameSize) == name;
                              });
  if (!target || !input.HasParameter("isid")) return target;

  const ImaList sessions("Unable to get session list.", IMA_GetSessionOidList, *target);
  return FindIma(sessions, IMA_GetSessionProperties, "Unable to get session properties.",
                 [isid = input.GetString("isid")](const IMA_SESSION_PROPERTIES& properties) {
                   return IsidText(properties.isid) == isid;
                 });
}

}  // namespace

bool IscsiTools::GetSessionOidFromInput(boost::shared_ptr<Plinth::CallSpec::Input> input,
                                        boost::shared_ptr<Plinth::CallSpec::Output> output, IMA_OID* oid) {
  *oid = {};
  if (!input->HasParameter("adapter")) {
    output->ReportError("Required adapter option.");
    return false;
  }
  if (input->HasParameter("isid") && !input->HasParameter("name")) {
    output->ReportError("Should not use isid option alone, missing target option.");
    return false;
  }
  bool found = false;
  ReportingImaFailures(*output, [&] {
    const std::optional<IMA_OID> selected = Select(*input);
    if (!selected) return;
    *oid = *selected;
    found = true;
  });
  return found;
}

}  // namespace IscsiUtil
