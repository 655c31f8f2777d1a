// Host descriptions: whatever the text, it is refused with a reason, or a host that shows as a description of
// itself, also after it has booted again.
#include <nlohmann/json.hpp>

#include "Support.h"
#include "host/Schema.h"
#include "host/Storage.h"
#include "simulator/Description.h"
#include "simulator/Simulator.h"

namespace {

using host::Collection;
using host::Key;
using host::Type;
using Json = nlohmann::ordered_json;

/// Changes a description in a place that the schema knows, by a value that the key may have.
class Mutator {
 public:
  explicit Mutator(unsigned seed) : random_(seed) {}

  void Change(Json& object, std::span<const Key> keys, std::span<const Collection> collections) {
    if (!object.is_object()) object = Json::object();
    const std::size_t place = random_.Below(keys.size() + collections.size() * 2);
    if (place >= keys.size()) return ChangeList(object, collections[(place - keys.size()) / 2]);
    const Key& key = keys[place];
    Json& value = object[std::string(key.name)];
    if (key.type == Type::Record && value.is_object() && !random_.OneIn(4)) {
      Change(value, key.keys, {});
    } else if (!value.is_null() && random_.OneIn(4)) {
      object.erase(std::string(key.name));
    } else {
      value = Value(key);
    }
  }

 private:
  void ChangeList(Json& object, const Collection& collection) {
    const host::KindSpec& spec = host::GetKindSpec(collection.kind);
    Json& list = object[std::string(collection.key)];
    if (!list.is_array()) list = Json::array();
    const std::size_t place = random_.Below(list.size() + 1);
    if (place == list.size()) {
      list.push_back(Record(spec.keys, spec.nameKeys));
    } else if (random_.OneIn(8)) {
      list.erase(place);
    } else {
      Change(list[place], spec.keys, spec.collections);
    }
  }

  Json Record(std::span<const Key> keys, std::span<const std::string_view> wanted) {
    Json record = Json::object();
    for (const Key& key : keys) {
      const bool isWanted = key.required || std::find(wanted.begin(), wanted.end(), key.name) != wanted.end();
      if (isWanted || random_.OneIn(8)) record[std::string(key.name)] = Value(key);
    }
    return record;
  }

  Json Value(const Key& key) {
    static const std::vector<std::string> texts = fuzz::TextsOf(std::string(simulator::DemoDescription()));
    switch (key.type) {
      case Type::Text: {
        std::vector<std::string> right;
        for (const std::string& text : texts) {
          if (key.fault != nullptr && key.fault(text).empty()) right.push_back(text);
        }
        return random_.Of(right.empty() ? texts : right);
      }
      case Type::Integer: {
        const std::int64_t numbers[] = {key.least, key.most, key.number, 0, 1, 2, 3260};
        return random_.Of(numbers);
      }
      case Type::Boolean:
        return random_.OneIn(2);
      case Type::Word:
        return std::string(random_.Of(key.words));
      case Type::Record:
        return Record(key.keys, {});
      case Type::List: {
        Json list = Json::array();
        for (std::size_t more = random_.Below(3); more > 0; --more) list.push_back(Value(key.keys[0]));
        return list;
      }
    }
    return {};
  }

  fuzz::Random random_;
};

}  // namespace

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t room,
                                               unsigned seed) {
  Json json = Json::parse(data, data + size, nullptr, false);
  if (json.is_discarded() || seed % 4 == 0) return LLVMFuzzerMutate(data, size, room);
  const host::KindSpec& spec = host::GetKindSpec(host::Kind::Host);
  Mutator(seed).Change(json, spec.keys, spec.collections);
  return fuzz::HandOver(json.dump(), data, room);
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const std::unique_ptr<host::Host> host = simulator::HostOf("{}");
  try {
    simulator::Load(std::string(reinterpret_cast<const char*>(data), size), *host);
  } catch (const host::Error& error) {
    fuzz::Require(error.GetKind() == host::Error::Kind::Invalid && *error.what() != 0,
                  std::string("not refused: ") + error.what());
    return 0;
  }
  fuzz::RequireThatItReloads(*host);
  simulator::Show(false, *host);
  simulator::Reboot(*host);
  fuzz::RequireThatItReloads(*host);
  return 0;
}
