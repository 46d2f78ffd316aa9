#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// Which entries of the system log are wanted. What is empty, 0 or 1900-01-01 sets no limit. All texts are looked for as
// they are, without regard to case: none is SQL, and "%" is no wildcard.
struct LogFilter {
  Long type = 0;              // the entries of one type, 0 too
  Date from = Date::empty();  // days; the last one counts in whole
  Date to = Date::empty();
  Long userId = 0;
  String computer;            // a part of the computer's name
  std::vector<String> users;  // parts of the user's name or login, one of which is enough
  String templateId;
  std::vector<String> templates;  // parts of the template's full name, one of which is enough
  String words;                   // a part of the description
};

struct LogEntry {
  String id;
  Date time;  // to the millisecond, by the server's clock
  String user;
  String computer;
  String application;  // in the system's language; "Other" for one that the library does not know
  String operation;
  String description;
  String templateName;
  String agent;  // who acted for the user
  String templateId;
  String record;  // id of the record concerned
  String item;    // a further id of the caller's
};

// The system log in pages, newest entries first. A page is asked for by the place of the last entry before it, so that
// it costs what it holds, however long the log is, and entries that come meanwhile move nothing.
//   LogPages log;  log.connect(server, "QVApp");
//   if (log.read(filter, 50, after)) show(log.entries(), log.next());
class QVSA_EXPORT LogPages : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Reads up to `size` entries behind the place `after`, which is a `next` of a page of the same filter; empty: from
  // the newest. 5 for a text that is no place, or a size below 1. Entries without a time are not found.
  Boolean read(const LogFilter& filter, Long size, const String& after = "");
  const std::vector<LogEntry>& entries() const { return entries_; }
  // The place behind the page, the time and the number of its last entry; empty where there are no more.
  const String& next() const { return next_; }

 private:
  SqlText statement(const LogFilter& filter, Long size, const String& after);

  std::vector<LogEntry> entries_;
  String next_;
};

}  // namespace QVSa
