#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

/// One byte for each character of @p wide, which is not converted: of a character above 255 the low byte
/// stays, and ends the text where it is zero.
std::string BytesOf(std::span<const IMA_WCHAR> wide) {
  std::string bytes;
  for (const IMA_WCHAR character : wide) {
    const char byte = static_cast<char>(character);
    if (byte == 0) break;
    bytes += byte;
  }
  return bytes;
}

struct Listed {
  const IMA_PLUGIN_PROPERTIES& properties;
  const std::string& fileName;
};

constexpr Column<Listed> kColumns[] = {
    {"Supported Ima Version", Property<&IMA_PLUGIN_PROPERTIES::supportedImaVersion>},
    {"Vendor", [](const Listed& listed) { return BytesOf(listed.properties.vendor); }},
    {"Implementation Version",
     [](const Listed& listed) { return BytesOf(listed.properties.implementationVersion); }},
    {"File Name", [](const Listed& listed) { return listed.fileName; }},
    {"Build Time", [](const Listed&) { return "na"; }},
    {"Auto Persistence Supported",
     [](const Listed& listed) { return listed.properties.autoPersistenceSupported == 1; }},
    {"Lhbas Can Be Created And Destroyed",
     [](const Listed& listed) { return listed.properties.lhbasCanBeCreatedAndDestroyed == 1; }},
};
constexpr auto kPlugin = StructureOf<kColumns>("iScsiPlugin");

constexpr Option kOptions[] = {
    StringOption("plugin", 'p', "The IMA plugin file name."),
    AdapterFilter(),
};

constexpr char kNoMatch[] = "Unable to find matching plugin.";

}  // namespace

class PluginList : public CommandFrame<PluginList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List IMA plugins.",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {Setting(
          "fields:iScsiPlugin", "File Name,Vendor,Supported Ima Version,Implementation Version,Build Time")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kPlugin); }

 private:
  /// Posts what was found even where a failure ended the search.
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const bool ofAdapter = input->HasParameter("adapter");
    if (ofAdapter && input->HasParameter("plugin")) {
      return output->ReportError("adapter and plugin options are mutually exclusive.");
    }
    const ListPtr list = NewList(GetListType());
    ReportingImaFailures(*output, [&] {
      ofAdapter ? ExecuteInternalAdapter(input, output, list) : ExecuteInternalPlugin(input, output, list);
    });
    Post(output, list);
  }

  static void ExecuteInternalPlugin(const InputPtr& input, const OutputPtr& output, const ListPtr& list) {
    bool found = false;
    for (const IMA_OID& oid : ImaList("Unable to get plugin list.", IMA_GetPluginOidList)) {
      const auto properties = PropertiesOf(oid);
      const std::string fileName = BytesOf(properties.fileName);
      if (!Passes(*input, "plugin", fileName)) continue;
      ExecuteInternalAdd(list, properties, fileName);
      found = true;
      if (input->HasParameter("plugin")) break;
    }
    if (!found) output->ReportError(kNoMatch);
  }

  static void ExecuteInternalAdapter(const InputPtr& input, const OutputPtr& output, const ListPtr& list) {
    const ImaList adapters("Unable to get logical adapter list.", IMA_GetLhbaOidList);
    const auto adapter = FindIma(adapters, IMA_GetLhbaProperties, "Unable to get logical adapter properties.",
                                 [name = input->GetString("adapter")](const IMA_LHBA_PROPERTIES& properties) {
                                   return BytesOf(properties.osDeviceName) == name;
                                 });
    if (!adapter) return output->ReportError(kNoMatch);
    const auto properties =
        PropertiesOf(ReadIma(IMA_GetAssociatedPluginOid, *adapter, "Unable to get plugin identifier."));
    ExecuteInternalAdd(list, properties, BytesOf(properties.fileName));
  }

  static IMA_PLUGIN_PROPERTIES PropertiesOf(const IMA_OID& oid) {
    return ReadIma(IMA_GetPluginProperties, oid, "Unable to get plugin properties.");
  }

  static void ExecuteInternalAdd(const ListPtr& list, const IMA_PLUGIN_PROPERTIES& properties,
                                 const std::string& fileName) {
    list->Append(NewRow(kPlugin, {properties, fileName}));
  }
};

template NodePtr Make<PluginList>();

}  // namespace TessaroCli::IscsiNamespace
