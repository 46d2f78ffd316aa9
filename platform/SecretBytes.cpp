#include "platform/SecretBytes.h"

#include <algorithm>

namespace QVSa::platform {

namespace {

constexpr char32_t replacement = 0xFFFD;

constexpr bool isHighSurrogate(char32_t unit) { return unit >= 0xD800 && unit <= 0xDBFF; }
constexpr bool isLowSurrogate(char32_t unit) { return unit >= 0xDC00 && unit <= 0xDFFF; }

std::size_t sequenceLength(unsigned char first) {
  if (first < 0x80) return 1;
  if (first >= 0xC2 && first <= 0xDF) return 2;
  if (first >= 0xE0 && first <= 0xEF) return 3;
  if (first >= 0xF0 && first <= 0xF4) return 4;
  return 0;
}

bool isShortestForm(char32_t character, std::size_t length) {
  if (length == 3) return character >= 0x800 && !isHighSurrogate(character) && !isLowSurrogate(character);
  if (length == 4) return character >= 0x10000 && character <= 0x10FFFF;
  return true;
}

// The character at `at`, which moves behind it; behind one byte where no character stands there.
char32_t takeUtf8(const String& text, std::size_t& at) {
  const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
  const std::size_t start = at++;
  const std::size_t length = sequenceLength(byte(start));
  if (length == 0 || length > text.size() - start) return replacement;
  if (length == 1) return byte(start);
  char32_t character = byte(start) & (0xFFU >> (length + 1));
  for (std::size_t i = start + 1; i < start + length; ++i) {
    if ((byte(i) & 0xC0) != 0x80) return replacement;
    character = character << 6 | (byte(i) & 0x3FU);
  }
  if (!isShortestForm(character, length)) return replacement;
  at = start + length;
  return character;
}

void appendUtf8(String& text, char32_t character) {
  const auto put = [&](char32_t byte) { text += static_cast<char>(byte); };
  const auto putRest = [&](int shift) { put(0x80 | (character >> shift & 0x3F)); };
  if (character < 0x80) return put(character);
  if (character < 0x800) {
    put(0xC0 | character >> 6);
  } else if (character < 0x10000) {
    put(0xE0 | character >> 12);
    putRest(6);
  } else {
    put(0xF0 | character >> 18);
    putRest(12);
    putRest(6);
  }
  putRest(0);
}

}  // namespace

SecretBytes toUtf16Bytes(const String& text) {
  SecretBytes bytes;
  bytes.reserve(text.size() * 2);
  const auto put = [&](char32_t unit) {
    bytes.push_back(static_cast<std::uint8_t>(unit & 0xFF));
    bytes.push_back(static_cast<std::uint8_t>(unit >> 8));
  };
  for (std::size_t at = 0; at < text.size();) {
    const char32_t character = takeUtf8(text, at);
    if (character < 0x10000) {
      put(character);
    } else {
      put(0xD800 + ((character - 0x10000) >> 10));
      put(0xDC00 + (character & 0x3FF));
    }
  }
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
      appendUtf8(*text, first);
      continue;
    }
    at += 2;
    if (!isHighSurrogate(first) || at == bytes.size() || !isLowSurrogate(unit(at))) return std::nullopt;
    appendUtf8(*text, 0x10000 + ((first - 0xD800) << 10) + (unit(at) - 0xDC00));
  }
  return text;
}

}  // namespace QVSa::platform
