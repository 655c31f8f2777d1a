#include <iterator>

#include "adapter/FirmwareFile.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Shown {
  std::string path;
  IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES image;
};

std::string TypeText(IMA_PHBA_DOWNLOAD_IMAGE_TYPE type) {
  switch (type) {
    case IMA_DOWNLOAD_IMAGE_TYPE_FIRMWARE:
      return "firmware";
    case IMA_DOWNLOAD_IMAGE_TYPE_OPTION_ROM:
      return "option rom";
    case IMA_DOWNLOAD_IMAGE_TYPE_ALL:
      return "all";
    case IMA_DOWNLOAD_IMAGE_TYPE_BOOTCODE:
      return "bootcode";
    default:
      return "unknown";
  }
}

/// @p wide as UTF-8 where it fits into @p size bytes with its terminator.
template <std::size_t size>
std::string TextOrUnknown(const IMA_WCHAR* wide) {
  char text[size];
  return IscsiTools::GetUtf8StringFromWideCharString(text, wide, size) == IMA_STATUS_SUCCESS ? text
                                                                                             : "unknown";
}

constexpr Column<Shown> kColumns[] = {
    {"File", [](const Shown& shown) { return shown.path; }},
    {"Type", [](const Shown& shown) { return TypeText(shown.image.imageType); }},
    {"Version", [](const Shown& shown) { return TextOrUnknown<128>(shown.image.fileVersion); }},
    {"Description", [](const Shown& shown) { return TextOrUnknown<2048>(shown.image.description); }},
    {"Upgrade",
     [](const Shown& shown) {
       return IscsiTools::ConvertExtendedBoolToString(
           static_cast<NodeCtl::Storage::ExtendedBool>(shown.image.upgrade));
     }},
};
constexpr auto kFirmware = StructureOf<kColumns>("AdapterFirmware");

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("file", 'f', "Path to the firmware file to retrieve information from.").Required(),
};

}  // namespace

class AdapterFirmwareGet : public CommandFrame<AdapterFirmwareGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Validate the iSCSI firmware for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:AdapterFirmware", "%File%"),
                            FieldsFrom(0, kFirmware, "fields:AdapterFirmware")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kFirmware); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const std::string name = input->GetString("adapter");
    const std::string path = input->GetString("file");
    const ListPtr list = NewList(GetListType());
    ReportingImaFailures(*output, [&] {
      const WideText widePath = WidePath(path);
      const auto adapter = FindPhysicalAdapter(name, output);
      if (!adapter) return;
      ReadDownloadProperties(*adapter);  // an adapter without them takes no file
      list->Append(NewRow(kFirmware, {path, ReadImage(*adapter, widePath, "Invalid file provided.")}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterFirmwareGet>();

}  // namespace TessaroCli::IscsiNamespace
