// Where a command reads its options: an option whose reading fails ends the steps there, with what that part
// of them reports.
#include <CoreCtl/Exception.h>

#include <boost/make_shared.hpp>

#include "host/Host.h"
#include "plinth/Declarations.h"
#include "support/Harness.h"
#include "support/SweepTable.h"
#include "support/Words.h"

namespace {

using Texts = std::vector<std::string>;

/// Options of which each says when it is read, and fails where its value is "fails".
class ToldInput : public Plinth::CallSpec::Input {
 public:
  ToldInput(const Texts& words, Texts& told) : told_(told) {
    for (const std::string& word : words) {
      const std::size_t sign = word.find('=');
      options_[word.substr(0, sign)] = word.substr(sign + 1);
    }
  }
  std::string GetString(const std::string& key) const override { return Read(key); }
  void GetStringList(const std::string& key, Texts& values) const override { values = {Read(key)}; }
  int GetInt(const std::string& key) const override { return std::stoi(Read(key)); }
  bool GetBool(const std::string& key) const override { return Read(key) == "true"; }
  bool GetFlag(const std::string& key) const override { return Read(key) == "true"; }
  bool HasParameter(const std::string& key) const override { return options_.contains(key); }

 private:
  std::string Read(const std::string& key) const {
    told_.push_back(key);
    if (!HasParameter(key)) return "";
    if (options_.at(key) == "fails") throw NodeCtl::Lib::NodeCtlException("unread", {});
    return options_.at(key);
  }

  std::map<std::string, std::string> options_;
  Texts& told_;
};

class ToldOutput : public Plinth::CallSpec::Output {
 public:
  explicit ToldOutput(Texts& told) : told_(told) {}
  void ReportError(const std::string& text) override { told_.push_back('"' + text + '"'); }
  void SetResult(boost::shared_ptr<Plinth::MetaObj::MetaObject>) override { told_.push_back("result"); }
  void Close() override {}

