#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <unistd.h>

#include "providers/odbc/Driver.h"
#include "providers/odbc/Provider.h"

namespace QVSa::odbc {
namespace {

// A port of this machine that takes connections and never answers, or refuses them once closed.
class Port {
 public:
  Port() {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    auto* plain = reinterpret_cast<sockaddr*>(&address);
    EXPECT_EQ(bind(socket_, plain, size), 0);
    EXPECT_EQ(listen(socket_, 1), 0);
    EXPECT_EQ(getsockname(socket_, plain, &size), 0);
    number_ = ntohs(address.sin_port);
  }
  ~Port() { close(); }

  String dataSource() const { return "127.0.0.1," + std::to_string(number_); }
  void close() {
    if (socket_ >= 0) ::close(socket_);
    socket_ = -1;
  }

 private:
  int socket_ = socket(AF_INET, SOCK_STREAM, 0);
  int number_ = 0;
};

class OdbcProvider : public testing::Test {
 protected:
  void SetUp() override {
    try {
      systemDriver();
    } catch (const Failure& failure) {
      GTEST_SKIP() << failure.description();
    }
  }

  static void expectOutOfReach(const String& dataSource) {
    ConnectionOptions options;
    options.dataSource = dataSource;
    options.database = "QVSys";
    options.user = "QVUser";
    options.password = "hid;d}en{";
    options.loginTimeout = std::chrono::seconds(2);
    const auto start = std::chrono::steady_clock::now();
    try {
      provider().open(options);
      ADD_FAILURE() << "opened";
    } catch (const Failure& failure) {
      EXPECT_EQ(failure.number(), number::general);
      EXPECT_EQ(failure.native(), 17);
      EXPECT_FALSE(failure.description().empty());
      EXPECT_EQ(failure.description().find("hid"), String::npos);
    }
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
  }
};

TEST_F(OdbcProvider, TellsAPortThatNobodyServes) {
  Port port;
  port.close();
  expectOutOfReach(port.dataSource());
}

TEST_F(OdbcProvider, DoesNotWaitForASilentServerBeyondTheLogInTimeout) {
  Port port;
  expectOutOfReach(port.dataSource());
}

}  // namespace
}  // namespace QVSa::odbc
