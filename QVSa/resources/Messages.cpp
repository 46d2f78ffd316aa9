#include "QVSa/resources/Messages.h"

#include "QVSa/resources/internal/MessageTable.h"
#include "QVSa/values/Failure.h"
#include "platform/LocaleName.h"

namespace QVSa {

namespace {

const MessageTable& tableOf(Language language) {
  switch (language) {
    case Language::simplifiedChinese:
      return simplifiedChineseMessages;
    case Language::traditionalChinese:
      return traditionalChineseMessages;
    case Language::english:
      break;
  }
  return englishMessages;
}

}  // namespace

Language systemLanguage() {
  const platform::LocaleName locale = platform::localeName("LC_MESSAGES");
  if (locale.language != "zh") return Language::english;
  return locale.isTraditionalChinese() ? Language::traditionalChinese : Language::simplifiedChinese;
}

String LoadResString(Long id) { return LoadResString(id, systemLanguage()); }

String LoadResString(Long id, Language language) {
  const MessageTable& table = tableOf(language);
  const auto message = std::ranges::lower_bound(table, id, {}, &Message::id);
  if (message == table.end() || message->id != id) throw runtimeFailure(number::argument);
  return String(message->text);
}

String fillMsg(const String& text, const std::vector<Variant>& values) {
  String filled = text;
  for (const Variant& value : values) {
    const std::size_t place = filled.find('@');
    if (place == String::npos) break;
    filled.replace(place, 1, "[" + (value.isNull() ? "" : value.toText()) + "]");
  }
  return filled;
}

}  // namespace QVSa
