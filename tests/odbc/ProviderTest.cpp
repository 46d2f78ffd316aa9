#include <arpa/inet.h>
#include <atomic>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <thread>
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
  // Takes the connections of clients and gives each the one answer to its first packet that a server without encryption
  // gives. Counts what comes behind it.
  void answerWithoutEncryption() {
    static constexpr unsigned char answer[] = {4, 1, 0,  26, 0, 0,   1,  0, 0, 0, 11, 0, 6,
                                               1, 0, 17, 0,  1, 255, 15, 0, 0, 0, 0,  0, 2};
    for (int client = accept(socket_, nullptr, nullptr); client >= 0; client = accept(socket_, nullptr, nullptr)) {
      unsigned char packet[4096];
      if (recv(client, packet, sizeof packet, 0) > 0) send(client, answer, sizeof answer, MSG_NOSIGNAL);
      while (recv(client, packet, sizeof packet, 0) > 0) ++furtherPackets_;
      ::close(client);
    }
  }
  int furtherPackets() const { return furtherPackets_; }
  // Ends the answering.
  void shut() { shutdown(socket_, SHUT_RDWR); }

  void close() {
    if (socket_ >= 0) ::close(socket_);
    socket_ = -1;
  }

 private:
  int socket_ = socket(AF_INET, SOCK_STREAM, 0);
  int number_ = 0;
  std::atomic<int> furtherPackets_ = 0;
};

class OdbcProvider : public testing::Test {
 protected:
  void SetUp() override {
    try {
      systemAccess();
    } catch (const Failure& failure) {
      GTEST_SKIP() << failure.description();
    }
  }

  static String expectOutOfReach(const String& dataSource) {
    String description;
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
      description = failure.description();
      EXPECT_FALSE(description.empty());
      EXPECT_EQ(description.find("hid"), String::npos);
    }
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
    return description;
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

TEST_F(OdbcProvider, SendsNoLogInToAServerWithoutEncryption) {
  if (!systemAccess().driver.freeTds) GTEST_SKIP() << "the answer is one that FreeTDS is known to wait for";
  Port port;
  std::thread server([&] { port.answerWithoutEncryption(); });
  EXPECT_NE(expectOutOfReach(port.dataSource()).find("encryption"), String::npos);
  port.shut();
  server.join();
  EXPECT_EQ(port.furtherPackets(), 0);
}

}  // namespace
}  // namespace QVSa::odbc
