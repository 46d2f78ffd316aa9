#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A locale's name taken apart: "zh_Hant_TW.BIG5@stroke" has the language "zh", the script "Hant", the territory "TW"
// and the encoding "BIG5". What the name does not have is empty.
struct LocaleName {
  String language;
  String script;
  String territory;
  String encoding;

  // By the script where there is one; else the Chinese of Taiwan, Hong Kong and Macao.
  bool isTraditionalChinese() const;
};

// The locale that the environment names for a category, as "LC_CTYPE": LC_ALL, the category, LANG, the first that is
// set. It need not be installed, and the process's own locale is not looked at.
LocaleName localeName(const char* category);

}  // namespace QVSa::platform
