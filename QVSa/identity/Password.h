#pragma once

#include <utility>

#include "QVSa/frame/Values.h"

namespace QVSa {

// A password in clear, for as long as an object needs one: its memory is overwritten on every change and at the end.
class Password {
 public:
  Password() = default;
  explicit Password(String text) : text_(std::move(text)) {}
  ~Password();
  Password(const Password& other) = default;
  Password& operator=(const Password& other);

  const String& text() const { return text_; }

 private:
  String text_;
};

}  // namespace QVSa
