#pragma once

#include <vector>

#include "QVSa/values/Variant.h"

namespace QVSa {

enum class Language { english, simplifiedChinese, traditionalChinese };

// The language of LC_ALL, LC_MESSAGES or LANG, the first that is set; English for anything but Chinese.
Language systemLanguage();

// The message `id` in the system's language. Throws Failure 5 for an id without a message.
String LoadResString(Long id);
String LoadResString(Long id, Language language);

// Fills the "@" places of `text` in order, each with "[" value "]", Null as the empty text. Surplus values are dropped,
// surplus places stay.
String fillMsg(const String& text, const std::vector<Variant>& values);

}  // namespace QVSa
