#include "bench/LogBook.h"

#include <cstdlib>

#include "QVSa/QVSa.h"
#include "bench/Operations.h"

namespace QVSa::bench {

namespace {

// 2020-01-01, counted from 1900-01-01.
constexpr std::int64_t firstDay = 43'829;

std::int64_t wantedEntries() {
  const char* const wanted = std::getenv("QVSA_LOG_ENTRIES");
  return wanted == nullptr ? 1'000'000 : std::strtoll(wanted, nullptr, 10);
}

}  // namespace

LogBook::LogBook() : entries_(wantedEntries()) {
  {
    Storage storage(folder());
    Query templates(storage, "insert into QVSys.repTmps(rtUid,fullName) values(?,?)");
    for (int i = 0; i < 200; ++i) {
      const std::string number = std::to_string(i);
      templates.start("t" + number, "Finance,Report " + number).run();
    }
    storage.execute("begin");
    Query(storage,
          "insert into QVApp.syslog(logId,logtype,UserId,LogTime,UserName,UserLogin,computer,FuncName,OpDesc,rcId,wiId,"
          "rtId,application) with recursive n(i) as (select 0 union all select i+1 from n where i<?) "
          "select printf('%014d',i),1,i%500,?+i*?,'User '||(i%500),'user-'||(i%500),'workstation-'||(i%500),"
          "'Function '||(i%40),'The report was opened and printed, time '||i,'r'||i,'','t'||(i%200),i%3 from n")
        .start(entries_ - 1, firstDay * ticksPerDay, ticksPerDay / entriesADay)
        .run();
    storage.execute("commit");
  }
  // The first number of the day is a row of its own.
  LogRecords log;
  log.connect(server(), "QVApp");
  require(log.Add(1, 2, "f", "d"), log);
}

std::int64_t LogBook::dayTicks() const { return (firstDay + entries_ / entriesADay / 2) * ticksPerDay; }

Date LogBook::day() const { return Date(2020, 1, 1).addDays(static_cast<double>(entries_ / entriesADay / 2)); }

const LogBook& logBook() {
  static const LogBook theLogBook;
  return theLogBook;
}

}  // namespace QVSa::bench
