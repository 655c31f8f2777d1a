/// A report for somebody who is to help from afar.
#pragma once

#include <Plinth/Checks.h>

#include <string>
#include <vector>

namespace TessaroCli::Doctor {

/// "ok", "warning" or "fault".
const char* WordOf(Plinth::FindingState state);

std::string BundleText(const std::vector<Plinth::Finding>& findings,
                       const std::vector<Plinth::Enclosure>& enclosures);

/// Writes @p text to the new file @p path, of mode 0600, whole or not at all. Returns why it could not be, a
/// sentence, or "". In a dry run nothing is written.
std::string WriteBundle(const std::string& path, const std::string& text);

}  // namespace TessaroCli::Doctor
