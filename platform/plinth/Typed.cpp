#include <algorithm>
#include <charconv>

#include "plinth/Formatter.h"
#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaObject;
using MetaObj::MetaType;
using Object = boost::shared_ptr<MetaObject>;

/// Longer ones are names, such as serial numbers, rather than amounts.
constexpr std::size_t kMostDigits = 10;

bool IsNumber(std::string_view text) {
  const std::string_view digits = text.substr(text.starts_with('-') ? 1 : 0);
  if (digits.empty() || digits.size() > kMostDigits) return false;
  if (digits.find_first_not_of("0123456789") != digits.npos) return false;
  return digits.front() != '0' || text == "0";
}

/// The words of a text in which one blank follows each word; empty where it is no such text.
std::vector<std::string> WordsEndedByBlanks(const std::string& text) {
  if (!text.ends_with(' ')) return {};
  std::vector<std::string> words = Split(text.substr(0, text.size() - 1), ' ');
  if (std::find(words.begin(), words.end(), "") != words.end()) words.clear();
  return words;
}

/// What a field's text says. The text can be had back from it, so nothing is lost where it was a name.
Object TypedText(const std::string& text) {
  if (text == "true" || text == "false") return MetaObj::MetaBool::New(text == "true");
  if (IsNumber(text)) {
    long long number = 0;
    std::from_chars(text.data(), text.data() + text.size(), number);
    return MetaObj::MetaInt::New(number);
  }
  const std::vector<std::string> words = WordsEndedByBlanks(text);
  if (words.empty()) return nullptr;
  auto list = MetaObj::MetaList::New(MetaType::String, MetaObj::MetaString::New());
  for (const std::string& word : words) list->Append(MetaObj::MetaString::New(word));
  return list;
}

/// The same value with each text that is a structure's field read by TypedText.
Object Typed(const Object& value) {
  if (!value) return value;
  if (value->GetType() == MetaType::Struct) {
    const auto& given = static_cast<const MetaObj::MetaStruct&>(*value);
    auto structure = MetaObj::MetaStruct::New(given.GetTypeName());
    for (std::size_t index = 0; index < given.GetFieldCount(); ++index) {
      const Object& field = given.GetField(index);
      const auto* const text = dynamic_cast<const MetaObj::MetaString*>(field.get());
      const Object read = text && text->HasValue() ? TypedText(text->GetValue()) : Typed(field);
      structure->SetField(given.GetFieldName(index), read ? read : field);
    }
    return structure;
  }
  if (value->GetType() == MetaType::List) {
    const auto& given = static_cast<const MetaObj::MetaList&>(*value);
    auto list = MetaObj::MetaList::New(given.GetElementType(), given.GetPrototype());
    for (std::size_t index = 0; index < given.GetSize(); ++index)
      list->Append(Typed(given.GetElement(index)));
    return list;
  }
  return value;
}

}  // namespace

void CheckTyped(Run& run, const Given& given) {
  if (!given.truth || ChosenFormatter(run).form == Form::Document) return;
  std::vector<std::string> names;
  for (const Formatter& formatter : kFormatters) {
    if (formatter.form == Form::Document) names.push_back(std::string("--output ") + formatter.name);
  }
  throw UsageError("option --typed: it goes with " + Join(names, " or ") + "; other forms have texts alone");
}

Object TypedResult(const Run& run) {
  const Object& result = run.record.result;
  return result && run.request.global.For("typed").truth ? Typed(result) : result;
}

}  // namespace Plinth
