/// One call of a library operation, as the trace and the answers know it.
#pragma once

#include <concepts>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <utility>

#include "host/Formats.h"
#include "host/Operations.h"

#pragma GCC visibility push(default)

namespace host {

/// True while somebody takes the lines of the trace.
bool IsTracing();

/// An argument of a call. What the trace shows of it is made when that is wanted: until then, a text that was
/// given to it has to stay.
class Argument {
 public:
  Argument(std::string_view text) : Argument(Form::Text, text, 0) {}
  Argument(const std::string& text) : Argument(std::string_view(text)) {}
  Argument(const char* text) : Argument(std::string_view(text)) {}
  template <std::same_as<bool> Bool>
  Argument(Bool value) : Argument(Form::Word, value ? "true" : "false", 0) {}
  template <std::integral Integer>
  requires(!std::same_as<Integer, bool>) Argument(Integer value)
      : Argument(Form::Number, {}, static_cast<std::int64_t>(value)) {}
  /// Text without quotes.
  static Argument Word(std::string_view text) { return Argument(Form::Word, text, 0); }
  /// A secret, of which the trace tells only that there is one.
  static Argument Secret() { return Word("***"); }
  /// A number with a word in front of it.
  static Argument Numbered(std::string_view word, std::int64_t number) {
    return Argument(Form::Number, word, number);
  }
  /// The same of a text that was made for it, such as the parts of a record.
  static Argument Plain(std::string text) {
    Argument argument(Form::Own, {}, 0);
    argument.own_ = std::move(text);
    return argument;
  }
  /// As the trace shows it.
  std::string Text() const;

 private:
  enum class Form : std::uint8_t { Text, Word, Number, Own };
  Argument(Form form, std::string_view text, std::int64_t number)
      : form_(form), text_(text), number_(number) {}

  Form form_;
  std::string_view text_;
  std::int64_t number_;
  std::string own_;
};

struct Call {
  enum class Style : std::uint8_t {
    Operation,  // failures are NodeCtlException
    Lookup,     // failures are CoreCtlException
    Ima,        // failures are a status
  };

  /// An operation on the adapter @p adapterName.
  static Call OnAdapter(Operation operation, std::string_view adapterName,
                        std::initializer_list<Argument> arguments = {}) {
    Call call{operation, Style::Operation, std::string(adapterName)};
    call.Show({Argument::Word(adapterName)});
    call.Show(arguments);
    return call;
  }
  /// An operation without an adapter.
  static Call OnHost(Operation operation, std::initializer_list<Argument> arguments = {}) {
    Call call{operation, Style::Operation, {}};
    call.Show(arguments);
    return call;
  }
  /// The lookup of an adapter by its name.
  static Call Lookup(Operation operation, std::string_view adapterName) {
    Call call{operation, Style::Lookup, std::string(adapterName)};
    call.Show({adapterName});
    return call;
  }
  /// An IMA call on the object @p objectId (0 for none); the adapter is the one that the object is or belongs
  /// to.
  static Call Ima(Operation operation, std::int64_t objectId,
                  std::initializer_list<Argument> arguments = {}) {
    Call call = OnHost(operation, arguments);
    call.style = Style::Ima;
    call.object = objectId;
    return call;
  }

  Operation operation;
  Style style = Style::Operation;
  std::string adapter;      // empty where there is none, or where object tells it
  std::int64_t object = 0;  // of an IMA call
  bool traced = IsTracing();
  std::string arguments = {};  // as the trace shows them; empty where there is none

 private:
  void Show(std::initializer_list<Argument> shown) {
    if (traced) AppendShown(shown);
  }
  void AppendShown(std::initializer_list<Argument> shown);
};

}  // namespace host

#pragma GCC visibility pop
