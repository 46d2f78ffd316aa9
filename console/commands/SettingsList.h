#pragma once

#include <span>

#include "QVSa/settings/Home.h"

namespace QVSa::console {

// The settings that can be shown and set, by what they hold. `name` is the member of the document and, with two hyphens
// before it, the option; passwords and pictures are not among them.
template <class Value>
struct Setting {
  const char* name;
  const char* label;
  Value (Home::*get)() const;
  void (Home::*set)(Value);
};

std::span<const Setting<String>> textSettings();
std::span<const Setting<Boolean>> flagSettings();
std::span<const Setting<Integer>> shortSettings();
std::span<const Setting<Long>> longSettings();

}  // namespace QVSa::console
