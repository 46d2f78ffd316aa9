#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// The content of a small file of secrets: at most 64 KiB. Throws Failure: 53 or 76 there is none, 70 it can't be read,
// or accounts outside its group may read, write or run it.
String readPrivateFile(const String& path);

// Makes a file that only its owner can reach or, with the name of a `group`, read by that too. Throws Failure: 58 it is
// there already, 5 no such group, 70, 75, 76 it can't be made.
void makePrivateFile(const String& path, const String& content, const String& group = "");

}  // namespace QVSa::platform
