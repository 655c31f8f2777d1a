/// What a command takes and gives: the declarations that the framework reads, and the objects through
/// which a run gets its options and posts its result.
///
/// All objects come from a static New() or are handed in by the framework; the framework owns Input and
/// Output and keeps them for the length of a run. Declarations share what is put into them. Texts are UTF-8.
/// Nothing here throws but std::bad_alloc and what an operation says.
#pragma once

#include <Plinth/MetaObj.h>

#include <boost/shared_ptr.hpp>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth::CallSpec {

/// The kind of value that a parameter takes. The numbers are part of the binary interface.
enum class ParameterType : int {
  String = 0,      ///< read with Input::GetString
  Int = 1,         ///< a decimal number of 32 bits with sign; read with Input::GetInt
  Bool = 2,        ///< takes a truth word: true, yes, y, 1, false, no, n, 0; read with Input::GetBool
  Flag = 3,        ///< given bare, or with a truth word behind "="; read with Input::GetFlag
  StringList = 4,  ///< may be given repeatedly; read with Input::GetStringList
};

/// The kind of a constraint. The number is part of the binary interface.
enum class ParameterConstraintType : int { StringEnum = 3 };

/// Limits the values of a parameter. The framework refuses any other value before the command runs.
class ParameterConstraint {
 public:
  /// A constraint without values, which limits nothing. Throws std::logic_error for a type that is none.
  static boost::shared_ptr<ParameterConstraint> New(ParameterConstraintType type);
  ParameterConstraint(const ParameterConstraint&) = delete;
  ParameterConstraint& operator=(const ParameterConstraint&) = delete;
  virtual ~ParameterConstraint();

  /// Allows @p value, compared exactly. @p help may be empty. Values keep the order of the calls.
  virtual void AddStringEnum(const std::string& value, const std::string& help) = 0;

 protected:
  ParameterConstraint() = default;
};

/// Declares one parameter of a command.
class ParameterSpec {
 public:
  /// @p name is the long name, without dashes, unique in its command.
  static boost::shared_ptr<ParameterSpec> New(const std::string& name, ParameterType type);
  ParameterSpec(const ParameterSpec&) = delete;
  ParameterSpec& operator=(const ParameterSpec&) = delete;
  virtual ~ParameterSpec();

  /// One letter, without the dash, unique in its command. A parameter without this call has none.
  virtual void SetShortName(const std::string& letter) = 0;
  /// "%ENUM%" in @p text stands for the allowed values.
  virtual void SetHelp(const std::string& text) = 0;
  /// Shares @p constraint: values may be added later. Null takes it away.
  virtual void SetConstraint(boost::shared_ptr<ParameterConstraint> constraint) = 0;
  /// Without this call a parameter is optional. The framework refuses a command line that lacks a required
  /// one.
  virtual void SetRequired(bool required) = 0;
  /// A sensitive value appears in no message, trace or help.
  virtual void SetSensitive(bool sensitive) = 0;

 protected:
  ParameterSpec() = default;
};

/// Declares all parameters of a command, in the order that the help shows.
class InputSpec {
 public:
  static boost::shared_ptr<InputSpec> New();
  InputSpec(const InputSpec&) = delete;
  InputSpec& operator=(const InputSpec&) = delete;
  virtual ~InputSpec();

  /// Shares @p parameter. Throws std::logic_error for null.
  virtual void AddParameter(boost::shared_ptr<ParameterSpec> parameter) = 0;

 protected:
  InputSpec() = default;
};

/// Declares the result of a command.
class OutputSpec {
 public:
  static boost::shared_ptr<OutputSpec> New();
  OutputSpec(const OutputSpec&) = delete;
  OutputSpec& operator=(const OutputSpec&) = delete;
  virtual ~OutputSpec();

  /// @p prototype has the type, and for structures the fields, of every result that the command posts. It is
  /// shared, and a later call replaces it.
  virtual void SetResultType(boost::shared_ptr<MetaObj::MetaObject> prototype) = 0;

 protected:
  OutputSpec() = default;
};

/// The options of one run, parsed and checked against the InputSpec.
///
/// A key is the long name of a declared parameter and is read with the operation of its type; anything
/// else is a fault of the command and throws std::logic_error. A parameter that was not given reads as
/// the empty text, 0, false or no elements.
class Input {
 public:
  Input(const Input&) = delete;
  Input& operator=(const Input&) = delete;
  virtual ~Input();

  /// The text as the user gave it.
  virtual std::string GetString(const std::string& key) const = 0;
  /// Replaces the contents of @p values by the values in the order given.
  virtual void GetStringList(const std::string& key, std::vector<std::string>& values) const = 0;
  /// From -2147483648 to 2147483647: the framework refuses other numbers.
  virtual int GetInt(const std::string& key) const = 0;
  /// The meaning of the truth word.
  virtual bool GetBool(const std::string& key) const = 0;
  /// True for a bare flag; a flag given with a false word reads as false.
  virtual bool GetFlag(const std::string& key) const = 0;
  /// True when the user gave the parameter, whatever its value.
  virtual bool HasParameter(const std::string& key) const = 0;

 protected:
  Input() = default;
};

/// Takes what a run has to say. A call that is out of place is a fault of the command and throws
/// std::logic_error.
class Output {
 public:
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;
  virtual ~Output();

  /// Shows @p text to the user when the run has ended, with a line break behind it where it ends in none. Any
  /// number of texts may be reported, with or without a result.
  virtual void ReportError(const std::string& text) = 0;
  /// Posts the result, shared with the caller; it fits the OutputSpec and is not null. Called at most once a
  /// run.
  virtual void SetResult(boost::shared_ptr<MetaObj::MetaObject> result) = 0;
  /// Ends the output. Called only behind SetResult.
  virtual void Close() = 0;

 protected:
  Output() = default;
};

}  // namespace Plinth::CallSpec

#pragma GCC visibility pop
