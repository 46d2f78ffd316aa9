#include <variant>

#include "QVSa/identity/User.h"

namespace QVSa {

struct User::Column {
  // As the tokens of the writing statements have it; rows find it without regard to case.
  const char* name;
  std::variant<String User::*, Boolean User::*, Integer User::*> member;
};

// In every statement that reads or writes accounts.
const User::Column User::accountColumns[] = {
    {"mobilePhone", &User::MobilePhone_}, {"email", &User::Email_},          {"useSms", &User::sendSms_},
    {"useKey", &User::keyLogin_},         {"uType", &User::uType_},          {"domain", &User::Domain_},
    {"company", &User::company_},         {"address", &User::Address_},      {"zipcode", &User::zipcode_},
    {"Telephone", &User::telePhone_},     {"isOuter", &User::isOuter_},      {"PwdNoChange", &User::PwdNoChange_},
    {"useOTPAuth", &User::useOTPAuth_},   {"OTPTokenId", &User::OTPTokenId_}};

// Not in the lists of users.
const User::Column User::furtherColumns[] = {
    {"ldsName", &User::ldsName_}, {"ldDn", &User::dn_}, {"ipList", &User::ipList_}, {"synLogin", &User::synLogin_}};

void User::readAccount(Recordset& row) {
  Name_ = row["userName"].asText();
  Login_ = row["userLogin"].asText();
  deptName_ = row["deptName"].asText();
  deptFullName_ = row["fullName"].asText();
  for (const Column& column : accountColumns) readColumn(column, row[column.name]);
}

void User::readFurther(Recordset& row) {
  for (const Column& column : furtherColumns) readColumn(column, row[column.name]);
}

void User::readColumn(const Column& column, const Field& field) {
  if (const auto* text = std::get_if<String User::*>(&column.member)) {
    this->** text = field.asText();
  } else if (const auto* flag = std::get_if<Boolean User::*>(&column.member)) {
    this->** flag = field.isOne();
  } else {
    this->*std::get<Integer User::*>(column.member) = field.asInteger();
  }
}

SqlText User::withColumns(SqlText statement) const {
  for (const Column& column : accountColumns) fillColumn(statement, column);
  for (const Column& column : furtherColumns) fillColumn(statement, column);
  return statement;
}

void User::fillColumn(SqlText& statement, const Column& column) const {
  if (const auto* text = std::get_if<String User::*>(&column.member)) {
    statement.text(column.name, this->**text);
  } else if (const auto* flag = std::get_if<Boolean User::*>(&column.member)) {
    statement.number(column.name, Long{this->**flag});
  } else {
    statement.number(column.name, this->*std::get<Integer User::*>(column.member));
  }
}

}  // namespace QVSa
