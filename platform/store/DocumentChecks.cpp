#include "store/DocumentChecks.h"

#include <algorithm>
#include <set>

#include "store/Text.h"

namespace store {

Scalar Whole(std::uint64_t number) {
  if (number > INT64_MAX) return static_cast<double>(number);
  return static_cast<std::int64_t>(number);
}

std::string Below(const std::string& path, std::string_view key) {
  return path.empty() ? std::string(key) : path + "." + std::string(key);
}

std::string Element(const std::string& path, std::size_t index) {
  return path + "[" + std::to_string(index) + "]";
}

bool IsForSecrets(std::span<const Key> keys) {
  const auto holdsSecret = [](std::span<const Key> some) {
    return std::any_of(some.begin(), some.end(), [](const Key& key) { return key.secret; });
  };
  return holdsSecret(keys) ||
         std::all_of(keys.begin(), keys.end(), [&](const Key& key) { return holdsSecret(key.keys); });
}

std::string Expected(const Key& key) {
  switch (key.type) {
    case Type::Text:
      return "expected a text";
    case Type::Integer:
      return "expected a whole number from " + std::to_string(key.least) + " to " + std::to_string(key.most);
    case Type::Boolean:
      return "expected true or false";
    case Type::Word: {
      std::string words;
      for (const std::string_view word : key.words) words += (words.empty() ? "" : ", ") + Quoted(word);
      return "expected one of " + words;
    }
    case Type::Record:
      return kNoObject;
    case Type::List:
      return kNoList;
  }
  return {};
}

std::string ValueFault(const Key& key, const Scalar& value) {
  const auto* const text = std::get_if<std::string_view>(&value);
  const auto* const number = std::get_if<std::int64_t>(&value);
  switch (key.type) {
    case Type::Text:
      if (text == nullptr) break;
      if (text->find('\0') != text->npos) return "a text cannot hold a zero character";
      if (key.secret && *text == kMask) {
        return "\"***\" stands for a secret that was not shown; simulator show --secrets shows it";
      }
      return key.fault == nullptr ? "" : key.fault(*text);
    case Type::Integer:
      if (number != nullptr && *number >= key.least && *number <= key.most) return {};
      break;
    case Type::Boolean:
      if (std::holds_alternative<bool>(value)) return {};
      break;
    case Type::Word:
      if (text != nullptr && std::find(key.words.begin(), key.words.end(), *text) != key.words.end()) {
        return {};
      }
      break;
    case Type::Record:
    case Type::List:
      break;
  }
  return Expected(key);
}

Scalar DefaultOf(const Key& key) {
  switch (key.type) {
    case Type::Text:
    case Type::Word:
      return key.text;
    case Type::Integer:
      return key.number;
    case Type::Boolean:
      return key.number != 0;
    case Type::Record:
    case Type::List:
      break;
  }
  return {};
}

namespace {

/// The path of the list that @p object is in.
std::string ListOf(const Document& document, std::size_t object) {
  const std::size_t parent = document[object].parent;
  for (const Collection& collection : GetKindSpec(document[parent].kind).collections) {
    if (collection.kind != document[object].kind) continue;
    return Below(PathOf(document, parent), collection.key);
  }
  return {};
}

/// @p fault is what is wrong with a whole object, and may begin with the path of a key in it.
void RequireNone(const std::string& fault, const Document& document, std::size_t object) {
  if (fault.empty()) return;
  const std::string_view first = std::string_view(fault).substr(0, fault.find_first_of(".[:"));
  const std::string path = PathOf(document, object);
  const std::size_t offset = document[object].offset;
  if (FindKey(GetKindSpec(document[object].kind).keys, first) == nullptr) throw Fault(offset, path, fault);
  throw Fault(offset, Below(path, fault), "");
}

}  // namespace

std::string PathOf(const Document& document, std::size_t object) {
  return object == 0 ? "" : Element(ListOf(document, object), document[object].place);
}

void RequireRight(const Document& document, std::size_t object) {
  const KindSpec& spec = GetKindSpec(document[object].kind);
  const Record& record = document[object].record;
  if (spec.fault != nullptr) RequireNone(spec.fault(record), document, object);
  const auto isHeldAgainst = [](const Collection& collection) {
    return GetKindSpec(collection.kind).faultBelow != nullptr;
  };
  if (std::none_of(spec.collections.begin(), spec.collections.end(), isHeldAgainst)) return;
  for (std::size_t i = object + 1; i < document.size(); ++i) {
    if (document[i].parent != object) continue;
    const KindSpec& below = GetKindSpec(document[i].kind);
    if (below.faultBelow == nullptr) continue;
    RequireNone(below.faultBelow(document[i].record, record), document, i);
  }
}

void RefuseName(const Document& document, std::size_t object, const std::string& name, std::size_t place) {
  const std::string_view key = GetKindSpec(document[object].kind).nameKeys[0];
  throw Fault(document[object].offset, Below(PathOf(document, object), key),
              name.empty() ? "must not be empty"
                           : Excerpt(name) + " is taken by " + Element(ListOf(document, object), place));
}

}  // namespace store
