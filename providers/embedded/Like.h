#pragma once

#include <optional>
#include <string_view>

namespace QVSa::embedded {

// The dialect's like, by the collation's folding: % any text, _ one symbol, [a-f] one of a set, [^a-f] one outside it.
// The symbol behind `escape` stands for itself. Trailing blanks count. A set without its end matches nothing.
bool matchesLike(std::string_view value, std::string_view pattern, std::optional<char32_t> escape);

}  // namespace QVSa::embedded
