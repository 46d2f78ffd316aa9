#pragma once

#include <map>
#include <memory>
#include <vector>

#include "QVSa/values/Date.h"
#include "QVSa/values/Values.h"
#include "QVSa/values/Variant.h"

namespace QVSa {

class Connection;
class Recordset;
class Rows;
struct Column;

// How a row set may be walked and written. A keyset or dynamic cursor with a pessimistic or optimistic lock can be
// written back.
enum CursorTypeEnum : Long { adOpenForwardOnly = 0, adOpenKeyset = 1, adOpenDynamic = 2, adOpenStatic = 3 };
enum LockTypeEnum : Long { adLockReadOnly = 1, adLockPessimistic = 2, adLockOptimistic = 3 };
// Whether rows stream from the server, or the client keeps them, so that they can be counted and walked back.
enum CursorLocationEnum : Long { adUseServer = 2, adUseClient = 3 };

// A row set that lives on a connection, which empties it when it closes.
using AttachedRows = std::shared_ptr<std::unique_ptr<Rows>>;

// One column of a record set's current row. The plain readers take NULL as 0, False, the empty text and day 0.
// Throws 0x800A0BCD where there is no current row.
class QVSA_EXPORT Field {
 public:
  String Name() const;
  Variant Value() const;
  // Sets the value to be written by Recordset::Update. Throws 0x800A0CB3 where the row set cannot be written back.
  void Value(const Variant& value);
  // Bytes of a binary or text value (of a text its UTF-16 form); 0 for NULL. Throws 13 for any other.
  Long ActualSize() const;
  // Appends to a long column; the first call on a row replaces what was there.
  void AppendChunk(const Bytes& data);
  // The next `length` bytes, counted from where the last call on this row ended; fewer at the end, none behind it.
  Bytes GetChunk(Long length);

  bool isNull() const;
  Long asLong() const;
  Integer asInteger() const;
  Date asDate() const;
  String asText() const;
  // True for any number but 0.
  Boolean asBoolean() const;
  // The flag rule of most columns: True where the value is the number 1, or True itself.
  Boolean isOne() const;

 private:
  friend class Recordset;
  Field(Recordset& recordset, std::size_t ordinal) : recordset_(&recordset), ordinal_(ordinal) {}

  Recordset* recordset_;
  std::size_t ordinal_;
};

// A row set, by ADO's names: forward-only and streaming by default. With a static cursor, or on a connection whose
// cursor location is the client, it keeps its rows as they come, to be counted and walked back; with a dynamic cursor
// it streams in any case.
// Throws 0x800A0E78 on a closed one, 0x800A0CC1 for a field that it does not have.
class QVSA_EXPORT Recordset {
 public:
  Recordset();
  ~Recordset();
  Recordset(Recordset&& other) noexcept;
  Recordset& operator=(Recordset&& other) noexcept;

  // A CursorTypeEnum and a LockTypeEnum; -1 takes the property.
  void Open(const String& Source, Connection& ActiveConnection, Long CursorType = -1, Long LockType = -1);
  void Close();
  // 1 open, 0 closed.
  Long State() const;

  void CursorType(Long value);
  void LockType(Long value);
  // Detaches the row set from its connection: the rows from the current one on (all, where they were kept) are fetched
  // and stay readable after the connection closed. They are read-only.
  void ActiveConnection(std::nullptr_t);

  bool EOF_() const;
  // Each move writes the changes of the row that it leaves. MoveFirst throws 0x800A0C93 where rows were passed that
  // nobody kept.
  void MoveNext();
  void MoveFirst();
  void MoveLast();
  // -1 where the rows stream.
  Long RecordCount();

  std::size_t fieldCount() const;
  Field operator[](std::size_t ordinal);
  Field operator[](int ordinal);
  // By name without regard to case; the first of two columns of one name.
  Field operator[](const String& name);
  Field operator[](const char* name);

  // All rows from the current one on, one vector a row; none at the end. Stands at the end afterwards.
  std::vector<std::vector<Variant>> GetRows();
  // Writes the changed fields of the current row back. Nothing changed: nothing to do, at the end too. Rows are written
  // in reading order: one that was walked back to, or counted over, throws 0x800A0CB3.
  void Update();

 private:
  friend class Connection;
  friend class Field;
  using Row = std::vector<Variant>;

  struct Change {
    Variant value;
    bool pending = true;
  };
  struct Chunks {
    Bytes data;
    std::size_t position = 0;
    bool pending = false;
  };

  void start(AttachedRows source, bool keep);
  bool isOpen() const;
  bool isCurrent() const { return position_ < fetched_; }
  void requireOpen() const;
  void requireRow() const;
  void requireUpdatable() const;
  std::size_t ordinalOf(const String& name);
  Rows& source() const { return **source_; }
  Row sourceRow() const;
  bool fetch();
  void fetchAll();
  void keepFromHere();
  void moveTo(std::size_t position);
  Variant valueAt(std::size_t ordinal) const;
  void change(std::size_t ordinal, const Variant& value);
  void settle(std::size_t ordinal, const Variant& value);
  Chunks& chunksOf(std::size_t ordinal);
  void append(std::size_t ordinal, const Bytes& data);

  AttachedRows source_;                                // empty for a closed or detached row set
  std::vector<Column> columns_;                        // none: closed, or moved from
  std::vector<std::pair<String, std::size_t>> asked_;  // names of columns as they were asked for, and their ordinals
  std::size_t turn_ = 0;                               // in asked_
  std::size_t position_ = 0;                           // of the current row, counted from the first
  std::size_t fetched_ = 0;  // rows that the source gave; the current row is behind them at the end
  bool exhausted_ = false;
  std::vector<Row> kept_;
  std::size_t firstKept_ = 0;
  std::map<std::size_t, Change> changes_;
  std::map<std::size_t, Chunks> chunks_;
  bool keeps_ = false;
  bool updatable_ = false;
  Long cursorType_ = 0;
  Long lockType_ = 1;
};

}  // namespace QVSa
