#pragma once

#include "QVSa/frame/Recordset.h"

namespace QVSa {

struct BatchResult;
class ProviderSession;

// A connection to a database, by ADO's names. Closes itself, and closing discards an open transaction.
//   Connection connection;
//   connection.Open(buildConnString(server, "", false));
//   Recordset rows = connection.Execute("select deptNo from departments");
// Every member but the properties throws Failure: 0x80004005 server not reachable, 0x80040E4D log-in or database
// refused, 0x800A0E78 not open, 0x800A0E79 open already, else the statement's own number.
class QVSA_EXPORT Connection {
 public:
  Connection();
  ~Connection();
  Connection(Connection&& other) noexcept;
  Connection& operator=(Connection&& other) noexcept;

  void Open(const String& ConnectionString);
  // Runs a batch of one or more statements and returns its first row set, closed where it has none.
  Recordset Execute(const String& CommandText, Long* RecordsAffected = nullptr);
  // Row sets that still stream from the connection are closed with it.
  void Close();
  // 1 open, 0 closed.
  Long State() const;

  // One level only: 0x8004D013 for a second BeginTrans, 0x8004D00E for an end without a beginning.
  void BeginTrans();
  void CommitTrans();
  void RollbackTrans();

  // A CursorLocationEnum; adUseServer by default.
  Long CursorLocation() const;
  void CursorLocation(Long value);
  // Seconds for one batch; 30 by default, 0 for no limit.
  Long CommandTimeout() const;
  void CommandTimeout(Long value);

 private:
  friend class Recordset;
  ProviderSession& session() const;
  void requireTransaction() const;
  BatchResult run(const String& text, bool updatable);
  AttachedRows attach(std::unique_ptr<Rows> rows);
  void disconnect() noexcept;

  std::unique_ptr<ProviderSession> session_;
  std::vector<std::weak_ptr<AttachedRows::element_type>> attached_;
  Long cursorLocation_ = 2;
  Long commandTimeout_ = 30;
  bool inTransaction_ = false;
};

}  // namespace QVSa
