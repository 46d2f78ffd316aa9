#include "QVSa/hosting/SecretRotation.h"

#include "QVSa/frame/Password.h"
#include "QVSa/frame/Secrets.h"
#include "QVSa/hosting/internal/LoginConnection.h"

namespace QVSa {

namespace {

Failure refusal(const String& why) { return {number::argument, "SecretRotation", why}; }

String firstText(Connection& connection, const String& query) {
  Recordset row = connection.Execute(query);
  return row.EOF_() ? "" : row[0].asText();
}

}  // namespace

Boolean SecretRotation::rotate(const String& newFile, const String& saPassword) {
  return operation(plain(), [&] {
    const Secrets to = Secrets::ofFile(newFile);
    if (logsIn(to)) throw refusal("The log-in has the password of these secrets already.");
    Connection connection = openSystem(saPassword);
    connection.BeginTrans();
    moveTexts(connection, to);
    connection.Execute(sql("alter login QVUser with password=<pwd>").secret("pwd", to.loginPassword()));
    connection.CommitTrans();
    return true;
  });
}

Boolean SecretRotation::rotateTexts(const String& newFile, const String& saPassword) {
  return operation(plain(), [&] {
    const Secrets to = Secrets::ofFile(newFile);
    Connection connection = openSystem(saPassword);
    connection.BeginTrans();
    moveTexts(connection, to);
    connection.CommitTrans();
    return true;
  });
}

Connection SecretRotation::openSystem(const String& saPassword) const {
  Connection connection = openAs(server(), "sa", saPassword);
  connection.Execute("use QVSys");
  return connection;
}

Boolean SecretRotation::logsIn(const Secrets& secrets) const try {
  openAs(server(), "QVUser", secrets.loginPassword());
  return true;
} catch (const Failure& failure) {
  if (failure.number() == number::login) return false;
  throw;
}

void SecretRotation::moveTexts(Connection& connection, const Secrets& to) {
  moved_ = 0;
  unread_.clear();
  const Secrets& from = deploymentSecrets();

  moveText(connection, "select top 1 isnull(protectPwd,'') from QVTmpSafe", "update QVTmpSafe set protectPwd=<text>",
           from.templatePwdKey, to.templatePwdKey, "the template password");
  moveText(connection, "select isnull(roleSpec,'') from roles where roleId=4",
           "update roles set roleSpec=<text> where roleId=4", from.backupLockKey(), to.backupLockKey(),
           "the lock of the backups");
  moveTemplates(connection, to);
}

void SecretRotation::moveText(Connection& connection, const String& query, const String& update, const String& oldKey,
                              const String& newKey, const String& name) {
  const String cipher = firstText(connection, query);
  if (cipher.empty()) return;
  connection.Execute(sql(update).secret("text", movedText(cipher, oldKey, newKey, name)));
}

void SecretRotation::moveTemplates(Connection& connection, const Secrets& to) {
  const Secrets& from = deploymentSecrets();
  std::vector<std::pair<String, String>> templates;
  for (Recordset row = connection.Execute("select rtUid,rtPwd from repTmps where rtPwd is not null and rtPwd<>''");
       !row.EOF_(); row.MoveNext())
    templates.emplace_back(row["rtUid"].asText(), row["rtPwd"].asText());
  for (const auto& [id, cipher] : templates) {
    // A template that nobody gave a password keeps being one.
    const bool isDefault = StoredPassword::read(cipher, from.templatePwdKey).is(from.defaultTemplatePwd);
    String moved = movedText(cipher, from.templatePwdKey, to.templatePwdKey, "the template " + id);
    if (isDefault) moved = StoredPassword(to.defaultTemplatePwd).encrypted(to.templatePwdKey);
    connection.Execute(sql("update repTmps set rtPwd=<pwd> where rtUid=<id>").secret("pwd", moved).text("id", id));
  }
}

String SecretRotation::movedText(const String& cipher, const String& oldKey, const String& newKey, const String& name) {
  const auto stored = StoredPassword::read(cipher, oldKey);
  if (stored.isReadable()) {
    ++moved_;
  } else {
    unread_.push_back(name);
  }
  return stored.encrypted(newKey);
}

}  // namespace QVSa
