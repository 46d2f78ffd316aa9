#pragma once

#include <cstdint>

#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

// The process's one ODBC environment, made at first use and kept. For any thread. Throws 0x80004005.
SQLHENV environment();

// ODBC takes the numbers of attributes in the place of a pointer.
inline SQLPOINTER attributeValue(std::int64_t value) {
  return reinterpret_cast<SQLPOINTER>(static_cast<SQLULEN>(value));
}

}  // namespace QVSa::odbc
