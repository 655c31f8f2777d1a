/// The input and output objects of one run.
#pragma once

#include <Plinth/CallSpec.h>

#include <boost/shared_ptr.hpp>
#include <string>
#include <vector>

#include "plinth/CommandLine.h"
#include "plinth/Options.h"

namespace Plinth {

/// A command broke what it declared: ends the process where @p checked, else throws std::logic_error.
[[noreturn]] void RaiseFault(bool checked, const std::string& text);

class RunInput final : public CallSpec::Input {
 public:
  /// @p options outlives this object.
  RunInput(const OptionTable& options, bool checked) : options_(options), checked_(checked) {}

  std::string GetString(const std::string& key) const override;
  void GetStringList(const std::string& key, std::vector<std::string>& values) const override;
  int GetInt(const std::string& key) const override;
  bool GetBool(const std::string& key) const override;
  bool GetFlag(const std::string& key) const override;
  bool HasParameter(const std::string& key) const override;

 private:
  const Parameter& Declared(const std::string& key) const;
  const Given& Read(const std::string& key, CallSpec::ParameterType type) const;

  const OptionTable& options_;
  bool checked_;
};

class RunOutput final : public CallSpec::Output {
 public:
  /// @p record outlives this object. What is reported is kept there, and shown when the run has ended.
  RunOutput(RunRecord& record, bool checked) : record_(record), checked_(checked) {}

  void ReportError(const std::string& text) override;
  void SetResult(boost::shared_ptr<MetaObj::MetaObject> result) override;
  void Close() override;

 private:
  RunRecord& record_;
  bool checked_;
};

}  // namespace Plinth
