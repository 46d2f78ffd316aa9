#include "QVSa/frame/Frame.h"

#include <algorithm>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/resources/Messages.h"

namespace QVSa {
namespace {

// A server quotes any piece of a statement, cut at either end: the text ends before the first piece of a secret in it.
String withoutSecrets(String description, const std::vector<String>& secrets) {
  constexpr std::size_t telling = 6;
  for (const String& secret : secrets) {
    const std::size_t length = std::min(telling, secret.size());
    for (std::size_t at = 0; length > 0 && at + length <= description.size(); ++at) {
      if (secret.find(description.substr(at, length)) == String::npos) continue;
      description = description.substr(0, at) + "***";
      break;
    }
  }
  return description;
}

String prefixOf(const Handler& handler) {
  if (handler.prefix == 0) return {};
  const String message = LoadResString(handler.prefix);
  return (handler.fill == nullptr ? message : fillMsg(message, {*handler.fill})) + handler.between;
}

}  // namespace

Handler Handler::filledWith(const String& value) && {
  fill = &value;
  return *this;
}

Handler Handler::number(Long value) && {
  fixedNumber = value;
  return *this;
}

Handler Handler::onIntegrity(Long messageId) && {
  aloneOnIntegrity = messageId;
  return *this;
}

Handler plain() { return {}; }

Handler prefixed(Long messageId) {
  Handler handler;
  handler.prefix = messageId;
  return handler;
}

Handler prefixedBlank(Long messageId) {
  Handler handler = prefixed(messageId);
  handler.between = " ";
  return handler;
}

Handler silent() {
  Handler handler;
  handler.silent = true;
  return handler;
}

SqlText::SqlText(SQLFactory& factory, std::vector<String>& secrets, String text)
    : factory_(factory), secrets_(secrets), text_(std::move(text)) {
  factory_.Clear();
}

SqlText& SqlText::number(const String& name, const Variant& value) {
  factory_.AddPara(name, paraNumber, value, false, true);
  return *this;
}

SqlText& SqlText::text(const String& name, const Variant& value) {
  factory_.AddPara(name, paraText, value, false, true);
  return *this;
}

SqlText& SqlText::secret(const String& name, const String& value) {
  secrets_.push_back(value);
  return text(name, value);
}

SqlText& SqlText::date(const String& name, const Variant& value) {
  factory_.AddPara(name, paraDate, value, false, true);
  return *this;
}

SqlText& SqlText::list(const String& name, const String& value) {
  factory_.AddPara(name, paraList, value, false, true);
  return *this;
}

SqlText& SqlText::raw(const String& name, const String& value) {
  factory_.AddPara(name, paraVerbatim, value, false, true);
  return *this;
}

SqlText::operator String() const { return factory_.fill(text_); }

Boolean Frame::connect(const String& server, const String& DBName) {
  // What was connected before must not pass for this.
  connectionString_.clear();
  return operation(plain(), [&] {
    server_ = server;
    DBName_ = DBName;
    connectionString_ = buildConnString(server, DBName, false);
    return true;
  });
}

Connection Frame::open() const {
  Connection connection;
  connection.Open(connectionString_);
  return connection;
}

void Frame::note(Long messageId, std::initializer_list<Variant> fill) {
  note(messageNumber(messageId), fillMsg(LoadResString(messageId), fill));
}

void Frame::note(Long number, const String& description) {
  errNumber_ = number;
  errDescription_ = description;
}

Frame::Refusal Frame::refuse(Long messageId, const std::vector<Variant>& fill) {
  note(messageNumber(messageId), fillMsg(LoadResString(messageId), fill));
  return {};
}

Frame::Refusal Frame::refuseButFailures() {
  try {
    throw;
  } catch (const Failure& failure) {
    if (failure.number() != number::memory) throw;
    report(plain());
  } catch (...) {
    report(plain());
  }
  return {};
}

void Frame::fail(const String& source, Long messageId, const std::vector<Variant>& fill) {
  throw Failure(messageNumber(messageId), source, fillMsg(LoadResString(messageId), fill));
}

void Frame::report(const Handler& handler) noexcept {
  if (handler.silent) return;
  try {
    report(handler, currentFailure());
  } catch (...) {
    // The memory for the text was short.
    tellCurrentFailure(errNumber_, errDescription_);
  }
}

void Frame::report(const Handler& handler, const Failure& failure) {
  const bool alone = failure.number() == number::integrity && handler.aloneOnIntegrity != 0;
  const bool fixed = failure.number() != number::memory && handler.fixedNumber != 0;
  note(fixed ? handler.fixedNumber : failure.number(),
       alone ? LoadResString(handler.aloneOnIntegrity)
             : prefixOf(handler) + withoutSecrets(failure.description(), secrets_));
}

}  // namespace QVSa
