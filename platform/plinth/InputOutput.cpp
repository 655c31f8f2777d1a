#include "plinth/InputOutput.h"

#include <cstdio>
#include <cstdlib>
#include <stdexcept>
#include <utility>

#include "plinth/Reasons.h"
#include "plinth/Text.h"

namespace Plinth {

using CallSpec::ParameterType;

void RaiseFault(bool checked, const std::string& text) {
  if (!checked) throw std::logic_error(text);
  std::fprintf(stderr, "hcli: fault: %s\n", Visible(text).c_str());
  std::abort();
}

const Parameter& RunInput::Declared(const std::string& key) const {
  const Parameter* parameter = options_.Find(key);
  if (!parameter) RaiseFault(checked_, "the command reads the parameter " + Quoted(key) + ", not declared");
  return *parameter;
}

const Given& RunInput::Read(const std::string& key, ParameterType type) const {
  const Parameter& parameter = Declared(key);
  if (parameter.type != type) {
    RaiseFault(checked_, "the command reads the parameter " + Quoted(key) + " as " + TypeName(type) +
                             ", declared is " + TypeName(parameter.type));
  }
  return options_.For(parameter);
}

std::string RunInput::GetString(const std::string& key) const {
  const Given& given = Read(key, ParameterType::String);
  return given.given ? given.texts.front() : "";
}

void RunInput::GetStringList(const std::string& key, std::vector<std::string>& values) const {
  values = Read(key, ParameterType::StringList).texts;
  if (values.size() == 1 && values.front().empty()) values.clear();  // given, and given nothing
}

int RunInput::GetInt(const std::string& key) const { return Read(key, ParameterType::Int).number; }
bool RunInput::GetBool(const std::string& key) const { return Read(key, ParameterType::Bool).truth; }
bool RunInput::GetFlag(const std::string& key) const { return Read(key, ParameterType::Flag).truth; }
bool RunInput::HasParameter(const std::string& key) const { return options_.For(Declared(key)).given; }

void RunOutput::ReportError(const std::string& text) {
  record_.messages.push_back(text);
  TakeReason(record_);
}

void RunOutput::SetResult(boost::shared_ptr<MetaObj::MetaObject> result) {
  if (!result) RaiseFault(checked_, "the command posts a null result");
  if (record_.result) RaiseFault(checked_, "the command posts a second result");
  record_.result = std::move(result);
}

void RunOutput::Close() {
  if (!record_.result) RaiseFault(checked_, "the command closes its output without a result");
  record_.closed = true;
}

}  // namespace Plinth
