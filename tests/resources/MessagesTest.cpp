#include <algorithm>
#include <gtest/gtest.h>
#include <set>

#include "QVSa/resources/Messages.h"
#include "QVSa/resources/internal/MessageTable.h"
#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/SecretMessage.h"
#include "tests/support/EnvironmentLocale.h"

namespace QVSa {
namespace {

constexpr Language allLanguages[] = {Language::english, Language::simplifiedChinese, Language::traditionalChinese};

TEST(Messages, KeepTheirEnglishTextsWithAllOddities) {
  const auto english = [](Long id) { return LoadResString(id, Language::english); };
  EXPECT_EQ(english(205), "The error SQL statement  is:");
  EXPECT_EQ(english(1117), "Error in listing users");
  EXPECT_EQ(english(1800), "Parameter is incompelte, name of user group is not assigned. ");
  String all;
  for (const Long id : messageIds) all += text(id) + "=" + english(id) + "\n";
  EXPECT_EQ(platform::md5Hex(all), "F70BBF919D577737DEEF98E107BAF0FF") << "of the texts as hosts know them";
}

TEST(Messages, HaveTheSamePlacesInEveryLanguage) {
  for (const Long id : messageIds) {
    const String english = LoadResString(id, Language::english);
    for (const Language language : allLanguages) {
      const String text = LoadResString(id, language);
      EXPECT_EQ(std::ranges::count(text, '@'), std::ranges::count(english, '@')) << id;
      EXPECT_EQ(text.starts_with(' '), english.starts_with(' ')) << id;
    }
  }
}

TEST(Messages, ThatNameColumnsAreIdentifiersAndThoseInLiteralsHoldNoQuote) {
  for (const Language language : allLanguages) {
    std::set<String> captions;
    for (const Long id : {1136, 1137, 1138, 1139, 1140, 1705, 1706, 1707, 1708, 1709, 1710, 1714, 1715}) {
      const String caption = LoadResString(id, language);
      EXPECT_EQ(caption.find_first_of(" \t[]'\"@.,-"), String::npos) << caption;
      EXPECT_TRUE(id < 1700 || captions.insert(caption).second) << caption;
    }
    for (const Long id : {1134, 1135, 1711, 1712, 1713}) {
      EXPECT_EQ(LoadResString(id, language).find('\''), String::npos) << id;
    }
  }
}

TEST(Messages, FollowTheEnvironmentsLocaleAtEachCall) {
  const auto locked = [](const std::map<std::string, std::string>& variables) {
    const test::EnvironmentLocale locale(variables);
    return LoadResString(1135);
  };
  EXPECT_EQ(locked({}), "Locked");
  EXPECT_EQ(locked({{"LANG", "C.UTF-8"}}), "Locked");
  EXPECT_EQ(locked({{"LANG", "zha"}}), "Locked");
  EXPECT_EQ(locked({{"LC_ALL", "en_US.UTF-8"}, {"LANG", "zh_CN.UTF-8"}}), "Locked");
  EXPECT_EQ(locked({{"LC_CTYPE", "zh_CN.UTF-8"}}), "Locked");
  EXPECT_EQ(locked({{"LANG", "zh"}}), "已锁定");
  EXPECT_EQ(locked({{"LC_ALL", ""}, {"LC_MESSAGES", "zh_SG.UTF-8"}, {"LANG", "zh_TW"}}), "已锁定");
  for (const char* name : {"zh_TW.UTF-8", "zh_HK", "zh_MO@x", "zh_Hant", "zh_Hant_CN.UTF-8"})
    EXPECT_EQ(locked({{"LANG", name}}), "已鎖定") << name;
}

TEST(Messages, WithoutATextAreRefused) {
  for (const Long id : {-1, 0, 46, 1000, 1007, 3105 - 3, 33303}) {
    try {
      LoadResString(id, Language::english);
      FAIL() << id;
    } catch (const Failure& failure) {
      EXPECT_EQ(failure.number(), number::argument);
    }
  }
}

TEST(FillMsg, PutsValuesInBracketsIntoThePlacesFromTheLeft) {
  EXPECT_EQ(fillMsg("Set duplicate password @ times recently.", {Long{3}}),
            "Set duplicate password [3] times recently.");
  EXPECT_EQ(fillMsg("@ and @", {"a"}), "[a] and @");
  EXPECT_EQ(fillMsg("@", {"a", "b"}), "[a]");
  EXPECT_EQ(fillMsg("none", {"a", "b"}), "none");
  EXPECT_EQ(fillMsg("@ @", {}), "@ @");
  EXPECT_EQ(fillMsg("@ @", {Variant::null(), Variant()}), "[] []");
}

TEST(FillMsg, FindsAPlaceThatAValueBroughtIn) { EXPECT_EQ(fillMsg("@ on @", {"a@b", "c"}), "[a[c]b] on @"); }

}  // namespace
}  // namespace QVSa
