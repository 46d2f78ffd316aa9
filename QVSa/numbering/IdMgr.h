#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/numbering/NumberStyles.h"

namespace QVSa {

// A numbering rule and the issuer of its numbers.
//   IdMgr rule;  rule.connect(server, "QVApp");  String number = rule.newId("invoice");
class QVSA_EXPORT IdMgr : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // The text before the date part. Blanks at its ends count in GetSample only.
  String preFix() const { return preFix_; }
  void preFix(String value) { preFix_ = std::move(value); }
  // A qvIdDatePart. Change it before the first number of a period. From days, or from none, to months or years the row
  // of another day than the new period's first can stay behind: newId reads it and never updates it, and gives one
  // number again and again until the period is over.
  Integer DateFormat() const { return DateFormat_; }
  void DateFormat(Integer value) { DateFormat_ = value; }
  // Digits of the sequence, 0 to 14. Can only grow once a number was issued.
  Integer numPlace() const { return numPlace_; }
  void numPlace(Integer value) { numPlace_ = value; }
  // A qvIdReuse.
  Integer reuseStyle() const { return reuseStyle_; }
  void reuseStyle(Integer value) { reuseStyle_ = value; }
  // Whether a record gets its number only when it is saved: a word for the hosts, without part in issuing.
  Boolean whenSave() const { return whenSave_ == 1; }
  void whenSave(Boolean value) { whenSave_ = value ? 1 : 0; }
  // The rule's name as Save will write it.
  String idName() const { return idName_; }
  void idName(String value) { idName_ = std::move(value); }

  // The next number of `idName` (empty: of this rule): trimmed prefix, date part, zero-padded sequence. The date is the
  // database server's. `vConnstring` is a whole connection string for this call, which then needs no connect.
  // `startNo` 0 or more is the sequence number to use, and what the rule released on the period's first day is
  // forgotten. With `rcId` a released number may come back, and the number is booked on that record and on `sesId`.
  // Empty on failure: numberNameMissing (0x800405DD) no name, numberRuleUnknown (0x800405DE) no such rule,
  // numbersUsedUp (0x800405E3) width exceeded, 0x80040E2F somebody else holds the period's row at this moment (trying
  // again is safe).
  String newId(const String& idName, const String& vConnstring = "", Long startNo = -1, const String& rcId = "",
               const String& sesId = "");
  // Makes the next number of the current period `startNo`. 0 does nothing and is a success; a negative number issues an
  // ordinary number, which is then used up. Fails as newId does.
  Boolean setStartNo(Long startNo);

  // Loads a rule; numberRuleUnknown (0x800405DE) where there is none.
  Boolean GetOne(const String& idName);
  // Removes the rule `idName` (empty: this one); its counters and released numbers stay.
  Boolean Delete(const String& idName = "");
  // Inserts the rule, or updates the one that GetOne or an earlier Save left here. A width above the one
  // that GetOne read (0 where it never ran) widens the numbers already counted, with every Save anew: so call GetOne
  // before another Save once numbers were issued, and after each change of the width, or numbers come twice. 0x80040E2F
  // the name is taken, numbersIssued (0x800405E4) the rule has issued numbers and can't be narrowed.
  Boolean Save();
  // Loads `strOld` and saves it as `strNew`. Counters stay under the old name: the new one starts afresh.
  Boolean Rename(const String& strOld, const String& strNew);
  // What number 1 of this rule would look like today, by this machine's clock. Asks no database.
  String GetSample() const;
  // The released numbers of rule `Name` (empty: of this one) as <ns><n ymd="day of issue">number</n>...</ns>, empty
  // where there are none. "fail" on failure, without a report.
  String InvalidNumbers(const String& Name = "");

 private:
  struct Issue;

  void insertRule(Connection& connection);
  void updateRule(Connection& connection);
  Boolean readRule(Connection& connection, Issue& issue);
  String reuse(Connection& connection, const Issue& issue);
  String issueNext(Connection& connection, const Issue& issue);
  void store(Connection& connection, const Issue& issue, const String& newId, Boolean isNewRow);
  void book(Connection& connection, const Issue& issue, const String& newId);
  static Long nextNumber(const Issue& issue, const String& maxId);
  static String GetDatePart(Integer style, Date date);

  String preFix_;
  Integer DateFormat_ = noDate;
  Integer numPlace_ = 0;
  Integer reuseStyle_ = noReuse;
  Integer whenSave_ = 0;  // the column's number, kept as it was read
  String idName_;
  String oldName_;           // the name under which the row is stored; empty for a new rule
  Integer oldNumPlace_ = 0;  // the width as GetOne read it
};

}  // namespace QVSa
