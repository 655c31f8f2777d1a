#include "simulator/Description.h"

#include <nlohmann/json.hpp>
#include <vector>

#include "host/Tree.h"

namespace simulator {

using namespace host;

namespace {

void Mask(std::span<const Key> keys, Json& record) {
  for (const Key& key : keys) {
    const auto found = record.find(std::string(key.name));
    if (found == record.end()) continue;
    if (key.secret && !found->get_ref<const std::string&>().empty()) *found = std::string(kMask);
    if (key.type == Type::Record) Mask(key.keys, *found);
    if (key.type == Type::List && key.keys[0].type == Type::Record) {
      for (Json& element : *found) Mask(key.keys[0].keys, element);
    }
  }
}

Json Show(host::Tree& tree, const Object& object, bool secrets) {
  const KindSpec& spec = GetKindSpec(object.kind);
  Json json = object.record.GetJson();
  if (!secrets) Mask(spec.keys, json);
  for (const Collection& collection : spec.collections) {
    Json& list = json[std::string(collection.key)] = Json::array();
    for (const Object& child : tree.Children(object.id, collection.kind))
      list.push_back(Show(tree, child, secrets));
  }
  return json;
}

}  // namespace

void LoadDescription(host::Tree& tree, const Description& description) {
  tree.Clear();
  std::vector<std::int64_t> ids;
  ids.reserve(description.size());
  for (const DocumentObject& described : description) {
    const std::int64_t parent = ids.empty() ? 0 : ids[described.parent];
    ids.push_back(tree.Add(parent, described.kind, described.name, described.record));
  }
}

std::string ShowDescription(host::Tree& tree, bool secrets) {
  return Show(tree, tree.Get(kRoot, Kind::Host), secrets).dump(2);
}

}  // namespace simulator