 private:
  Texts& told_;
};

/// @p name is a path, or the class of a command that stands on none.
boost::shared_ptr<Plinth::AutoCli::Command> CommandNamed(const std::string& name) {
  for (const sweep::SweptCommand& command : sweep::Commands()) {
    if (command.make && command.name == name) return command.make();
  }
  Plinth::AutoCli::NamespaceNode* node = &CommandTree();
  for (const std::string& word : SplitWords("iscsi " + name)) {
    node = Plinth::AutoCli::NodeData::FindChild(*node, word);
  }
  return boost::dynamic_pointer_cast<Plinth::AutoCli::Command>(node->shared_from_this());
}

TEST(Options, AreReadWhereTheyAreUsed) {
  const std::string kParmFailure =
      "\"Unable to set parameters. Please make sure parameter input is settable and within MAX/MIN range "
      "(integer takes numbers, bool takes [true/false,yes/no,y/n]). Digests will take {prohibited, "
      "discouraged, preferred, required} only.\"";
  const struct {
    const char* command;
    const char* options;
    std::string told;  ///< options read, library calls and reports, in order
  } kCases[] = {
      {"networkportal add", "adapter=none nic=nic1 force=fails",
       "nic, adapter, GetScsiInterface, \"Invalid adapter specified or unable to get adapter.\""},
      {"networkportal add", "adapter=soft nic=nic1 force=fails",
       "nic, adapter, GetScsiInterface, force, \"Unable to bind iscsi port. [force = 0]\n\""},
      {"networkportal add", "adapter=soft nic=nic1 force=true",
       "nic, adapter, GetScsiInterface, force, nic, BindHostnic, result"},
      {"networkportal remove", "adapter=soft nic=nic1 force=fails",
       "nic, adapter, GetScsiInterface, force, \"Unable to unbind iscsi port.\""},
      {"networkportal ipconfig get", "adapter=ind nic=fails",
       "adapter, GetScsiInterface, nic, \"Failed to get IP configuration for network portal.\", \"unread\""},
      {"networkportal ipconfig set", "adapter=ind dns1=192.0.2.1 dns2=192.0.2.2",
       "adapter, GetScsiInterface, GetNetworkProperties, dns1, dns2, SetDnsServers, result"},
      // What names a place is read as a whole, and then looked at.
      {"adapter discovery sendtarget param set", "adapter=ind address=[ key=MaxCmds value=1",
       "key, value, adapter, GetScsiInterface, address, key, " + kParmFailure},
      {"adapter target portal param set", "adapter=ind name=t address=[ key=MaxCmds inherit=true",
       "key, adapter, GetScsiInterface, name, address, key, " + kParmFailure},
      {"adapter target portal param get", "adapter=ind name=t address=[",
       "adapter, GetScsiInterface, name, address, \"Failed to get parameter configuration.\""},
      {"adapter auth chap get", "adapter=ind direction=up",
       "adapter, GetScsiInterface, direction, \"Invalid authentication direction.\""},
      {"adapter discovery sendtarget auth chap get", "adapter=ind address=192.0.2.1 direction=up",
       "adapter, GetScsiInterface, address, direction, GetSendTargetParms, "
       "\"Invalid authentication direction.\""},
      {"adapter target portal auth chap get", "adapter=ind name=all address=all direction=up",
       "adapter, GetScsiInterface, name, address, direction, GetStaticTargets, "
       "\"Invalid authentication direction.\""},
      {"adapter discovery sendtarget auth chap set", "adapter=ind address=[",
       "adapter, GetScsiInterface, address, direction, "
       "\"Failed to set CHAP authentication configuration.\""},
      {"adapter target portal auth chap set", "adapter=ind name=t address=[",
       "adapter, GetScsiInterface, name, address, direction, \"Unable to set CHAP authentication.\""},
      {"AdapterDiscoveryIsnsParamSet", "adapter=none",
       "method, address, \"Only one options value, inherit, default can be used at once.\""},
      {"AdapterDiscoveryIsnsParamSet", "adapter=ind method=static address=192.0.2.1 key=PollInterval value=7",
       "method, address, key, value, adapter, GetScsiInterface, key, GetIsnsParms, value, SetIsnsParms, "
       "result"},
      {"AdapterIsnsParamSet", "adapter=ind key=PollInterval value=7",
       "key, value, adapter, GetScsiInterface, key, GetAdapterIsnsParms, value, SetAdapterIsnsParms, result"},
      {"AdapterDiscoveryIsnsList", "adapter=fails",
       "adapter, \"unread\", \"Failed to list isns discovery addresses.\""},
      // Each limit of a listing is read where there is something to hold against it.
      {"session connection list", "adapter=soft name=fails isid=fails cid=fails",
       "IMA_GetLhbaOidList, IMA_GetLhbaProperties, adapter, IMA_GetTargetOidList, "
       "IMA_GetLhbaProperties, adapter, result"},
      {"plugin list", "plugin=fails", "IMA_GetPluginOidList, \"Unable to find matching plugin.\", result"},
      // The name is read ahead of what the handler is for.
      {"physicalnetworkportal param get", "adapter=ind nic=fails", "adapter, GetScsiInterface, nic, unread"},
  };
  for (const auto& [command, options, told] : kCases) {
    Harness host(R"({"nics": [{"name": "nic1"}], "adapters": [{"name": "soft", "kind": "software"},
        {"name": "ind", "kind": "independent", "capabilities": {"Primary DNS Settable": true,
         "Secondary DNS Settable": true, "ISnS Settable": true}, "sendTargets": [{"host": "192.0.2.1"}],
         "isnsServers": [{"address": "192.0.2.1"}]}]})");
    Texts steps;
    host::SetTraceSink([&](const std::string& call) { steps.push_back(call.substr(0, call.find('('))); });
    try {
      CommandNamed(command)->Execute(boost::make_shared<ToldInput>(SplitWords(options), steps),
                                     boost::make_shared<ToldOutput>(steps));
    } catch (const NodeCtl::Lib::NodeCtlException& escaped) {
      steps.push_back(escaped.GetDescription(0));
    }
    std::string joined;
    for (const std::string& step : steps) joined += (joined.empty() ? "" : ", ") + step;
    EXPECT_EQ(joined, told) << command << ' ' << options;
  }
}

}  // namespace
