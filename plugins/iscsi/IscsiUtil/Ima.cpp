#include "IscsiUtil/Ima.h"

#include <cstdio>

#include "IscsiUtil/IscsiTools.h"

namespace IscsiUtil {
namespace {

/// Bytes that continue a UTF-8 character are 10xxxxxx.
bool ContinuesCharacter(char byte) { return (static_cast<unsigned char>(byte) & 0xc0) == 0x80; }

void AppendUtf8(std::string& text, char32_t character) {
  const auto append = [&text](char32_t bits) { text += static_cast<char>(bits); };
  const auto continueFrom = [&](unsigned shift) { append(0x80 | ((character >> shift) & 0x3f)); };
  if (character < 0x80) {
    append(character);
  } else if (character < 0x800) {
    append(0xc0 | (character >> 6));
    continueFrom(0);
  } else if (character >= 0xd800 && character < 0xe000) {
    text += '?';
  } else if (character < 0x10000) {
    append(0xe0 | (character >> 12));
    continueFrom(6);
    continueFrom(0);
  } else if (character < 0x110000) {
    append(0xf0 | (character >> 18));
    continueFrom(12);
    continueFrom(6);
    continueFrom(0);
  } else {
    text += '?';
  }
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
  std::string text;
  for (const IMA_WCHAR character : wide) {
    if (character == 0 || text.size() >= size) break;
    AppendUtf8(text, static_cast<char32_t>(character));
  }
  return CutText(std::move(text), size);
}

std::string AddressText(const IMA_IP_ADDRESS& address) {
  const char* text = IscsiTools::GetStringFromImaIpAddress(&address);
  return text == nullptr ? "" : text;
}

std::string IsidText(const IMA_INITIATOR_SESSION_ID& isid) {
  char text[32];
  std::snprintf(text, sizeof text, "%02x%02x%02x%02x%02x%02x", isid[0], isid[1], isid[2], isid[3], isid[4],
                isid[5]);
  return text;
}

std::optional<IMA_OID> FindLogicalAdapter(const ImaList& adapters, const std::string& name,
                                          const char* failure, std::size_t size) {
  return FindIma(adapters, IMA_GetLhbaProperties, failure, [&](const IMA_LHBA_PROPERTIES& properties) {
    return NarrowText(properties.osDeviceName, size) == name;
  });
}

}  // namespace IscsiUtil
