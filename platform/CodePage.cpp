#include "platform/CodePage.h"

#include <algorithm>
#include <cstdint>
#include <iconv.h>
#include <strings.h>

#include "QVSa/frame/Failure.h"
#include "platform/LocaleName.h"

namespace QVSa::platform {

namespace {

class Converter {
 public:
  explicit Converter(const String& codePage) : handle_(iconv_open(codePage.c_str(), "UTF-8")) {}
  Converter(const Converter&) = delete;
  Converter& operator=(const Converter&) = delete;
  ~Converter() {
    if (exists()) iconv_close(handle_);
  }

  bool exists() const { return reinterpret_cast<std::intptr_t>(handle_) != -1; }

  // One character; empty where the code page lacks it.
  String convert(String character) const {
    char target[8];
    char* in = character.data();
    char* out = target;
    std::size_t inLeft = character.size();
    std::size_t outLeft = sizeof target;
    const bool done = iconv(handle_, &in, &inLeft, &out, &outLeft) == 0;
    iconv(handle_, nullptr, nullptr, nullptr, nullptr);
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

String codePageOf(const LocaleName& locale) {
  if (locale.language == "ja") return "CP932";
  if (locale.language == "ko") return "CP949";
  if (locale.language != "zh") return "CP1252";
  return locale.isTraditionalChinese() ? "CP950" : "CP936";
}

}  // namespace

String ansiCodePage() {
  const LocaleName locale = localeName("LC_CTYPE");
  const bool usable = !locale.encoding.empty() && !isUtf8(locale.encoding) && Converter(locale.encoding).exists();
  return usable ? locale.encoding : codePageOf(locale);
}

AnsiText toAnsi(const String& text) {
  // ASCII is the same in every code page.
  if (std::ranges::all_of(text, isAscii)) return {text};
  const Converter converter(ansiCodePage());
  if (!converter.exists()) throw runtimeFailure(number::argument);
  AnsiText result;
  for (auto at = text.begin(); at != text.end();) {
    const auto next = std::find_if_not(at + 1, text.end(), isContinuation);
    const String bytes = converter.convert(String(at, next));
    result.oneByteEach = result.oneByteEach && bytes.size() == 1;
    result.bytes += bytes.empty() ? "?" : bytes;
    at = next;
  }
  return result;
}

}  // namespace QVSa::platform
