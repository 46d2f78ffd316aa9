/* QVSa for C and every language that calls C: the public classes, their properties and their operations, by name.
 *
 *   qvsa_value user, result, arguments[3] = {qvsa_text("ann"), qvsa_text(password), qvsa_empty()};
 *   qvsa_value place[2] = {qvsa_text("file:/var/lib/qvsa"), qvsa_text("QVApp")};
 *   if (qvsa_create("User", &user) < 0) complain(qvsa_error_text());
 *   qvsa_call(user.as.object, "connect", place, 2, NULL);
 *   if (qvsa_call(user.as.object, "loginAuth", arguments, 3, &result) < 0) complain(qvsa_error_text());
 *   else if (result.as.boolean) welcome(arguments[2].as.text.data);      (the session id came back by reference)
 *   qvsa_release(&arguments[2]);
 *   qvsa_release(&user);
 *
 * What the classes do, their headers tell; qvsa_describe() lists classes, members, arguments, types and defaults. Names
 * are taken without regard to case.
 *
 * Failures. Two things are apart. A call that could not be made gives a negative code, and qvsa_error_text() says why;
 * nothing has been done then. A call that was made gives 0, and an operation that failed tells so by its result, as
 * False, and by the properties errNumber and errDescription of the object.
 *
 * Memory. What the library puts into a value, objects among it, is the caller's until qvsa_release() of that value;
 * there is no other call that frees anything. What the caller puts in stays the caller's; the library copies it and
 * keeps no pointer. An object stays alive while a handle to it is held or another object needs it, so that an item
 * outlives its collection. A handle or value that was released, or never was one, is refused with QVSA_HANDLE.
 *
 * Threads. Any thread may call. One object is for one thread at a time; a call on an object that is in the middle of
 * another call is refused with QVSA_BUSY, but what one object holds of another, as the schedule of a plan, is not
 * watched. The last error is each thread's own. No thread is started, no signal handled. After a fork without an exec
 * the child may use the objects that it has inherited, but the embedded engine refuses it.
 */
#ifndef QVSA_H
#define QVSA_H

#include <stddef.h>
#include <stdint.h>
#include <string.h>

