#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// A password in clear, for as long as an object needs one: its memory is overwritten on every change and at the end.
class QVSA_EXPORT Password {
 public:
  Password() = default;
  explicit Password(const String& text) : text_(text) {}
  // Overwrites `text`. A short one lies inside the string itself, where a plain move would leave it.
  explicit Password(String&& text);
  ~Password();
  Password(const Password& other) = default;
  Password(Password&& other) noexcept;
  // All or nothing: a password that could not be copied must not turn into the empty one.
  Password& operator=(Password other) noexcept;

  const String& text() const { return text_; }

 private:
  void clear() noexcept;

  String text_;
};

// A password out of a table: in clear, and where the stored text does not decrypt, that text. Such a one equals no
// password, not even the empty one, and goes back into the table as it stands until another one is set.
class QVSA_EXPORT StoredPassword {
 public:
  StoredPassword() = default;
  explicit StoredPassword(const String& clear) : clear_(clear) {}
  StoredPassword(const StoredPassword& other) = default;
  StoredPassword(StoredPassword&& other) noexcept = default;
  StoredPassword& operator=(StoredPassword other) noexcept;
  // `secret`: what the text was encrypted under. Throws std::bad_alloc, and Failure 51 where the cipher can't
  // run.
  static StoredPassword read(const String& cipher, const String& secret);

  bool isReadable() const { return unread_.empty(); }
  // In clear; empty where it is not readable.
  const String& text() const { return clear_.text(); }
  bool is(const String& password) const { return isReadable() && password == text(); }
  // The text for the table. Throws as `read` does.
  String encrypted(const String& secret) const;

 private:
  Password clear_;
  String unread_;
};

}  // namespace QVSa
