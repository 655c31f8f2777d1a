#include "adapter/FirmwareFile.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("file", 'f', "Path to the firmware file to download.").Required(),
};

/// Why an image of that type is not downloaded; null where it is. Only the kinds that carry an option ROM are
/// held against what the adapter supports.
const char* Refusal(IMA_PHBA_DOWNLOAD_IMAGE_TYPE type, const IMA_PHBA_DOWNLOAD_PROPERTIES& download) {
  const bool takesOptionRom = download.optionRomDownloadSupported == 1;
  const bool takesFirmware = download.firmwareDownloadSupported == 1;
  switch (type) {
    case IMA_DOWNLOAD_IMAGE_TYPE_FIRMWARE:
    case IMA_DOWNLOAD_IMAGE_TYPE_BOOTCODE:
      return nullptr;
    case IMA_DOWNLOAD_IMAGE_TYPE_OPTION_ROM:
      return takesOptionRom ? nullptr : "OptionRom download not supported.";
    case IMA_DOWNLOAD_IMAGE_TYPE_ALL:
      return takesFirmware || takesOptionRom ? nullptr : "All download not supported.";
    default:
      return "Invalid download file type.";
  }
}

}  // namespace

class AdapterFirmwareSet : public CommandFrame<AdapterFirmwareSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Upload the iSCSI firmware for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const std::string name = input->GetString("adapter");
    const std::string path = input->GetString("file");
    ReportingImaFailures(*output, [&] {
      const WideText widePath = WidePath(path);
      const auto adapter = FindPhysicalAdapter(name, output);
      if (!adapter) return;
      const auto download = ReadDownloadProperties(*adapter);
      const auto type = ReadImage(*adapter, widePath, "Invalid download file provided.").imageType;
      if (const char* refusal = Refusal(type, download)) return output->ReportError(refusal);
      CheckIma(IMA_PhbaDownload(*adapter, type, widePath.get()), "Firmware download failed.");
      PostSuccess(output);
    });
  }
};

template NodePtr Make<AdapterFirmwareSet>();

}  // namespace TessaroCli::IscsiNamespace
