#include "QVSa/hosting/LogPages.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class Log : public Scene {
 protected:
  // All entries of a filter by their numbers, a "|" between two pages.
  String pages(const LogFilter& filter, Long size) {
    auto log = connected<LogPages>();
    String result, after;
    do {
      EXPECT_TRUE(log.read(filter, size, after)) << log.errDescription();
      for (const LogEntry& entry : log.entries()) result += entry.id;
      after = log.next();
      if (!after.empty()) result += "|";
    } while (!after.empty());
    return result;
  }
};

TEST_F(Log, IsReadInPagesThatMeetWhateverComesMeanwhile) {
  // Two pairs of one moment, told apart by their numbers, and moments that lie closer than a second.
  tables_.run(
      "insert into syslog(logId,logtype,LogTime) select 'a',1,'20240307 10:00:00.003' union all select 'b',1,"
      "'20240307 10:00:00.003' union all select 'c',1,'20240307 10:00:00.007' union all select 'd',1,'20240307 "
      "10:00:00.010' union all select 'e',1,'20240307 10:00:00.010' union all select 'x',2,'20240307'");
  LogFilter filter;
  filter.type = 1;
  for (const auto& [size, expected] : {std::pair{1, "e|d|c|b|a"}, {2, "ed|cb|a"}, {4, "edcb|a"}, {5, "edcba"}})
    EXPECT_EQ(pages(filter, size), expected);

  auto log = connected<LogPages>();
  ASSERT_TRUE(log.read(filter, 2));
  tables_.run(
      "insert into syslog(logId,logtype,LogTime) values('f',1,'20240307 11:00') delete from syslog where "
      "logId='d'");
  ASSERT_TRUE(log.read(filter, 1, log.next()));
  EXPECT_EQ(log.entries().at(0).id, "c") << "the place holds though its entry is gone";
  EXPECT_FALSE(log.read(filter, 1, "yesterday"));
  EXPECT_EQ(log.errNumber(), number::argument);
  EXPECT_FALSE(log.read(filter, 0));
}

TEST_F(Log, TakesEveryTextOfAFilterAsItIs) {
  tables_.run(
      "insert into repTmps(rtUid,fullName) values('t1','Sales,North')"
      " insert into syslog(logId,logtype,LogTime,UserId,UserName,UserLogin,computer,OpDesc,rtId,application) select "
      "'a',"
      "0,'20240305 10:00',7,'Ann','ann','pc1','50% of it''s','t1',1 union all select 'b',0,'20240306 23:59:59',8,'Bob',"
      "'bob','pc2','5000',null,9");
  using Set = void (*)(LogFilter&);
  for (const auto& [set, expected] : std::initializer_list<std::pair<Set, const char*>>{
           {[](LogFilter&) {}, "ba"},
           {[](LogFilter& f) { f.words = "50% OF"; }, "a"},
           {[](LogFilter& f) { f.words = "it's"; }, "a"},
           {[](LogFilter& f) { f.words = "x' or 1=1 --"; }, ""},
           {[](LogFilter& f) {
              f.users = {"", "<part1>", "nn"};
            },
            "a"},
           {[](LogFilter& f) {
              f.users = {"ANN", "ob"};
            },
            "ba"},
           {[](LogFilter& f) { f.templates = {"s,N"}; }, "a"},
           {[](LogFilter& f) { f.templateId = "t1"; }, "a"},
           {[](LogFilter& f) { f.computer = "pc2"; }, "b"},
           {[](LogFilter& f) { f.userId = 7; }, "a"},
           {[](LogFilter& f) { f.to = Date(2024, 3, 5); }, "a"},
           {[](LogFilter& f) { f.from = f.to = Date(2024, 3, 6); }, "b"}}) {
    LogFilter filter;
    set(filter);
    EXPECT_EQ(pages(filter, 10), expected) << filter.words << filter.computer;
  }
  auto log = connected<LogPages>();
  ASSERT_TRUE(log.read({}, 2));
  const LogEntry& entry = log.entries().at(1);
  EXPECT_EQ(entry.time.text() + entry.user + entry.application + entry.templateName,
            "2024-03-05 10:00:00AnnExcelSales,North");
}

}  // namespace
}  // namespace QVSa::test
