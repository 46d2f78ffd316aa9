#include <atomic>
#include <cmath>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include "bindings/c/Handles.h"
#include "bindings/c/qvsa.h"

namespace QVSa {
namespace {

class Interface : public testing::Test {
 protected:
  ~Interface() override {
    for (qvsa_value& value : made_) qvsa_release(&value);
  }
  qvsa_object make(const char* name) {
    EXPECT_EQ(qvsa_create(name, &made_.emplace_back()), QVSA_OK);
    return made_.back().as.object;
  }
  int set(qvsa_object object, const char* property, const qvsa_value& value) {
    return qvsa_set(object, property, &value);
  }
  int call(qvsa_object object, const char* operation, std::vector<qvsa_value> arguments) {
    return qvsa_call(object, operation, arguments.data(), arguments.size(), nullptr);
  }

 private:
  std::vector<qvsa_value> made_;
};

TEST_F(Interface, WhatWasReleasedOrNeverGivenIsRefused) {
  qvsa_value role;
  qvsa_value value;
  ASSERT_EQ(qvsa_create("Role", &role), QVSA_OK);
  ASSERT_EQ(set(role.as.object, "Name", qvsa_text("Clerk")), QVSA_OK);
  ASSERT_EQ(qvsa_get(role.as.object, "Name", &value), QVSA_OK);

  // A copy is the same thing, and a text is no object.
  qvsa_value copy = value;
  EXPECT_EQ(qvsa_get(value.owner, "Name", &copy), QVSA_HANDLE);
  copy = value;
  EXPECT_EQ(qvsa_release(&value), QVSA_OK);
  EXPECT_EQ(qvsa_release(&copy), QVSA_HANDLE);
  EXPECT_EQ(qvsa_release(&copy), QVSA_OK) << "a released value is empty";

  copy = role;
  EXPECT_EQ(qvsa_release(&role), QVSA_OK);
  const qvsa_object another = make("Role");  // in the place of the first
  EXPECT_EQ(qvsa_get(copy.as.object, "Name", &value), QVSA_HANDLE);
  EXPECT_EQ(qvsa_release(&copy), QVSA_HANDLE);
  const qvsa_object next = another + (qvsa_object{1} << 32);
  for (const qvsa_object made_up : {qvsa_object{0}, qvsa_object{1}, another + 1, next, ~qvsa_object{0}}) {
    EXPECT_EQ(qvsa_get(made_up, "Name", &value), QVSA_HANDLE);
    EXPECT_EQ(value.kind, QVSA_EMPTY);
  }

  // Objects of the wrong class, and walks, which are for qvsa_next alone.
  EXPECT_EQ(call(make("User"), "setDept", {qvsa_handle(another)}), QVSA_TYPE);
  EXPECT_EQ(call(make("User"), "setDept", {qvsa_handle(0)}), QVSA_TYPE);
  EXPECT_EQ(call(make("User"), "setDept", {qvsa_handle(next)}), QVSA_HANDLE);
  qvsa_value walk;
  EXPECT_EQ(qvsa_enumerate(another, &walk), QVSA_NO_MEMBER);
  ASSERT_EQ(qvsa_enumerate(make("Roles"), &walk), QVSA_OK);
  EXPECT_EQ(qvsa_get(walk.as.object, "Name", &value), QVSA_HANDLE);
  EXPECT_EQ(qvsa_next(another, &value), QVSA_HANDLE);
  EXPECT_EQ(qvsa_release(&walk), QVSA_OK);
  EXPECT_EQ(qvsa_next(walk.as.object, &value), QVSA_HANDLE);
}

TEST_F(Interface, AValueThatDoesNotFitIsRefusedAndNothingIsChanged) {
  const qvsa_object rule = make("safeRule");
  const qvsa_object schedule = make("cSchedule");
  const qvsa_object role = make("Role");
  ASSERT_EQ(set(rule, "minLen", qvsa_long(-32768)), QVSA_OK);
  ASSERT_EQ(set(role, "Name", qvsa_text("Clerk")), QVSA_OK);

  qvsa_value fraction = qvsa_empty();
  fraction.kind = QVSA_DOUBLE;
  fraction.as.double_ = 1.5;
  qvsa_value noMemory = qvsa_text(nullptr);
  noMemory.as.text.length = 5;
  qvsa_value unknown = qvsa_empty();
  unknown.kind = 99;
  for (const qvsa_value& value : {qvsa_long(32768), fraction, qvsa_text("5"), qvsa_boolean(1), qvsa_empty(), unknown})
    EXPECT_EQ(set(rule, "minLen", value), QVSA_TYPE);
  for (const double days : {std::nan(""), HUGE_VAL}) EXPECT_EQ(set(schedule, "StartTime", qvsa_date(days)), QVSA_TYPE);
  for (const qvsa_value& value : {qvsa_text("a\xFF"), qvsa_text("\xED\xA0\x80"), noMemory, qvsa_long(1)})
    EXPECT_EQ(set(role, "Name", value), QVSA_TYPE);

  qvsa_value value;
  ASSERT_EQ(qvsa_get(rule, "minLen", &value), QVSA_OK);
  EXPECT_EQ(value.as.integer, -32768);
  ASSERT_EQ(qvsa_get(role, "Name", &value), QVSA_OK);
  EXPECT_STREQ(value.as.text.data, "Clerk");
  EXPECT_EQ(qvsa_release(&value), QVSA_OK);

  EXPECT_EQ(qvsa_get(role, nullptr, &value), QVSA_POINTER);
  EXPECT_EQ(qvsa_call(role, "Delete", nullptr, 1, &value), QVSA_POINTER);
  EXPECT_EQ(qvsa_create("Rolle", &value), QVSA_NO_CLASS);
  EXPECT_EQ(qvsa_get(role, "Save", &value), QVSA_NO_MEMBER);
  EXPECT_EQ(call(role, std::string(5000, 'x').c_str(), {}), QVSA_NO_MEMBER);
  EXPECT_EQ(std::string(qvsa_error_text()).size(), 1023U);
}

TEST_F(Interface, AnOperationThatRaisesTellsTheNumberAndOneThatFailsDoesNot) {
  const qvsa_object departments = make("Departments");
  EXPECT_EQ(call(departments, "Add", {qvsa_text("S1"), qvsa_text("Sales")}), QVSA_RAISED);
  EXPECT_EQ(qvsa_error_number(), 13);
  EXPECT_STREQ(qvsa_error_text(), "Type mismatch");

  // No database was named.
  qvsa_value number;
  EXPECT_EQ(call(departments, "GetAll", {}), QVSA_OK);
  ASSERT_EQ(qvsa_get(departments, "errNumber", &number), QVSA_OK);
  EXPECT_NE(number.as.long_, 0);
}

TEST_F(Interface, AnObjectInACallIsBusyForEveryOtherCall) {
  const qvsa_object department = make("Department");
  qvsa_value value;
  {
    const binding::Use call(department);
    EXPECT_EQ(qvsa_get(department, "Name", &value), QVSA_BUSY);
    EXPECT_EQ(this->call(make("User"), "setDept", {qvsa_handle(department)}), QVSA_BUSY);
  }
  EXPECT_EQ(call(make("User"), "setDept", {qvsa_handle(department)}), QVSA_OK);
}

TEST_F(Interface, AChildOfABusyProcessUsesWhatItHasInherited) {
  const qvsa_object role = make("Role");
  qvsa_value name;  // the child then finds all the memory that it needs
  ASSERT_EQ(qvsa_get(role, "Name", &name), QVSA_OK);
  std::atomic<bool> done = false;
  std::thread busy([&] {
    for (qvsa_value value; !done; qvsa_release(&value)) qvsa_create("Role", &value);
  });
  for (int i = 0; i < 50; ++i) {
    const pid_t child = fork();
    if (child == 0) {
      alarm(20);
      qvsa_value value;
      _exit(qvsa_get(role, "Name", &value));
    }
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_EQ(status, 0);
  }
  done = true;
  busy.join();
}

}  // namespace
}  // namespace QVSa
