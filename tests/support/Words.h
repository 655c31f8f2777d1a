/// Command lines as tests write them.
#pragma once

#include <string>
#include <vector>

/// Splits @p line at blanks; quotes '...' and "..." keep what is between them together.
std::vector<std::string> SplitWords(const std::string& line);
