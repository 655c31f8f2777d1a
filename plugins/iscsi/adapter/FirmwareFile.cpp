#include "adapter/FirmwareFile.h"

namespace TessaroCli::IscsiNamespace {
namespace {

IMA_OID FindPhysicalAdapter(const std::string& name) {
  for (const IMA_OID& physical : ImaList("Unable to get physical adapter list.", IMA_GetPhbaOidList)) {
    static constexpr char kFailure[] = "Unable to get logical adapter list.";
    const ImaList logicals(kFailure, IMA_TSR_GetLhbaOidList, physical);
    if (IscsiUtil::FindLogicalAdapter(logicals, name, kFailure, IscsiUtil::kDeviceNameSize)) return physical;
  }
  throw IscsiUtil::ImaFailure{"Invalid adapter provided."};
}

}  // namespace

IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES FirmwareFile::Image(const char* failure) const {
  IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES image{};
  CheckIma(IMA_IsPhbaDownloadFile(adapter, path.get(), &image), failure);
  return image;
}

void WithFirmwareFile(const InputPtr& input, const OutputPtr& output,
                      const std::function<void(const FirmwareFile&)>& steps) {
  ReportingImaFailures(*output, [&] {
    wchar_t* path = nullptr;
    CheckIma(IscsiTools::GetWideCharStringFromUtf8String(&path, input->GetString("file").c_str()),
             "Filename conversion failed.");
    FirmwareFile file{{}, WideText(path, &std::free), {}};
    file.adapter = FindPhysicalAdapter(input->GetString("adapter"));
    file.download = ReadIma(IMA_GetPhbaDownloadProperties, file.adapter, "No download properties.");
    steps(file);
  });
}

}  // namespace TessaroCli::IscsiNamespace
