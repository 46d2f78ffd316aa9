#pragma once

#include <memory>
#include <mutex>
#include <variant>
#include <vector>

#include "bindings/c/CallFailure.h"
#include "bindings/c/Memory.h"

namespace QVSa::binding {

struct ClassDescription;

// An object of a public class, shared with whatever else needs it.
struct Object {
  std::shared_ptr<void> pointer;
  const ClassDescription* type = nullptr;
};

// The items of a collection as they were when the walk began.
struct Walk {
  std::vector<Object> items;
  std::size_t next = 0;
};

// Everything that was handed out and not released yet. A handle is the number of a place and the number of its present
// use, so that a handle that was released is known as such when the place is taken again. For all threads.
class Handles {
 public:
  using Handle = std::uint64_t;
  using Content = std::variant<std::monostate, Object, Walk, Memory>;

  Handle add(Content content);
  // Throw CallFailure QVSA_HANDLE for a handle that was released or never given, or is one of something else.
  Object object(Handle handle);
  Object nextOf(Handle walk);  // no pointer at the end
  // False for such a handle.
  bool releaseObject(Handle handle) { return release(handle, false); }
  bool releaseMemory(Handle handle) { return release(handle, true); }

 private:
  friend class Use;
  friend Handles& handles();

  struct Place {
    Content content;
    std::uint32_t use = 1;
    std::uint32_t nextFree = 0;  // place + 1, 0 for none
  };

  Handles();
  Place* placeOf(Handle handle);
  template <class Wanted>
  Wanted& contentOf(Handle handle);
  bool release(Handle handle, bool memory);

  std::mutex mutex_;
  std::vector<Place> places_;
  std::uint32_t firstFree_ = 0;
  std::vector<const void*> running_;  // the objects that are in a call
};

// The one table. It is never destroyed: a host may release its last objects while the process ends.
Handles& handles();

// An object in a call. Throws QVSA_HANDLE, and QVSA_BUSY where another call runs on the object, by whatever handle.
class Use {
 public:
  explicit Use(Handles::Handle handle);
  ~Use();
  Use(const Use&) = delete;
  Use& operator=(const Use&) = delete;

  void* pointer() const { return object_.pointer.get(); }
  const ClassDescription& type() const { return *object_.type; }

 private:
  Object object_;
};

}  // namespace QVSa::binding
