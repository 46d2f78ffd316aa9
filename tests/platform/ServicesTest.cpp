#include <cstdlib>
#include <gtest/gtest.h>

#include "platform/CodePage.h"
#include "platform/Services.h"
#include "tests/support/EnvironmentLocale.h"

namespace QVSa::platform {
namespace {

TEST(CodePage, FollowsTheEnvironmentsLocale) {
  const auto codePage = [](const std::map<std::string, std::string>& variables) {
    const test::EnvironmentLocale locale(variables);
    return ansiCodePage();
  };
  EXPECT_EQ(codePage({}), "CP1252");
  EXPECT_EQ(codePage({{"LANG", "C"}}), "CP1252");
  EXPECT_EQ(codePage({{"LANG", "de_DE.utf8"}}), "CP1252");
  EXPECT_EQ(codePage({{"LANG", "ru_RU.KOI8-R"}}), "KOI8-R");
  for (const char* noCodePage : {"nonsense", "UTF-16", "UTF-32LE", "UTF-7", "ISO-2022-JP", "ISO-2022-KR", "EBCDIC-US"})
    EXPECT_EQ(codePage({{"LANG", String("ru_RU.") + noCodePage}}), "CP1252");
  for (const char* other : {"ISO-8859-15", "BIG5", "EUC-JP", "GB18030", "CP1251"})
    EXPECT_EQ(codePage({{"LANG", String("ru_RU.") + other}}), other);
  EXPECT_EQ(codePage({{"LANG", "zh_CN.UTF-8"}}), "CP936");
  for (const char* traditional : {"zh_HK", "zh_Hant", "zh_Hant_SG"})
    EXPECT_EQ(codePage({{"LANG", String(traditional) + ".UTF-8"}}), "CP950");
  EXPECT_EQ(codePage({{"LANG", "zh_Hans_HK"}}), "CP936");
  EXPECT_EQ(codePage({{"LANG", "ja_JP.UTF-8"}}), "CP932");
  EXPECT_EQ(codePage({{"LANG", "ko_KR.UTF-8"}}), "CP949");
  EXPECT_EQ(codePage({{"LC_ALL", ""}, {"LC_CTYPE", "ja_JP.UTF-8"}, {"LANG", "ko_KR.UTF-8"}}), "CP932");
  EXPECT_EQ(codePage({{"LC_ALL", "zh_TW.UTF-8"}, {"LC_CTYPE", "ja_JP.UTF-8"}}), "CP950");
}

TEST(CodePage, PutsAQuestionMarkForWhatDoesNotFit) {
  const test::EnvironmentLocale western("fr_FR.UTF-8");
  EXPECT_EQ(toAnsi("a\u00e9\u20ac\u201c").bytes, "a\xE9\x80\x93");
  EXPECT_TRUE(toAnsi("a\u00e9\u20ac").oneByteEach);
  EXPECT_EQ(toAnsi("<\u5bc6\u7801>\U0001F511").bytes, "<\?\?>\?\?");
  EXPECT_TRUE(toAnsi("\u5bc6").oneByteEach);
  EXPECT_EQ(toAnsi("a\xE5\xAF").bytes, "a?");
}

TEST(CodePage, HasTwoBytesForAnEastAsianCharacter) {
  const test::EnvironmentLocale chinese("zh_CN.UTF-8");
  const AnsiText text = toAnsi("a\u5bc6");
  EXPECT_EQ(text.bytes, "a\xC3\xDC");
  EXPECT_FALSE(text.oneByteEach);
}

TEST(Services, TellTheLocalTimeOfTheMachine) {
  const char* old = std::getenv("TZ");
  const String kept = old == nullptr ? "" : old;
  const auto at = [](const char* zone) {
    setenv("TZ", zone, 1);
    tzset();
    return services().localTime().days();
  };
  // East of Greenwich the name's sign is a minus.
  const double difference = at("<EAST>-5:30") - at("<WEST>5");
  EXPECT_NEAR(difference, 10.5 / 24, 1.0 / 24 / 60);
  const double now = 25569 + static_cast<double>(std::time(nullptr)) / 86400;
  EXPECT_NEAR(at("UTC0"), now, 1.0 / 24 / 60);
  old == nullptr ? unsetenv("TZ") : setenv("TZ", kept.c_str(), 1);
  tzset();
}

}  // namespace
}  // namespace QVSa::platform
