#include "QVSa/values/Failure.h"

#include <new>

namespace QVSa {

namespace {

String runtimeText(Long runtimeNumber) {
  switch (runtimeNumber) {
    case 5:
      return "Invalid procedure call or argument";
    case 6:
      return "Overflow";
    case 7:
      return "Out of memory";
    case 9:
      return "Subscript out of range";
    case 13:
      return "Type mismatch";
    case 51:
      return "Internal error";
    case 53:
      return "File not found";
    case 58:
      return "File already exists";
    case 70:
      return "Permission denied";
    case 75:
      return "Path/File access error";
    case 76:
      return "Path not found";
    case 91:
      return "Object variable not set";
    case 94:
      return "Invalid use of Null";
    case 457:
      return "This key is already associated with an element of this collection";
    default:
      return "Application-defined or object-defined error";
  }
}

}  // namespace

Failure runtimeFailure(Long runtimeNumber, Long native) {
  return Failure(runtimeNumber, "QVSa", runtimeText(runtimeNumber), native);
}

Failure currentFailure() {
  try {
    throw;
  } catch (const Failure& failure) {
    return failure;
  } catch (const std::bad_alloc&) {
    return runtimeFailure(number::memory);
  } catch (const std::exception& error) {
    return Failure(number::internal, "QVSa", error.what());
  } catch (...) {
    return runtimeFailure(number::internal);
  }
}

void tellCurrentFailure(Long& number, String& description) noexcept {
  try {
    const Failure failure = currentFailure();
    description = failure.description();
    number = failure.number();
  } catch (...) {
    number = number::memory;
    // Short enough to find its place in any string.
    description = "Out of memory";
  }
}

}  // namespace QVSa
