#include "platform/DirectoryLookup.h"

#include <algorithm>
#include <ldap.h>
#include <memory>
#include <new>
#include <span>
#include <vector>

#include "platform/SilenceLimit.h"

namespace QVSa::platform {
namespace {

constexpr ber_int_t pageSize = 500;
constexpr const char* persons = "(|(objectClass=person)(objectClass=account)(objectClass=posixAccount))";
// Of each list, the first attribute that an entry has counts.
constexpr const char* loginNames[] = {"sAMAccountName", "uid", "userPrincipalName"};
constexpr const char* displayNames[] = {"displayName", "cn"};
constexpr const char* mailNames[] = {"mail"};
constexpr const char* classNames[] = {"objectClass"};
using Names = std::span<const char* const>;

struct Unbind {
  void operator()(LDAP* handle) const { ldap_unbind_ext_s(handle, nullptr, nullptr); }
};
using Handle = std::unique_ptr<LDAP, Unbind>;

struct FreeText {
  void operator()(char* text) const { ldap_memfree(text); }
};
using Text = std::unique_ptr<char, FreeText>;

struct FreeMessage {
  void operator()(LDAPMessage* message) const { ldap_msgfree(message); }
};
using Message = std::unique_ptr<LDAPMessage, FreeMessage>;

struct FreeControl {
  void operator()(LDAPControl* control) const { ldap_control_free(control); }
};
using Control = std::unique_ptr<LDAPControl, FreeControl>;

// A failed step of a lookup.
struct Ended {
  DirectoryStatus status;
};

bool isNoAnswer(int code) {
  return code == LDAP_SERVER_DOWN || code == LDAP_TIMEOUT || code == LDAP_CONNECT_ERROR || code == LDAP_UNAVAILABLE ||
         code == LDAP_BUSY;
}

// `otherwise` for every failure that the server itself answered with.
void require(int code, DirectoryStatus otherwise) {
  if (code == LDAP_NO_MEMORY) throw std::bad_alloc();
  if (code != LDAP_SUCCESS) throw Ended{isNoAnswer(code) ? directoryUnreachable : otherwise};
}

bool speaksTlsAtOnce(const DirectoryQuery& query) {
  if (query.security == DirectoryQuery::Security::byPort) return query.port == 636 || query.port == 3269;
  return query.security == DirectoryQuery::Security::tls;
}

String addressOf(const DirectoryQuery& query) {
  String scheme = speaksTlsAtOnce(query) ? "ldaps" : "ldap";
  String host = query.host;
  LDAPURLDesc parts{};
  parts.lud_scheme = scheme.data();
  parts.lud_host = host.data();
  parts.lud_port = static_cast<int>(query.port);
  parts.lud_scope = LDAP_SCOPE_DEFAULT;
  const Text address(ldap_url_desc2str(&parts));
  return address ? address.get() : "";
}

// No host would lead to the one that the system's LDAP settings name.
bool isComplete(const DirectoryQuery& query) { return !query.host.empty() && 0 < query.port && query.port <= 65535; }

Handle connected(const DirectoryQuery& query, SilenceLimit& silence) {
  if (!isComplete(query)) throw Ended{directoryUnreachable};
  LDAP* raw = nullptr;
  require(ldap_initialize(&raw, addressOf(query).c_str()), directoryUnreachable);
  Handle handle(raw);
  const int version = LDAP_VERSION3;
  const timeval limit{query.seconds, 0};
  require(silence.watch(raw), directoryUnreachable);
  ldap_set_option(raw, LDAP_OPT_PROTOCOL_VERSION, &version);
  ldap_set_option(raw, LDAP_OPT_NETWORK_TIMEOUT, &limit);
  ldap_set_option(raw, LDAP_OPT_TIMEOUT, &limit);
  // Another server would be given the same name and password.
  ldap_set_option(raw, LDAP_OPT_REFERRALS, LDAP_OPT_OFF);
  if (query.security == DirectoryQuery::Security::startTls)
    require(ldap_start_tls_s(raw, nullptr, nullptr), directoryUnreachable);
  return handle;
}

void bind(LDAP* handle, const String& name, const String& password) {
  berval credentials{password.size(), const_cast<char*>(password.data())};
  require(ldap_sasl_bind_s(handle, name.c_str(), LDAP_SASL_SIMPLE, &credentials, nullptr, nullptr, nullptr),
          directoryRefused);
}

String escaped(const String& value) {
  berval in{value.size(), const_cast<char*>(value.data())};
  berval out{};
  if (ldap_bv2escaped_filter_value(&in, &out) != 0) throw Ended{directoryFailed};
  const Text owner(out.bv_val);
  return String(out.bv_val, out.bv_len);
}

bool isDistinguishedName(const String& text) {
  LDAPDN dn = nullptr;
  if (ldap_str2dn(text.c_str(), &dn, LDAP_DN_FORMAT_LDAPV3) != LDAP_SUCCESS) return false;
  ldap_dnfree(dn);
  return true;
}

std::vector<String> valuesOf(LDAP* handle, LDAPMessage* entry, const char* attribute) {
  std::vector<String> result;
  berval** values = ldap_get_values_len(handle, entry, attribute);
  if (values == nullptr) return result;
  for (berval** value = values; *value != nullptr; ++value) result.emplace_back((*value)->bv_val, (*value)->bv_len);
  ldap_value_free_len(values);
  return result;
}

// Active Directory counts its computers among the persons. A filter can't say so to a server that has no such class.
bool isComputer(LDAP* handle, LDAPMessage* entry) {
  const std::vector<String> classes = valuesOf(handle, entry, classNames[0]);
  return std::find(classes.begin(), classes.end(), "computer") != classes.end();
}

// Where a search of the whole directory begins.
std::vector<String> rootsOf(LDAP* handle) {
  String attribute = "namingContexts";
  char* attributes[] = {attribute.data(), nullptr};
  LDAPMessage* raw = nullptr;
  const int code = ldap_search_ext_s(handle, "", LDAP_SCOPE_BASE, "(objectClass=*)", attributes, 0, nullptr, nullptr,
                                     nullptr, LDAP_NO_LIMIT, &raw);
  const Message answer(raw);
  require(code, directoryFailed);
  LDAPMessage* entry = ldap_first_entry(handle, answer.get());
  return entry == nullptr ? std::vector<String>{} : valuesOf(handle, entry, attribute.c_str());
}

String firstOf(LDAP* handle, LDAPMessage* entry, Names attributes) {
  for (const char* attribute : attributes) {
    const std::vector<String> values = valuesOf(handle, entry, attribute);
    if (!values.empty()) return values.front();
  }
  return "";
}

String lineOf(LDAP* handle, LDAPMessage* entry) {
  const Text dn(ldap_get_dn(handle, entry));
  String line;
  for (String value : {String(dn ? dn.get() : ""), firstOf(handle, entry, loginNames),
                       firstOf(handle, entry, displayNames), firstOf(handle, entry, mailNames)}) {
    std::ranges::replace_if(
        value, [](unsigned char c) { return c < ' '; }, ' ');
    line += value + '\t';
  }
  line.back() = '\n';
  return line;
}

// The mark of the next page; empty at the last one, or where the server knows no pages.
String nextPage(LDAP* handle, LDAPMessage* answer) {
  LDAPControl** controls = nullptr;
  if (ldap_parse_result(handle, answer, nullptr, nullptr, nullptr, nullptr, &controls, 0) != LDAP_SUCCESS) return "";
  String mark;
  LDAPControl* page = ldap_control_find(LDAP_CONTROL_PAGEDRESULTS, controls, nullptr);
  berval cookie{};
  ber_int_t estimate = 0;
  if (page != nullptr && ldap_parse_pageresponse_control(handle, page, &estimate, &cookie) == LDAP_SUCCESS) {
    mark.assign(cookie.bv_val == nullptr ? "" : cookie.bv_val, cookie.bv_len);
    ber_memfree(cookie.bv_val);
  }
  ldap_controls_free(controls);
  return mark;
}

// All that is read of an entry: pictures and certificates stay with the server.
std::vector<char*> wantedAttributes() {
  std::vector<char*> wanted;
  for (const Names names : {Names(loginNames), Names(displayNames), Names(mailNames), Names(classNames)})
    for (const char* name : names) wanted.push_back(const_cast<char*>(name));
  wanted.push_back(nullptr);
  return wanted;
}

class Search {
 public:
  Search(LDAP* handle, String filter) : handle_(handle), filter_(std::move(filter)) {}

