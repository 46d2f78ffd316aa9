#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace QVSa::embedded {

// Finds a text in others by the collation's folding (trailing blanks count), in time linear in both.
class TextSearch {
 public:
  struct Match {
    std::size_t begin;  // in bytes
    std::size_t end;
  };

  // `what` is not empty.
  explicit TextSearch(std::string_view what);

  // The first occurrence at or behind the byte `from`.
  std::optional<Match> find(std::string_view in, std::size_t from = 0) const;

 private:
  std::u32string what_;
  // Of the first n symbols of what_: how many of their last ones begin what_ again.
  std::vector<std::size_t> fallback_;
};

}  // namespace QVSa::embedded
