#include <algorithm>

#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

void ChooseFields(Run& run, const Given& given) {
  auto* const command = dynamic_cast<AutoCli::Command*>(run.request.node);
  if (!command) return;
  run.fields = Split(given.texts.front(), ',');
  const auto prototype = PrototypeOf(*command->GetOutputSpec());
  const MetaObj::MetaStruct* structure = prototype ? StructureOf(*prototype) : nullptr;
  if (!structure) throw UsageError("option --fields: the result of this command has no fields");
  const std::vector<std::string> names = FieldNames(*structure);
  for (auto here = run.fields.begin(); here != run.fields.end(); ++here) {
    if (std::find(run.fields.begin(), here, *here) != here) {
      throw UsageError("option --fields: " + Quoted(*here) + " is named twice");
    }
    // A structure declared without fields is open: which it has shows only when it is there.
    if (here->empty() || (!names.empty() && std::find(names.begin(), names.end(), *here) == names.end())) {
      throw UsageError("option --fields: there is no field " + Quoted(*here) +
                       "; there are: " + Join(names, ","));
    }
  }
}

}  // namespace Plinth
