#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Function.h"
#include "providers/embedded/functions/Like.h"
#include "providers/embedded/functions/NumberText.h"
#include "providers/embedded/functions/TextSearch.h"
#include "providers/embedded/functions/Utf8.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

// The most that SQLite takes as one value.
constexpr std::int64_t longest = 1'000'000'000;
// Of a text that str makes.
constexpr std::int64_t widest = 8000;

// The last argument tells how long the result may be: cut there, or refused where it is negative. -1: any length.
void giveLimited(Call& call, const std::string& text) {
  const std::int64_t limit = call.whole(call.count() - 1);
  if (limit >= 0) return call.give(unitsAt(text, 0, limit));
  if (limit < -1 && unitsOf(text) > -limit) throw sqlFailure(8152, "String or binary data would be truncated.");
  call.give(text);
}

// Behind a varchar, blanks may follow what matches.
template <bool blanksMayFollow>
void like(Call& call) {
  call.give(std::int64_t{matchesLike(call.text(0), call.text(1), std::nullopt, blanksMayFollow)});
}

template <bool blanksMayFollow>
void likeEscaped(Call& call) {
  const std::string_view escape = call.text(2);
  const char* at = escape.data();
  const char* const end = at + escape.size();
  const char32_t symbol = escape.empty() ? 0 : nextSymbol(at, end);
  if (escape.empty() || at != end)
    throw sqlFailure(506,
                     "The invalid escape character \"" + std::string(escape) + "\" was specified in a LIKE predicate.");
  call.give(std::int64_t{matchesLike(call.text(0), call.text(1), symbol, blanksMayFollow)});
}

void length(Call& call) { call.give(unitsOf(withoutTrailingBlanks(call.text(0)))); }

void charIndex(Call& call) {
  const std::string_view what = call.text(0);
  const std::string_view in = call.text(1);
  const std::int64_t skipped = call.count() == 3 ? std::max<std::int64_t>(call.whole(2), 1) - 1 : 0;
  if (what.empty()) return call.give(std::int64_t{0});
  const std::size_t from = skipped == 0 ? 0 : unitsAt(in, 0, skipped).size();
  const auto match = from > in.size() ? std::nullopt : TextSearch(what).find(in, from);
  call.give(match ? unitsOf(in.substr(0, match->begin)) + 1 : std::int64_t{0});
}

void replace(Call& call) {
  const std::string_view in = call.text(0);
  const std::string_view what = call.text(1);
  const std::string_view with = call.text(2);
  if (what.empty()) return giveLimited(call, std::string(in));
  const TextSearch search(what);
  std::string result;
  std::size_t at = 0;
  while (const auto match = search.find(in, at)) {
    result += in.substr(at, match->begin - at);
    result += with;
    at = match->end;
  }
  result += in.substr(at);
  giveLimited(call, result);
}

void substring(Call& call) {
  const std::int64_t start = std::max<std::int64_t>(call.whole(1), std::numeric_limits<std::int32_t>::min());
  const std::int64_t count = std::min<std::int64_t>(call.whole(2), std::numeric_limits<std::int32_t>::max());
  if (count < 0) throw sqlFailure(537, "Invalid length parameter passed to the LEFT or SUBSTRING function.");
  // Positions before the first are counted but have no text.
  const std::int64_t lost = start < 1 ? 1 - start : 0;
  call.give(unitsAt(call.text(0), std::max<std::int64_t>(start, 1) - 1, count - std::min(count, lost)));
}

void left(Call& call) {
  if (call.whole(1) < 0) throw sqlFailure(537, "Invalid length parameter passed to the LEFT or SUBSTRING function.");
  call.give(unitsAt(call.text(0), 0, call.whole(1)));
}

void right(Call& call) {
  const std::int64_t count = call.whole(1);
  if (count < 0) throw sqlFailure(536, "Invalid length parameter passed to the right function.");
  const std::string_view text = call.text(0);
  call.give(unitsAt(text, std::max<std::int64_t>(unitsOf(text) - count, 0), count));
}

void trimLeft(Call& call) {
  std::string_view text = call.text(0);
  text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));
  call.give(std::string(text));
}

void trimRight(Call& call) { call.give(std::string(withoutTrailingBlanks(call.text(0)))); }

template <char32_t (*mapping)(char32_t)>
void mapCase(Call& call) {
  const std::string_view text = call.text(0);
  std::string result;
  result.reserve(text.size());
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) appendSymbol(result, mapping(nextSymbol(at, end)));
  call.give(result);
}

// Rounds halves away from zero; gives up decimals where the text would be too long.
std::string fixedText(double value, std::int64_t width, std::int64_t decimals) {
  std::string text;
  do {
    const double scale = std::pow(10.0, static_cast<double>(decimals));
    const double rounded = std::abs(value) < 1e15 / scale ? std::round(value * scale) / scale : value;
    char buffer[400];
    const auto end = std::to_chars(buffer, buffer + sizeof buffer, rounded == 0 ? 0.0 : rounded,
                                   std::chars_format::fixed, static_cast<int>(decimals));
    text.assign(buffer, end.ptr);
  } while (std::ssize(text) > width && decimals-- > 0);
  return text;
}

void numberText(Call& call) {
  const std::int64_t width = call.count() > 1 ? call.whole(1) : 10;
  const std::int64_t decimals = call.count() > 2 ? std::min<std::int64_t>(call.whole(2), 16) : 0;
  if (width < 0 || width > widest || decimals < 0) return;
  const std::string text = fixedText(call.real(0), width, decimals);
  const std::size_t size = static_cast<std::size_t>(width);
  call.give(text.size() > size ? std::string(size, '*') : std::string(size - text.size(), ' ') + text);
}

void replicate(Call& call) {
  const std::string_view text = call.text(0);
  const std::int64_t times = call.whole(1);
  if (times < 0) return;
  const std::int64_t limit = std::abs(call.whole(2));
  const std::int64_t units = std::max<std::int64_t>(unitsOf(text), 1);
  const std::int64_t most = limit == 1 ? times : std::min(times, limit / units + 1);
  if (std::ssize(text) * most > longest) throw valueTooLarge();
  std::string result;
  for (std::int64_t i = 0; i < most && !text.empty(); ++i) result += text;
  giveLimited(call, result);
}

constexpr Function functions[] = {{"t_like", 2, like<false>},
                                  {"t_like", 3, likeEscaped<false>},
                                  {"t_like_varchar", 2, like<true>},
                                  {"t_like_varchar", 3, likeEscaped<true>},
                                  {"t_len", 1, length},
                                  {"t_charindex", 2, charIndex},
                                  {"t_charindex", 3, charIndex},
                                  {"t_replace", 4, replace},
                                  {"t_substring", 3, substring},
                                  {"t_left", 2, left},
                                  {"t_right", 2, right},
                                  {"t_ltrim", 1, trimLeft},
                                  {"t_rtrim", 1, trimRight},
                                  {"t_upper", 1, mapCase<upperCase>},
                                  {"t_lower", 1, mapCase<lowerCase>},
                                  {"t_str", 1, numberText},
                                  {"t_str", 2, numberText},
                                  {"t_str", 3, numberText},
                                  {"t_replicate", 3, replicate}};

}  // namespace

std::span<const Function> textFunctions() { return functions; }

}  // namespace QVSa::embedded
