#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::odbc {

// A batch as it is sent. Servers from 2012 on refuse the old outer joins (*= and =*): a batch that has one goes out
// with left joins in their place, any other as it stands. Throws where a batch with an old join does not parse.
String wireText(const String& batch);

// Whether the batch's first row set is that of its last statement, so that nothing waits behind its rows. False where
// the batch does not parse.
bool endsWithItsRowSet(const String& batch);

}  // namespace QVSa::odbc
