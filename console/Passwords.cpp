#include "console/Passwords.h"

#include <algorithm>
#include <iostream>
#include <optional>
#include <random>
#include <termios.h>
#include <unistd.h>

#include "console/Answer.h"

namespace QVSa::console {

namespace {

bool onTerminal() { return isatty(STDIN_FILENO) != 0; }

// Turns the terminal's echo off for its own lifetime.
class Silence {
 public:
  Silence() {
    tcgetattr(STDIN_FILENO, &before_);
    termios silent = before_;
    silent.c_lflag &= ~static_cast<tcflag_t>(ECHO);
    tcsetattr(STDIN_FILENO, TCSAFLUSH, &silent);
  }
  ~Silence() { tcsetattr(STDIN_FILENO, TCSAFLUSH, &before_); }
  Silence(const Silence&) = delete;
  Silence& operator=(const Silence&) = delete;

 private:
  termios before_{};
};

std::optional<String> nextLine() {
  String line;
  if (!std::getline(std::cin, line)) return std::nullopt;
  if (!line.empty() && line.back() == '\r') line.pop_back();
  return line;
}

std::optional<String> askOnTerminal(const String& prompt) {
  std::cerr << prompt << ": " << std::flush;
  const Silence silence;
  auto line = nextLine();
  std::cerr << "\n";
  return line;
}

std::optional<String> ask(const String& prompt) { return onTerminal() ? askOnTerminal(prompt) : nextLine(); }

void confirm(const String& password) {
  if (!onTerminal() || password.empty()) return;
  if (askOnTerminal("Once more") != password) throw Misuse("The two passwords differ.");
}

}  // namespace

String askPassword(const String& prompt) {
  const auto password = ask(prompt);
  if (!password) throw Misuse("A password is needed on the standard input.");
  return *password;
}

String askNewPassword(const String& prompt) {
  const String password = askPassword(prompt);
  confirm(password);
  return password;
}

String askNewPasswordOrNone(const String& prompt) {
  const String password = ask(prompt).value_or("");
  confirm(password);
  return password;
}

// Characters that are easily mistaken for each other are left out, and ";", which ends a value of a connection string.
String makePassword(Integer minLen) {
  const String kinds[] = {"ABCDEFGHJKLMNPQRSTUVWXYZ", "abcdefghijkmnopqrstuvwxyz", "23456789", "-_+=.:!?"};
  std::random_device random;
  const auto below = [&](std::size_t limit) {
    return std::uniform_int_distribution<std::size_t>(0, limit - 1)(random);
  };
  const auto length = static_cast<std::size_t>(std::max<Integer>(minLen, 16));
  String password;
  while (password.size() < length) {
    const String& kind = kinds[password.size() < std::size(kinds) ? password.size() : below(3)];
    password += kind[below(kind.size())];
  }
  std::shuffle(password.begin(), password.end(), random);
  return password;
}

}  // namespace QVSa::console
