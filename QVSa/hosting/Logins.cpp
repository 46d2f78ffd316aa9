#include "QVSa/hosting/Logins.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/hosting/internal/LoginConnection.h"
#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

void requireScrambled(const String& password) {
  try {
    scrambleText(password);
  } catch (const Failure& failure) {
    throw Failure(failure.number(), "Logins",
                  "This password can't be scrambled into a server text: choose another one.");
  }
}

}  // namespace

Boolean Logins::setPassword(const String& login, const String& password, const String& asLogin,
                            const String& asPassword) {
  return operation(plain(), [&] {
    if (!isPlainName(login))
      throw Failure(number::argument, "Logins", "The name of a log-in is letters, digits and _.");
    if (password.empty() || password.find(';') != String::npos || password != trimRight(password))
      throw Failure(number::argument, "Logins",
                    "The password of a log-in is not empty, holds no semicolon and ends with no blank.");
    if (sameText(login, "QVUser")) requireScrambled(password);
    Connection connection = openAs(server(), asLogin, asPassword);
    connection.Execute(sql("alter login " + login + " with password=<password>").secret("password", password));
    return true;
  });
}

}  // namespace QVSa
