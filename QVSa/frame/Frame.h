#pragma once

#include <initializer_list>
#include <new>
#include <utility>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/SQLFactory.h"
#include "QVSa/resources/MessageId.h"
#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"

namespace QVSa {

// How an operation reports the failure that ended it, made by plain(), prefixed() or prefixedBlank(). It is made before
// the operation begins, where nothing may fail: it names its texts and holds none.
struct Handler {
  Long prefix = 0;               // the message before the failure's text; 0: none
  const String* fill = nullptr;  // what the prefix's place is filled with
  const char* between = "";      // the prefix and the failure's text
  Long fixedNumber = 0;          // reported in place of the failure's number, where not 0; want of memory stays 7
  Long aloneOnIntegrity = 0;     // the message told alone where a key or a not-null column refused the write; 0: none
  bool silent = false;           // the error values stay untouched

  Handler filledWith(const String& value) &&;
  Handler number(Long value) &&;
  Handler onIntegrity(Long messageId) &&;
};

// The failure's number and text as they are.
Handler plain();
// The text of a message directly before the failure's text.
Handler prefixed(Long messageId);
// The same with a blank between.
Handler prefixedBlank(Long messageId);
// Nothing is reported; the result alone tells.
Handler silent();

// A statement text whose tokens are filled by the object's factory, in one pass and with the usual flags: an empty text
// goes as an empty text and not as NULL, trailing blanks are cut. Throws Failure for a value that has no literal.
class QVSA_EXPORT SqlText {
 public:
  SqlText(SQLFactory& factory, std::vector<String>& secrets, String text);
  SqlText& number(const String& name, const Variant& value);
  SqlText& text(const String& name, const Variant& value);
  // A password as it is stored. A server may quote a piece of it, now or in a later statement of the operation: the
  // object's error text then ends before that piece.
  SqlText& secret(const String& name, const String& value);
  SqlText& date(const String& name, const Variant& value);
  SqlText& list(const String& name, const String& value);
  // SQL of the caller's own: a list of ids, a part of a condition. It goes into the statement as it is.
  SqlText& raw(const String& name, const String& value);
  operator String() const;

 private:
  SQLFactory& factory_;
  std::vector<String>& secrets_;
  String text_;
};

// The common stock of the public classes: where the database is, the last failure, the shape of an operation.
class QVSA_EXPORT Frame {
 protected:
  Frame() = default;
  // A copy is an object of its own with the same values.
  Frame(const Frame&) = default;
  Frame& operator=(const Frame&) = default;
  ~Frame() = default;

  // The number and text of this object's last failure. A success does not clear them.
  Long errNumber() const { return errNumber_; }
  String errDescription() const { return errDescription_; }

  // Keeps both names and builds the connection string; opens nothing. An empty DBName means QVSys. Both go into the
  // string as they are and must hold no semicolon.
  Boolean connect(const String& server, const String& DBName = "");

  const String& server() const { return server_; }
  const String& DBName() const { return DBName_; }
  void setServer(const String& value) { server_ = value; }
  void setDBName(const String& value) { DBName_ = value; }
  const String& connectionString() const { return connectionString_; }
  void setConnectionString(const String& value) { connectionString_ = value; }
  // Connects another object to the same place. A False of it is its own affair, but for want of memory: an object that
  // is not connected must not be handed out or used.
  template <class Other>
  void connectAlike(Other& other) const {
    if (!other.connect(server_, DBName_) && other.errNumber() == number::memory) throw std::bad_alloc();
  }

  // An open connection on the object's own string.
  Connection open() const;
  // Clears the object's factory and starts a statement on it.
  SqlText sql(const String& text) { return SqlText(factory_, secrets_, text); }

  // Runs `body` and returns its result. A failure is turned into the two error values by `handler`, and the result is
  // the body type's negative one: False, the empty text, no object. A body that also refuses names its type:
  //   return operation(plain(), [&]() -> Boolean {
  //     if (Id().empty()) return refuse(message::departmentIncomplete);
  //     ...
  //     return true;
  //   });
  template <class Body>
  auto operation(const Handler& handler, Body&& body) {
    decltype(body()) result{};
    attempt(handler, [&] { result = body(); });
    return result;
  }

  // The same for operations whose failure has a result of its own: `result` as the body last left it.
  template <class Result, class Body>
  Result operation(const Handler& handler, Result result, Body&& body) {
    attempt(handler, [&] { body(result); });
    return result;
  }

  // Sets the error values to a message's number and text; the operation goes on.
  void note(Long messageId, std::initializer_list<Variant> fill = {});
  void note(Long number, const String& description);

  // Sets the error values and gives the negative result of whatever type the operation has.
  struct Refusal {
    operator Boolean() const { return false; }
    operator String() const { return {}; }
    template <class Record>
    operator std::shared_ptr<Record>() const {
      return nullptr;
    }
  };
  Refusal refuse(Long messageId, const std::vector<Variant>& fill = {});
  // Takes over the error values of another object of the library.
  template <class Other>
  Refusal refuseAs(const Other& other) {
    note(other.errNumber(), other.errDescription());
    return {};
  }

  // The end of an operation without a handler, from its catch block: a failure passes on to the caller; want of memory,
  // and what no part of the library has thrown, are reported as they are.
  Refusal refuseButFailures();

  // A refusal that passes through the operation's handler, and so gets its prefix.
  [[noreturn]] static void fail(const String& source, Long messageId, const std::vector<Variant>& fill = {});

 private:
  template <class Body>
  void attempt(const Handler& handler, Body&& body) {
    // One operation may call another one of its object.
    std::vector<String> callersSecrets = std::exchange(secrets_, {});
    try {
      body();
    } catch (...) {
      report(handler);
    }
    secrets_ = std::move(callersSecrets);
  }
  // Of what is being handled.
  void report(const Handler& handler) noexcept;
  void report(const Handler& handler, const Failure& failure);

  String server_;
  String DBName_;
  String connectionString_;
  SQLFactory factory_;
  std::vector<String> secrets_;  // that the running operation has sent
  Long errNumber_ = 0;
  String errDescription_;
};

}  // namespace QVSa
