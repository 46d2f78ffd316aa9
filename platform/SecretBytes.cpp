#include "platform/SecretBytes.h"

#include <algorithm>

#include "QVSa/values/Utf8.h"

namespace QVSa::platform {

SecretBytes toUtf16Bytes(const String& text) {
  SecretBytes bytes;
  bytes.reserve(text.size() * 2);
  const auto put = [&](char16_t unit) {
    bytes.push_back(static_cast<std::uint8_t>(unit & 0xFF));
    bytes.push_back(static_cast<std::uint8_t>(unit >> 8));
  };
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) putUnits(nextSymbol(at, end), put);
  return bytes;
}

std::optional<String> fromUtf16Bytes(const SecretBytes& bytes) {
  if (bytes.size() % 2 != 0) return std::nullopt;
  const auto unit = [&](std::size_t at) { return static_cast<char32_t>(bytes[at] | bytes[at + 1] << 8); };
  std::optional<String> text(std::in_place);
  // It never grows and is never held inside the object, so that neither growing nor moving it leaves a copy behind.
  text->reserve(std::max(bytes.size() / 2 * 3, sizeof(String)));
  for (std::size_t at = 0; at < bytes.size(); at += 2) {
    const char32_t first = unit(at);
    if (!isHighSurrogate(first) && !isLowSurrogate(first)) {
      appendSymbol(*text, first);
      continue;
    }
    at += 2;
    if (!isHighSurrogate(first) || at == bytes.size() || !isLowSurrogate(unit(at))) return std::nullopt;
    appendSymbol(*text, fromSurrogates(first, unit(at)));
  }
  return text;
}

}  // namespace QVSa::platform
