#include "store/DocumentReader.h"

#include <algorithm>
#include <functional>
#include <map>

#include "store/DocumentChecks.h"
#include "store/Text.h"

namespace store {

namespace {

/// Ten times what a host with 100,000 targets, each with a session, has.
constexpr std::size_t kMostSettings = 100'000'000;

}  // namespace

DocumentReader::Level& DocumentReader::Push(Level::Shape shape, std::span<const Key> keys,
                                            const KindSpec* spec) {
  if (depth_ == levels_.size()) levels_.emplace_back();
  Level& level = levels_[depth_++];
  level.shape = shape;
  level.keys = keys;
  level.spec = spec;
  level.partial = false;
  level.document.clear();
  bson::BeginDocument(level.document);
  if (level.slots.size() < level.Size()) level.slots.resize(level.Size());
  for (Slot& slot : level.slots) slot.given = false;
  level.current = kNone;
  level.count = 0;
  return level;
}

/// The key whose value begins; null where it is a list of objects, or an object.
const Key* DocumentReader::KeyInTurn() {
  if (depth_ == 0) return nullptr;
  const Level& level = Top();
  if (level.shape == Level::Shape::List) return level.keys.data();
  return level.current < level.keys.size() ? &level.keys[level.current] : nullptr;
}

void DocumentReader::Value(const Scalar& value) {
  const Key* key = KeyInTurn();
  if (key == nullptr) Refuse(depth_ > 0 && Top().shape == Level::Shape::Record ? kNoList : kNoObject);
  if (!(std::holds_alternative<std::monostate>(value) && key->optional && Top().partial)) {
    const std::string fault = ValueFault(*key, value);
    if (!fault.empty()) Refuse(fault);
  }
  Put(value);
}

/// @p value is right for the key in turn.
void DocumentReader::Put(const Scalar& value) {
  bytes_.clear();
  bson::Type type = bson::Type::Null;
  if (const auto* const text = std::get_if<std::string_view>(&value)) {
    type = bson::Type::Text;
    bson::AppendText(bytes_, *text);
  } else if (const auto* const number = std::get_if<std::int64_t>(&value)) {
    type = bson::AppendNumber(bytes_, *number);
  } else if (const auto* const truth = std::get_if<bool>(&value)) {
    type = bson::Type::Boolean;
    bytes_ += *truth ? '\1' : '\0';
  }
  Put(type, bytes_);
}

void DocumentReader::Put(bson::Type type, std::string_view bytes) {
  Level& level = Top();
  if (level.shape == Level::Shape::List) {
    bson::AppendElement(level.document, type, std::to_string(level.count++), bytes);
  } else {
    Slot& slot = level.slots[level.current];
    slot.given = true;
    slot.type = type;
    slot.bytes = bytes;
  }
}

/// Leaves the record or list that is complete, and puts it where it belongs.
void DocumentReader::PutTop(bson::Type type) {
  const Level& level = Top();
  Pop();
  Put(type, level.document);
}

void DocumentReader::BeginObject() {
  if (depth_ == 0) {
    BeginObjectOf(top_);
  } else if (Top().shape == Level::Shape::Objects) {
    BeginObjectOf(Top().spec->kind);
  } else {
    const Key* key = KeyInTurn();
    if (key == nullptr) Refuse(kNoList);
    if (key->type != Type::Record) Refuse(Expected(*key));
    BeginRecord(*key);
  }
}

void DocumentReader::BeginObjectOf(Kind kind) {
  DocumentObject object{.kind = kind, .offset = offset_, .record = {}};
  if (depth_ > 0) {
    object.parent = Top().object;
    object.place = Top().count;
  }
  const KindSpec& spec = GetKindSpec(kind);
  Level& level = Push(Level::Shape::Record, spec.keys, &spec);
  level.offset = offset_;
  level.object = objects_.size();
  objects_.push_back(std::move(object));
}

void DocumentReader::BeginRecord(const Key& key) {
  const bool partial = key.partial || Top().partial;
  Level& level = Push(Level::Shape::Record, key.keys, nullptr);
  level.partial = partial;
  level.offset = offset_;
}

void DocumentReader::Name(std::string_view name) {
  Level& level = Top();
  // Most documents have the keys in the order of the schema.
  const std::size_t size = level.Size();
  std::size_t place = level.current == kNone ? 0 : level.current + 1;
  std::size_t tried = 0;
  for (; tried < size; ++tried, ++place) {
    if (place == size) place = 0;
    if (level.NameOf(place) == name) break;
  }
  if (tried == size) {
    level.current = kNone;
    if (IsForSecrets(level.keys)) Refuse("unknown key, not shown because it may be a secret");
    std::vector<std::string_view> known;
    for (std::size_t i = 0; i < size; ++i) known.push_back(level.NameOf(i));
    const std::string nearest = Nearest(name, known);
    Refuse("unknown key " + Excerpt(name) +
           (nearest.empty() ? "" : "; did you mean " + Quoted(nearest) + "?"));
  }
  level.current = place;
  if (level.slots[place].given) Refuse("is given twice");
}

void DocumentReader::EndObject() {
  if (Top().spec != nullptr) {
    Complete();
  } else {
    EndRecord();
    PutTop(bson::Type::Document);
  }
}

/// Completes the record, in the order of the schema and with the defaults of what was not written.
void DocumentReader::EndRecord() {
  Level& level = Top();
  for (std::size_t i = 0; i < level.keys.size(); ++i) {
    const Key& key = level.keys[i];
    const Slot& slot = level.slots[i];
    if (!slot.given) {
      if (level.partial) continue;
      level.current = i;
      if (key.required) throw Fault(level.offset, Path(), "missing, and required");
      if (key.optional) continue;
      PutDefault(key);
    }
    bson::AppendElement(level.document, slot.type, key.name, slot.bytes);
    ++settings_;
  }
  bson::EndDocument(level.document);
  level.current = kNone;
  if (settings_ > kMostSettings) {
    Refuse("the host has more than " + std::to_string(kMostSettings) +
           " settings, the most that it can have");
  }
}

void DocumentReader::PutDefault(const Key& key) {
  if (key.type == Type::Record) {
    BeginRecord(key);
    EndRecord();
    PutTop(bson::Type::Document);
  } else if (key.type == Type::List) {
    Put(bson::Type::Array, bson::Document({}));
  } else {
    Put(DefaultOf(key));
  }
}

void DocumentReader::Complete() {
  EndRecord();
  const Level& level = Top();
  const KindSpec& spec = *level.spec;
  const std::size_t number = level.object;
  objects_[number].record = Record::Stored(level.document);
  objects_[number].name = NameOf(spec.kind, objects_[number].record);
  RequireRight(objects_, number);
  Pop();
  if (depth_ == 0) return;
  Level& list = Top();
  if (!spec.nameKeys.empty()) {
    const std::string& name = objects_[number].name;
    if (name.empty()) RefuseName(objects_, number, name, list.count);
    list.names.push_back(std::hash<std::string_view>()(name));
  }
  ++list.count;
}

void DocumentReader::RequireOwnNames(Level& list) const {
  std::sort(list.names.begin(), list.names.end());
  const bool areOwn = std::adjacent_find(list.names.begin(), list.names.end()) == list.names.end();
  list.names.clear();
  if (areOwn) return;
  std::map<std::string_view, std::size_t> places;
  for (std::size_t number = list.object + 1; number < objects_.size(); ++number) {
    const DocumentObject& object = objects_[number];
    if (object.parent != list.object || object.kind != list.spec->kind) continue;
    const auto [first, isNew] = places.emplace(object.name, object.place);
    if (!isNew) RefuseName(objects_, number, object.name, first->second);
  }
}

void DocumentReader::BeginList() {
  const Key* key = KeyInTurn();
  if (key == nullptr) {
    if (depth_ == 0 || Top().shape != Level::Shape::Record) Refuse(kNoObject);
    Level& object = Top();
    object.slots[object.current].given = true;
    const Collection& collection = object.spec->collections[object.current - object.keys.size()];
    Push(Level::Shape::Objects, {}, &GetKindSpec(collection.kind)).object = object.object;
  } else {
    if (key->type != Type::List) Refuse(Expected(*key));
    Push(Level::Shape::List, key->keys, nullptr);
  }
}

void DocumentReader::EndList() {
  Level& list = Top();
  if (list.shape == Level::Shape::Objects) {
    RequireOwnNames(list);
    Pop();
  } else {
    bson::EndDocument(list.document);
    PutTop(bson::Type::Array);
  }
}

/// Of what is being read.
std::string DocumentReader::Path() const {
  std::size_t level = depth_;
  const auto isObject = [](const Level& one) {
    return one.shape == Level::Shape::Record && one.spec != nullptr;
  };
  while (level > 0 && !isObject(levels_[level - 1])) --level;
  std::string path;
  for (level -= level > 0; level < depth_; ++level) {
    const Level& one = levels_[level];
    if (isObject(one)) path = PathOf(objects_, one.object);
    if (one.shape != Level::Shape::Record) {
      path = Element(path, one.count);
    } else if (one.current != kNone) {
      path = Below(path, one.NameOf(one.current));
    }
  }
  return path;
}

void DocumentReader::Refuse(const std::string& text) const { throw Fault(offset_, Path(), text); }

}  // namespace store
