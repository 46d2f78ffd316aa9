#include "QVSa/frame/ConnectionString.h"

#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/frame/Text.h"

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

void setOption(ConnectionOptions& options, const String& keyword, const String& value) {
  if (keyword == "provider") options.provider = value;
  if (keyword == "data source") options.dataSource = value;
  if (keyword == "database") options.database = value;
  if (keyword == "uid") options.user = value;
  if (keyword == "pwd") options.password = value;
  if (keyword == "integrated security") options.integrated = sameText(value, "sspi");
}

}  // namespace

String buildConnString(const String& server, const String& DBName, Boolean integrated) {
  String result = integrated ? integratedTemplate : loginTemplate;
  result = replaceAll(result, "<server>", serverOnly(server));
  result = replaceAll(result, "<dbname>", DBName.empty() ? "QVSys" : DBName);
  return integrated ? result : replaceAll(result, "<pwd>", passwordOf(server));
}

String defaultDbPwd() {
  return secrets::connPwdHead + text(secrets::connPwdNumber) + scrambleText(secrets::connPwdWordA) +
         scrambleText(lowerCase(secrets::connPwdWordB)) + secrets::connPwdTail;
}

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

ConnectionOptions parseConnectionString(const String& connectionString) {
  ConnectionOptions options;
  for (const String& part : split(connectionString, ';')) {
    const std::size_t mark = part.find('=');
    // A path or a password with a semicolon in it would otherwise be cut short without a word.
    if (mark == String::npos && !trim(part).empty())
      throw Failure(number::general, "Connection", "Invalid format of the initialization string.");
    if (mark != String::npos) setOption(options, lowerCase(trim(part.substr(0, mark))), part.substr(mark + 1));
  }
  if (options.dataSource.empty()) throw Failure(number::general, "Connection", "Data source name not found.");
  return options;
}

}  // namespace QVSa
