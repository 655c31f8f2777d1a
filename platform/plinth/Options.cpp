#include "plinth/Options.h"

#include <charconv>
#include <iterator>
#include <string_view>
#include <utility>

#include "plinth/Text.h"

namespace Plinth {

using CallSpec::ParameterType;

namespace {

bool ReadNumber(std::string_view text, int& number) {
  if (text.size() > 1 && text[0] == '+' && text[1] != '-') text.remove_prefix(1);
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  return error == std::errc() && end == text.data() + text.size();
}

[[noreturn]] void RefuseValue(const Parameter& parameter, const std::string& text, const std::string& right) {
  const std::string value = parameter.sensitive ? "the value" : Quoted(text);
  throw UsageError("option " + OptionName(parameter) + ": " + value + " is not " + right);
}

void CheckAllowed(const Parameter& parameter, const std::string& text) {
  // An empty text stands for an option that was left out, where it may be: so do commands take it.
  if (parameter.allowed.empty() || (text.empty() && !parameter.required)) return;
  for (const AllowedValue& allowed : parameter.allowed) {
    if (allowed.value == text) return;
  }
  RefuseValue(parameter, text, "one of: " + Join(AllowedValues(parameter), ", "));
}

bool TakesNoWord(const Parameter& parameter) { return parameter.type == ParameterType::Flag; }

[[noreturn]] void RefuseOption(const std::string& name, const std::vector<OptionTable*>& tables) {
  std::vector<std::string> names;
  std::string nearest;
  for (const OptionTable* table : tables) {
    for (const Parameter& parameter : table->Parameters()) {
      names.push_back("--" + parameter.name);
      // Of the short ones, the same letter in the other case.
      const std::string& letter = parameter.shortName;
      if (name.size() == 2 && letter.size() == 1 && (letter[0] ^ name[1]) == ' ') nearest = '-' + letter;
    }
  }
  if (name.size() > 2) nearest = Nearest(name, names);
  throw UsageError("unknown option " + Quoted(name) +
                   (nearest.empty() ? "; --help lists the options" : "; did you mean \"" + nearest + "\"?"));
}

}  // namespace

bool ReadTruth(std::string_view text, bool& truth) {
  for (const std::string_view word : {"true", "yes", "y", "1"}) {
    if (text == word) return truth = true;
  }
  for (const std::string_view word : {"false", "no", "n", "0"}) {
    if (text == word) {
      truth = false;
      return true;
    }
  }
  return false;
}

std::string OptionName(const Parameter& parameter) {
  return "--" + parameter.name + (parameter.shortName.empty() ? "" : " (-" + parameter.shortName + ")");
}

MissingValue::MissingValue(const Parameter& parameter)
    : UsageError("option " + OptionName(parameter) + " needs a value"), option(parameter.name) {}

OptionTable::OptionTable(std::vector<Parameter> declared)
    : parameters_(std::move(declared)), given_(parameters_.size()) {}

const Parameter* OptionTable::Find(const std::string& name) const {
  for (const Parameter& parameter : parameters_) {
    if (parameter.name == name) return &parameter;
  }
  return nullptr;
}

const Parameter* OptionTable::FindShort(char letter) const {
  for (const Parameter& parameter : parameters_) {
    if (parameter.shortName.size() == 1 && parameter.shortName[0] == letter) return &parameter;
  }
  return nullptr;
}

Given& OptionTable::Slot(const Parameter& parameter) {
  return given_[static_cast<std::size_t>(&parameter - parameters_.data())];
}

const Given& OptionTable::For(const Parameter& parameter) const {
  return given_[static_cast<std::size_t>(&parameter - parameters_.data())];
}

void OptionTable::Take(const Parameter& parameter, const std::string* text) {
  Given& slot = Slot(parameter);
  if (slot.given && parameter.type != ParameterType::StringList) {
    throw UsageError("option " + OptionName(parameter) + " is given more than once");
  }
  bool truth = true;
  int number = 0;
  if (text) {
    switch (parameter.type) {
      case ParameterType::Bool:
      case ParameterType::Flag:
        if (!ReadTruth(*text, truth)) {
          RefuseValue(parameter, *text, "a truth word: true, yes, y, 1, false, no, n or 0");
        }
        break;
      case ParameterType::Int:
        if (!ReadNumber(*text, number)) {
          RefuseValue(parameter, *text, "a whole number from -2147483648 to 2147483647");
        }
        break;
      case ParameterType::String:
      case ParameterType::StringList:
        // A sensitive "-" stands for a value that is still to be read.
        if (!parameter.sensitive || *text != "-") CheckAllowed(parameter, *text);
        break;
    }
    slot.texts.push_back(*text);
  }
  slot.given = true;
  slot.truth = truth;
  slot.number = number;
}

bool OptionTable::TakeOperand(const std::string& text) {
  for (const Parameter& parameter : parameters_) {
    const bool isFull = For(parameter).given && parameter.type != ParameterType::StringList;
    if (!MayBeOperand(parameter) || isFull) continue;
    Take(parameter, &text);
    return true;
  }
  return false;
}

void OptionTable::RequireAll() const {
  std::vector<std::string> missing;
  for (const Parameter& parameter : parameters_) {
    if (parameter.required && !For(parameter).given) missing.push_back(OptionName(parameter));
  }
  if (missing.empty()) return;
  throw UsageError("missing required option" + std::string(missing.size() > 1 ? "s " : " ") +
                   Join(missing, ", "));
}

void OptionTable::Inherit(const std::string& name, const OptionTable& other) {
  Given& slot = Slot(*Find(name));
  if (!slot.given) slot = other.For(name);
}

void OptionTable::ReadSecrets(const std::function<std::string(const Parameter&)>& read) {
  for (const Parameter& parameter : parameters_) {
    if (!parameter.sensitive) continue;
    for (std::string& text : Slot(parameter).texts) {
      if (text != "-") continue;
      text = read(parameter);
      CheckAllowed(parameter, text);
    }
  }
}

bool IsOption(const std::string& argument) { return argument.size() > 1 && argument[0] == '-'; }

namespace {

/// A parameter and the table that holds it.
struct Match {
  OptionTable* table = nullptr;
  const Parameter* parameter = nullptr;
};

template <class Finder>
Match FindIn(const std::vector<OptionTable*>& tables, Finder find) {
  for (OptionTable* table : tables) {
    if (const Parameter* parameter = find(*table)) return {table, parameter};
  }
  return {};
}

/// Takes the word at @p at, which may look like an option, as the value.
void TakeWord(const Match& match, const std::vector<std::string>& arguments, std::size_t& at) {
  if (at == arguments.size()) throw MissingValue(*match.parameter);
  match.table->Take(*match.parameter, &arguments[at++]);
}

void ReadLongOption(const std::vector<std::string>& arguments, std::size_t& at,
                    const std::vector<OptionTable*>& tables) {
  const std::string& argument = arguments[at++];
  const std::size_t equals = argument.find('=');
  const std::string name = argument.substr(2, equals == argument.npos ? equals : equals - 2);
  const Match match = FindIn(tables, [&](OptionTable& table) { return table.Find(name); });
  if (!match.parameter) RefuseOption("--" + name, tables);
  if (equals != argument.npos) {
    const std::string value = argument.substr(equals + 1);
    match.table->Take(*match.parameter, &value);
  } else if (TakesNoWord(*match.parameter)) {
    match.table->Take(*match.parameter, nullptr);
  } else {
    TakeWord(match, arguments, at);
  }
}

void ReadShortOptions(const std::vector<std::string>& arguments, std::size_t& at,
                      const std::vector<OptionTable*>& tables) {
  const std::string& argument = arguments[at++];
  for (std::size_t letter = 1; letter < argument.size(); ++letter) {
    const Match match = FindIn(tables, [&](OptionTable& table) { return table.FindShort(argument[letter]); });
    if (!match.parameter) {
      RefuseOption('-' + argument.substr(letter, DecodeUtf8(argument, letter).length), tables);
    }
    std::string rest = argument.substr(letter + 1);
    if (TakesNoWord(*match.parameter)) {
      const bool hasWord = !rest.empty() && rest[0] == '=';
      rest.erase(0, 1);
      match.table->Take(*match.parameter, hasWord ? &rest : nullptr);
      if (hasWord) return;
    } else if (rest.empty()) {
      return TakeWord(match, arguments, at);
    } else {
      return match.table->Take(*match.parameter, &rest);
    }
  }
}

}  // namespace

void ReadOption(const std::vector<std::string>& arguments, std::size_t& at,
                const std::vector<OptionTable*>& tables) {
  if (arguments[at][1] == '-') return ReadLongOption(arguments, at, tables);
  ReadShortOptions(arguments, at, tables);
}

}  // namespace Plinth
