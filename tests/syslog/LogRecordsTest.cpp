#include "QVSa/resources/Messages.h"
#include "platform/Services.h"
#include "tests/support/Failures.h"
#include "tests/syslog/LogInstallation.h"

namespace QVSa {
namespace {

using test::failureOf;
using test::Lines;

class LogWriting : public test::LogInstallation {};
class LogQueries : public test::LogInstallation {
 protected:
  static std::vector<Variant> query(Date start, Date end, const char* computer = "", const char* users = "",
                                    const char* templates = "", const char* description = "") {
    return {start, end, computer, users, templates, description};
  }
  String foundBy(std::vector<Variant> values) {
    EXPECT_TRUE(log_.GetLogByQuery(values)) << log_.errDescription();
    return found();
  }
};

const Date never = Date::empty();

TEST_F(LogWriting, AnEntryCarriesTheUsersNameAndLoginAndTheServersTime) {
  const String record = "r1";
  const String place = "w1";
  const String report = "t1";
  EXPECT_TRUE(log_.Add(1, 7, "Print's", "It's \"so\"", "s1", &record, &place, &report));
  EXPECT_TRUE(log_.Add(1, 2, "f", ""));
  EXPECT_EQ(tables_.rows("select logId,logtype,UserId,LogTime,UserLogin,FuncName,OpDesc,rcId,wiId,rtId,application,"
                         "replacerName from syslog order by logId"),
            (Lines{"24030700000001|7|1|2024-03-07 14:05:09|Admin|Print's|It's \"so\"|r1|w1|t1|0|-",
                   "24030700000002|2|1|2024-03-07 14:05:09|Admin|f|||||0|-"}));
  EXPECT_EQ(tables_.text("select count(*) from syslog l,users u where l.UserId=u.userId and l.UserName=u.userName"
                         " and computer=N'" +
                         log_.computerName() + "'"),
            "2");
  EXPECT_EQ(log_.computerName(), platform::services().computerName());
}

TEST_F(LogWriting, AnEntryOfNobodyIsNotWrittenAndUsesANumberUp) {
  EXPECT_TRUE(log_.Add(99, 1, "f", "d"));
  EXPECT_EQ(tables_.text("select count(*) from syslog"), "0");
  EXPECT_TRUE(log_.Add(1, 1, "f", "d"));
  EXPECT_EQ(tables_.text("select right(logId,1) from syslog"), "2");
}

TEST_F(LogWriting, AFailureIsToldBehindTheLogsOwnSentence) {
  tables_.run("delete from idRule where idName='_log'");
  EXPECT_EQ(refusal(log_, log_.Add(1, 1, "f", "d")), messageNumber(1502));
  EXPECT_EQ(log_.errDescription(), "Error in recording system log. " + LoadResString(1502));

  LogRecords unconnected;
  EXPECT_FALSE(unconnected.Add(1, 1, "f", "d"));
  EXPECT_NE(unconnected.errNumber(), 0);
}

TEST_F(LogQueries, TheRowsStayBehindUnderCaptionsOfTheLanguage) {
  write("a", "20240305 10:20:45", ",UserName,computer,FuncName,OpDesc,rcId,wiId,rtId,application,replacerName",
        ",'Ann','pc1','Print','Printed it','r1','w1','t1',1,'Bob'");
  ASSERT_TRUE(log_.GetAll());
  EXPECT_EQ(log_.dateCols(), "0|2");
  EXPECT_EQ(log_.hiddenCols(), "0|1|10|11|12");
  Recordset& rows = *log_.GetDataMember("logs");
  String names, values;
  for (std::size_t i = 0; i < rows.fieldCount(); ++i) {
    names += rows[i].Name() + "|";
    values += rows[i].asText() + "|";
  }
  EXPECT_EQ(names, "logId|LogTime|QVUser|Compter|Application|Operation|Description|Template|Agent|rtId|rcId|wiId|");
  EXPECT_EQ(values, "a|2024-03-05 10:21:00|Ann|pc1|Excel|Print|Printed it|Finance,Sales|Bob|t1|r1|w1|");

  for (const char* language : {"zh_CN.UTF-8", "zh_TW.UTF-8"}) {
    const test::EnvironmentLocale chinese{language};
    LogRecords log;
    log.connect(server(), "QVApp");
    ASSERT_TRUE(log.GetAll()) << log.errDescription();
    EXPECT_EQ(log.recordset()[2].Name(), LoadResString(1706));
    EXPECT_EQ(log.recordset()[4].asText(), LoadResString(1712));
    EXPECT_NE(log.recordset()[2].Name(), "QVUser");
  }
}

TEST_F(LogQueries, AllAsksByTypeDaysUserTemplateAndDescription) {
  write("a", "20240305 00:00:00", ",UserId,rtId,OpDesc", ",1,'t1','alpha beta'");
  write("b", "20240306 23:58:00", ",UserId,rtId,OpDesc", ",2,'t2','beta'");
  write("c", "20240307 00:00:00", ",UserId,rtId,OpDesc", ",1,'gone','gamma'");
  write("d", "20240306 12:00:00", "", "", 3);
  const auto all = [&](Date start, Date end, Long user = 0, const char* report = "", const char* words = "") {
    EXPECT_TRUE(log_.GetAll(0, start, end, user, report, words, "logId", 1)) << log_.errDescription();
    return found();
  };
  const Date fifth(2024, 3, 5);
  const Date sixth(2024, 3, 6);
  EXPECT_EQ(all(never, never), "c b a");
  EXPECT_EQ(all(sixth, never), "c b");
  EXPECT_EQ(all(never, sixth), "b a");
  EXPECT_EQ(all(fifth, fifth), "a");
  EXPECT_EQ(all(never, never, 1), "c a");
  EXPECT_EQ(all(never, never, 0, "T1"), "a");
  EXPECT_EQ(all(never, never, 0, "", "BETA"), "b a");
  EXPECT_TRUE(log_.GetAll(3));
  EXPECT_EQ(found(), "d");
  EXPECT_EQ(refusal(log_, log_.GetAll(0, never, Date(9999, 12, 31))), number::overflow);
}

TEST_F(LogQueries, TheWebPageAloneGetsItems) {
  write("a", "20240305 10:20:00", ",UserName,computer,FuncName,OpDesc,rcId,wiId,rtId,replacerName",
        ",'Ann','pc1','Print','Printed','r1','w1','t1','Bob'");
  write("b", "20240306");
  ASSERT_TRUE(log_.GetAll(0, never, never, 0, "", "", "", 0, 2));
  ASSERT_EQ(log_.Count(), 2);
  const LogRecord& record = *log_.Item(2);
  EXPECT_EQ(record.operator_() + record.Computer() + record.FuncName() + record.description() + record.rcId() +
                record.wiId() + record.rtId() + record.repName() + record.agentName() + record.LogTime(),
            "Annpc1PrintPrintedr1w1t1Finance,SalesBob2024-03-05 10:20:00");
  EXPECT_EQ(log_.Item(1)->operator_() + log_.Item(1)->repName(), "");
  EXPECT_EQ(log_.recordset()["logId"].asText(), "b") << "the record set stands on its first row again";
  log_.Remove(1);
  EXPECT_EQ(log_.Item(1)->operator_(), "Ann");
  EXPECT_EQ(log_.Count(), 2) << "the rows are counted, not the items";
  EXPECT_EQ(failureOf([&] { log_.Remove(2); }), number::position);
  EXPECT_EQ(failureOf([&] { log_.Item("a"); }), number::argument);
  EXPECT_EQ(failureOf([&] { log_.Item(Date()); }), number::type);

  ASSERT_TRUE(log_.GetAll());
  EXPECT_EQ(log_.Count(), 2);
  EXPECT_EQ(failureOf([&] { log_.Item(1); }), number::position);
  EXPECT_EQ(found(), "b a");
  EXPECT_EQ(log_.Count(), 0) << "at the end of the rows";
}

TEST_F(LogQueries, AListOfFewerThanSixValuesAsksNothing) {
  write("a", "20240305");
  ASSERT_TRUE(log_.GetAll(0, never, never, 0, "", "", "", 0, 2));
  std::vector<Variant> five = query(never, never);
  five.pop_back();
  EXPECT_FALSE(log_.GetLogByQuery(five));
  EXPECT_EQ(log_.errNumber(), 0);
  EXPECT_EQ(failureOf([&] { log_.Item(1); }), number::position) << "the items go all the same";
  EXPECT_EQ(log_.Count(), 1);
}

TEST_F(LogQueries, TheListsDaysCountInWholeAndOneDayTakesTheNextMidnightAsWell) {
  write("a", "20240305 00:00:00");
  write("b", "20240305 23:58:00");
  write("c", "20240306 00:00:00");
  write("d", "20240306 00:02:00");
  write("e", "20240307 00:00:00");
  const Date fifth(2024, 3, 5);
  const Date sixth(2024, 3, 6);
  EXPECT_EQ(foundBy(query(fifth, fifth)), "c b a");
  EXPECT_EQ(foundBy(query(fifth, sixth)), "d c b a");
  EXPECT_EQ(foundBy(query(sixth, never)), "e d c");
  EXPECT_EQ(foundBy(query(never, fifth)), "b a");
  EXPECT_EQ(foundBy(query(never, never)), "e d c b a");
  std::vector<Variant> turned = query(sixth, fifth);
  ASSERT_TRUE(log_.GetLogByQuery(turned));
  EXPECT_EQ(found(), "e d c");
  EXPECT_EQ(turned[1], Variant(never));
  std::vector<Variant> endless = query(never, Date(9999, 12, 31));
  EXPECT_EQ(refusal(log_, log_.GetLogByQuery(endless)), number::overflow) << "no day is behind it";
}

TEST_F(LogQueries, ANullInTheListIsNotSet) {
  write("a", "20240305");
  std::vector<Variant> nulls(6, Variant::null());
  EXPECT_EQ(foundBy(nulls), "a");
  nulls[0] = Date(2024, 3, 6);
  ASSERT_TRUE(log_.GetLogByQuery(nulls));
  EXPECT_EQ(found(), "");
  EXPECT_TRUE(nulls[1].isNull()) << "no end that the start could be behind";
}

TEST_F(LogQueries, TheListsPartsAreFoundAnywhere) {
  const String columns = ",UserName,UserLogin,computer,OpDesc,rtId";
  write("a", "20240305 03:00", columns, ",'Ann','xa','PC-1','one','t1'");
  write("b", "20240305 02:00", columns, ",'Bob','xb','PC-2','two','t2'");
  write("c", "20240305 01:00", columns, ",'Cid','ann','other','three',''");
  EXPECT_EQ(foundBy(query(never, never, "c-")), "a b");
  EXPECT_EQ(foundBy(query(never, never, "", "ann")), "a c");
  EXPECT_EQ(foundBy(query(never, never, "", "ann,xb")), "a b c");
  EXPECT_EQ(foundBy(query(never, never, "", "ann,")), "a c");
  EXPECT_EQ(foundBy(query(never, never, "", ",")), "a b c");
  EXPECT_EQ(foundBy(query(never, never, "", "", "Sales")), "a");
  EXPECT_EQ(foundBy(query(never, never, "", "", "Finance,tock")), "a b");
  EXPECT_EQ(foundBy(query(never, never, "", "", "", "o")), "a b");
  EXPECT_EQ(foundBy(query(never, never, "", "x", "tock", "tw")), "b");
}

TEST_F(LogQueries, AListMayHaveThousandsOfParts) {
  const String columns = ",UserName,UserLogin,rtId";
  write("a", "20240305 03:00", columns, ",'Ann','user7x','t1'");
  write("b", "20240305 02:00", columns, ",'Bob','user1999x','t1'");
  write("c", "20240305 01:00", columns, ",'Cid','user1998x','t2'");
  String users, templates = "Sales";
  for (int i = 0; i < 2000; ++i) {
    users += (i == 0 ? "user" : ",user") + std::to_string(i) + "x";
    templates += ",template" + std::to_string(i);
  }
  EXPECT_EQ(foundBy(query(never, never, "", users.c_str(), templates.c_str())), "a b");
}

TEST_F(LogQueries, AListThatBeginsWithACommaFailsAtTheServer) {
  write("a", "20240305");
  for (const auto& values : {query(never, never, "", ",bob"), query(never, never, "", "", ",bob")}) {
    std::vector<Variant> refused = values;
    ASSERT_TRUE(log_.GetAll(0, never, never, 0, "", "", "", 0, 2));
    EXPECT_FALSE(log_.GetLogByQuery(refused));
    EXPECT_EQ(log_.begin(), log_.end());
    EXPECT_EQ(log_.Count(), 0);
    EXPECT_EQ(log_.errNumber(), number::statement);
    EXPECT_EQ(log_.errDescription().find("Error in requesting system log."), 0U);
  }
}

TEST_F(LogQueries, TheListsQueryNamesNoApplicationButAnother) {
  write("a", "20240305 02:00", ",application", ",2");
  write("b", "20240305 01:00", ",application", ",9");
  ASSERT_TRUE(log_.GetAll());
  EXPECT_EQ(log_.recordset()[4].asText(), "Web Page");
  std::vector<Variant> any = query(never, never);
  ASSERT_TRUE(log_.GetLogByQuery(any));
  EXPECT_EQ(log_.recordset()[4].asText(), "");
  log_.recordset().MoveNext();
  EXPECT_EQ(log_.recordset()[4].asText(), "Other");
}

}  // namespace
}  // namespace QVSa