  // In pages, since servers limit what one answer holds.
  String below(const String& base) {
    String lines;
    String mark;
    do {
      const Message answer = page(base, mark);
      for (LDAPMessage* entry = ldap_first_entry(handle_, answer.get()); entry != nullptr;
           entry = ldap_next_entry(handle_, entry))
        if (!isComputer(handle_, entry)) lines += lineOf(handle_, entry);
      mark = nextPage(handle_, answer.get());
    } while (!mark.empty());
    return lines;
  }

 private:
  Message page(const String& base, String& mark) {
    berval cookie{mark.size(), mark.data()};
    LDAPControl* raw = nullptr;
    require(ldap_create_page_control(handle_, pageSize, &cookie, 0, &raw), directoryFailed);
    const Control control(raw);
    LDAPControl* controls[] = {control.get(), nullptr};
    std::vector<char*> wanted = wantedAttributes();
    LDAPMessage* message = nullptr;
    const int code = ldap_search_ext_s(handle_, base.c_str(), LDAP_SCOPE_SUBTREE, filter_.c_str(), wanted.data(), 0,
                                       controls, nullptr, nullptr, LDAP_NO_LIMIT, &message);
    Message answer(message);
    require(code, directoryFailed);
    return answer;
  }

  LDAP* handle_;
  String filter_;
};

String personsNamed(const String& name) {
  const String value = escaped(name);
  String filter = String("(&") + persons + "(|";
  for (const char* attribute : {"uid", "sAMAccountName", "userPrincipalName", "mail", "cn"})
    filter += String("(") + attribute + "=" + value + ")";
  return filter + "))";
}

String search(LDAP* handle, const String& text) {
  if (isDistinguishedName(text)) return Search(handle, persons).below(text);
  Search named(handle, personsNamed(text));
  String lines;
  for (const String& root : rootsOf(handle)) lines += named.below(root);
  return lines;
}

}  // namespace

String getUsersFromLD(const DirectoryQuery& query, const String& password, Integer& status) {
  try {
    // The client library's texts end there.
    for (const String* text : {&query.host, &query.bindDn, &query.searchText})
      if (text->find('\0') != String::npos) throw Ended{directoryRefused};
    SilenceLimit silence(query.seconds);
    const Handle handle = connected(query, silence);
    bind(handle.get(), query.bindDn, password);
    String lines = search(handle.get(), query.searchText);
    status = directoryDone;
    return lines;
  } catch (const Ended& ended) {
    status = ended.status;
    return "";
  }
}

}  // namespace QVSa::platform
