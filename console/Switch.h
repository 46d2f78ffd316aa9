#pragma once

#include <CLI/CLI.hpp>
#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa::console {

// The options --NAME and --no-NAME; `value` stays without one where neither is given, which a plain flag of the library
// would set to false.
inline void addSwitch(CLI::App* command, const String& name, std::optional<bool>& value, const String& meaning) {
  command->add_flag_function(
      "--" + name + ",!--no-" + name, [&value](std::int64_t count) { value = count > 0; }, meaning);
}

}  // namespace QVSa::console
