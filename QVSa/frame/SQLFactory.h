#pragma once

#include <vector>

#include "QVSa/values/Variant.h"

namespace QVSa {

// Type codes of a parameter; any other code is taken as a text.
enum ParaType : Long { paraList = -1, paraVerbatim = 0, paraNumber = 1, paraText = 2, paraDate = 3 };

// Puts values into statement texts: each token "<name>" of a text becomes a literal made by the rule of its type.
//   factory.Clear();
//   factory.AddPara("deptNo", paraText, "S'1", false, true);
//   String text = "select * from departments where deptNo=<deptNo>";
//   factory.makeSql(text, "");                                  // ... where deptNo=N'S''1'
class QVSA_EXPORT SQLFactory {
 public:
  // The text that makeSql takes when its own is empty. Survives Clear.
  String SQL() const { return sql_; }
  void SQL(String value) { sql_ = std::move(value); }
  Long errNumber() const { return errNumber_; }
  String errDescription() const { return errDescription_; }

  // A name added twice: the first one wins, since its token is gone when the second is processed.
  void AddPara(const String& paraName, Long paraType, const Variant& paraValue, Boolean keepNull, Boolean escapeText);
  void Clear();
  // Replaces the tokens of `sql` in place, one parameter after the other, then those named in the comma-separated
  // `nullParas` by null. Plain text work: a value that holds a later token's text is replaced as well. False with
  // errNumber -1 where there is no text at all; `sql` then keeps what it had become.
  Boolean makeSql(String& sql, const String& nullParas);
  // `text` with each token replaced by its literal in one pass. What a literal brings is not looked at again, so that
  // every value is stored as it is. A token without a parameter stays. Throws Failure for a value without a literal.
  String fill(const String& text) const;

 private:
  struct Parameter {
    String name;
    Long type;
    Variant value;
    Boolean keepNull;
    Boolean escapeText;

    bool tokenAt(const String& text, std::size_t at) const;
    String literal() const;
  };

  String sql_;
  Long errNumber_ = 0;
  String errDescription_;
  std::vector<Parameter> parameters_;
};

// A moment from a day number: the time as whole hours, minutes and seconds, parts of a second dropped; a day number
// below 2 has the date 1900-01-01.
QVSA_EXPORT Date dayNumberToDate(double dayNumber);

// The quotes that sqlEscape doubles; any other code means both.
enum EscapeMode : Long { escapeSingle = 1, escapeDouble = 2 };

// The text of `value` without trailing blanks, the quotes of `mode` doubled. Null and Empty come back as they are.
QVSA_EXPORT Variant sqlEscape(const Variant& value, Long mode);

}  // namespace QVSa
