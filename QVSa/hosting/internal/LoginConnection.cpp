#include "QVSa/hosting/internal/LoginConnection.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/values/Failure.h"

namespace QVSa {

Connection openAs(const String& server, const String& login, const String& password) {
  if ((login + password).find(';') != String::npos)
    throw Failure(number::argument, "Installation", "A log-in and its password must hold no semicolon.");
  Connection connection;
  connection.CommandTimeout(0);
  connection.Open("provider=sqloledb;data source=" + serverOnly(server) + ";database=master;uid=" + login +
                  ";pwd=" + password + ";");
  return connection;
}

}  // namespace QVSa
