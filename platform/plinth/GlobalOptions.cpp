#include "plinth/GlobalOptions.h"

#include "plinth/Formatter.h"
#include "plinth/Tty.h"

namespace Plinth {

using CallSpec::ParameterType;

namespace {

constexpr GlobalOption kGlobalOptions[] = {
    {"output", ParameterType::String, "", "How to show the result: %ENUM%.", FormatterNames, nullptr,
     nullptr},
    {"fields", ParameterType::String, "", "The fields to show, separated by commas, in this order.", nullptr,
     ChooseFields, nullptr},
    {"no-header", ParameterType::Flag, "", "Leave out the names of the fields above table and csv.", nullptr,
     nullptr, nullptr},
    {"typed", ParameterType::Flag, "",
     "Give numbers, truth values and lists in json and yaml where commands give texts.", nullptr, CheckTyped,
     nullptr},
    {"color", ParameterType::String, "", "When to colour headings and failures: %ENUM%.", ColorWords, nullptr,
     nullptr},
    {"no-pager", ParameterType::Flag, "", "Do not show what the terminal does not hold in a pager.", nullptr,
     nullptr, nullptr},
    {"trace", ParameterType::Flag, "", "Show each call of the host's libraries.", nullptr, nullptr, Trace},
    {"exit-codes", ParameterType::Flag, "",
     "Tell with the exit status why a command failed; HCLI_EXIT_CODES=1 asks for it too.", nullptr, nullptr,
     nullptr},
    {"dry-run", ParameterType::Flag, "",
     "Undo everything at the end, and show the calls that would have changed something.", nullptr,
     CheckDryRun, DryRun},
    {"batch", ParameterType::String, "",
     "A file with a command line a line, to be run instead; - reads standard input.", nullptr, CheckBatch,
     RunBatch},
    {"keep-going", ParameterType::Flag, "", "Run the lines of the batch behind one that fails too.", nullptr,
     CheckKeepGoing, nullptr},
    {"timeout", ParameterType::String, "",
     "How many seconds to wait for other processes: 20 unless given, 0 for not at all.", nullptr,
     CheckTimeout, LimitWaiting},
    {"quiet", ParameterType::Flag, "q", "Show no notes, and not the result \"true\".", nullptr, nullptr,
     nullptr},
    {"secret-file", ParameterType::String, "",
     "A file whose first line is the command's secret; its owner alone may have access to it.", nullptr,
     ExpectSecretFile, nullptr},
    {"plugins", ParameterType::String, "", "The folder to load plug-ins from; HCLI_PLUGINS names it too.",
     nullptr, nullptr, nullptr},
    {"help", ParameterType::Flag, "h", "Show this help.", nullptr, nullptr, nullptr},
    {"version", ParameterType::Flag, "V", "Show the version.", nullptr, nullptr, nullptr},
};

}  // namespace

std::span<const GlobalOption> GlobalOptions() { return kGlobalOptions; }

std::vector<Parameter> GlobalParameters() {
  std::vector<Parameter> parameters;
  for (const GlobalOption& option : GlobalOptions()) {
    Parameter& parameter = parameters.emplace_back();
    parameter.name = option.name;
    parameter.type = option.type;
    parameter.shortName = option.letter;
    parameter.help = option.help;
    if (!option.values) continue;
    for (const std::string& value : option.values()) parameter.allowed.push_back({value, ""});
  }
  return parameters;
}

}  // namespace Plinth
