#include <algorithm>
#include <cstring>
#include <initializer_list>

#include "QVSa/frame/Version.h"
#include "QVSa/values/Failure.h"
#include "bindings/c/Call.h"
#include "bindings/c/Registry.h"
#include "bindings/c/qvsa.h"

namespace QVSa::binding {

namespace {

// The last error of the thread. Of fixed size, so that want of memory can be told too.
struct LastError {
  Long number = 0;
  char text[1024] = "";

  void set(Long failureNumber, const char* failureText) {
    number = failureNumber;
    std::size_t length = std::strlen(failureText);
    if (length >= sizeof text) {
      length = sizeof text - 1;
      while (length > 0 && (failureText[length] & 0xC0) == 0x80) --length;  // a whole character more
    }
    std::memcpy(text, failureText, length);
    text[length] = '\0';
  }
};
thread_local LastError lastError;

// Runs `body` and turns what it throws into a code.
template <class Body>
int guarded(const Body& body) noexcept {
  try {
    body();
    return QVSA_OK;
  } catch (const CallFailure& failure) {
    lastError.set(0, failure.what());
    return failure.code();
  } catch (...) {
    Long number = 0;
    String description;
    tellCurrentFailure(number, description);
    lastError.set(number, description.c_str());
    return QVSA_RAISED;
  }
}

void require(std::initializer_list<const void*> pointers) {
  if (std::find(pointers.begin(), pointers.end(), nullptr) != pointers.end())
    throw CallFailure(QVSA_POINTER, "A null pointer was given.");
}

void clear(qvsa_value* value) {
  if (value != nullptr) *value = qvsa_empty();
}

void release(const qvsa_value& value) {
  const bool isObject = value.kind == QVSA_OBJECT;
  const Handles::Handle handle = isObject ? value.as.object : value.owner;
  if (handle == 0) return;
  if (!(isObject ? handles().releaseObject(handle) : handles().releaseMemory(handle)))
    throw CallFailure(QVSA_HANDLE, "This was released, or never given.");
}

qvsa_value objectValue(Object object) {
  qvsa_value value = emptyValue(QVSA_OBJECT);
  value.as.object = handles().add(std::move(object));
  return value;
}

}  // namespace

}  // namespace QVSa::binding

using namespace QVSa::binding;

int qvsa_create(const char* class_name, qvsa_value* object) noexcept {
  clear(object);
  return guarded([&] {
    require({class_name, object});
    const ClassDescription& type = registry().named(class_name);
    *object = objectValue({type.make(), &type});
  });
}

int qvsa_release(qvsa_value* value) noexcept {
  return guarded([&] {
    require({value});
    const qvsa_value released = std::exchange(*value, qvsa_empty());
    release(released);
  });
}

int qvsa_get(qvsa_object object, const char* property, qvsa_value* value) noexcept {
  clear(value);
  return guarded([&] {
    require({property, value});
    const Use use(object);
    const Property& wanted = use.type().property(property);
    if (!wanted.get) throw CallFailure(QVSA_ACCESS, wanted.name + " can only be set.");
    *value = wanted.get(use.pointer());
  });
}

int qvsa_set(qvsa_object object, const char* property, const qvsa_value* value) noexcept {
  return guarded([&] {
    require({property, value});
    const Use use(object);
    const Property& wanted = use.type().property(property);
    if (!wanted.set) throw CallFailure(QVSA_ACCESS, wanted.name + " can't be set.");
    wanted.set(wanted, use.pointer(), *value);
  });
}

int qvsa_call(qvsa_object object, const char* operation, qvsa_value* arguments, size_t count,
              qvsa_value* result) noexcept {
  clear(result);
  return guarded([&] {
    require({operation});
    if (count > 0) require({arguments});
    const Use use(object);
    const Operation& wanted = use.type().operation(operation);
    wanted.checkCount(count);
    const qvsa_value given = wanted.call(wanted, use.pointer(), {arguments, count});
    if (result != nullptr)
      *result = given;
    else
      release(given);
  });
}

int qvsa_enumerate(qvsa_object collection, qvsa_value* walk) noexcept {
  clear(walk);
  return guarded([&] {
    require({walk});
    const Use use(collection);
    if (!use.type().walk) throw CallFailure(QVSA_NO_MEMBER, use.type().name + " is no collection.");
    qvsa_value value = emptyValue(QVSA_OBJECT);
    value.as.object = handles().add(Walk{use.type().walk(use.pointer())});
    *walk = value;
  });
}

int qvsa_next(qvsa_object walk, qvsa_value* item) noexcept {
  clear(item);
  return guarded([&] {
    require({item});
    Object next = handles().nextOf(walk);
    if (next.pointer) *item = objectValue(std::move(next));
  });
}

const char* qvsa_describe(void) noexcept {
  const char* text = nullptr;
  guarded([&] { text = registry().json().c_str(); });
  return text;
}

const char* qvsa_version(void) noexcept { return QVSa::version(); }

const char* qvsa_error_text(void) noexcept { return lastError.text; }

int32_t qvsa_error_number(void) noexcept { return lastError.number; }
