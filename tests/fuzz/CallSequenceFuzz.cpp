// Any sequence of calls on the C interface, with any values and handles, gives codes and nothing else. The objects
// reach no database: the one installation that is ever named does not exist.

#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>

#include "bindings/c/qvsa.h"

namespace {

using Json = nlohmann::json;

const Json& classes() {
  static const Json description = Json::parse(qvsa_describe());
  return description["classes"];
}

class Input {
 public:
  Input(const std::uint8_t* data, std::size_t size) : at_(data), end_(data + size) {}
  bool isEmpty() const { return at_ == end_; }
  std::size_t below(std::size_t limit) { return isEmpty() || limit == 0 ? 0 : *at_++ % limit; }
  const Json& oneOf(const Json& list) { return list[below(list.size())]; }

 private:
  const std::uint8_t* at_;
  const std::uint8_t* end_;
};

struct Thing {
  qvsa_value value;
  std::string className;  // of an object
};

qvsa_value ofKind(std::int32_t kind) {
  qvsa_value value = qvsa_empty();
  value.kind = kind;
  return value;
}

qvsa_value array(const qvsa_value* items, std::size_t length) {
  qvsa_value value = ofKind(QVSA_ARRAY);
  value.as.array = {items, length};
  return value;
}

qvsa_value real(double content) {
  qvsa_value value = ofKind(QVSA_DOUBLE);
  value.as.double_ = content;
  return value;
}

class Session {
 public:
  explicit Session(Input input) : input_(input) {}
  ~Session() {
    for (Thing& thing : things_) qvsa_release(&thing.value);
  }
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;

  void run() {
    while (!input_.isEmpty()) step();
  }

 private:
  void step() {
    switch (input_.below(7)) {
      case 0:
        return create();
      case 1:
        return get();
      case 2:
        return set();
      case 3:
        return call();
      case 4:
        return enumerate();
      case 5:
        return release();
      default:
        return useStale();
    }
  }

  void create() {
    const std::string name = input_.oneOf(classes())["name"];
    qvsa_value object;
    qvsa_create(name.c_str(), &object);
    keep(object, name);
  }

  void get() {
    const Thing& object = anObject();
    const Json& property = memberOf(object, "properties");
    qvsa_value value;
    const std::string name = property["name"], type = property["type"];
    qvsa_get(object.value.as.object, name.c_str(), &value);
    keep(value, type);
  }

  void set() {
    const Thing object = anObject();
    const std::string name = memberOf(object, "properties")["name"];
    Thing given = takeValue(name);
    qvsa_set(object.value.as.object, name.c_str(), &given.value);
    keep(given.value, given.className);
  }

  void call() {
    const Thing object = anObject();
    const Json& operation = memberOf(object, "operations");
    const std::string name = operation["name"], type = operation["result"];
    const Json& parameters = operation["arguments"];
    std::vector<Thing> given;
    std::vector<qvsa_value> values;
    const std::size_t count = parameters.size() + input_.below(3) - input_.below(2);
    for (std::size_t i = 0; i < count && i < 20; ++i) {
      given.push_back(takeValue(i < parameters.size() ? parameters[i]["name"].get<std::string>() : ""));
      values.push_back(given.back().value);
    }
    qvsa_value result;
    qvsa_call(object.value.as.object, name.c_str(), values.data(), values.size(), &result);
    for (std::size_t i = 0; i < values.size(); ++i) keep(values[i], given[i].className);
    keep(result, type);
  }

  void enumerate() {
    const Thing object = anObject();
    const std::string items = memberOf(object, "")["items"].is_null() ? "" : memberOf(object, "")["items"];
    qvsa_value walk, item;
    qvsa_enumerate(object.value.as.object, &walk);
    for (int i = 0; i < 3; ++i) {
      qvsa_next(walk.as.object, &item);
      keep(item, items);
    }
    keep(walk, "");
  }

  void release() {
    if (things_.empty()) return;
    Thing thing = take(input_.below(things_.size()));
    stale_.push_back(thing.value);
    qvsa_release(&thing.value);
  }

  // The library must know what was released, by whatever value it comes back.
  void useStale() {
    if (stale_.empty()) return;
    qvsa_value value = stale_[input_.below(stale_.size())], got;
    const qvsa_object handle = value.kind == QVSA_OBJECT ? value.as.object : value.owner;
    if (handle != 0 && qvsa_get(handle, "errNumber", &got) == QVSA_OK) std::abort();
    qvsa_next(handle, &got);
    keep(got, "");
    if (handle != 0 && qvsa_release(&value) == QVSA_OK) std::abort();
  }

  const Thing& anObject() {
    static const Thing none{qvsa_handle(42), "User"};
    return things_.empty() ? none : things_[input_.below(things_.size())];
  }

  // A member of the object's class, or the class itself.
  const Json& memberOf(const Thing& object, const std::string& kind) {
    for (const Json& described : classes()) {
      if (described["name"] != object.className) continue;
      if (kind.empty()) return described;
      if (!described[kind].empty()) return input_.oneOf(described[kind]);
    }
    return kind.empty() ? classes()[0] : classes()[0][kind][0];
  }

  // What the library gave is handed in as it is, and no longer held here: it may come back changed.
  Thing takeValue(const std::string& name) {
    static constexpr const char* texts[] = {"",      "1",    "5|3",   "2024-02-29", "h\xC3\xA4lt",
                                            "a\xFF", "'%_[", "users", "x,y"};
    static const qvsa_value items[] = {qvsa_date(45000), qvsa_date(44000), qvsa_text("a"), ofKind(QVSA_NULL),
                                       qvsa_text("b"),   qvsa_text("c"),   qvsa_long(1)};
    if (name == "server" || name == "ServerName" || name == "vConnstring" || name == "gsDBConnString")
      return {qvsa_text("file:/nowhere/qvsa"), ""};
    if (!things_.empty() && input_.below(4) == 0) return take(input_.below(things_.size()));
    switch (input_.below(12)) {
      case 0:
        return {qvsa_boolean(1), ""};
      case 1:
      case 2:
        return {qvsa_long(static_cast<std::int32_t>(input_.below(5)) - 1), ""};
      case 3:
        return {qvsa_long(std::numeric_limits<std::int32_t>::max()), ""};
      case 4:
        return {real(input_.below(2) == 0 ? 1e300 : 2.5), ""};
      case 5:
        return {qvsa_date(input_.below(2) == 0 ? std::nan("") : 45000.5), ""};
      case 6:
        return {array(items, input_.below(std::size(items) + 1)), ""};
      case 7:
        return {array(nullptr, input_.below(2)), ""};
      case 8:
        return {ofKind(static_cast<std::int32_t>(input_.below(14)) - 1), ""};
      default:
        return {qvsa_text(texts[input_.below(std::size(texts))]), ""};
    }
  }

  void keep(const qvsa_value& value, const std::string& className) {
    if ((value.kind == QVSA_OBJECT && value.as.object != 0) || value.owner != 0) things_.push_back({value, className});
  }

  Thing take(std::size_t index) {
    Thing thing = things_[index];
    things_.erase(things_.begin() + static_cast<std::ptrdiff_t>(index));
    return thing;
  }

  Input input_;
  std::vector<Thing> things_;
  std::vector<qvsa_value> stale_;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Session(Input(data, size)).run();
  return 0;
}
