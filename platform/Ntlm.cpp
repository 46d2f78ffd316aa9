#include "platform/Ntlm.h"

#include <gssapi/gssapi.h>
#include <gssapi/gssapi_ext.h>

#include "platform/Services.h"

namespace QVSa::platform {
namespace {

struct NtlmIdentity {
  const String& user;
  const String& domain;
  const String& password;
};

gss_OID mechanism() {
  static char digits[] = "\x2b\x06\x01\x04\x01\x82\x37\x02\x02\x0a";  // 1.3.6.1.4.1.311.2.2.10
  static gss_OID_desc oid{10, digits};
  return &oid;
}

gss_OID_set mechanisms() {
  static gss_OID_set_desc set{1, mechanism()};
  return &set;
}

// A text or token of the caller's, lent to the library.
gss_buffer_desc lend(const String& text) { return {text.size(), const_cast<char*>(text.data())}; }
gss_buffer_desc lend(const Bytes& token) { return {token.size(), const_cast<std::uint8_t*>(token.data())}; }

class Name {
 public:
  Name(const String& text, gss_OID type) {
    gss_buffer_desc buffer = lend(text);
    OM_uint32 minor = 0;
    if (GSS_ERROR(gss_import_name(&minor, &buffer, type, &name_))) name_ = GSS_C_NO_NAME;
  }
  Name(const Name&) = delete;
  Name& operator=(const Name&) = delete;
  ~Name() {
    OM_uint32 minor = 0;
    if (name_ != GSS_C_NO_NAME) gss_release_name(&minor, &name_);
  }
  gss_name_t get() const { return name_; }

 private:
  gss_name_t name_ = GSS_C_NO_NAME;
};

// One side of an exchange: what it holds from its first step on.
struct Side {
  Side() = default;
  Side(const Side&) = delete;
  Side& operator=(const Side&) = delete;
  ~Side() {
    OM_uint32 minor = 0;
    if (context != GSS_C_NO_CONTEXT) gss_delete_sec_context(&minor, &context, GSS_C_NO_BUFFER);
    if (credentials != GSS_C_NO_CREDENTIAL) gss_release_cred(&minor, &credentials);
  }

  gss_cred_id_t credentials = GSS_C_NO_CREDENTIAL;
  gss_ctx_id_t context = GSS_C_NO_CONTEXT;
};

Bytes taken(gss_buffer_desc& token) {
  const auto* begin = static_cast<const std::uint8_t*>(token.value);
  Bytes result = token.length == 0 ? Bytes() : Bytes(begin, begin + token.length);
  OM_uint32 minor = 0;
  gss_release_buffer(&minor, &token);
  return result;
}

bool acquireClient(Side& side, const NtlmIdentity& identity) {
  const Name user(identity.domain + "\\" + identity.user, GSS_C_NT_USER_NAME);
  gss_buffer_desc password = lend(identity.password);
  OM_uint32 minor = 0;
  return user.get() != GSS_C_NO_NAME &&
         !GSS_ERROR(gss_acquire_cred_with_password(&minor, user.get(), &password, GSS_C_INDEFINITE, mechanisms(),
                                                   GSS_C_INITIATE, &side.credentials, nullptr, nullptr));
}

bool acquireServer(Side& side) {
  OM_uint32 minor = 0;
  return !GSS_ERROR(gss_acquire_cred(&minor, GSS_C_NO_NAME, GSS_C_INDEFINITE, mechanisms(), GSS_C_ACCEPT,
                                     &side.credentials, nullptr, nullptr));
}

bool ntlmClientStep(Side& side, const NtlmIdentity& identity, const Bytes& inToken, Bytes& outToken, bool& more) {
  if (side.credentials == GSS_C_NO_CREDENTIAL && !acquireClient(side, identity)) return false;
  // The mechanism asks for the name of a service; the exchange does not leave the process.
  const Name target("host@" + services().computerName(), GSS_C_NT_HOSTBASED_SERVICE);
  if (target.get() == GSS_C_NO_NAME) return false;
  gss_buffer_desc in = lend(inToken);
  gss_buffer_desc out = GSS_C_EMPTY_BUFFER;
  OM_uint32 minor = 0;
  const OM_uint32 status = gss_init_sec_context(
      &minor, side.credentials, &side.context, target.get(), mechanism(), 0, GSS_C_INDEFINITE,
      GSS_C_NO_CHANNEL_BINDINGS, inToken.empty() ? GSS_C_NO_BUFFER : &in, nullptr, &out, nullptr, nullptr);
  outToken = taken(out);
  more = (status & GSS_S_CONTINUE_NEEDED) != 0;
  return !GSS_ERROR(status);
}

bool ntlmServerStep(Side& side, const Bytes& inToken, Bytes& outToken, bool& more) {
  if (side.credentials == GSS_C_NO_CREDENTIAL && !acquireServer(side)) return false;
  gss_buffer_desc in = lend(inToken);
  gss_buffer_desc out = GSS_C_EMPTY_BUFFER;
  OM_uint32 minor = 0;
  OM_uint32 granted = 0;
  const OM_uint32 status =
      gss_accept_sec_context(&minor, &side.context, side.credentials, &in, GSS_C_NO_CHANNEL_BINDINGS, nullptr, nullptr,
                             &out, &granted, nullptr, nullptr);
  outToken = taken(out);
  more = (status & GSS_S_CONTINUE_NEEDED) != 0;
  // Some servers let everybody in as nobody; that is no proof of a password.
  return !GSS_ERROR(status) && (granted & GSS_C_ANON_FLAG) == 0;
}

}  // namespace

Boolean ntlmLogon(const String& user, const String& domain, const String& password) {
  // Without a user or a password the client side would offer an anonymous exchange, without a domain the mechanism
  // takes the user of any, and its texts end at a NUL byte.
  const auto isUsable = [](const String& text) { return !text.empty() && text.find('\0') == String::npos; };
  if (!isUsable(user) || !isUsable(domain) || !isUsable(password)) return false;
  const NtlmIdentity identity{user, domain, password};
  Side client;
  Side server;
  Bytes fromClient;
  Bytes fromServer;
  bool more = false;
  // An exchange that wants a fifth step has proved nothing yet.
  return ntlmClientStep(client, identity, fromServer, fromClient, more) &&
         ntlmServerStep(server, fromClient, fromServer, more) &&
         ntlmClientStep(client, identity, fromServer, fromClient, more) &&
         ntlmServerStep(server, fromClient, fromServer, more) && !more;
}

}  // namespace QVSa::platform
