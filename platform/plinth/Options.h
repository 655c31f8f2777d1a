/// Reads options as GNU programs do, against declared parameters.
#pragma once

#include <cstddef>
#include <functional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "plinth/Declarations.h"

namespace Plinth {

/// The user's command line is wrong. The text is one line without the program's name in front.
struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// The line ends behind an option that needs a value.
struct MissingValue : UsageError {
  explicit MissingValue(const Parameter& parameter);
  /// The long name.
  std::string option;
};

/// What was given for one parameter.
struct Given {
  bool given = false;
  /// As given, in order; a bare flag has none.
  std::vector<std::string> texts;
  int number = 0;
  bool truth = false;
};

/// Parameters with what was given for them.
class OptionTable {
 public:
  explicit OptionTable(std::vector<Parameter> declared);

  const std::vector<Parameter>& Parameters() const { return parameters_; }
  /// Null for a name that is not declared.
  const Parameter* Find(const std::string& name) const;
  const Parameter* FindShort(char letter) const;
  const Given& For(const Parameter& parameter) const;
  /// The text given, or empty; the parameter must be declared.
  const Given& For(const std::string& name) const { return For(*Find(name)); }

  /// Takes @p text, checked, as a value of the parameter; null means a bare flag.
  void Take(const Parameter& parameter, const std::string* text);
  /// Takes a value for the next parameter that may stand without its name; a list takes all that follow.
  /// False where there is none.
  bool TakeOperand(const std::string& text);
  void RequireAll() const;
  /// Takes over what @p other, of the same parameters, has for the parameter, unless it is given here.
  void Inherit(const std::string& name, const OptionTable& other);
  /// Replaces each sensitive value that is "-" by what @p read gives for its parameter.
  void ReadSecrets(const std::function<std::string(const Parameter&)>& read);

 private:
  Given& Slot(const Parameter& parameter);

  std::vector<Parameter> parameters_;
  std::vector<Given> given_;
};

/// True for an argument that names options; "-" alone is none.
bool IsOption(const std::string& argument);

/// Reads the option at @p arguments[@p at], which moves behind it and its value. Earlier tables win.
/// Throws UsageError.
void ReadOption(const std::vector<std::string>& arguments, std::size_t& at,
                const std::vector<OptionTable*>& tables);

/// Reads a truth word: true, yes, y, 1, false, no, n or 0. False where @p text is none.
bool ReadTruth(std::string_view text, bool& truth);

/// "--name" or "--name (-n)", as messages name a parameter.
std::string OptionName(const Parameter& parameter);

}  // namespace Plinth
