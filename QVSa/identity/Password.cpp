#include "QVSa/identity/Password.h"

#include "platform/SecretMessage.h"

namespace QVSa {

Password::Password(String&& text) : text_(text) { platform::clearSecret(text); }

Password::~Password() { platform::clearSecret(text_); }

Password& Password::operator=(const Password& other) {
  if (this == &other) return *this;
  platform::clearSecret(text_);
  text_ = other.text_;
  return *this;
}

}  // namespace QVSa
