#include "tests/support/Slapd.h"

#include <arpa/inet.h>
#include <cstdlib>
#include <fstream>
#include <signal.h>
#include <spawn.h>
#include <sstream>
#include <stdexcept>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>
#include <vector>

namespace QVSa::test {

namespace {

constexpr const char* program = "/usr/sbin/slapd";

String fileOf(const char* name) {
  std::ostringstream content;
  content << std::ifstream(std::filesystem::path(QVSA_SOURCE_DIR) / "tests/support" / name).rdbuf();
  return content.str();
}

String manyEntries() {
  String entries = "dn: ou=many,dc=example,dc=org\nobjectClass: organizationalUnit\nou: many\n\n";
  for (int i = 0; i < Slapd::many; ++i) {
    const String login = "user" + std::to_string(i);
    entries += "dn: uid=" + login + ",ou=many,dc=example,dc=org\nobjectClass: inetOrgPerson\nuid: " + login +
               "\ncn: " + login + "\nsn: " + login + "\n\n";
  }
  return entries;
}

pid_t spawn(std::vector<String> words) {
  std::vector<char*> arguments;
  for (String& word : words) arguments.push_back(word.data());
  arguments.push_back(nullptr);
  pid_t process = 0;
  if (posix_spawn(&process, arguments[0], nullptr, nullptr, arguments.data(), environ) != 0)
    throw std::runtime_error("cannot start " + words[0]);
  return process;
}

// The certificate of all servers of this process: the LDAP library reads once whom it trusts.
const std::filesystem::path& trust() {
  static const TestFolder folder;
  static const bool made = [] {
    const String place = folder.path().string();
    const String command =
        "openssl req -x509 -newkey rsa:2048 -nodes -days 1 -subj /CN=127.0.0.1 -addext "
        "subjectAltName=IP:127.0.0.1 -keyout " +
        place + "/key.pem -out " + place + "/certificate.pem 2>/dev/null";
    return std::system(command.c_str()) == 0 &&
           setenv("LDAPTLS_CACERT", (folder.path() / "certificate.pem").c_str(), 1) == 0;
  }();
  if (!made) throw std::runtime_error("no certificate for the directory server");
  return folder.path();
}

void write(const std::filesystem::path& path, String text, const String& folder) {
  for (const auto& [mark, value] : {std::pair<String, String>{"FOLDER", folder}, {"TRUST", trust().string()}})
    for (auto at = text.find(mark); at != String::npos; at = text.find(mark)) text.replace(at, mark.size(), value);
  std::ofstream(path) << text;
}

}  // namespace

// A free port of the loopback device, held by a socket that does not listen: the server, which takes it for reuse, can
// still listen there, and nobody is given it meanwhile.
class Slapd::Port {
 public:
  Port() {
    const int yes = 1;
    socklen_t size = sizeof address_;
    address_.sin_family = AF_INET;
    address_.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    if (::bind(holder_, address(), size) != 0 || ::getsockname(holder_, address(), &size) != 0 ||
        ::setsockopt(holder_, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes) != 0)
      throw std::runtime_error("no port for the directory server");
  }
  ~Port() { ::close(holder_); }
  Port(const Port&) = delete;
  Port& operator=(const Port&) = delete;

  Long number() const { return ntohs(address_.sin_port); }

  bool answers() {
    const int client = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    const bool connected = ::connect(client, address(), sizeof address_) == 0;
    ::close(client);
    return connected;
  }

 private:
  sockaddr* address() { return reinterpret_cast<sockaddr*>(&address_); }

  int holder_ = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
  sockaddr_in address_{};
};

bool Slapd::isInstalled() { return ::access(program, X_OK) == 0; }

Slapd::Slapd() : port_(std::make_unique<Port>()), tlsPort_(std::make_unique<Port>()) {
  const std::filesystem::path& folder = folder_.path();
  const String settings = folder / "slapd.conf";
  const String entries = folder / "entries.ldif";
  std::filesystem::create_directory(folder / "data");
  write(settings, fileOf("slapd.conf"), folder);
  write(entries, fileOf("slapd.ldif") + manyEntries(), folder);
  int status = 0;
  waitpid(spawn({program, "-Tadd", "-q", "-f", settings, "-l", entries}), &status, 0);
  if (status != 0) throw std::runtime_error("slapd does not take its entries");
  const String addresses =
      "ldap://127.0.0.1:" + std::to_string(port()) + "/ ldaps://127.0.0.1:" + std::to_string(tlsPort()) + "/";
  process_ = spawn({program, "-f", settings, "-h", addresses, "-d", "0"});
  for (int i = 0; i < 1500; ++i) {
    if (waitpid(process_, nullptr, WNOHANG) != 0) throw std::runtime_error("slapd has ended");
    if (answers()) return;
    usleep(20'000);
  }
  stop();
  throw std::runtime_error("slapd does not answer");
}

Slapd::~Slapd() { stop(); }

Long Slapd::port() const { return port_->number(); }

Long Slapd::tlsPort() const { return tlsPort_->number(); }

bool Slapd::answers() const { return port_->answers() && tlsPort_->answers(); }

// The signal only begins it: threads that run at this moment still answer.
void Slapd::hang() const {
  int status = 0;
  ::kill(process_, SIGSTOP);
  if (waitpid(process_, &status, WUNTRACED) != process_ || !WIFSTOPPED(status))
    throw std::runtime_error("slapd does not stop");
}

void Slapd::goOn() const { ::kill(process_, SIGCONT); }

void Slapd::stop() {
  const pid_t process = std::exchange(process_, 0);
  if (process == 0) return;
  ::kill(process, SIGCONT);
  ::kill(process, SIGTERM);
  waitpid(process, nullptr, 0);
}

}  // namespace QVSa::test
