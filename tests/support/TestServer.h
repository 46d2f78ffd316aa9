#pragma once

#include <map>
#include <vector>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/internal/Providers.h"

namespace QVSa::test {

// Whether the tests run against the SQL Server that QVSA_TEST_SERVER names ("host,port"), in place of the embedded
// engine.
bool onServer();
// Why a test is skipped there that reads a time which nobody wrote.
inline constexpr const char* serversClock = "defaults of columns have the server's clock";

// The three databases on that server: made by the library itself at their first use in this program, and removed at its
// end with the log-in QVUser, if that was made here. A server that has one of them already is refused: it may be
// somebody's. While a FakeClock stands, getdate() in a statement is its time; in a column's default it is the server's.
class TestServer {
 public:
  // Throws where the server can't be used.
  static TestServer& instance();

  String server() const { return server_; }
  // QVSA_TEST_PASSWORD, of the log-in sa.
  String administratorPassword() const { return password_; }
  String administratorString(const String& database) const;

  void ship();   // the databases as they are shipped
  void empty();  // no tables, views and synonyms
 private:
  // The tables, views and synonyms of a database by name, each with the word that drops it.
  using Objects = std::map<String, String>;

  TestServer();
  ~TestServer();
  TestServer(const TestServer&) = delete;
  TestServer& operator=(const TestServer&) = delete;

  void refuseOthers();
  void make();
  void remove() noexcept;
  Connection open(const String& database) const;
  static Objects objects(Connection& connection);
  static void drop(Connection& connection, const Objects& objects);

  SessionOpener before_;
  String server_;
  String password_;
  bool hasMadeLogin_ = false;
  std::vector<Objects> shipped_;
};

}  // namespace QVSa::test
