#pragma once

#include <sql.h>
#include <sqlext.h>

#include "QVSa/values/Text.h"

// ODBC's wide texts are UTF-16, the library's are UTF-8.
namespace QVSa::odbc {

static_assert(sizeof(SQLWCHAR) == sizeof(char16_t), "the driver manager must be built for UTF-16");

inline SQLWCHAR* wideData(std::u16string& text) { return reinterpret_cast<SQLWCHAR*>(text.data()); }

}  // namespace QVSa::odbc
