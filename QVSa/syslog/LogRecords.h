#pragma once

#include <array>

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/KeyedCollection.h"
#include "QVSa/syslog/LogRecord.h"

namespace QVSa {

// The system log: entries are written, asked for, exported and cleared.
//   LogRecords log;  log.connect(server, "QVApp");
//   log.Add(userId, 1, "Sales report", "Printed");
//   log.GetAll(1, monday, friday);
//   for (Recordset& rows = log.recordset(); !rows.EOF_(); rows.MoveNext()) show(rows[6].asText());
class QVSA_EXPORT LogRecords : private Frame {
 public:
  LogRecords();

  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Positions of the columns that a front end formats as dates and of those that it hides, "|" between; empty until a
  // query runs.
  String dateCols() const { return dateCols_; }
  String hiddenCols() const { return hiddenCols_; }
  // Removes all items, and gives False whatever happens.
  Boolean Clear();
  // The name of this machine.
  String computerName() const;

  // Writes an entry with the user's present name and login. A `userId` that is no user's writes nothing and is a
  // success. `SessionId` plays no part. The entry's number is used up by a failure too: 0x80040E2F means that somebody
  // took a number at the same moment, and the entry is lost.
  Boolean Add(Long userId, Long LogType, const String& FuncName, const String& desc, const String& SessionId = "",
              const String* rcId = nullptr, const String* wiId = nullptr, const String* rtId = nullptr);
  // The entries of a type, newest first, into the record set, and with `app` 2 into the collection as well. A date of
  // 1900-01-01 sets no limit; the end date counts in whole. `desc` may stand anywhere in the description. `ordByFld`
  // and `ordBy` play no part.
  Boolean GetAll(Long LogType = 0, Date startDate = Date::empty(), Date endDate = Date::empty(), Long operator_ = 0,
                 const String& rtId = "", const String& desc = "", const String& ordByFld = "", Integer ordBy = 0,
                 Integer app = 0);
  // Writes the entries of a type (1 to 3; any other: all) to a text file in the system's code page ("?" for what that
  // lacks), with no heading: a line break before each entry, tabs between its values. The file is complete or as it was
  // before; it keeps its owner and mode, a link leads to it, a terminal, a pipe or a device is written as it is. 70,
  // 75 or 76 where it can't be written; 70 also for a file of an installation and a link that a stranger may have laid.
  Boolean saveLog(const String& vBakFile, const Long* vLogType = nullptr);
  // Deletes the entries of a type (1 to 3; any other: all), with `vSaveBackup` after an export to `vBakFile`. A failed
  // export does not keep the entries, and neither do entries that came after it.
  Boolean clearLog(const Long* vLogType = nullptr, const Boolean* vSaveBackup = nullptr,
                   const String* vBakFile = nullptr);
  // As GetAll, by six values: start and end date, a part of the computer's name, of the user's name or login, of the
  // template's full name, of the description. The dates 1900-01-01 and empty texts set no limit; users and templates
  // may be lists with "," between. An end before the start is set to 1900-01-01 in the caller's list. Of fewer values:
  // False without a report. The parts of users and templates are SQL of the caller's own, inside '%...%': they go into
  // the statement as they are, so double their quotes.
  Boolean GetLogByQuery(std::vector<Variant>& arrList, Long LogType = 0, const String& ordByFld = "", Integer ordBy = 0,
                        Integer app = 0);

  // By position from 1. Throws 9 for a position out of range, 5 for a key.
  std::shared_ptr<LogRecord> Item(const Variant& vntIndexKey) const { return items_.at(vntIndexKey); }
  // The number of rows of the record set; 0 where none is open, or it was read to its end.
  Long Count();
  // Throws as Item does.
  void Remove(const Variant& vntIndexKey) { items_.remove(vntIndexKey); }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

  // The twelve columns of the last query, detached from the database; closed before the first one.
  Recordset& recordset() { return recordset_; }
  // The same for the data member "logs"; nothing for any other.
  Recordset* GetDataMember(const String& DataMember) { return DataMember == "logs" ? &recordset_ : nullptr; }

 private:
  Connection openAtClient() const;
  void startQuery();
  String head() const;
  Boolean showRows(const String& statement, Integer app);
  void readItems();
  static String queryConditions(const std::vector<Variant>& arrList);

  std::array<String, 9> captions_;
  String dateCols_;
  String hiddenCols_;
  KeyedCollection<LogRecord> items_;
  Recordset recordset_;
};

}  // namespace QVSa
