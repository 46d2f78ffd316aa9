#include <gtest/gtest.h>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Frame.h"
#include "tests/support/FakeSession.h"

namespace QVSa {

using test::FakeServer;

namespace {

constexpr const char* statement = "delete from jobs where deptNo=N'S''1'";

// A public class in small: each operation runs one statement.
class Record : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  bool Delete(const Handler& handler) {
    return operation(handler, [&] {
      Connection connection = open();
      connection.BeginTrans();
      connection.Execute(sql("delete from jobs where deptNo=<deptNo>").text("deptNo", "S'1"));
      connection.CommitTrans();
      return true;
    });
  }

  Long Count(const Handler& handler) {
    return operation(handler, Long{-1}, [&](Long& result) {
      Connection connection = open();
      result = 0;
      connection.Execute(statement);
      result = 7;
    });
  }

  template <class Body>
  auto perform(Body body) {
    return operation(plain(), body);
  }

  Boolean store(const String& secret) {
    return operation(plain(), [&] {
      Connection connection = open();
      connection.Execute(sql("update users set pwd=<pwd>").secret("pwd", secret));
      connection.Execute(statement);
      return true;
    });
  }
};

}  // namespace

class FrameTest : public testing::Test {
 protected:
  FrameTest() { record.connect("db1", "QVApp"); }
  void failing(Long failureNumber) { server.fail(statement, Failure(failureNumber, "Provider", "It broke.")); }

  FakeServer server;
  Record record;
};

TEST_F(FrameTest, AnOperationLeavesNothingOpenAndASuccessClearsNoFailure) {
  failing(number::timeout);
  EXPECT_FALSE(record.Delete(plain()));
  EXPECT_EQ(server.log, (std::vector<String>{"open", "begin", statement, "rollback", "close"}));
  EXPECT_EQ(record.errNumber(), number::timeout);
  EXPECT_FALSE(record.Delete(silent()));
  EXPECT_TRUE(record.perform([] { return true; }));
  EXPECT_EQ(record.errNumber(), number::timeout);
  EXPECT_EQ(record.errDescription(), "It broke.");
}

TEST_F(FrameTest, AResultOfItsOwnIsTheLastOneStored) {
  EXPECT_EQ(record.Count(plain()), 7);
  failing(number::timeout);
  EXPECT_EQ(record.Count(plain()), 0);
  server.fail("open", Failure(number::login, "Provider", "No."));
  EXPECT_EQ(record.Count(plain()), -1);
}

TEST_F(FrameTest, OtherExceptionsStayInsideToo) {
  EXPECT_FALSE(record.perform([]() -> Boolean { throw std::bad_alloc(); }));
  EXPECT_EQ(record.errNumber(), number::memory);
  EXPECT_FALSE(record.perform([]() -> Boolean { throw std::out_of_range("index"); }));
  EXPECT_EQ(record.errNumber(), number::internal);
  EXPECT_FALSE(record.perform([]() -> Boolean { throw "a host's service"; }));
  EXPECT_EQ(record.errDescription(), "Internal error");
}

TEST_F(FrameTest, AnErrorTextEndsBeforeAnyPieceOfASecret) {
  const String secret = "MGkGCSsGAQQBgjdYA6BcMFoGCisGAQQBgjdYAwGgTDBKAgMCAAECAmYBAgFABAgA";
  const auto quoting = [&](std::size_t from, std::size_t length) {
    return Failure(number::range, "Provider", "Truncated value: '" + secret.substr(from, length) + "'.");
  };
  for (const auto& [from, length] : {std::pair(0, 64), {0, 6}, {20, 40}, {58, 6}}) {
    server.fail(statement, quoting(from, length));
    EXPECT_FALSE(record.store(secret)) << "a later statement of the operation";
    EXPECT_EQ(record.errDescription(), "Truncated value: '***");
  }
  server.fail("update users set pwd=N'" + secret + "'", quoting(0, 40));
  EXPECT_FALSE(record.store(secret));
  EXPECT_EQ(record.errDescription(), "Truncated value: '***");
  EXPECT_FALSE(record.store("other"));
  EXPECT_NE(record.errDescription(), "Truncated value: '***");
}

}  // namespace QVSa
