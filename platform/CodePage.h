#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

struct AnsiText {
  String bytes;             // "?" for what the code page lacks, twice where that is a pair in UTF-16
  bool oneByteEach = true;  // no character takes more bytes than one
};

// The name of the system's ANSI code page: the encoding of the environment's locale; where that is UTF-8, unknown or no
// extension of ASCII (UTF-16, ISO-2022-JP), the code page of the locale's language for Chinese, Japanese and Korean,
// and CP1252 for any other.
String ansiCodePage();

// A text in the system's ANSI code page.
AnsiText toAnsi(const String& text);

}  // namespace QVSa::platform
