#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include "bindings/c/qvsa.h"

namespace QVSa {
namespace {

using Json = nlohmann::json;

const Json& classes() {
  static const Json description = Json::parse(qvsa_describe());
  return description["classes"];
}

// An object of a class that goes with it.
class Made {
 public:
  explicit Made(const std::string& name) { EXPECT_EQ(qvsa_create(name.c_str(), &value_), QVSA_OK) << name; }
  ~Made() { qvsa_release(&value_); }
  Made(const Made&) = delete;
  Made& operator=(const Made&) = delete;
  qvsa_object handle() const { return value_.as.object; }

 private:
  qvsa_value value_{};
};

// A value of a type that differs from what a new object has.
qvsa_value valueOf(const std::string& type) {
  if (type == "Boolean") return qvsa_boolean(1);
  if (type == "Date") return qvsa_date(45000.5);
  if (type == "String") return qvsa_text("h\xC3\xA4lt");
  return qvsa_long(7);
}

// One that no member of the type takes.
qvsa_value wrongFor(const std::string& type) {
  qvsa_value array = qvsa_empty();
  array.kind = QVSA_ARRAY;
  return type == "Variants" ? qvsa_text("x") : array;
}

Json plain(const qvsa_value& value) {
  switch (value.kind) {
    case QVSA_BOOLEAN:
      return value.as.boolean != 0;
    case QVSA_INTEGER:
      return value.as.integer;
    case QVSA_LONG:
      return value.as.long_;
    case QVSA_DATE:
      return value.as.date;
    case QVSA_TEXT:
      return std::string(value.as.text.data, value.as.text.length);
    default:
      return "of kind " + std::to_string(value.kind);
  }
}

std::string upper(std::string name) {
  for (char& c : name) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return name;
}

bool isValue(const std::string& type) {
  return type == "Boolean" || type == "Integer" || type == "Long" || type == "Date" || type == "String";
}

void expectCode(int code, qvsa_code expected) {
  EXPECT_EQ(code, expected) << qvsa_error_text();
  EXPECT_STRNE(qvsa_error_text(), "");
}

void testProperty(qvsa_object object, const Json& property) {
  const std::string name = upper(property["name"]);
  const std::string type = property["type"];
  SCOPED_TRACE(name);
  qvsa_value given = valueOf(type);
  if (!property["write"]) {
    expectCode(qvsa_set(object, name.c_str(), &given), QVSA_ACCESS);
  } else {
    const qvsa_value wrong = wrongFor(type);
    expectCode(qvsa_set(object, name.c_str(), &wrong), QVSA_TYPE);
    EXPECT_EQ(qvsa_set(object, name.c_str(), &given), isValue(type) ? QVSA_OK : QVSA_TYPE) << qvsa_error_text();
  }
  qvsa_value got;
  if (!property["read"]) return expectCode(qvsa_get(object, name.c_str(), &got), QVSA_ACCESS);
  ASSERT_EQ(qvsa_get(object, name.c_str(), &got), QVSA_OK) << qvsa_error_text();
  // The port of the directory server is the database's alone.
  if (property["write"] && isValue(type)) {
    EXPECT_EQ(plain(got), name == "LDPORT" ? Json(389) : plain(given));
  }
  EXPECT_EQ(qvsa_release(&got), QVSA_OK);
}

TEST(Description, EveryPropertyComesBackAsItWasSet) {
  ASSERT_EQ(classes().size(), 27U);
  for (const Json& described : classes()) {
    SCOPED_TRACE(described["name"]);
    const Made object(upper(described["name"]));
    for (const Json& property : described["properties"]) testProperty(object.handle(), property);
  }
}

void testOperation(qvsa_object object, const Json& operation) {
  const std::string name = upper(operation["name"]);
  SCOPED_TRACE(name);
  const Json& parameters = operation["arguments"];
  std::vector<qvsa_value> given;
  std::size_t required = 0;
  for (const Json& parameter : parameters) {
    given.push_back(wrongFor(parameter["type"]));
    if (!parameter["optional"]) ++required;
  }
  given.push_back(qvsa_empty());

  qvsa_value result;
  expectCode(qvsa_call(object, name.c_str(), given.data(), given.size(), &result), QVSA_COUNT);
  if (required > 0) expectCode(qvsa_call(object, name.c_str(), given.data(), required - 1, &result), QVSA_COUNT);
  // Each in turn is the only wrong one.
  for (std::size_t wrong = 0; wrong < parameters.size(); ++wrong) {
    SCOPED_TRACE(parameters[wrong]["name"]);
    for (std::size_t i = 0; i < parameters.size(); ++i)
      given[i] = i == wrong                       ? wrongFor(parameters[i]["type"])
                 : parameters[i]["optional"]      ? qvsa_empty()
                 : isValue(parameters[i]["type"]) ? valueOf(parameters[i]["type"])
                                                  : qvsa_empty();
    expectCode(qvsa_call(object, name.c_str(), given.data(), parameters.size(), &result), QVSA_TYPE);
  }
}

TEST(Description, EveryOperationRefusesAWrongCountAndAWrongType) {
  for (const Json& described : classes()) {
    SCOPED_TRACE(described["name"]);
    const Made object(described["name"].get<std::string>());
    for (const Json& operation : described["operations"]) testOperation(object.handle(), operation);
  }
}

}  // namespace
}  // namespace QVSa
