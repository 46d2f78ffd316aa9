#include <cstdio>
#include <fstream>
#include <memory>

#include "QVSa/QVSa.h"
#include "bench/LogBook.h"
#include "bench/NumberFloor.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/StoragePlan.h"

namespace QVSa::bench {

namespace {

std::shared_ptr<LogRecords> log() {
  auto records = std::make_shared<LogRecords>();
  records->connect(logBook().server(), "QVApp");
  return records;
}

Call add() {
  return {[log = log()] { require(log->Add(1, 2, "Print", "The report was printed"), *log); }};
}

Call addFloor() {
  struct Floor {
    Storage storage{logBook().folder()};
    NumberFloor numbers{storage, "QVApp"};
    Query insert{storage,
                 "insert into QVApp.syslog(logId,logtype,UserId,LogTime,UserName,UserLogin,computer,FuncName,OpDesc,"
                 "rcId,wiId,rtId) select ?,2,1,?,userName,userLogin,?,?,?,'','','' from QVSys.users where userId=1"};
  };
  return {[floor = std::make_shared<Floor>()] {
    const std::string id = floor->numbers.newId("_log");
    floor->insert.start(id, nowTicks(), "workstation", "Print", "The report was printed").run();
  }};
}

Call oneDay() {
  return {[log = log()] {
    require(log->GetAll(1, logBook().day(), logBook().day()) && log->Count() == LogBook::entriesADay, *log);
  }};
}

Call twoDaysByQuery() {
  return {[log = log()] {
    std::vector<Variant> values{logBook().day(), logBook().day().addDays(1), "", "User 7,User 8", "", "printed"};
    require(log->GetLogByQuery(values, 1) && log->Count() > 0, *log);
  }};
}

class Reading {
 public:
  explicit Reading(const std::string& more)
      : query_(storage_,
               "select logId,LogTime,userName,computer,application,funcName,opDesc,rt.fullName,replacerName,rtId,rcId,"
               "wiId from QVApp.syslog l left join QVSys.repTmps rt on l.rtId=rt.rtUid where logtype=1 and LogTime>=? "
               "and LogTime<?" +
                   more + " order by LogTime desc") {}
  void run(std::int64_t days) {
    std::vector<Row> rows;
    query_.start(logBook().dayTicks(), logBook().dayTicks() + days * ticksPerDay);
    while (query_.step()) rows.push_back(query_.row());
    if (rows.empty()) throw std::runtime_error("The floor found no entry.");
  }

 private:
  Storage storage_{logBook().folder()};
  Query query_;
};

Call oneDayFloor() {
  return {[floor = std::make_shared<Reading>("")] { floor->run(1); }};
}

Call twoDaysByQueryFloor() {
  return {[floor = std::make_shared<Reading>(
               " and (userName like '%User 7%' or userLogin like '%User 7%' or userName like '%User 8%' or userLogin "
               "like '%User 8%') and opDesc like '%printed%'")] { floor->run(2); }};
}

Call exportAll() {
  return {[log = log(), file = (logBook().folder() / "log.txt").string()] { require(log->saveLog(file), *log); }};
}

// The rows as they lie in the file, the times as numbers.
Call exportFloor() {
  struct Floor {
    Storage storage{logBook().folder()};
    Query query{storage, "select UserName,UserLogin,computer,FuncName,OpDesc,LogTime,logtype from QVApp.syslog"};
  };
  return {[floor = std::make_shared<Floor>(), file = (logBook().folder() / "floor.txt").string()] {
    std::ofstream output(file);
    floor->query.start();
    while (floor->query.step()) {
      const Row row = floor->query.row();
      output << "\r\n" << row.numbers[0] << '\t' << row.numbers[1];
      for (const std::string& text : row.texts) output << '\t' << text;
    }
  }};
}

// Kilobytes of this process by the system's own names: VmRSS now, VmHWM the most so far.
long memory(const std::string& name) {
  std::ifstream status("/proc/self/status");
  for (std::string line; std::getline(status, line);)
    if (line.rfind(name + ":", 0) == 0) return std::stol(line.substr(name.size() + 1));
  return 0;
}

void tellPlans() {
  for (const char* const tables : {" from sysLog l,repTmps rt where logType=1 and l.rtId*=rt.rtUid",
                                   " from sysLog l left outer join repTmps rt on l.rtId=rt.rtUid where logType=1 "}) {
    const String query =
        String(
            "select logId as logId,convert(smalldatetime,logTime,120) as [LogTime],userName as [QVUser]"
            ",rt.fullName as [Template]") +
        tables + " and logTime>='20240301 00:00:00' and logTime<'20240302 00:00:00' order by logTime desc";
    std::printf("%s\n", query.c_str());
    for (const std::string& step : storagePlan(logBook().folder(), "QVApp", query))
      std::printf("    %s\n", step.c_str());
  }
}

void tellMemory() {
  const Call call = exportAll();
  // Sets the most so far back to what is in use now.
  std::ofstream("/proc/self/clear_refs") << "5";
  const long before = memory("VmRSS");
  call.run();
  std::printf("An export of the whole log needs %ld KB more than what is in use before it.\n",
              memory("VmHWM") - before);
}

}  // namespace

void addLogPairs() {
  addPair("LogRecords.Add", add, addFloor);
  addPair("LogRecords.GetAll, a day of 10,000 entries", oneDay, oneDayFloor);
  addPair("LogRecords.GetLogByQuery, two days, two users", twoDaysByQuery, twoDaysByQueryFloor);
  addPair("LogRecords.saveLog, the whole log", exportAll, exportFloor);
}

void tellLogFacts() {
  std::printf("\nThe log has %ld entries. How a day of it is found:\n", static_cast<long>(logBook().entries()));
  tellPlans();
  tellMemory();
}

}  // namespace QVSa::bench
