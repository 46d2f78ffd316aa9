/* A department, a user in it, his sign-on, and the lists in which all that shows. */
#include <stdio.h>
#include <string.h>

#include "bindings/c/qvsa.h"

static char failed[600];

#define STEP(condition)                                                                         \
  do {                                                                                          \
    if (!(condition)) {                                                                         \
      snprintf(failed, sizeof failed, "%s, the last error: %s", #condition, qvsa_error_text()); \
      return failed;                                                                            \
    }                                                                                           \
  } while (0)

static const char* server_text;

static qvsa_object connected(const char* class_name) {
  qvsa_value object, place[2];
  place[0] = qvsa_text(server_text);
  place[1] = qvsa_text("QVApp");
  if (qvsa_create(class_name, &object) < 0) return 0;
  return qvsa_call(object.as.object, "connect", place, 2, NULL) < 0 ? 0 : object.as.object;
}

static int set(qvsa_object object, const char* property, qvsa_value value) {
  return qvsa_set(object, property, &value) == QVSA_OK;
}

static int release(qvsa_object object) {
  qvsa_value value = qvsa_handle(object);
  return qvsa_release(&value) == QVSA_OK;
}

/* Whether an operation was called and gave True. */
static int done(qvsa_object object, const char* operation, qvsa_value* arguments, size_t count) {
  qvsa_value result;
  return qvsa_call(object, operation, arguments, count, &result) == QVSA_OK && result.kind == QVSA_BOOLEAN &&
         result.as.boolean;
}

static int number_is(qvsa_object object, uint32_t number) {
  qvsa_value value;
  return qvsa_get(object, "errNumber", &value) == QVSA_OK && (uint32_t)value.as.long_ == number;
}

static int is_text(qvsa_value value, const char* expected) {
  return value.kind == QVSA_TEXT && strcmp(value.as.text.data, expected) == 0;
}

static int property_is(qvsa_object object, const char* property, const char* expected) {
  qvsa_value value;
  int same = qvsa_get(object, property, &value) == QVSA_OK && is_text(value, expected);
  return qvsa_release(&value) == QVSA_OK && same;
}

static const char* make_department(void) {
  qvsa_object sales = connected("Department");
  STEP(sales != 0);
  STEP(set(sales, "Id", qvsa_text("S1")) && set(sales, "Name", qvsa_text("Sales")));
  STEP(set(sales, "Super", qvsa_text("_root")));
  STEP(done(sales, "Save", NULL, 0));
  STEP(release(sales));
  return NULL;
}

static const char* make_user(void) {
  qvsa_value department[2], pass_check;
  qvsa_object sales = connected("Department"), user = connected("User");
  STEP(sales != 0 && user != 0);
  department[0] = qvsa_long(1);
  department[1] = qvsa_text("S1");
  STEP(done(sales, "GetOne", department, 2));
  STEP(set(user, "Name", qvsa_text("Ann")) && set(user, "Login", qvsa_text("ann")));
  STEP(set(user, "Pwd", qvsa_text("right")));
  department[0] = qvsa_handle(sales);
  STEP(done(user, "setDept", department, 1));
  pass_check = qvsa_boolean(1);
  STEP(done(user, "Save", &pass_check, 1));
  STEP(release(sales) && release(user));
  return NULL;
}

static const char* sign_on(void) {
  qvsa_value given[3], session, item, result;
  qvsa_object user = connected("user"), sessions;
  STEP(user != 0);
  given[0] = qvsa_text("ann");
  given[1] = qvsa_text("wrong");
  given[2] = qvsa_empty();
  STEP(!done(user, "loginAuth", given, 3));
  STEP(number_is(user, 0x80040452u));
  given[1] = qvsa_text("right");
  STEP(done(user, "LOGINAUTH", given, 3));
  STEP(property_is(user, "deptname", "Sales"));
  session = given[2];
  STEP(session.kind == QVSA_TEXT && session.as.text.length > 0);

  sessions = connected("Sessions");
  STEP(sessions != 0);
  STEP(qvsa_call(sessions, "Item", &session, 1, &item) == QVSA_OK);
  STEP(property_is(item.as.object, "UserLogin", "ann"));
  STEP(done(sessions, "Terminate", &session, 1));
  STEP(done(sessions, "GetAll", NULL, 0));
  STEP(qvsa_call(sessions, "Item", &session, 1, &result) == QVSA_RAISED && qvsa_error_number() == 5);
  STEP(property_is(item.as.object, "UserLogin", "ann")); /* the item outlives its collection's list */
  STEP(qvsa_release(&item) == QVSA_OK && qvsa_release(&session) == QVSA_OK);
  STEP(release(sessions) && release(user));
  return NULL;
}

static const char* read_lists(void) {
  qvsa_value zero = qvsa_long(0), member = qvsa_text("users"), rows, result, walk, item;
  qvsa_object users = connected("Users");
  int found = 0;
  STEP(users != 0);
  STEP(qvsa_call(users, "GetDataMember", &member, 1, &rows) == QVSA_OK && rows.kind == QVSA_EMPTY);
  STEP(qvsa_call(users, "GetList", &zero, 1, &result) == QVSA_OK && result.as.long_ == 2);
  STEP(qvsa_call(users, "GetDataMember", &member, 1, &rows) == QVSA_OK);
  STEP(rows.kind == QVSA_ARRAY && rows.as.array.length == 3); /* the names of the columns, Admin, Ann */
  STEP(rows.as.array.items[0].as.array.length == 7);
  STEP(is_text(rows.as.array.items[0].as.array.items[1], "userid"));
  STEP(qvsa_release(&rows) == QVSA_OK);

  STEP(done(users, "GetAll", NULL, 0));
  STEP(qvsa_enumerate(users, &walk) == QVSA_OK);
  STEP(qvsa_call(users, "Clear", NULL, 0, NULL) == QVSA_OK);
  for (;;) {
    STEP(qvsa_next(walk.as.object, &item) == QVSA_OK);
    if (item.kind == QVSA_EMPTY) break;
    found += property_is(item.as.object, "Login", "ann");
    STEP(qvsa_release(&item) == QVSA_OK);
  }
  STEP(found == 1);
  STEP(qvsa_release(&walk) == QVSA_OK && release(users));
  return NULL;
}

/* An end before the start is set to the empty date in the caller's list; a plan shares its schedule. */
static const char* change_by_reference(void) {
  qvsa_value six[6], list, cycle;
  qvsa_value schedule;
  qvsa_object log = connected("LogRecords"), plan = connected("BKPlan");
  int i;
  STEP(log != 0 && plan != 0);
  six[0] = qvsa_date(45010.0);
  six[1] = qvsa_date(45000.0);
  for (i = 2; i < 6; ++i) six[i] = qvsa_text("");
  list = qvsa_empty();
  list.kind = QVSA_ARRAY;
  list.as.array.items = six;
  list.as.array.length = 6;
  STEP(done(log, "GetLogByQuery", &list, 1));
  STEP(list.as.array.items != six && list.as.array.length == 6 && list.as.array.items[1].as.date == 2.0);
  STEP(qvsa_release(&list) == QVSA_OK);

  STEP(qvsa_get(plan, "schedule", &schedule) == QVSA_OK);
  STEP(set(schedule.as.object, "cycle", qvsa_long(2)));
  STEP(qvsa_release(&schedule) == QVSA_OK);
  STEP(qvsa_get(plan, "schedule", &schedule) == QVSA_OK);
  STEP(qvsa_get(schedule.as.object, "cycle", &cycle) == QVSA_OK && cycle.as.integer == 2);
  STEP(qvsa_release(&schedule) == QVSA_OK);
  STEP(qvsa_create("cSchedule", &schedule) == QVSA_OK);
  STEP(set(plan, "schedule", schedule));
  STEP(set(schedule.as.object, "cycle", qvsa_long(1)));
  STEP(qvsa_release(&schedule) == QVSA_OK);
  STEP(qvsa_get(plan, "schedule", &schedule) == QVSA_OK);
  STEP(qvsa_get(schedule.as.object, "cycle", &cycle) == QVSA_OK && cycle.as.integer == 1);
  STEP(qvsa_release(&schedule) == QVSA_OK && release(plan) && release(log));
  return NULL;
}

const char* walkRoad(const char* server) {
  const char* (*const parts[])(void) = {make_department, make_user, sign_on, read_lists, change_by_reference};
  size_t i;
  server_text = server;
  for (i = 0; i < sizeof parts / sizeof parts[0]; ++i) {
    const char* why = parts[i]();
    if (why != NULL) return why;
  }
  return NULL;
}
