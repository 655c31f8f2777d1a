#include "host/AnswerSchema.h"

#include <vector>

#include "host/Operations.h"

namespace host {

std::string AnswerFault(const Record& answer) {
  const std::string& name = answer.GetString("operation");
  const OperationSpec* operation = FindOperation(name);
  if (operation == nullptr) {
    std::vector<std::string_view> names;
    for (const OperationSpec& one : kOperations) names.push_back(one.name);
    const std::string nearest = Nearest(name, names);
    return "operation: no operation is called " + Excerpt(name) +
           (nearest.empty() ? "" : "; did you mean " + Quoted(nearest) + "?");
  }
  const int given = answer.Has("throw") + answer.Has("status") + answer.Has("imaStatus");
  if (given != 1) return "expected exactly one of \"throw\", \"status\" and \"imaStatus\"";
  if (answer.Has("text") && !answer.Has("throw")) return "text: goes with \"throw\" only";
  if (answer.Has("imaStatus") != (operation->gives == Gives::Ima)) {
    return operation->gives == Gives::Ima ? name + " can be answered by an \"imaStatus\" only"
                                          : "imaStatus: " + name + " is no IMA call";
  }
  if (answer.Has("status") && operation->gives != Gives::Status)
    return "status: " + name + " gives no status";
  return {};
}

}  // namespace host
