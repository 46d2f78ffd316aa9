#include "providers/embedded/functions/Like.h"

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Utf8.h"

namespace QVSa::embedded {

namespace {

// A pattern is read in place, one element at a time: it may come from a column and differ from row to row.
class Pattern {
 public:
  Pattern(std::string_view text, std::optional<char32_t> escape)
      : at_(text.data()), end_(text.data() + text.size()), escape_(escape) {}

  bool done() const { return at_ == end_; }

  // Moves behind a "%", if one stands here.
  bool skipAny() {
    if (done() || *at_ != '%' || escape_ == U'%') return false;
    ++at_;
    return true;
  }

  // Moves behind the element that stands here if it matches the symbol, which is folded already.
  bool take(char32_t symbol) {
    if (done()) return false;
    const char* const begin = at_;
    if (matches(symbol)) return true;
    at_ = begin;
    return false;
  }

 private:
  struct Element {
    char32_t symbol;
    bool literal;  // stood behind the escape symbol
  };

  Element next() {
    const char32_t symbol = nextSymbol(at_, end_);
    if (symbol != escape_ || done()) return {symbol, false};
    return {nextSymbol(at_, end_), true};
  }

  bool matches(char32_t symbol) {
    const Element element = next();
    if (!element.literal && element.symbol == U'_') return true;
    if (!element.literal && element.symbol == U'[') return matchesSet(symbol);
    return foldCase(element.symbol) == symbol;
  }

  bool matchesSet(char32_t symbol) {
    const bool negated = !done() && *at_ == '^' && escape_ != U'^';
    if (negated) ++at_;
    bool found = false;
    while (!done()) {
      const Element low = next();
      if (!low.literal && low.symbol == U']') return found != negated;
      const char32_t first = foldCase(low.symbol);
      const char32_t last = isRange() ? foldCase(endOfRange()) : first;
      found = found || (first <= symbol && symbol <= last);
    }
    return false;
  }

  bool isRange() const { return end_ - at_ >= 2 && at_[0] == '-' && at_[1] != ']' && escape_ != U'-'; }

  char32_t endOfRange() {
    ++at_;
    return next().symbol;
  }

  const char* at_;
  const char* end_;
  std::optional<char32_t> escape_;
};

}  // namespace

bool matchesLike(std::string_view value, std::string_view text, std::optional<char32_t> escape, bool blanksMayFollow) {
  Pattern pattern(text, escape);
  const char* at = value.data();
  const char* const end = at + value.size();
  const char* const enough = blanksMayFollow ? at + withoutTrailingBlanks(value).size() : end;
  // Only the last "%" is ever tried again with a longer text: what an earlier one could win, the last one wins too.
  std::optional<Pattern> behindAny;
  const char* retry = at;
  while (at < end) {
    if (at >= enough && pattern.done()) return true;
    if (pattern.skipAny()) {
      behindAny = pattern;
      retry = at;
      continue;
    }
    if (pattern.take(foldCase(nextSymbol(at, end)))) continue;
    if (!behindAny) return false;
    nextSymbol(retry, end);
    at = retry;
    pattern = *behindAny;
  }
  while (pattern.skipAny()) continue;
  return pattern.done();
}

}  // namespace QVSa::embedded
