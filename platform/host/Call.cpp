#include "host/Call.h"

namespace host {

std::string Argument::Text() const {
  switch (form_) {
    case Form::Text:
      return Quoted(text_);
    case Form::Word:
      return std::string(text_);
    case Form::Number:
      return (text_.empty() ? "" : std::string(text_) + ' ') + std::to_string(number_);
    case Form::Own:
      return own_;
  }
  return {};
}

void Call::AppendShown(std::initializer_list<Argument> shown) {
  for (const Argument& argument : shown) arguments += (arguments.empty() ? "" : ", ") + argument.Text();
}

}  // namespace host
