#include "QVSa/frame/Password.h"

#include <utility>

#include "platform/SecretMessage.h"

namespace QVSa {

Password::Password(String&& text) : text_(text) { platform::clearSecret(text); }

Password::Password(Password&& other) noexcept {
  text_.swap(other.text_);
  other.clear();
}

Password::~Password() { clear(); }

Password& Password::operator=(Password other) noexcept {
  text_.swap(other.text_);
  return *this;
}

// The whole of the string's memory: a short text that was swapped out has left its bytes behind.
void Password::clear() noexcept {
  text_.resize(text_.capacity());
  platform::clearSecret(text_);
}

StoredPassword& StoredPassword::operator=(StoredPassword other) noexcept {
  clear_ = std::move(other.clear_);
  unread_ = std::move(other.unread_);
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
