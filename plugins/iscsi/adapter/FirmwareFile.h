/// What the two firmware commands start with.
#pragma once

#include <cstdlib>
#include <functional>
#include <memory>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {

using WideText = std::unique_ptr<wchar_t, decltype(&std::free)>;

/// An image file, and the physical adapter that it is for.
struct FirmwareFile {
  IMA_OID adapter;
  WideText path;
  IMA_PHBA_DOWNLOAD_PROPERTIES download;

  /// What the adapter says of the file. Throws ImaFailure with @p failure for one that it does not take.
  IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES Image(const char* failure) const;
};

/// Finds the physical adapter behind the one that the user named, and runs @p steps on it and the file. A
/// failed call is reported.
void WithFirmwareFile(const InputPtr& input, const OutputPtr& output,
                      const std::function<void(const FirmwareFile&)>& steps);

}  // namespace TessaroCli::IscsiNamespace
