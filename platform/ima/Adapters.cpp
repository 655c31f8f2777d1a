/// Adapters: each iSCSI adapter of the host is a logical one on a physical one.
#include "host/Adapters.h"

#include <ima/ima_tsr.h>

#include "ima/FirmwareImage.h"
#include "ima/Objects.h"

using host::Kind;
using host::Object;
using host::Record;
using host::Tree;

namespace {

/// True when both stand on one physical adapter.
bool ShareHardware(const Object& a, const Object& b) {
  const std::string& name = a.record.GetString("physicalAdapter");
  return a.id == b.id || (!name.empty() && name == b.record.GetString("physicalAdapter"));
}

/// A physical adapter goes by the first iSCSI adapter on it. It is there while its logical adapter is not.
bool IsFirstOnHardware(const Object& adapter, const std::vector<Object>& all) {
  for (const Object& other : all) {
    if (host::IsIscsi(other) && ShareHardware(other, adapter)) return other.id == adapter.id;
  }
  return false;
}

std::vector<std::int64_t> Ids(const std::vector<Object>& objects) {
  std::vector<std::int64_t> ids;
  ids.reserve(objects.size());
  for (const Object& object : objects) ids.push_back(object.id);
  return ids;
}

ima::FirmwareImage ReadImage(const Object& physical, const IMA_WCHAR* path) {
  if (ima::Unsigned(physical.record, "download/fileSupported") != 1) {
    throw host::Error(host::Error::Kind::NotSupported, "The adapter takes no images.");
  }
  ima::FirmwareImage image = ima::ReadFirmwareImage(ima::Narrow(path));
  const std::string& model = physical.record.GetString("properties/model");
  if (!image.model.empty() && image.model != model) {
    throw host::Error(host::Error::Kind::Invalid, "The image is for another model than " + model + ".");
  }
  return image;
}

void Install(Record& record, IMA_PHBA_DOWNLOAD_IMAGE_TYPE type, const std::string& version) {
  const bool all = type == IMA_DOWNLOAD_IMAGE_TYPE_ALL;
  if (all || type == IMA_DOWNLOAD_IMAGE_TYPE_FIRMWARE) record.Set("properties/firmwareVersion", version);
  if (all || type == IMA_DOWNLOAD_IMAGE_TYPE_OPTION_ROM) record.Set("properties/optionRomVersion", version);
  if (all || type == IMA_DOWNLOAD_IMAGE_TYPE_BOOTCODE) record.Set("download/bootcodeVersion", version);
}

}  // namespace

extern "C" IMA_STATUS IMA_GetLhbaOidList(IMA_OID_LIST** list) {
  return ima::Read(host::Call::Ima("IMA_GetLhbaOidList", 0), [&](Tree& tree) {
    *list = ima::OidList(IMA_OBJECT_TYPE_LHBA, Ids(host::IscsiAdapters(tree))).release();
  });
}

extern "C" IMA_STATUS IMA_GetLhbaProperties(IMA_OID lhbaOid, IMA_LHBA_PROPERTIES* properties) {
  return ima::ReadProperties("IMA_GetLhbaProperties", lhbaOid, IMA_OBJECT_TYPE_LHBA, properties,
                             [](Tree&, const Object& adapter, IMA_LHBA_PROPERTIES& filled) {
                               ima::SetWide(filled.osDeviceName, adapter.name);
                             });
}

extern "C" IMA_STATUS IMA_GetPhbaOidList(IMA_OID_LIST** list) {
  return ima::Read(host::Call::Ima("IMA_GetPhbaOidList", 0), [&](Tree& tree) {
    const std::vector<Object> all = tree.Children(host::kRoot, Kind::Adapter);
    std::vector<Object> physical = all;
    std::erase_if(physical, [&](const Object& adapter) { return !IsFirstOnHardware(adapter, all); });
    *list = ima::OidList(IMA_OBJECT_TYPE_PHBA, Ids(physical)).release();
  });
}

extern "C" IMA_STATUS IMA_TSR_GetLhbaOidList(IMA_OID phbaOid, IMA_OID_LIST** list) {
  return ima::ReadObject("IMA_TSR_GetLhbaOidList", phbaOid, [&](Tree& tree) {
    const Object physical = ima::Get(tree, phbaOid, IMA_OBJECT_TYPE_PHBA);
    std::vector<Object> logical = host::IscsiAdapters(tree);
    std::erase_if(logical, [&](const Object& adapter) { return !ShareHardware(physical, adapter); });
    *list = ima::OidList(IMA_OBJECT_TYPE_LHBA, Ids(logical)).release();
  });
}

extern "C" IMA_STATUS IMA_GetPhbaDownloadProperties(IMA_OID phbaOid,
                                                    IMA_PHBA_DOWNLOAD_PROPERTIES* properties) {
  return ima::ReadProperties(
      "IMA_GetPhbaDownloadProperties", phbaOid, IMA_OBJECT_TYPE_PHBA, properties,
      [](Tree&, const Object& physical, IMA_PHBA_DOWNLOAD_PROPERTIES& filled) {
        const Record download = physical.record.GetRecord("download");
        filled.isPhbaDownloadFileSupported = ima::Unsigned(download, "fileSupported");
        filled.optionRomDownloadSupported = ima::Unsigned(download, "optionRomSupported");
        filled.firmwareDownloadSupported = ima::Unsigned(download, "firmwareSupported");
      });
}

extern "C" IMA_STATUS IMA_IsPhbaDownloadFile(IMA_OID phbaOid, const IMA_WCHAR* path,
                                             IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES* properties) {
  const auto call = host::Call::Ima("IMA_IsPhbaDownloadFile", ima::Id(phbaOid),
                                    {ima::OidArgument(phbaOid), ima::Narrow(path)});
  return ima::Read(call, [&](Tree& tree) {
    const ima::FirmwareImage image = ReadImage(ima::Get(tree, phbaOid, IMA_OBJECT_TYPE_PHBA), path);
    IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES filled{};
    filled.imageType = image.type;
    ima::SetWide(filled.fileVersion, image.version);
    ima::SetWide(filled.description, image.description);
    filled.upgrade = image.upgrade;
    *properties = filled;
  });
}

extern "C" IMA_STATUS IMA_PhbaDownload(IMA_OID phbaOid, IMA_PHBA_DOWNLOAD_IMAGE_TYPE imageType,
                                       const IMA_WCHAR* path) {
  const auto call = host::Call::Ima("IMA_PhbaDownload", ima::Id(phbaOid),
                                    {ima::OidArgument(phbaOid), imageType, ima::Narrow(path)});
  return ima::Change(call, [&](Tree& tree) {
    const Object physical = ima::Get(tree, phbaOid, IMA_OBJECT_TYPE_PHBA);
    const ima::FirmwareImage image = ReadImage(physical, path);
    if (image.type != imageType) {
      throw host::Error(host::Error::Kind::Invalid, "The image is of another type than the download.");
    }
    for (Object& adapter : tree.Children(host::kRoot, Kind::Adapter)) {
      if (!host::IsIscsi(adapter) || !ShareHardware(physical, adapter)) continue;
      Install(adapter.record, imageType, image.version);
      tree.Update(adapter);
    }
  });
}