#ifdef __cplusplus
extern "C" {
#define QVSA_NOEXCEPT noexcept
#else
#define QVSA_NOEXCEPT
#endif

#if defined(__GNUC__)
#define QVSA_API __attribute__((visibility("default")))
#else
#define QVSA_API
#endif

/* Numbers never change; new ones go to the end. */
enum qvsa_code {
  QVSA_OK = 0,
  QVSA_NO_CLASS = -1,  /* no class of that name */
  QVSA_NO_MEMBER = -2, /* no property or operation of that name */
  QVSA_ACCESS = -3,    /* a property that can't be read, or can't be set */
  QVSA_COUNT = -4,     /* too few or too many arguments */
  QVSA_TYPE = -5,      /* a value of the wrong kind, out of range, or a text that is no UTF-8 */
  QVSA_HANDLE = -6,    /* no object, or one that was released */
  QVSA_BUSY = -7,      /* another call runs on the object */
  QVSA_RAISED = -8,    /* the operation raised: qvsa_error_number() tells the failure's number; 7 is want of memory */
  QVSA_POINTER = -9    /* a null pointer where there must be none */
};

enum qvsa_kind {
  QVSA_EMPTY = 0, /* no value; as an argument: left out */
  QVSA_NULL = 1,  /* the database's NULL */
  QVSA_BOOLEAN = 2,
  QVSA_INTEGER = 3,
  QVSA_LONG = 4,
  QVSA_DOUBLE = 5,
  QVSA_DATE = 6,
  QVSA_TEXT = 7,
  QVSA_BYTES = 8,
  QVSA_OBJECT = 9,
  QVSA_ARRAY = 10
};

/* An object of the library; 0 is no object. */
typedef uint64_t qvsa_object;

typedef struct qvsa_string {
  const char* data; /* UTF-8. A text of the library's has a zero byte behind it. */
  size_t length;    /* in bytes */
} qvsa_string;

typedef struct qvsa_bytes {
  const uint8_t* data;
  size_t length;
} qvsa_bytes;

typedef struct qvsa_array {
  const struct qvsa_value* items;
  size_t length;
} qvsa_array;

typedef struct qvsa_value {
  int32_t kind;   /* a qvsa_kind */
  uint64_t owner; /* the library's; 0 in a value that the caller makes */
  union {
    int32_t boolean; /* 0 or not */
    int16_t integer;
    int32_t long_;
    double double_;
    double
        date; /* days since 1899-12-30; before that day the fraction still counts forward: -1.25 is 06:00 of day -1 */
    qvsa_string text;
    qvsa_bytes bytes;
    qvsa_object object;
    qvsa_array array;
  } as;
} qvsa_value;

/* Makes an object of a class. */
QVSA_API int qvsa_create(const char* class_name, qvsa_value* object) QVSA_NOEXCEPT;

/* Releases what the library has put into `value`, an object too, and leaves it empty. */
QVSA_API int qvsa_release(qvsa_value* value) QVSA_NOEXCEPT;

/* A whole number of any kind is taken where it fits. */
QVSA_API int qvsa_get(qvsa_object object, const char* property, qvsa_value* value) QVSA_NOEXCEPT;
QVSA_API int qvsa_set(qvsa_object object, const char* property, const qvsa_value* value) QVSA_NOEXCEPT;

/* Calls an operation. Optional arguments may be left out at the end, or anywhere by an empty value. Those by reference
 * come back changed in `arguments`: what the library had put there is released, what the caller had is not. An empty
 * value stands for one without a value yet. `result` may be null.
 * A record set comes as an array of rows, itself arrays; the first holds the names of the columns. A closed one is
 * empty. */
QVSA_API int qvsa_call(qvsa_object object, const char* operation, qvsa_value* arguments, size_t count,
                       qvsa_value* result) QVSA_NOEXCEPT;

/* Starts a walk over the items that a collection has now. The walk is an object, for qvsa_next() alone. */
QVSA_API int qvsa_enumerate(qvsa_object collection, qvsa_value* walk) QVSA_NOEXCEPT;
/* The next item; empty behind the last one. */
QVSA_API int qvsa_next(qvsa_object walk, qvsa_value* item) QVSA_NOEXCEPT;

/* All classes as JSON, in UTF-8; it stays as long as the library does. Null for want of memory.
 *   {"version", "enumerations": [{"name", "values": [{"name", "value"}]}],
 *    "classes": [{"name", "items": class of the items or null,
 *      "properties": [{"name", "type", "read", "write"}],
 *      "operations": [{"name", "result", "failure": [results that mean failure],
 *        "arguments": [{"name", "type", "optional", "default", "byReference"}]}]}]}
 * A type is Boolean, Integer, Long, Date, String, Bytes, Variant, Variants, Strings (arrays), Rows (a record set),
 * Nothing, or a class. A default of a Date is its days; null stands for no object and for no default. */
QVSA_API const char* qvsa_describe(void) QVSA_NOEXCEPT;

/* The version of the library, as "1.2.3". */
QVSA_API const char* qvsa_version(void) QVSA_NOEXCEPT;

/* Of this thread's last call that could not be made: the text, which stays until the next such call, and the number of
 * the failure that was raised, 0 where it was none. */
QVSA_API const char* qvsa_error_text(void) QVSA_NOEXCEPT;
QVSA_API int32_t qvsa_error_number(void) QVSA_NOEXCEPT;

/* Values of the caller's. */
static inline qvsa_value qvsa_empty(void) {
  qvsa_value value;
  memset(&value, 0, sizeof value);
  return value;
}
static inline qvsa_value qvsa_boolean(int content) {
  qvsa_value value = qvsa_empty();
  value.kind = QVSA_BOOLEAN;
  value.as.boolean = content != 0;
  return value;
}
static inline qvsa_value qvsa_long(int32_t content) {
  qvsa_value value = qvsa_empty();
  value.kind = QVSA_LONG;
  value.as.long_ = content;
  return value;
}
static inline qvsa_value qvsa_date(double days) {
  qvsa_value value = qvsa_empty();
  value.kind = QVSA_DATE;
  value.as.date = days;
  return value;
}
/* Points to `content`, which ends with a zero byte. */
static inline qvsa_value qvsa_text(const char* content) {
  qvsa_value value = qvsa_empty();
  value.kind = QVSA_TEXT;
  value.as.text.data = content;
  value.as.text.length = content ? strlen(content) : 0;
  return value;
}
static inline qvsa_value qvsa_handle(qvsa_object object) {
  qvsa_value value = qvsa_empty();
  value.kind = QVSA_OBJECT;
  value.as.object = object;
  return value;
}

#ifdef __cplusplus
}
#endif

#endif
