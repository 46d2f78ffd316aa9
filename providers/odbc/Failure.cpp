#include "providers/odbc/Failure.h"

#include <algorithm>
#include <array>
#include <new>

#include "providers/tsql/SqlFailure.h"

namespace QVSa::odbc {

namespace {

bool startsWith(const String& text, const char* prefix) { return text.rfind(prefix, 0) == 0; }

bool isWarning(const Diagnostic& diagnostic) {
  return startsWith(diagnostic.state, "01") || startsWith(diagnostic.state, "00");
}

String withoutPrefixes(const String& text) {
  std::size_t at = 0;
  while (at < text.size() && text[at] == '[') {
    const auto end = text.find(']', at);
    if (end == String::npos) break;
    at = end + 1;
  }
  return text.substr(std::min(text.find_first_not_of(' ', at), text.size()));
}

// 08004 is a server that answers, and refuses a database for example.
bool speaksOfLink(const Diagnostic& diagnostic) {
  const bool refused = diagnostic.state == "08004" && diagnostic.native > 0;
  return (startsWith(diagnostic.state, "08") && !refused) || startsWith(diagnostic.state, "HYT");
}

// FreeTDS tells by numbers of its own alone that reading, writing or the whole conversation has ended.
bool isLostLink(const Diagnostic& diagnostic) {
  static constexpr std::array<Long, 4> ends{20004, 20006, 20017, 20047};
  return startsWith(diagnostic.state, "08S") || std::ranges::find(ends, diagnostic.native) != ends.end();
}

bool isWantOfMemory(const Diagnostic& diagnostic) { return diagnostic.state == "HY001" || diagnostic.state == "HY013"; }

// Beside the server's, a record may bear the number of a socket error, or one of FreeTDS's client, which counts from
// 20000 on.
bool isServers(const Diagnostic& diagnostic) {
  const bool inRange = diagnostic.native > 0 && (diagnostic.native < 20000 || diagnostic.native >= 21000);
  return inRange && !isWarning(diagnostic) && !speaksOfLink(diagnostic);
}

// What the server says stands above what a driver makes of it ("Unable to connect to data source").
const Diagnostic& deciding(const std::vector<Diagnostic>& diagnostics) {
  const auto end = diagnostics.end();
  auto found = std::find_if(diagnostics.begin(), end, isServers);
  if (found == end) found = std::find_if_not(diagnostics.begin(), end, isWarning);
  return found == end ? diagnostics.front() : *found;
}

struct StateNumber {
  const char* prefix;
  Long number;
};

// For what has no number of the server's; the longer prefix stands first.
constexpr std::array<StateNumber, 14> stateNumbers{{{"28", number::login},
                                                    {"HYT", number::timeout},
                                                    {"23", number::integrity},
                                                    {"42S02", number::noTable},
                                                    {"42501", number::permission},
                                                    {"42", number::statement},
                                                    {"37", number::statement},
                                                    {"07", number::statement},
                                                    {"21", number::statement},
                                                    {"22001", number::range},
                                                    {"22003", number::range},
                                                    {"22008", number::range},
                                                    {"22", number::conversion},
                                                    {"", number::general}}};

Long numberOfState(const String& state) {
  return std::find_if(stateNumbers.begin(), stateNumbers.end(),
                      [&](const StateNumber& entry) { return startsWith(state, entry.prefix); })
      ->number;
}

bool containsWithoutCase(const String& text, const String& what) {
  const auto lower = [](unsigned char c) { return c >= 'A' && c <= 'Z' ? c + 32 : c; };
  return std::search(text.begin(), text.end(), what.begin(), what.end(), [&](char a, char b) {
           return lower(static_cast<unsigned char>(a)) == lower(static_cast<unsigned char>(b));
         }) != text.end();
}

Failure failureOf(const std::vector<Diagnostic>& diagnostics) {
  if (diagnostics.empty()) return Failure(number::general, "ODBC", "Unspecified error");
  const Diagnostic& error = deciding(diagnostics);
  const String text = withoutPrefixes(error.text);
  if (isWantOfMemory(error)) throw std::bad_alloc();
  if (!isServers(error)) return Failure(numberOfState(error.state), "ODBC", text);
  const Failure told = tsql::sqlFailure(error.native, text);
  // The server has a number for every reason to refuse a log-in, and one state for all.
  return startsWith(error.state, "28") ? Failure(number::login, told.source(), text, error.native) : told;
}

// FreeTDS gives the reason in a record beside the one that tells of the failure. Of a conversation that ended before
// the log-in, the reason is mostly the encryption, and it says so nowhere.
String reasonOf(const std::vector<Diagnostic>& diagnostics) {
  constexpr Long firstOfClient = 20000;
  constexpr Long conversationEnded = 20002;
  const auto client =
      std::ranges::find_if(diagnostics, [](const Diagnostic& one) { return one.native >= firstOfClient; });
  if (client == diagnostics.end()) return withoutPrefixes(deciding(diagnostics).text);
  if (client->native == conversationEnded)
    return "The server ended the conversation before the log-in: it may not offer the encryption that is required, or "
           "its certificate was refused.";
  return withoutPrefixes(client->text);
}

}  // namespace

std::vector<Diagnostic> diagnostics(SQLSMALLINT handleType, SQLHANDLE handle) {
  std::vector<Diagnostic> result;
  std::u16string state(6, u'\0');
  std::u16string text(4096, u'\0');
  for (SQLSMALLINT record = 1;; ++record) {
    SQLINTEGER native = 0;
    SQLSMALLINT length = 0;
    const SQLRETURN rc = SQLGetDiagRecW(handleType, handle, record, wideData(state), &native, wideData(text),
                                        static_cast<SQLSMALLINT>(text.size()), &length);
    if (!SQL_SUCCEEDED(rc)) return result;
    const auto units = std::min(static_cast<std::size_t>(std::max<SQLSMALLINT>(length, 0)), text.size() - 1);
    result.push_back({fromUtf16(state.substr(0, 5)), static_cast<Long>(native), fromUtf16(text.substr(0, units))});
  }
}

Failure failure(const std::vector<Diagnostic>& diagnostics) {
  const Failure told = failureOf(diagnostics);
  if (told.native() == 0 && std::ranges::any_of(diagnostics, isLostLink))
    return Failure(number::general, told.source(), "The connection to the server is lost.");
  return told;
}

Failure connectFailure(const std::vector<Diagnostic>& diagnostics, const String& password) {
  constexpr Long unreachable = 17;
  const Failure told = failureOf(diagnostics);
  const bool outOfReach = !diagnostics.empty() && speaksOfLink(deciding(diagnostics));
  const String reason = outOfReach ? reasonOf(diagnostics) : told.description();
  const bool tellsTooMuch =
      (!password.empty() && reason.find(password) != String::npos) || containsWithoutCase(reason, "pwd=");
  const String text = tellsTooMuch ? "The data source cannot be opened." : reason;
  if (outOfReach) return Failure(number::general, told.source(), text, unreachable);
  return Failure(told.number(), told.source(), text, told.native());
}

}  // namespace QVSa::odbc
