#pragma once

#include "QVSa/frame/Recordset.h"

namespace QVSa {

// Reads a file into a long binary field, in chunks: the odd one first, then 4,096 bytes each. An empty file appends
// nothing. On failure False, the text in `errText` and in the system's event log. Want of memory is the caller's own:
// both throw std::bad_alloc.
Boolean fileToField(Field field, const String& path, String& errText);

// Writes a long binary field to a file, the same chunks in the same order. A NULL field makes no file and gives True.
Boolean fieldToFile(Field field, const String& path, String& errText);

}  // namespace QVSa
