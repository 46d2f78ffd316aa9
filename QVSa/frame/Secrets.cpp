#include "QVSa/frame/Secrets.h"

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <optional>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/NamedLines.h"
#include "platform/PrivateFile.h"
#include "platform/RandomBytes.h"

namespace QVSa {

namespace {

constexpr const char* systemFile = "/etc/qvsa/secrets";
constexpr int highestKeyStart = 9;

// The lines of a file of secrets, each as it is asked for.
class Lines {
 public:
  explicit Lines(const String& content) {
    for (platform::NamedLine& line : platform::namedLines(content))
      if (line.name.empty() || !values_.emplace(std::move(line.name), std::move(line.value)).second)
        throw unusable("line " + text(line.number));
  }

  String take(const String& name) {
    const auto found = values_.find(name);
    if (found == values_.end() || found->second.empty()) throw unusable(name);
    String value = std::move(found->second);
    values_.erase(found);
    return value;
  }

  Long takeNumber(const String& name, Long highest, int base = 10) { return numberOf(take(name), name, highest, base); }

  std::array<unsigned char, 10> takeCodes(const String& name) {
    const std::vector<String> codes = split(take(name), ' ');
    std::array<unsigned char, 10> result{};
    if (codes.size() != result.size()) throw unusable(name);
    for (std::size_t i = 0; i < result.size(); ++i)
      result[i] = static_cast<unsigned char>(numberOf(codes[i], name, 0x7E, 16));
    return result;
  }

  void requireEnd() const {
    if (!values_.empty()) throw unusable(values_.begin()->first);
  }

  static Failure unusable(const String& what) {
    return {number::argument, "Secrets", "The file of secrets is unusable: " + what + "."};
  }

 private:
  static Long numberOf(const String& value, const String& name, Long highest, int base) {
    Long result = 0;
    const char* const end = value.data() + value.size();
    const auto read = std::from_chars(value.data(), end, result, base);
    if (read.ec != std::errc() || read.ptr != end || result < 0 || result > highest) throw unusable(name);
    return result;
  }

