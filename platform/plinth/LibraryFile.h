#pragma once

#include <string>

namespace Plinth {

/// Why the file @p path is no whole shared library of this machine's kind, or "" where it is one by its kind,
/// size and ELF header. The dynamic loader would wait for ever for a pipe, and a file that ends before the
/// segments that its header lists ends the process that maps it.
std::string LibraryFault(const std::string& path);

}  // namespace Plinth
