#include "platform/CodePage.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <iconv.h>
#include <new>
#include <strings.h>

#include "QVSa/values/Failure.h"
#include "platform/LocaleName.h"

namespace QVSa::platform {

namespace {

class Converter {
 public:
  Converter(const String& to, const String& from) : handle_(iconv_open(to.c_str(), from.c_str())) {
    if (!exists() && errno == ENOMEM) throw std::bad_alloc();
  }
  Converter(const Converter&) = delete;
  Converter& operator=(const Converter&) = delete;
  ~Converter() {
    if (exists()) iconv_close(handle_);
  }

  bool exists() const { return reinterpret_cast<std::intptr_t>(handle_) != -1; }

  // A short text, as a character is; empty where the target lacks a part of it.
  String convert(String text) const {
    char target[256];
    char* in = text.data();
    char* out = target;
    std::size_t inLeft = text.size();
    std::size_t outLeft = sizeof target;
    const bool done = iconv(handle_, &in, &inLeft, &out, &outLeft) == 0;
    // A character that one behind it may still change is written now.
    iconv(handle_, nullptr, nullptr, &out, &outLeft);
    return done ? String(target, out) : String();
  }

 private:
  iconv_t handle_;
};

bool isAscii(char c) { return static_cast<unsigned char>(c) < 0x80; }
bool isContinuation(char c) { return (static_cast<unsigned char>(c) & 0xC0) == 0x80; }

bool isUtf8(const String& encoding) {
  return strcasecmp(encoding.c_str(), "UTF-8") == 0 || strcasecmp(encoding.c_str(), "UTF8") == 0;
}

// Whether each byte below 128 stands for itself, wherever it stands: not so where all characters are wider, or where a
// sign or an escape sequence changes what the bytes behind it mean.
bool keepsAscii(const String& encoding) {
  String text = "\x1B(B";
  for (char c = 0; isAscii(c); ++c) text.push_back(c);
  const Converter reader("UTF-8", encoding);
  return reader.exists() && reader.convert(text) == text;
}

String codePageOf(const LocaleName& locale) {
  if (locale.language == "ja") return "CP932";
  if (locale.language == "ko") return "CP949";
  if (locale.language != "zh") return "CP1252";
  return locale.isTraditionalChinese() ? "CP950" : "CP936";
}

}  // namespace

String ansiCodePage() {
  const LocaleName locale = localeName("LC_CTYPE");
  const bool usable = !locale.encoding.empty() && !isUtf8(locale.encoding) && keepsAscii(locale.encoding);
  return usable ? locale.encoding : codePageOf(locale);
}

AnsiText toAnsi(const String& text) {
  // ASCII is the same in every code page.
  if (std::ranges::all_of(text, isAscii)) return {text};
  const Converter converter(ansiCodePage(), "UTF-8");
  if (!converter.exists()) throw runtimeFailure(number::argument);
  AnsiText result;
  for (auto at = text.begin(); at != text.end();) {
    const auto next = std::find_if_not(at + 1, text.end(), isContinuation);
    String bytes = converter.convert(String(at, next));
    if (bytes.size() > 1) result.oneByteEach = false;
    // A character of four bytes is a pair in UTF-16.
    if (bytes.empty()) bytes.assign(next - at > 3 ? 2 : 1, '?');
    result.bytes += bytes;
    at = next;
  }
  return result;
}

}  // namespace QVSa::platform
