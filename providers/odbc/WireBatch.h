#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::odbc {

// A batch as it is sent, and what is to be known of it. Nothing is known of a batch that does not parse here: the
// server may know more, or tells what is wrong with it.
struct WireBatch {
  // Servers from 2012 on refuse the old outer joins (*= and =*): a batch that has one goes out with left joins in their
  // place. A literal with characters beyond ASCII gets the N without which the server's code page would decide which of
  // them survive. Anything else stands as it is.
  String text;
  // The first row set is that of the last statement: nothing waits behind its rows.
  bool endsWithItsRowSet = false;
  // Other statements may stand in front of it.
  bool canFollow = false;
  // It does nothing but set nocount.
  bool isNocount = false;
  // The session is afterwards as it was, but for the database, nocount and an open transaction.
  bool leavesNoTrace = false;
  // It wants a database that no other session stands in.
  bool wantsDatabaseAlone = false;
};

// Throws where a batch with an old join does not parse.
WireBatch wireBatch(const String& batch);

}  // namespace QVSa::odbc
