#pragma once

#include <chrono>
#include <unistd.h>

#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

// A connection handle of the driver manager, open while it lives.
class Link {
 public:
  // Throws the failure of connecting; its text repeats neither `odbcText` nor `password`.
  Link(const String& odbcText, const String& password, std::chrono::seconds loginTimeout);
  ~Link();
  Link(const Link&) = delete;
  Link& operator=(const Link&) = delete;

  SQLHDBC handle() const { return handle_; }
  // False behind a fork: the socket is the parent's, and whatever the child sent there would break in on its talk.
  bool isOwn() const { return process_ == ::getpid(); }

 private:
  SQLHDBC handle_ = SQL_NULL_HDBC;
  pid_t process_ = ::getpid();
};

}  // namespace QVSa::odbc
