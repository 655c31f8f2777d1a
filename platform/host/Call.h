/// One call of a library operation, as the trace and the answers know it.
#pragma once

#include <concepts>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>

#include "host/Formats.h"
#include "host/Operations.h"

#pragma GCC visibility push(default)

namespace host {

/// An argument as the trace shows it.
class Argument {
 public:
  Argument(const std::string& text) : text_(Quoted(text)) {}
  Argument(std::string_view text) : text_(Quoted(text)) {}
  Argument(const char* text) : text_(Quoted(text)) {}
  template <std::same_as<bool> Bool>
  Argument(Bool value) : text_(value ? "true" : "false") {}
  template <std::integral Integer>
  requires(!std::same_as<Integer, bool>) Argument(Integer value) : text_(std::to_string(value)) {}
  /// A secret, of which the trace tells only that there is one.
  static Argument Secret() { return Plain("***"); }
  /// Text without quotes, such as the parts of a record.
  static Argument Plain(std::string text) {
    Argument argument("");
    argument.text_ = std::move(text);
    return argument;
  }
  const std::string& Text() const { return text_; }

 private:
  std::string text_;
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
    Call call{operation, Style::Operation, std::string(adapterName), 0, std::string(adapterName)};
    for (const Argument& argument : arguments) call.arguments += ", " + argument.Text();
    return call;
  }
  /// An operation without an adapter.
  static Call OnHost(Operation operation, std::initializer_list<Argument> arguments = {}) {
    Call call{operation, Style::Operation, {}, 0, {}};
    for (const Argument& argument : arguments) {
      call.arguments += (call.arguments.empty() ? "" : ", ") + argument.Text();
    }
    return call;
  }
  /// The lookup of an adapter by its name.
  static Call Lookup(Operation operation, std::string_view adapterName) {
    return {operation, Style::Lookup, std::string(adapterName), 0, Quoted(adapterName)};
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
  std::string arguments;    // as the trace shows them
};

}  // namespace host

#pragma GCC visibility pop
