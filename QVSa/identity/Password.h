#pragma once

#include "QVSa/frame/Values.h"

namespace QVSa {

// A password in clear, for as long as an object needs one: its memory is overwritten on every change and at the end.
class Password {
 public:
  Password() = default;
  explicit Password(const String& text) : text_(text) {}
  // Overwrites `text`. A short one lies inside the string itself, where a plain move would leave it.
  explicit Password(String&& text);
  ~Password();
  Password(const Password& other) = default;
  Password& operator=(const Password& other);

  const String& text() const { return text_; }

 private:
  String text_;
};

}  // namespace QVSa
