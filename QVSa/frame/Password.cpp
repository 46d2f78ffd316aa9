#include "QVSa/frame/Password.h"

#include <utility>

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

StoredPassword StoredPassword::read(const String& cipher, const String& secret) {
  StoredPassword result;
  if (cipher.empty()) return result;
  if (auto clear = platform::decrypt(cipher, secret)) {
    result.clear_ = Password(*std::move(clear));
  } else {
    result.unread_ = cipher;
  }
  return result;
}

String StoredPassword::encrypted(const String& secret) const {
  return isReadable() ? platform::encryptText(text(), secret) : unread_;
}

}  // namespace QVSa
