#include "bindings/c/Handles.h"

#include <algorithm>
#include <limits>
#include <new>
#include <pthread.h>
#include <utility>

namespace QVSa::binding {

namespace {

using Guard = std::lock_guard<std::mutex>;

}  // namespace

Handles& handles() {
  static Handles& table = *new Handles;
  return table;
}

// A fork copies the mutex as it stands: without these a child of a busy process could wait for ever.
Handles::Handles() {
  pthread_atfork([] { handles().mutex_.lock(); }, [] { handles().mutex_.unlock(); }, [] { handles().mutex_.unlock(); });
}

Handles::Handle Handles::add(Content content) {
  const Guard guard(mutex_);
  if (firstFree_ == 0) {
    if (places_.size() == std::numeric_limits<std::uint32_t>::max()) throw std::bad_alloc();
    places_.emplace_back();
    firstFree_ = static_cast<std::uint32_t>(places_.size());
  }
  const std::uint32_t index = firstFree_ - 1;
  Place& place = places_[index];
  firstFree_ = place.nextFree;
  place.content = std::move(content);
  return Handle{place.use} << 32 | index;
}

Handles::Place* Handles::placeOf(Handle handle) {
  const std::size_t index = handle & std::numeric_limits<std::uint32_t>::max();
  if (index >= places_.size()) return nullptr;
  Place& place = places_[index];
  // A number that was made up may hit the next use of a free place.
  const bool isFree = std::holds_alternative<std::monostate>(place.content);
  return place.use == handle >> 32 && !isFree ? &place : nullptr;
}

template <class Wanted>
Wanted& Handles::contentOf(Handle handle) {
  Place* const place = placeOf(handle);
  Wanted* const content = place == nullptr ? nullptr : std::get_if<Wanted>(&place->content);
  if (content == nullptr) throw CallFailure(QVSA_HANDLE, "This is no object, or one that was released.");
  return *content;
}

Object Handles::object(Handle handle) {
  const Guard guard(mutex_);
  return contentOf<Object>(handle);
}

Object Handles::nextOf(Handle walk) {
  const Guard guard(mutex_);
  Walk& items = contentOf<Walk>(walk);
  return items.next == items.items.size() ? Object{} : items.items[items.next++];
}

bool Handles::release(Handle handle, bool memory) {
  Content released;  // destroyed behind the lock: an object may have a connection to close
  const Guard guard(mutex_);
  Place* const place = placeOf(handle);
  if (place == nullptr || std::holds_alternative<Memory>(place->content) != memory) return false;
  released = std::exchange(place->content, {});
  // A place whose uses are counted out is never taken again.
  if (++place->use == 0) return true;
  place->nextFree = firstFree_;
  firstFree_ = static_cast<std::uint32_t>(place - places_.data()) + 1;
  return true;
}

Use::Use(Handles::Handle handle) {
  Handles& table = handles();
  object_ = table.object(handle);
  const Guard guard(table.mutex_);
  auto& running = table.running_;
  if (std::find(running.begin(), running.end(), pointer()) != running.end())
    throw CallFailure(QVSA_BUSY, "Another call runs on this object.");
  running.push_back(pointer());
}

Use::~Use() {
  Handles& table = handles();
  const Guard guard(table.mutex_);
  table.running_.erase(std::find(table.running_.begin(), table.running_.end(), pointer()));
}

}  // namespace QVSa::binding
