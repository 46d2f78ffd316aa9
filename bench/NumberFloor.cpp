#include "bench/NumberFloor.h"

#include <cstdio>
#include <ctime>

namespace QVSa::bench {

namespace {

std::string datePart() {
  const std::time_t now = std::time(nullptr);
  std::tm local{};
  localtime_r(&now, &local);
  char text[16];
  return std::string(text, std::strftime(text, sizeof text, "%y%m%d", &local));
}

}  // namespace

NumberFloor::NumberFloor(const Storage& storage, const std::string& database)
    : rule_(storage, "select preFix,ymdStyle,noStyle,reuseStyle from " + database + ".idRule where idName=?"),
      last_(storage, "select max(maxId) from " + database + ".idRec where idName=? and ymd>=? and ymd<?"),
      write_(storage, "update " + database + ".idRec set maxId=? where idName=? and ymd=?"),
      begin_(storage, "begin"),
      commit_(storage, "commit") {}

std::string NumberFloor::newId(const std::string& rule) {
  const std::int64_t day = nowTicks() / ticksPerDay * ticksPerDay;
  const Row found = rule_.start(rule).one();
  const auto width = static_cast<std::size_t>(found.numbers[1]);
  begin_.start().run();
  const std::string last = last_.start(rule, day, day + ticksPerDay).one().texts[0];
  char digits[16];
  std::snprintf(digits, sizeof digits, "%0*ld", static_cast<int>(width),
                std::stol(last.substr(last.size() - width)) + 1);
  const std::string id = found.texts[0] + datePart() + digits;
  write_.start(id, rule, day).run();
  commit_.start().run();
  return id;
}

}  // namespace QVSa::bench
