/// The plug-ins of this API.
#include "ima/Objects.h"

using host::Kind;
using host::Object;
using host::Tree;

extern "C" IMA_STATUS IMA_GetPluginOidList(IMA_OID_LIST** list) {
  return ima::Read(host::Call::Ima("IMA_GetPluginOidList", 0), [&](Tree& tree) {
    *list = ima::OidList(IMA_OBJECT_TYPE_PLUGIN, tree.ChildIds(host::kRoot, Kind::Plugin)).release();
  });
}

extern "C" IMA_STATUS IMA_GetPluginProperties(IMA_OID pluginOid, IMA_PLUGIN_PROPERTIES* properties) {
  return ima::ReadProperties(
      "IMA_GetPluginProperties", pluginOid, IMA_OBJECT_TYPE_PLUGIN, properties,
      [](Tree&, const Object& plugin, IMA_PLUGIN_PROPERTIES& filled) {
        const host::Record& record = plugin.record;
        filled.supportedImaVersion = ima::Unsigned(record, "supportedImaVersion");
        ima::SetWide(filled.vendor, record.GetString("vendor"));
        ima::SetWide(filled.implementationVersion, record.GetString("implementationVersion"));
        ima::SetWide(filled.fileName, record.GetString("fileName"));
        if (record.Has("buildTime")) filled.buildTime = ima::Time(record.GetString("buildTime"));
        filled.lhbasCanBeCreatedAndDestroyed = ima::Unsigned(record, "lhbasCanBeCreatedAndDestroyed");
        filled.autoPersistenceSupported = ima::Unsigned(record, "autoPersistenceSupported");
      });
}

extern "C" IMA_STATUS IMA_GetAssociatedPluginOid(IMA_OID oid, IMA_OID* pluginOid) {
  return ima::ReadObject("IMA_GetAssociatedPluginOid", oid, [&](Tree& tree) {
    const auto adapter = tree.Above(ima::Id(oid), Kind::Adapter);
    if (!adapter) throw host::Error(host::Error::Kind::NotFound, "The object is gone.");
    const std::string& wanted = adapter->record.GetString("plugin");
    for (const Object& plugin : tree.Children(host::kRoot, Kind::Plugin)) {
      if (!wanted.empty() && plugin.record.GetString("fileName") != wanted) continue;
      *pluginOid = ima::Oid(IMA_OBJECT_TYPE_PLUGIN, plugin.id);
      return;
    }
    throw host::Error(host::Error::Kind::NotFound, "No plug-in serves the adapter " + adapter->name + ".");
  });
}
