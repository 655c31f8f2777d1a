#include "store/Schema.h"

#include <stdexcept>

#include "store/Record.h"
#include "store/Text.h"

namespace store {

namespace {

constinit std::span<const KindSpec> schema;

std::string TypeText(const Key& key) {
  const auto joined = [&] {
    std::string words;
    for (const std::string_view word : key.words) words += (words.empty() ? "" : ", ") + std::string(word);
    return words;
  };
  switch (key.type) {
    case Type::Text:
      return "text";
    case Type::Integer:
      return "integer, " + std::to_string(key.least) + " to " + std::to_string(key.most);
    case Type::Boolean:
      return "true or false";
    case Type::Word:
      return "one of " + joined();
    case Type::Record:
      return key.partial ? "part of this record" : "record";
    case Type::List:
      return "list of: " + TypeText(key.keys[0]);
  }
  return {};
}

std::string DefaultText(const Key& key) {
  if (key.required) return "required";
  if (key.optional) return "none";
  if (key.type == Type::Integer) return std::to_string(key.number);
  if (key.type == Type::Boolean) return key.number != 0 ? "true" : "false";
  return key.type == Type::Text || key.type == Type::Word ? Quoted(key.text) : "";
}

void AppendRows(std::string& text, std::span<const Key> keys, const std::string& prefix) {
  for (const Key& key : keys) {
    const std::string name = prefix + std::string(key.name);
    text += "| `" + name + "` | " + TypeText(key) + " | " + DefaultText(key) + " | " + std::string(key.help) +
            (key.secret ? " Secret." : "") + " |\n";
    if (key.type == Type::Record && !key.partial) AppendRows(text, key.keys, name + ".");
    if (key.type == Type::List && key.keys[0].type == Type::Record) {
      AppendRows(text, key.keys[0].keys, name + "[].");
    }
  }
}

}  // namespace

void SetSchema(std::span<const KindSpec> kinds) { schema = kinds; }

Kind RootKind() { return schema.front().kind; }

const KindSpec& GetKindSpec(Kind kind) {
  for (const KindSpec& spec : schema) {
    if (spec.kind == kind) return spec;
  }
  throw std::logic_error("a kind of object without a row in the schema");
}

std::string NameOf(Kind kind, const Record& record) {
  const KindSpec& spec = GetKindSpec(kind);
  std::string name;
  for (const std::string_view key : spec.nameKeys) {
    if (!name.empty()) name += ' ';
    const Key& part = *FindKey(spec.keys, key);
    if (part.type == Type::Integer) {
      name += std::to_string(record.GetInt64(key));
    } else {
      name += part.folded ? LowerCase(record.GetString(key)) : record.GetString(key);
    }
  }
  return name;
}

std::string SchemaTables() {
  std::string text;
  for (const KindSpec& spec : schema) {
    text += "### " + std::string(spec.word) + "\n\n| key | value | default | meaning |\n|---|---|---|---|\n";
    AppendRows(text, spec.keys, "");
    for (const Collection& collection : spec.collections) {
      text += "| `" + std::string(collection.key) + "` | list of " +
              std::string(GetKindSpec(collection.kind).word) + " | [] | " + std::string(collection.help) +
              " |\n";
    }
    text += '\n';
  }
  return text;
}

}  // namespace store
