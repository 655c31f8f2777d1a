#include "host/Description.h"

#include <algorithm>
#include <limits>
#include <map>
#include <nlohmann/json.hpp>
#include <set>
#include <vector>

#include "host/Error.h"
#include "host/Formats.h"
#include "host/Tree.h"

namespace host {

namespace {

[[noreturn]] void Fault(const std::string& path, const std::string& text) {
  throw Error(Error::Kind::Refused, path.empty() ? text : path + ": " + text);
}

std::string Below(const std::string& path, std::string_view key) {
  return path.empty() ? std::string(key) : path + "." + std::string(key);
}

std::string Element(const std::string& path, std::size_t index) {
  return path + "[" + std::to_string(index) + "]";
}

/// Follows the parser through a document to find a key that stands twice in one object: the parser would let
/// the last one win in silence.
class DuplicateKeys {
 public:
  bool operator()(int, Json::parse_event_t event, Json& value) {
    switch (event) {
      case Json::parse_event_t::object_start:
      case Json::parse_event_t::array_start:
        Enter();
        levels_.push_back({.array = event == Json::parse_event_t::array_start});
        break;
      case Json::parse_event_t::object_end:
      case Json::parse_event_t::array_end:
        levels_.pop_back();
        break;
      case Json::parse_event_t::key:
        levels_.back().key = value.get<std::string>();
        if (!levels_.back().keys.insert(levels_.back().key).second) Fault(Path(), "is given twice");
        break;
      case Json::parse_event_t::value:
        Enter();
        break;
    }
    return true;
  }

