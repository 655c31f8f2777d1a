/// What the two firmware commands share.
#pragma once

#include <cstdlib>
#include <memory>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {

using WideText = std::unique_ptr<wchar_t, decltype(&std::free)>;

// A failed call throws ImaFailure.

/// The path of an image file as the management API takes it.
WideText WidePath(const std::string& path);
/// The physical adapter behind the logical adapter @p name. That there is none is reported.
std::optional<IMA_OID> FindPhysicalAdapter(const std::string& name, const OutputPtr& output);
IMA_PHBA_DOWNLOAD_PROPERTIES ReadDownloadProperties(const IMA_OID& adapter);
/// What @p adapter says of the file @p path. @p failure is what is shown of a file that it does not take.
IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES ReadImage(const IMA_OID& adapter, const WideText& path,
                                             const char* failure);

}  // namespace TessaroCli::IscsiNamespace
