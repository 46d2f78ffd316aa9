#pragma once

#include <exception>
#include <stdexcept>

#include "QVSa/values/Values.h"

namespace QVSa {

// The one kind of exception of the library: a failure number that callers test, the name of who raised it, a text for a
// person, and the own number of the database server or the operating system (0 where there is none). No text holds a
// password or a connection string. Only want of memory is std::bad_alloc, which needs no memory itself, until an
// operation reports it as 7.
class QVSA_EXPORT Failure : public std::runtime_error {
 public:
  Failure(Long number, const String& source, const String& description, Long native = 0)
      : std::runtime_error(description), number_(number), native_(native), source_(source) {}

  Long number() const { return number_; }
  Long native() const { return native_; }
  const String& source() const { return source_; }
  String description() const { return what(); }

 private:
  Long number_;
  Long native_;
  String source_;
};

// The number of the message `id` as a failure of the library's own: 0x80040000 plus the id.
constexpr Long messageNumber(Long id) { return static_cast<Long>(0x80040000U + static_cast<std::uint32_t>(id)); }

// Failure numbers below the library: those of the database layer and of the run-time.
namespace number {
constexpr Long of(std::uint32_t value) { return static_cast<Long>(value); }

constexpr Long integrity = of(0x80040E2F);      // unique or primary key, NULL into not-null
constexpr Long statement = of(0x80040E14);      // syntax and every statement error without a number of its own
constexpr Long noTable = of(0x80040E37);        // unknown table or view
constexpr Long conversion = of(0x80040E07);     // a text that does not convert
constexpr Long range = of(0x80040E57);          // value out of range, text truncated
constexpr Long permission = of(0x80040E09);     // permission denied
constexpr Long login = of(0x80040E4D);          // log-in failed, database cannot be opened
constexpr Long timeout = of(0x80040E31);        // command time-out
constexpr Long general = of(0x80004005);        // server not reachable, no data source, deadlock
constexpr Long noField = of(0x800A0CC1);        // field not in the row set
constexpr Long closed = of(0x800A0E78);         // operation on a closed object
constexpr Long open = of(0x800A0E79);           // operation that only a closed object allows
constexpr Long noRow = of(0x800A0BCD);          // before the first or behind the last row
constexpr Long readOnly = of(0x800A0CB3);       // a row that cannot be written back
constexpr Long context = of(0x800A0C93);        // walking back over rows that nobody kept
constexpr Long noTransaction = of(0x8004D00E);  // ending a transaction that was not begun
constexpr Long inTransaction = of(0x8004D013);  // beginning a second transaction

constexpr Long argument = 5;
constexpr Long overflow = 6;
constexpr Long memory = 7;
constexpr Long position = 9;
constexpr Long type = 13;
constexpr Long internal = 51;
constexpr Long noFile = 53;
constexpr Long accessDenied = 70;
constexpr Long pathAccess = 75;
constexpr Long noPath = 76;
constexpr Long noObject = 91;
constexpr Long nullUse = 94;
constexpr Long keyExists = 457;
}  // namespace number

// A run-time failure with its usual text: 6 "Overflow", 9 "Subscript out of range", 13 "Type mismatch" and so on.
QVSA_EXPORT Failure runtimeFailure(Long runtimeNumber, Long native = 0);

// What is being handled in a catch block, as a failure: one of ours as it is, 7 for want of memory, 51 for any other.
QVSA_EXPORT Failure currentFailure();
// The number and text of that. Where there is no memory for the text, those of want of memory.
QVSA_EXPORT void tellCurrentFailure(Long& number, String& description) noexcept;

}  // namespace QVSa
