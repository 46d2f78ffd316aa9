#include "QVSa/classification/Directory.h"

namespace QVSa {

Boolean Directory::updateSubOrder(const String& SuperOrdPath, const String& SubDirs) {
  return operation(plain(), [&] {
    Connection connection = open();
    if (SubDirs.empty()) return true;
    Long position = 0;
    for (const String& name : split(SubDirs, ',')) {
      ++position;
      connection.Execute(sql(" update RptDirectory set ordNo = <OrdNo> , ordPath = <oP> where class = <Class>")
                             .number("OrdNo", position)
                             .text("oP", SuperOrdPath + threeDigits(position))
                             .text("Class", name));
      reorderBelow(connection, name);
    }
    return true;
  });
}

// More places than three digits can name are refused: the texts would no longer sort.
String Directory::threeDigits(Long position) {
  const String digits = text(position);
  if (digits.size() > 3) throw runtimeFailure(number::argument);
  return String(3 - digits.size(), '0') + digits;
}

// In one pass: a row takes the text of the one above it as it stood before the statement, so that only the first level
// below the node is right after it.
void Directory::reorderBelow(Connection& connection, const String& name) {
  connection.Execute(sql(" update r1 "
                         " set r1.ordpath = r2.ordpath + '.' + replicate( '0', 3 - len( r1.ordNo )) + ltrim( str( "
                         "r1.ordno )) "
                         " from rptdirectory r1 , rptdirectory r2 "
                         " where r1.superClass = r2.Class "
                         "     and charindex( <Class> , r1.path ) > 0 ")
                         .text("Class", "." + name + "."));
}

// A number that loses a digit leaves its zeros short, as 010 becomes 09, until updateSubOrder writes it anew.
void Directory::closeGap(Connection& connection) {
  connection.Execute(sql(" update rptdirectory "
                         " set ordNo = ordNo -1 , ordpath = left( ordpath , len ( ordpath ) - len ( ordNo )) + ltrim( "
                         "str( ordno - 1 )) "
                         " from rptdirectory "
                         " where superClass = <SuperClass> and ordNo > <OrdNo> ")
                         .text("SuperClass", oldSuperClass_)
                         .number("OrdNo", ordNo_));
  reorderBelow(connection, oldSuperClass_);
}

}  // namespace QVSa
