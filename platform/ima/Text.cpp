#include <text/text.h>

#include <cstdlib>
#include <cstring>
#include <new>

#include "host/Formats.h"

namespace {

/// The text in memory from malloc, with its terminator; null where there is none to be had.
template <class Char>
Char* Copied(const std::basic_string<Char>& text) {
  const std::size_t size = (text.size() + 1) * sizeof(Char);
  auto* copy = static_cast<Char*>(std::malloc(size));
  return copy == nullptr ? nullptr : static_cast<Char*>(std::memcpy(copy, text.c_str(), size));
}

template <class Source, class Char>
bool Convert(const Source& converted, Char** destination) {
  Char* copy = converted ? Copied(*converted) : nullptr;
  if (copy == nullptr) return false;
  *destination = copy;
  return true;
}

}  // namespace

extern "C" bool CodeSet_UTF8ToUTF32(const char* source, wchar_t** destination) try {
  return Convert(host::WideFromUtf8(source), destination);
} catch (const std::bad_alloc&) {
  return false;
}

extern "C" bool CodeSet_UTF32ToUTF8(const wchar_t* source, char** destination) try {
  return Convert(host::Utf8FromWide(source), destination);
} catch (const std::bad_alloc&) {
  return false;
}

extern "C" char* Str_Strcat(char* destination, const char* source, std::size_t size) {
  const std::size_t used = strnlen(destination, size);
  if (used >= size) return destination;  // no terminator: not a text that could be added to
  const std::size_t added = strnlen(source, size - used - 1);
  std::memcpy(destination + used, source, added);
  destination[used + added] = '\0';
  return destination;
}
