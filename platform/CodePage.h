#pragma once

#include "QVSa/frame/Values.h"

namespace QVSa::platform {

struct AnsiText {
  String bytes;             // "?" for a character that the code page lacks
  bool oneByteEach = true;  // each character has a place in the code page, and there takes one byte
};

// The name of the system's ANSI code page: the encoding of the environment's locale; where that is UTF-8 or unknown,
// the code page of the locale's language for Chinese, Japanese and Korean, and CP1252 for any other.
String ansiCodePage();

// A text in the system's ANSI code page.
AnsiText toAnsi(const String& text);

}  // namespace QVSa::platform
