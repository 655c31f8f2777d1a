#include "IscsiUtil/Ima.h"

#include <text/text.h>

#include <algorithm>
#include <cstdlib>
#include <memory>
#include <new>

#include "IscsiUtil/IscsiTools.h"

namespace IscsiUtil {
namespace {

/// Bytes that continue a UTF-8 character are 10xxxxxx.
bool ContinuesCharacter(char byte) { return (static_cast<unsigned char>(byte) & 0xc0) == 0x80; }

bool IsCharacter(IMA_WCHAR character) {
  const auto number = static_cast<char32_t>(character);
  return number < 0xd800 || (number >= 0xe000 && number < 0x110000);
}

}  // namespace

std::string CutText(std::string text, std::size_t size) {
  if (text.size() < size) return text;
  std::size_t length = size - 1;
  while (length > 0 && ContinuesCharacter(text[length])) --length;
  text.resize(length);
  return text;
}

std::string NarrowText(std::span<const IMA_WCHAR> wide, std::size_t size) {
  // Most are ASCII, which needs no conversion.
  char ascii[kDeviceNameSize];
  std::size_t length = 0;
  const std::size_t most = std::min(wide.size(), sizeof ascii);
  for (; length < most && wide[length] > 0 && wide[length] < 0x80; ++length) {
    ascii[length] = static_cast<char>(wide[length]);
  }
  if (length < most && wide[length] == 0) return CutText(std::string(ascii, length), size);
  std::wstring characters;  // as many as can fit
  for (const IMA_WCHAR character : wide) {
    if (character == 0 || characters.size() >= size) break;
    characters += IsCharacter(character) ? character : L'?';
  }
  char* converted = nullptr;
  if (!CodeSet_UTF32ToUTF8(characters.c_str(), &converted))
    throw std::bad_alloc();  // there is no other reason
  const std::unique_ptr<char, decltype(&std::free)> text(converted, &std::free);
  return CutText(text.get(), size);
}

std::string AddressText(const IMA_IP_ADDRESS& address) {
  const char* text = IscsiTools::GetStringFromImaIpAddress(&address);
  return text == nullptr ? "" : text;
}

std::string IsidText(const IMA_INITIATOR_SESSION_ID& isid) {
  constexpr char kDigits[] = "0123456789abcdef";
  std::string text;
  for (const IMA_BYTE byte : isid) (text += kDigits[byte >> 4]) += kDigits[byte & 0xf];
  return text;
}

std::optional<IMA_OID> FindLogicalAdapter(const ImaList& adapters, const std::string& name,
                                          const char* failure, std::size_t size) {
  return FindIma(adapters, IMA_GetLhbaProperties, failure, [&](const IMA_LHBA_PROPERTIES& properties) {
    return NarrowText(properties.osDeviceName, size) == name;
  });
}

}  // namespace IscsiUtil
