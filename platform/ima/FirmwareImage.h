/// Image files of the simulated adapters: docs/firmware-image.md.
#pragma once

#include <ima/ima.h>

#include <string>

namespace ima {

struct FirmwareImage {
  IMA_PHBA_DOWNLOAD_IMAGE_TYPE type = -1;
  std::string version;
  std::string description;
  IMA_EXTENDED_BOOL upgrade = 2;
  std::string model;  // empty for all
};

/// Reads the header of the file @p path and holds its length against it. Throws host::Error with
/// the file and the reason for anything that is no whole image.
__attribute__((visibility("default"))) FirmwareImage ReadFirmwareImage(const std::string& path);

}  // namespace ima