  std::map<String, String> values_;
};

// Throws where the words can't be scrambled, or the password would end its connection string.
void requireUsable(const Secrets& secrets) {
  try {
    if (secrets.loginPassword().find(';') == String::npos) return;
  } catch (const Failure&) {
    throw Lines::unusable("connPwdWordA or connPwdWordB");
  }
  throw Lines::unusable("a semicolon in the connection password");
}

String randomText(std::size_t length, std::string_view characters) {
  String result;
  while (result.size() < length) {
    std::array<std::uint8_t, 64> bytes{};
    platform::fillRandom(bytes);
    for (const std::uint8_t byte : bytes) {
      // A plain remainder would favour the first characters.
      if (byte < 256 / characters.size() * characters.size() && result.size() < length)
        result.push_back(characters[byte % characters.size()]);
    }
  }
  return result;
}

String randomText(std::size_t length) {
  return randomText(length, "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789");
}

String randomWord() {
  for (;;) {
    String word = randomText(14, "abcdefghijklmnopqrstuvwxyz");
    try {
      scrambleText(word);
      return word;
    } catch (const Failure&) {
      // About a fifth of all words has no scrambled form.
    }
  }
}

std::optional<String> chosenFile() {
  const char* const name = secure_getenv("QVSA_SECRETS");
  if (name == nullptr) return std::nullopt;
  return String(name);
}

Secrets loaded() {
  const String file = secretsFile();
  if (file.empty()) return Secrets::ofBuild();
  try {
    return Secrets::ofFile(file);
  } catch (const Failure& failure) {
    const bool isMissing = failure.number() == number::noFile || failure.number() == number::noPath;
    if (chosenFile() || !isMissing) throw;
    return Secrets::ofBuild();
  }
}

}  // namespace

Secrets Secrets::ofBuild() {
  Secrets result;
  result.builtIn = secrets::builtInSecrets;
  result.connPwdHead = secrets::connPwdHead;
  result.connPwdNumber = secrets::connPwdNumber;
  result.connPwdWordA = secrets::connPwdWordA;
  result.connPwdWordB = secrets::connPwdWordB;
  result.connPwdTail = secrets::connPwdTail;
  result.rotatedKeyCharacters = secrets::rotatedKeyCharacters;
  result.backupLockKeyStart = secrets::backupLockKeyStart;
  result.templatePwdKey = secrets::templatePwdKey;
  result.defaultTemplatePwd = secrets::defaultTemplatePwd;
  return result;
}

Secrets Secrets::madeUp() {
  Secrets result;
  result.connPwdHead = randomText(6);
  result.connPwdNumber = std::stoi(randomText(6, "123456789"));
  result.connPwdWordA = randomWord();
  result.connPwdWordB = randomWord();
  result.connPwdTail = randomText(6);
  for (unsigned char& character : result.rotatedKeyCharacters)
    character = static_cast<unsigned char>(randomText(1).front());
  result.backupLockKeyStart = randomText(1, "0123456789")[0] - '0';
  result.templatePwdKey = randomText(16);
  result.defaultTemplatePwd = randomText(12);
  return result;
}

Secrets Secrets::ofFile(const String& path) {
  Lines lines(platform::readPrivateFile(path));
  Secrets result;
  result.connPwdHead = lines.take("connPwdHead");
  result.connPwdNumber = lines.takeNumber("connPwdNumber", INT32_MAX);
  result.connPwdWordA = lines.take("connPwdWordA");
  result.connPwdWordB = lines.take("connPwdWordB");
  result.connPwdTail = lines.take("connPwdTail");
  result.rotatedKeyCharacters = lines.takeCodes("rotatedKeyCharacters");
  result.backupLockKeyStart = lines.takeNumber("backupLockKeyStart", highestKeyStart);
  result.templatePwdKey = lines.take("templatePwdKey");
  result.defaultTemplatePwd = lines.take("defaultTemplatePwd");
  lines.requireEnd();
  requireUsable(result);
  return result;
}

String Secrets::fileText() const {
  String codes;
  for (const unsigned char code : rotatedKeyCharacters) {
    char digits[4];
    std::snprintf(digits, sizeof digits, " %02X", code);
    codes += digits;
  }
  return "# The deployment secrets of this site. Keep a copy: without them neither the databases nor their backups can "
         "be\n"
         "# read. No account outside the owner's and the group's may reach this file.\n"
         "connPwdHead = " +
         connPwdHead + "\nconnPwdNumber = " + text(connPwdNumber) + "\nconnPwdWordA = " + connPwdWordA +
         "\nconnPwdWordB = " + connPwdWordB + "\nconnPwdTail = " + connPwdTail + "\nrotatedKeyCharacters =" + codes +
         "\nbackupLockKeyStart = " + text(backupLockKeyStart) + "\ntemplatePwdKey = " + templatePwdKey +
         "\ndefaultTemplatePwd = " + defaultTemplatePwd + "\n";
}

String Secrets::loginPassword() const {
  return connPwdHead + text(connPwdNumber) + scrambleText(connPwdWordA) + scrambleText(lowerCase(connPwdWordB)) +
         connPwdTail;
}

String Secrets::rotatedKey(Integer start) const {
  const auto& characters = rotatedKeyCharacters;
  const auto first = characters.begin() + std::clamp<std::ptrdiff_t>(start, 0, std::ssize(characters) - 1);
  String key(first, characters.end());
  return key.append(characters.begin(), first);
}

String secretsFile() { return chosenFile().value_or(systemFile); }

// Never destroyed: a host may call with its last statics.
const Secrets& deploymentSecrets() {
  static const Secrets& kept = *new Secrets(loaded());
  return kept;
}

}  // namespace QVSa
