#include <algorithm>

#include "plinth/GlobalOptions.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using CallSpec::ParameterType;

/// What may stand behind a path.
struct Place {
  std::string path;
  std::vector<AutoCli::Child> children;
  std::vector<Parameter> parameters;
};

std::vector<Place> Places(const AutoCli::Namespace& root) {
  std::vector<Place> places{{"", AutoCli::NodeData::Of(root).children, GlobalParameters()}};
  WalkTree(root, "", [&](const std::string& path, AutoCli::NamespaceNode& node) {
    Place place{path, AutoCli::NodeData::Of(node).children, GlobalParameters()};
    if (auto* command = dynamic_cast<AutoCli::Command*>(&node)) {
      place.parameters = ParametersOf(*command->GetInputSpec());
      for (Parameter& global : GlobalParameters()) {
        const auto known = [&](const Parameter& own) { return own.name == global.name; };
        // The plug-ins are loaded before there is a command.
        if (global.name == "plugins" || std::any_of(place.parameters.begin(), place.parameters.end(), known))
          continue;
        place.parameters.push_back(std::move(global));
      }
    }
    places.push_back(std::move(place));
  });
  return places;
}

/// The values that are known of @p parameter, with blanks between them.
std::string Values(const Parameter& parameter) {
  return parameter.type == ParameterType::Bool ? "true false" : Join(AllowedValues(parameter), " ");
}

/// A word of any of the three shells.
std::string ShellWord(const std::string& text) {
  std::string quoted = "'";
  for (const char byte : text) {
    if (byte == '\'') {
      quoted += "'\\''";
    } else {
      quoted += byte;
    }
  }
  return quoted + '\'';
}

/// The functions that bash and zsh share. The first prints the words that may follow a path; with a second
/// argument, the values that are known of this option there, or fails where it takes none.
std::string SharedFunctions(const std::vector<Place>& places) {
  std::string script = "_hcli_candidates() {\n  case \"$1,$2\" in\n";
  for (const Place& place : places) {
    std::vector<std::string> words;
    for (const AutoCli::Child& child : place.children) words.push_back(child.name);
    for (const Parameter& parameter : place.parameters) {
      if (MayBeOperand(parameter) && !parameter.allowed.empty()) words.push_back(Values(parameter));
      words.push_back("--" + parameter.name);
      if (parameter.type == ParameterType::Flag) continue;
      std::string pattern = ShellWord(place.path + ",--" + parameter.name);
      if (!parameter.shortName.empty()) pattern += '|' + ShellWord(place.path + ",-" + parameter.shortName);
      script += "    " + pattern + ") echo " + ShellWord(Values(parameter)) + " ;;\n";
    }
    script += "    " + ShellWord(place.path + ",") + ") echo " + ShellWord(Join(words, " ")) + " ;;\n";
  }
  return script + "    *) return 1 ;;\n  esac\n}\n" + R"sh(_hcli_answer() {
  local place='' option='' word=''
  for word in "$@"; do
    case "$word" in
      =) ;;
      -*) option="$word" ;;
      *)
        option=''
        if _hcli_candidates "${place:+$place }$word" >/dev/null; then place="${place:+$place }$word"; fi
        ;;
    esac
  done
  if [ -n "$option" ] && _hcli_candidates "$place" "$option"; then return; fi
  _hcli_candidates "$place"
}
)sh";
}

std::string BashScript(const std::vector<Place>& places) {
  return SharedFunctions(places) + R"sh(_hcli() {
  local words
  words="$(_hcli_answer "${COMP_WORDS[@]:1:COMP_CWORD-1}")"
  # An equals sign is a word of its own.
  COMPREPLY=($(compgen -W "$words" -- "${COMP_WORDS[COMP_CWORD]#=}"))
}
complete -o default -F _hcli hcli
)sh";
}

std::string ZshScript(const std::vector<Place>& places) {
  return "#compdef hcli\n" + SharedFunctions(places) + R"sh(_hcli() {
  compadd -- ${=$(_hcli_answer "${(@)words[2,CURRENT-1]}")} || _files
}
compdef _hcli hcli
)sh";
}

std::string FishScript(const std::vector<Place>& places) {
  std::string script = R"sh(function __hcli_words
  for word in (commandline -opc)[2..-1]
    string match -q -- '-*' $word; or echo $word
  end
end
function __hcli_at
  test "$(__hcli_words | string join ' ')" = "$argv[1]"
end
function __hcli_in
  string match -q -- "$argv[1] *" "$(__hcli_words | string join ' ') "
end
complete -c hcli -e
complete -c hcli -f
)sh";
  for (const Place& place : places) {
    // The condition is a text that the shell reads once more, so the path stands in quotes of the other kind.
    const std::string quotedPath = '"' + place.path + '"';
    for (const AutoCli::Child& child : place.children) {
      script += "complete -c hcli -n " + ShellWord("__hcli_at " + quotedPath) + " -a " +
                ShellWord(child.name) + " -d " + ShellWord(AutoCli::NodeData::Of(*child.node).description) +
                '\n';
    }
    // Global options are known everywhere from the root on.
    if (!place.children.empty() && !place.path.empty()) continue;
    for (const Parameter& parameter : place.parameters) {
      script += "complete -c hcli";
      if (!place.path.empty()) script += " -n " + ShellWord("__hcli_in " + quotedPath);
      if (!parameter.shortName.empty()) script += " -s " + parameter.shortName;
      script += " -l " + parameter.name;
      // -x keeps file names away where the values are known.
      const std::string values = Values(parameter);
      if (parameter.type != ParameterType::Flag) script += values.empty() ? " -r" : " -x";
      if (!values.empty()) script += " -a " + ShellWord(values);
      script += '\n';
    }
  }
  return script;
}

struct Shell {
  const char* name;
  std::string (*script)(const std::vector<Place>& places);
};

constexpr Shell kShells[] = {{"bash", BashScript}, {"zsh", ZshScript}, {"fish", FishScript}};

class Completion final : public virtual AutoCli::Command {
 public:
  explicit Completion(AutoCli::Namespace& root) : root_(root) {
    SetDescription("Write a script that lets a shell complete command lines.");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto shells = CallSpec::ParameterConstraint::New(CallSpec::ParameterConstraintType::StringEnum);
    for (const Shell& shell : kShells) shells->AddStringEnum(shell.name, "");
    auto shell = CallSpec::ParameterSpec::New("shell", ParameterType::String);
    shell->SetHelp("The shell to write for. %ENUM%");
    shell->SetConstraint(shells);
    shell->SetRequired(true);
    auto spec = CallSpec::InputSpec::New();
    spec->AddParameter(shell);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(MetaObj::MetaString::New("Script"));
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    const std::string name = input->GetString("shell");
    for (const Shell& shell : kShells) {
      if (name == shell.name) output->SetResult(MetaObj::MetaString::New(shell.script(Places(root_))));
    }
    output->Close();
  }

  AutoCli::Namespace& root_;
};

}  // namespace

boost::shared_ptr<AutoCli::Command> NewCompletion(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::Command>(new Completion(root));
}

}  // namespace Plinth
