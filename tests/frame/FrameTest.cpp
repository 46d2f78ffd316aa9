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
  using Frame::connectionString;
  using Frame::DBName;
  using Frame::errDescription;
  using Frame::errNumber;
  using Frame::server;

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

  Boolean refuseSoft() {
    return operation(plain(), [&]() -> Boolean {
      if (Delete(plain())) return true;
      return refuse(1002);
    });
  }
  String refuseText() {
    return operation(plain(), [&]() -> String { return refuse(1201, {"Chief"}); });
  }
  std::shared_ptr<Record> refuseObject() {
    return operation(plain(), [&]() -> std::shared_ptr<Record> { return refuse(1001); });
  }
  Boolean refuseHard() {
    return operation(prefixedBlank(1109), [&]() -> Boolean { fail("User", 1101); });
  }
  Boolean passOn(const Record& other) {
    return operation(plain(), [&]() -> Boolean { return refuseAs(other); });
  }
  void noteName(const String& name) { note(1400, {name}); }

  Boolean store(const String& secret) {
    return operation(plain(), [&] {
      Connection connection = open();
      connection.Execute(sql("update users set pwd=<pwd>").secret("pwd", secret));
      connection.Execute(statement);
      return true;
    });
  }

  String filled() {
    return sql("<n> <t> <d> <l> <x>").number("n", "").text("t", "a ").date("d", Date::empty()).list("l", "a,b");
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

TEST_F(FrameTest, ConnectKeepsWhatItIsToldAndOpensNothing) {
  Record fresh;
  EXPECT_EQ(fresh.errNumber(), 0);
  EXPECT_TRUE(fresh.connect("db1|AB"));
  EXPECT_EQ(fresh.server(), "db1|AB");
  EXPECT_EQ(fresh.DBName(), "");
  EXPECT_EQ(fresh.connectionString(), buildConnString("db1|AB", "QVSys", false));
  EXPECT_TRUE(server.log.empty());
}

TEST_F(FrameTest, BeforeConnectAnOperationFailsInTheDatabaseLayer) {
  Record fresh;
  EXPECT_FALSE(fresh.Delete(plain()));
  EXPECT_EQ(fresh.errNumber(), number::general);
  fresh.connect("", "");
  EXPECT_FALSE(fresh.Delete(plain()));
}

TEST_F(FrameTest, AnOperationLeavesNothingOpenAndASuccessClearsNoFailure) {
  failing(number::timeout);
  EXPECT_FALSE(record.Delete(plain()));
  EXPECT_EQ(server.log, (std::vector<String>{"open", "begin", statement, "rollback", "close"}));
  EXPECT_EQ(record.errNumber(), number::timeout);
  EXPECT_TRUE(record.perform([] { return true; }));
  EXPECT_EQ(record.errNumber(), number::timeout);
  EXPECT_EQ(record.errDescription(), "It broke.");
}

TEST_F(FrameTest, HandlersReportInTheirForms) {
  failing(number::integrity);
  const auto reported = [&](const Handler& handler) {
    EXPECT_FALSE(record.Delete(handler));
    return std::pair(record.errNumber(), record.errDescription());
  };
  const String chief = "Chief";
  EXPECT_EQ(reported(plain()), std::pair(number::integrity, String("It broke.")));
  EXPECT_EQ(reported(prefixed(1601)),
            std::pair(number::integrity, String("Error in listing current connections.It broke.")));
  EXPECT_EQ(reported(prefixedBlank(1109)), std::pair(number::integrity, String("Error in removing user. It broke.")));
  EXPECT_EQ(reported(prefixed(1206).filledWith(chief)),
            std::pair(number::integrity, String("Error in listing users who have the role [Chief].It broke.")));
  EXPECT_EQ(reported(prefixed(1802).number(-5).onIntegrity(1801)),
            std::pair(Long{-5}, String("Name of user group is duplicate.")));
  failing(number::timeout);
  EXPECT_EQ(reported(prefixed(1802).onIntegrity(1801)),
            std::pair(number::timeout, String("Error in adding the new user group.It broke.")));
  failing(number::range);
  EXPECT_EQ(reported(silent()).first, number::timeout);
}

TEST_F(FrameTest, AResultOfItsOwnIsTheLastOneStored) {
  EXPECT_EQ(record.Count(plain()), 7);
  failing(number::timeout);
  EXPECT_EQ(record.Count(plain()), 0);
  server.fail("open", Failure(number::login, "Provider", "No."));
  EXPECT_EQ(record.Count(plain()), -1);
}

TEST_F(FrameTest, AFailureGivesTheNegativeResultOfEachType) {
  const auto breaks = [](bool broken) {
    if (broken) throw runtimeFailure(number::type);
  };
  EXPECT_EQ(record.perform([&] { return breaks(true), String("text"); }), "");
  EXPECT_EQ(record.perform([&] { return breaks(true), std::make_shared<int>(1); }), nullptr);
  EXPECT_EQ(record.perform([&] { return breaks(false), String("text"); }), "text");
  EXPECT_EQ(record.errNumber(), number::type);
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

TEST_F(FrameTest, RefusalsReportTheirMessage) {
  failing(number::timeout);
  EXPECT_FALSE(record.refuseSoft());
  EXPECT_EQ(record.errNumber(), messageNumber(1002));
  EXPECT_EQ(record.refuseText(), "");
  EXPECT_EQ(record.errDescription(), "Undefined role [Chief].");
  EXPECT_EQ(record.refuseObject(), nullptr);
  EXPECT_EQ(record.errDescription(), "Department does not exist.");
  EXPECT_FALSE(record.refuseHard());
  EXPECT_EQ(record.errNumber(), static_cast<Long>(0x8004044D));
  EXPECT_EQ(record.errDescription(), "Error in removing user. User does not exist.");
  Record other;
  EXPECT_FALSE(other.passOn(record));
  EXPECT_EQ(other.errDescription(), record.errDescription());
  record.noteName("Sales");
  EXPECT_EQ(record.errNumber(), messageNumber(1400));
  EXPECT_EQ(record.errDescription(), "Classification [Sales] does not exist.");
}

TEST_F(FrameTest, StatementsAreFilledWithTheUsualFlags) {
  EXPECT_EQ(record.filled(), "0 N'a' '' N'a',N'b' <x>");
  EXPECT_EQ(record.filled(), "0 N'a' '' N'a',N'b' <x>");
}

}  // namespace QVSa
