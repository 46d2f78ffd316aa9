#pragma once

#include "QVSa/values/Variant.h"
#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

// A column of a row set as its driver describes it.
struct ColumnType {
  SQLSMALLINT type = SQL_UNKNOWN_TYPE;
  SQLULEN size = 0;
  SQLSMALLINT digits = 0;
};

bool isText(const ColumnType& type);
bool isBinary(const ColumnType& type);
bool isLong(const ColumnType& type);

// A value of the statement's current row, by its position from 0. Drivers give each column once and from left to right.
// Whole decimals and 64-bit numbers that fit are a Long, others a double.
Variant readColumn(SQLHSTMT statement, std::size_t ordinal, const ColumnType& type);

}  // namespace QVSa::odbc