 private:
  struct Level {
    bool array = false;
    std::size_t count = 0;
    std::string key = {};
    std::set<std::string> keys = {};
  };
  void Enter() {
    if (!levels_.empty() && levels_.back().array) ++levels_.back().count;
  }
  std::string Path() const {
    std::string path;
    for (const Level& level : levels_) {
      path = level.array ? Element(path, level.count - 1) : Below(path, level.key);
    }
    return path;
  }
  std::vector<Level> levels_;
};

Json Parse(const std::string& text) {
  try {
    return Json::parse(text, DuplicateKeys());
  } catch (const Json::parse_error& error) {
    // "[json.exception...] parse error at line 1, column 2: REASON; last read: 'TEXT'", and the text may hold
    // a secret.
    const std::string what = error.what();
    const std::size_t begin = std::min(what.find("parse error"), what.size());
    throw Error(Error::Kind::Refused,
                "not a JSON document: " + what.substr(begin, what.find("; last read: ") - begin));
  } catch (const Json::out_of_range&) {
    throw Error(Error::Kind::Refused, "the document has a number that is too large");
  }
}

Json CompleteKeys(std::span<const Key> keys, std::span<const Collection> collections, const Json& given,
                  const std::string& path);
Json PartOf(std::span<const Key> keys, const Json& given, const std::string& path);

Json CompleteKey(const Key& key, const Json& given, const std::string& path) {
  switch (key.type) {
    case Type::Text: {
      if (!given.is_string()) Fault(path, "expected a text");
      const std::string& text = given.get_ref<const std::string&>();
      if (text.find('\0') != text.npos) Fault(path, "a text cannot hold a zero character");
      if (key.secret && text == kMask) {
        Fault(path, "\"***\" stands for a secret that was not shown; simulator show --secrets shows it");
      }
      const std::string fault = key.fault == nullptr ? "" : key.fault(text);
      if (!fault.empty()) Fault(path, fault);
      return given;
    }
    case Type::Integer: {
      // Beyond 64 bits the parser gives unsigned or broken numbers.
      const bool fits = given.is_number_integer() &&
                        !(given.is_number_unsigned() &&
                          given.get<std::uint64_t>() >
                              static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max()));
      if (!fits || given.get<std::int64_t>() < key.least || given.get<std::int64_t>() > key.most) {
        Fault(path, "expected a whole number from " + std::to_string(key.least) + " to " +
                        std::to_string(key.most));
      }
      return given.get<std::int64_t>();
    }
    case Type::Boolean:
      if (!given.is_boolean()) Fault(path, "expected true or false");
      return given;
    case Type::Word: {
      std::string words;
      for (const std::string_view word : key.words) {
        if (given.is_string() && given.get_ref<const std::string&>() == word) return given;
        words += (words.empty() ? "" : ", ") + Quoted(word);
      }
      Fault(path, "expected one of " + words);
    }
    case Type::Record:
      return key.partial ? PartOf(key.keys, given, path) : CompleteKeys(key.keys, {}, given, path);
    case Type::List: {
      if (!given.is_array()) Fault(path, "expected a list");
      Json list = Json::array();
      for (std::size_t i = 0; i < given.size(); ++i) {
        list.push_back(CompleteKey(key.keys[0], given[i], Element(path, i)));
      }
      return list;
    }
  }
  return {};
}

Json DefaultOf(const Key& key, const std::string& path) {
  switch (key.type) {
    case Type::Text:
    case Type::Word:
      return std::string(key.text);
    case Type::Integer:
      return key.number;
    case Type::Boolean:
      return key.number != 0;
    case Type::Record:
      return CompleteKeys(key.keys, {}, Json::object(), path);
    case Type::List:
      return Json::array();
  }
  return {};
}

void RequireKnownKeys(std::span<const Key> keys, std::span<const Collection> collections, const Json& given,
                      const std::string& path) {
  if (!given.is_object()) Fault(path, "expected an object in braces");
  std::vector<std::string_view> known;
  for (const Key& key : keys) known.push_back(key.name);
  for (const Collection& collection : collections) known.push_back(collection.key);
  for (const auto& item : given.items()) {
    if (std::find(known.begin(), known.end(), item.key()) != known.end()) continue;
    const std::string nearest = Nearest(item.key(), known);
    Fault(Below(path, item.key()),
          nearest.empty() ? "unknown key" : "unknown key; did you mean " + Quoted(nearest) + "?");
  }
}

/// The record that @p given stands for: known keys only, in the order of the schema. Collections are left
/// out.
Json CompleteKeys(std::span<const Key> keys, std::span<const Collection> collections, const Json& given,
                  const std::string& path) {
  RequireKnownKeys(keys, collections, given, path);
  Json record = Json::object();
  for (const Key& key : keys) {
    const std::string name(key.name);
    const auto found = given.find(name);
    if (found != given.end()) {
      record[name] = CompleteKey(key, *found, Below(path, name));
    } else if (key.required) {
      Fault(Below(path, name), "missing, and required");
    } else if (!key.optional) {
      record[name] = DefaultOf(key, Below(path, name));
    }
  }
  return record;
}

/// The part of a record that @p given stands for, without any defaults.
Json PartOf(std::span<const Key> keys, const Json& given, const std::string& path) {
  RequireKnownKeys(keys, {}, given, path);
  Json part = Json::object();
  for (const Key& key : keys) {
    const std::string name(key.name);
    const auto found = given.find(name);
    if (found == given.end()) continue;
    if (found->is_null() && key.optional) {
      part[name] = nullptr;
    } else if (key.type == Type::Record) {
      part[name] = PartOf(key.keys, *found, Below(path, name));
    } else {
      part[name] = CompleteKey(key, *found, Below(path, name));
    }
  }
  return part;
}

/// @p fault is what is wrong with a whole record, which may begin with the path of a key in it.
void RequireNone(const std::string& fault, const KindSpec& spec, const std::string& path) {
  if (fault.empty()) return;
  const std::string_view first = std::string_view(fault).substr(0, fault.find_first_of(".[:"));
  if (FindKey(spec.keys, first) == nullptr) Fault(path, fault);
  Fault("", Below(path, fault));
}

Record CompleteObject(const KindSpec& spec, const Json& given, const std::string& path) {
  Record record(CompleteKeys(spec.keys, spec.collections, given, path));
  if (spec.fault != nullptr) RequireNone(spec.fault(record), spec, path);
  return record;
}

void LoadCollections(Tree& tree, const Object& parent, const KindSpec& spec, const Json& given,
                     const std::string& path) {
  for (const Collection& collection : spec.collections) {
    const auto found = given.find(std::string(collection.key));
    if (found == given.end()) continue;
    const std::string listPath = Below(path, collection.key);
    if (!found->is_array()) Fault(listPath, "expected a list");
    const KindSpec& childSpec = GetKindSpec(collection.kind);
    std::map<std::string, std::size_t> names;
    for (std::size_t i = 0; i < found->size(); ++i) {
      const std::string childPath = Element(listPath, i);
      Record record = CompleteObject(childSpec, (*found)[i], childPath);
      if (!childSpec.nameKeys.empty()) {
        const std::string name = NameOf(collection.kind, record);
        const std::string namePath = Below(childPath, childSpec.nameKeys[0]);
        if (name.empty()) Fault(namePath, "must not be empty");
        const auto [first, isNew] = names.emplace(name, i);
        if (!isNew) Fault(namePath, Quoted(name) + " is taken by " + Element(listPath, first->second));
      }
      if (childSpec.faultBelow != nullptr) {
        RequireNone(childSpec.faultBelow(record, parent.record), childSpec, childPath);
      }
      const Object child = tree.Insert(parent.id, collection.kind, std::move(record));
      LoadCollections(tree, child, childSpec, (*found)[i], childPath);
    }
  }
}

/// Adapters go ahead of the NICs in a description.
void RequireBoundNics(Tree& tree) {
  const std::vector<Object> adapters = tree.Children(kRoot, Kind::Adapter);
  for (std::size_t i = 0; i < adapters.size(); ++i) {
    const std::vector<Object> portals = tree.Children(adapters[i].id, Kind::NetworkPortal);
    for (std::size_t j = 0; j < portals.size(); ++j) {
      if (tree.Find(kRoot, Kind::Nic, portals[j].name)) continue;
      const std::string list = Below(Element("adapters", i), "networkPortals");
      Fault(Below(Element(list, j), "nic"), "the host has no NIC " + Quoted(portals[j].name));
    }
  }
}

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

Json Show(Tree& tree, const Object& object, bool secrets) {
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

Record Complete(Kind kind, const Record& given) {
  return CompleteObject(GetKindSpec(kind), given.GetJson(), "");
}

void LoadDescription(Tree& tree, const std::string& text) {
  const Json json = Parse(text);
  const KindSpec& spec = GetKindSpec(Kind::Host);
  Object root{
      .id = kRoot, .parent = 0, .kind = Kind::Host, .name = {}, .record = CompleteObject(spec, json, "")};
  if (tree.Lookup(kRoot)) {
    tree.Update(root);
    for (const Collection& collection : spec.collections) {
      for (const std::int64_t id : tree.ChildIds(kRoot, collection.kind)) tree.Remove(id);
    }
  } else {
    tree.Insert(0, Kind::Host, root.record);  // the first row of all, and so kRoot
  }
  LoadCollections(tree, root, spec, json, "");
  RequireBoundNics(tree);
}

std::string ShowDescription(Tree& tree, bool secrets) {
  return Show(tree, tree.Get(kRoot, Kind::Host), secrets).dump(2);
}

}  // namespace host
