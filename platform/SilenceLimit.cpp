#include "platform/SilenceLimit.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <poll.h>

namespace QVSa::platform {
namespace {

using Clock = std::chrono::steady_clock;
using Milliseconds = std::chrono::milliseconds;

// A signal that the host handles does not begin the wait anew.
bool isReady(int descriptor, short event, Milliseconds limit) {
  const Clock::time_point end = Clock::now() + limit;
  while (true) {
    const auto rest = std::max(Milliseconds(0), std::chrono::ceil<Milliseconds>(end - Clock::now()));
    pollfd asked{descriptor, event, 0};
    const int count = poll(&asked, 1, static_cast<int>(rest.count()));
    if (count < 0 && errno == EINTR) continue;
    if (count == 0) errno = ETIMEDOUT;
    return count > 0;
  }
}

// The layer of a connection that stands between the socket and what encrypts.
bool isReady(Sockbuf_IO_Desc* layer, short event) {
  int descriptor = -1;
  ber_sockbuf_ctrl(layer->sbiod_sb, LBER_SB_OPT_GET_FD, &descriptor);
  return isReady(descriptor, event, std::chrono::seconds(*static_cast<const int*>(layer->sbiod_pvt)));
}

int setUp(Sockbuf_IO_Desc* layer, void* seconds) {
  layer->sbiod_pvt = seconds;
  return 0;
}
int leave(Sockbuf_IO_Desc*) { return 0; }
int control(Sockbuf_IO_Desc* layer, int option, void* argument) {
  return LBER_SBIOD_CTRL_NEXT(layer, option, argument);
}
ber_slen_t read(Sockbuf_IO_Desc* layer, void* buffer, ber_len_t size) {
  return isReady(layer, POLLIN) ? LBER_SBIOD_READ_NEXT(layer, buffer, size) : -1;
}
ber_slen_t write(Sockbuf_IO_Desc* layer, void* buffer, ber_len_t size) {
  return isReady(layer, POLLOUT) ? LBER_SBIOD_WRITE_NEXT(layer, buffer, size) : -1;
}

int onConnected(LDAP*, Sockbuf* connection, LDAPURLDesc*, sockaddr*, ldap_conncb* callbacks) {
  static Sockbuf_IO layer{setUp, leave, control, read, write, leave};
  return ber_sockbuf_add_io(connection, &layer, LBER_SBIOD_LEVEL_PROVIDER + 1, callbacks->lc_arg);
}
void onClosing(LDAP*, Sockbuf*, ldap_conncb*) {}

}  // namespace

SilenceLimit::SilenceLimit(int seconds) : seconds_(seconds), callbacks_{onConnected, onClosing, &seconds_} {}

int SilenceLimit::watch(LDAP* handle) { return ldap_set_option(handle, LDAP_OPT_CONNECT_CB, &callbacks_); }

}  // namespace QVSa::platform
