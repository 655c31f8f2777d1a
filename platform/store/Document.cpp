#include "store/Document.h"

#include <nlohmann/json.hpp>

#include "store/DocumentReader.h"
#include "store/Error.h"

namespace store {

namespace {

Scalar ScalarOf(const Json& json) {
  if (json.is_boolean()) return json.get<bool>();
  if (json.is_number_unsigned()) return Whole(json.get<std::uint64_t>());
  if (json.is_number_integer()) return json.get<std::int64_t>();
  if (json.is_number()) return json.get<double>();
  if (json.is_string()) return std::string_view(json.get_ref<const std::string&>());
  return {};
}

/// Has @p reader read what stands in @p json.
void Replay(const Json& json, DocumentReader& reader) {
  switch (json.type()) {
    case Json::value_t::object:
      reader.BeginObject();
      for (const auto& [key, value] : json.get_ref<const Json::object_t&>()) {
        reader.Name(key);
        Replay(value, reader);
      }
      reader.EndObject();
      break;
    case Json::value_t::array:
      reader.BeginList();
      for (const Json& element : json) Replay(element, reader);
      reader.EndList();
      break;
    default:
      reader.Value(ScalarOf(json));
  }
}

}  // namespace

Record Complete(Kind kind, const Record& given) try {
  DocumentReader reader(kind);
  Replay(given.GetJson(), reader);
  return std::move(reader.Take().front().record);
} catch (const Fault& fault) {
  throw Error(Error::Kind::Invalid, fault.what());
}

}  // namespace store
