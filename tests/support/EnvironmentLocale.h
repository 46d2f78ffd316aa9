#pragma once

#include <cstdlib>
#include <map>
#include <optional>
#include <string>

namespace QVSa::test {

// The environment's locale for one scope, by the variables given; those not given are unset.
class EnvironmentLocale {
 public:
  explicit EnvironmentLocale(const std::map<std::string, std::string>& variables) {
    for (const char* name : {"LC_ALL", "LC_CTYPE", "LC_MESSAGES", "LANG"}) {
      const char* old = std::getenv(name);
      old_[name] = old == nullptr ? std::nullopt : std::optional<std::string>(old);
      const auto value = variables.find(name);
      set(name, value == variables.end() ? std::nullopt : std::optional(value->second));
    }
  }
  explicit EnvironmentLocale(const std::string& all)
      : EnvironmentLocale(std::map<std::string, std::string>{{"LC_ALL", all}}) {}
  EnvironmentLocale(const EnvironmentLocale&) = delete;
  EnvironmentLocale& operator=(const EnvironmentLocale&) = delete;
  ~EnvironmentLocale() {
    for (const auto& [name, value] : old_) set(name.c_str(), value);
  }

 private:
  static void set(const char* name, const std::optional<std::string>& value) {
    if (value) {
      setenv(name, value->c_str(), 1);
    } else {
      unsetenv(name);
    }
  }

  std::map<std::string, std::optional<std::string>> old_;
};

}  // namespace QVSa::test
