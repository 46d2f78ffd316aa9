#include "providers/tsql/Words.h"

#include <algorithm>
#include <array>

namespace QVSa::tsql {
namespace {

constexpr std::string_view kReserved[] = {
    "add",
    "all",
    "alter",
    "and",
    "any",
    "as",
    "asc",
    "authorization",
    "backup",
    "begin",
    "between",
    "break",
    "browse",
    "bulk",
    "by",
    "cascade",
    "case",
    "check",
    "checkpoint",
    "close",
    "clustered",
    "coalesce",
    "collate",
    "column",
    "commit",
    "compute",
    "constraint",
    "contains",
    "containstable",
    "continue",
    "convert",
    "create",
    "cross",
    "current",
    "current_date",
    "current_time",
    "current_timestamp",
    "current_user",
    "cursor",
    "database",
    "dbcc",
    "deallocate",
    "declare",
    "default",
    "delete",
    "deny",
    "desc",
    "disk",
    "distinct",
    "distributed",
    "double",
    "drop",
    "dump",
    "else",
    "end",
    "errlvl",
    "escape",
    "except",
    "exec",
    "execute",
    "exists",
    "exit",
    "external",
    "fetch",
    "file",
    "fillfactor",
    "for",
    "foreign",
    "freetext",
    "freetexttable",
    "from",
    "full",
    "function",
    "goto",
    "grant",
    "group",
    "having",
    "holdlock",
    "identity",
    "identity_insert",
    "identitycol",
    "if",
    "in",
    "index",
    "inner",
    "insert",
    "intersect",
    "into",
    "is",
    "join",
    "key",
    "kill",
    "left",
    "like",
    "lineno",
    "load",
    "merge",
    "national",
    "nocheck",
    "nonclustered",
    "not",
    "null",
    "nullif",
    "of",
    "off",
    "offsets",
    "on",
    "open",
    "opendatasource",
    "openquery",
    "openrowset",
    "openxml",
    "option",
    "or",
    "order",
    "outer",
    "over",
    "percent",
    "pivot",
    "plan",
    "precision",
    "primary",
    "print",
    "proc",
    "procedure",
    "public",
    "raiserror",
    "read",
    "readtext",
    "reconfigure",
    "references",
    "replication",
    "restore",
    "restrict",
    "return",
    "revert",
    "revoke",
    "right",
    "rollback",
    "rowcount",
    "rowguidcol",
    "rule",
    "save",
    "schema",
    "securityaudit",
    "select",
    "semantickeyphrasetable",
    "semanticsimilaritydetailstable",
    "semanticsimilaritytable",
    "session_user",
    "set",
    "setuser",
    "shutdown",
    "some",
    "statistics",
    "system_user",
    "table",
    "tablesample",
    "textsize",
    "then",
    "to",
    "top",
    "tran",
    "transaction",
    "trigger",
    "truncate",
    "try_convert",
    "tsequal",
    "union",
    "unique",
    "unpivot",
    "update",
    "updatetext",
    "use",
    "user",
    "values",
    "varying",
    "view",
    "waitfor",
    "when",
    "where",
    "while",
    "with",
    "writetext",
};

constexpr std::size_t kLongest = 30;
constexpr std::size_t kSlots = 1024;

constexpr char lowerCase(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c; }

// Sets the bit that tells the cases of a letter apart; bytes that it confuses are told apart by the comparison.
constexpr std::size_t slotOf(std::string_view word) {
  std::size_t hash = word.size();
  for (char c : word) hash = hash * 31 + (static_cast<unsigned char>(c) | 0x20U);
  return hash % kSlots;
}

// Open addressing: a word lies in the first free slot at or behind its own.
constexpr std::array<std::string_view, kSlots> kTable = [] {
  std::array<std::string_view, kSlots> table{};
  for (std::string_view word : kReserved) {
    std::size_t slot = slotOf(word);
    while (!table[slot].empty()) slot = (slot + 1) % kSlots;
    table[slot] = word;
  }
  return table;
}();

}  // namespace

bool sameWord(std::string_view a, std::string_view b) {
  return a.size() == b.size() &&
         std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) { return lowerCase(x) == lowerCase(y); });
}

bool isReserved(std::string_view word) {
  if (word.size() > kLongest) return false;
  for (std::size_t slot = slotOf(word); !kTable[slot].empty(); slot = (slot + 1) % kSlots)
    if (sameWord(kTable[slot], word)) return true;
  return false;
}

String lowered(std::string_view word) {
  String lower(word);
  for (char& c : lower) c = lowerCase(c);
  return lower;
}

}  // namespace QVSa::tsql
