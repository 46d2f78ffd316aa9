#include "QVSa/frame/ConnectionString.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <string_view>
#include <utility>

#include "QVSa/frame/Secrets.h"
#include "QVSa/values/Text.h"
#include "providers/Provider.h"

namespace QVSa {

namespace {

constexpr const char* loginTemplate = "provider=sqloledb;data source=<server>;database=<dbname>;uid=QVUser;pwd=<pwd>;";
constexpr const char* integratedTemplate =
    "PROVIDER=SQLOLEDB;DATA SOURCE=<server>;Integrated Security=sspi;DATABASE=<dbname>";

String passwordOf(const String& server) {
  const std::size_t bar = server.find('|');
  return bar == String::npos ? defaultDbPwd() : unscrambleText(server.substr(bar + 1));
}

std::uint32_t byteCode(std::uint32_t code) {
  if (code > 255) throw runtimeFailure(number::argument);
  return code;
}

// The text as one long number, lowest digit first, times 13. A digit's own carry is not carried on, so that not every
// text has a form.
std::vector<std::uint32_t> multiplied(const std::u16string& text) {
  std::vector<std::uint32_t> codes;
  std::uint32_t carry = 0;
  for (const char16_t unit : text) {
    const std::uint32_t product = 13U * unit;
    codes.push_back(byteCode(product % 256 + carry));
    carry = product / 256;
  }
  codes.push_back(byteCode(carry));
  return codes;
}

// Whether the keyword is known.
bool setOption(ConnectionOptions& options, const String& keyword, const String& value) {
  static constexpr std::pair<std::string_view, String ConnectionOptions::*> texts[] = {
      {"provider", &ConnectionOptions::provider},
      {"data source", &ConnectionOptions::dataSource},
      {"database", &ConnectionOptions::database},
      {"uid", &ConnectionOptions::user},
      {"pwd", &ConnectionOptions::password}};
  const bool isIntegrated = keyword == "integrated security";
  if (isIntegrated) options.integrated = sameText(value, "sspi");
  const auto* const text = std::ranges::find(texts, keyword, [](const auto& entry) { return entry.first; });
  if (text != std::end(texts)) options.*text->second = value;
  return isIntegrated || text != std::end(texts);
}

Failure malformed() { return Failure(number::general, "Connection", "Invalid format of the initialization string."); }

}  // namespace

String buildConnString(const String& server, const String& DBName, Boolean integrated) {
  String result = integrated ? integratedTemplate : loginTemplate;
  result = replaceAll(result, "<server>", serverOnly(server));
  result = replaceAll(result, "<dbname>", DBName.empty() ? "QVSys" : DBName);
  return integrated ? result : replaceAll(result, "<pwd>", passwordOf(server));
}

String defaultDbPwd() { return deploymentSecrets().loginPassword(); }

String serverOnly(const String& server) { return server.substr(0, server.find('|')); }

String scrambleText(const String& text) {
  if (text.empty()) return {};
  String result;
  for (const std::uint32_t code : multiplied(toUtf16(text))) {
    result.push_back(static_cast<char>(64 + code / 16));
    result.push_back(static_cast<char>(64 + code % 16));
  }
  return result;
}

String unscrambleText(const String& text) {
  const std::u16string letters = toUtf16(text);
  std::vector<std::int64_t> codes;
  for (std::size_t i = 0; i + 1 < letters.size(); i += 2)
    codes.push_back((letters[i] - 64) * 16 + (letters[i + 1] - 64));
  if (codes.empty()) return {};

  std::u16string result(codes.size() - 1, u'\0');
  std::int64_t rest = codes.back();
  for (std::size_t i = result.size(); i-- > 0;) {
    const std::int64_t value = codes[i] + 256 * rest;
    rest = value % 13;
    result[i] = static_cast<char16_t>(value / 13 & 0xFFFF);
  }
  return fromUtf16(result);
}

bool isFolder(const String& dataSource) { return dataSource.rfind("file:", 0) == 0; }

// A path or a password with a semicolon in it must not be cut short without a word: a part without "=" is the rest of
// one, and for a folder, whose strings are all of our own make, so is a keyword that is unknown or comes again.
ConnectionOptions parseConnectionString(const String& connectionString) {
  ConnectionOptions options;
  std::set<String> keywords;
  bool ownKeywords = true;
  bool ofFolder = false;
  for (const String& part : split(connectionString, ';')) {
    if (trim(part).empty()) continue;
    const std::size_t mark = part.find('=');
    if (mark == String::npos) throw malformed();
    const String keyword = lowerCase(trim(part.substr(0, mark)));
    const bool known = setOption(options, keyword, part.substr(mark + 1));
    if (!known || !keywords.insert(keyword).second) ownKeywords = false;
    if (isFolder(options.dataSource)) ofFolder = true;
  }
  if (ofFolder && !ownKeywords) throw malformed();
  if (options.dataSource.empty()) throw Failure(number::general, "Connection", "Data source name not found.");
  return options;
}

}  // namespace QVSa
