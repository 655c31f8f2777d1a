#include "adapter/FirmwareFile.h"

namespace TessaroCli::IscsiNamespace {

WideText WidePath(const std::string& path) {
  wchar_t* wide = nullptr;
  CheckIma(IscsiTools::GetWideCharStringFromUtf8String(&wide, path.c_str()), "Filename conversion failed.");
  return {wide, &std::free};
}

std::optional<IMA_OID> FindPhysicalAdapter(const std::string& name, const OutputPtr& output) {
  for (const IMA_OID& physical : ImaList("Unable to get physical adapter list.", IMA_GetPhbaOidList)) {
    static constexpr char kFailure[] = "Unable to get logical adapter list.";
    const ImaList logicals(kFailure, IMA_TSR_GetLhbaOidList, physical);
    if (IscsiUtil::FindLogicalAdapter(logicals, name, kFailure, IscsiUtil::kDeviceNameSize)) return physical;
  }
  output->ReportError("Invalid adapter provided.");
  return std::nullopt;
}

IMA_PHBA_DOWNLOAD_PROPERTIES ReadDownloadProperties(const IMA_OID& adapter) {
  return ReadIma(IMA_GetPhbaDownloadProperties, adapter, "No download properties.");
}

IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES ReadImage(const IMA_OID& adapter, const WideText& path,
                                             const char* failure) {
  IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES image{};
  CheckIma(IMA_IsPhbaDownloadFile(adapter, path.get(), &image), failure);
  return image;
}

}  // namespace TessaroCli::IscsiNamespace
