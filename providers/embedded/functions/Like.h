#pragma once

#include <optional>
#include <string_view>

namespace QVSa::embedded {

// The dialect's like, by the collation's folding: % any text, _ one symbol, [a-f] one of a set, [^a-f] one outside it.
// The symbol behind `escape` stands for itself. A set without its end matches nothing. Trailing blanks count, but those
// of the value may follow what matches where the caller says so.
bool matchesLike(std::string_view value, std::string_view pattern, std::optional<char32_t> escape,
                 bool blanksMayFollow);

}  // namespace QVSa::embedded
