/// Text helpers.
#pragma once

#include <stdbool.h>
#include <stddef.h>
#include <wchar.h>

#pragma GCC visibility push(default)

#ifdef __cplusplus
extern "C" {
#endif

/// Converts @p source, UTF-8 ending in a zero, to UTF-32. On success *destination is a text allocated with
/// malloc, for the caller to free, and the result is true. Malformed UTF-8 (RFC 3629) or no memory yields
/// false and leaves *destination alone. Neither pointer may be null.
bool CodeSet_UTF8ToUTF32(const char* source, wchar_t** destination);

/// Converts @p source, UTF-32 ending in a zero, to UTF-8. The rules are those of CodeSet_UTF8ToUTF32; a
/// surrogate or a number above 0x10ffff is malformed.
bool CodeSet_UTF32ToUTF8(const wchar_t* source, char** destination);

/// Appends @p source to the text in @p destination, a buffer of @p size bytes, as far as it fits with the
/// terminator, and returns @p destination. A text that fills the buffer is left as it is. It cuts by bytes,
/// not characters; neither pointer may be null, and the two may not overlap.
char* Str_Strcat(char* destination, const char* source, size_t size);

#ifdef __cplusplus
}
#endif

#pragma GCC visibility pop
