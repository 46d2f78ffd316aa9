#include "providers/embedded/functions/TextSearch.h"

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Utf8.h"

namespace QVSa::embedded {

TextSearch::TextSearch(std::string_view what) {
  const char* const end = what.data() + what.size();
  for (const char* at = what.data(); at < end;) what_ += foldCase(nextSymbol(at, end));
  fallback_.assign(what_.size() + 1, 0);
  for (std::size_t i = 1, same = 0; i < what_.size(); ++i) {
    while (same > 0 && what_[i] != what_[same]) same = fallback_[same];
    if (what_[i] == what_[same]) ++same;
    fallback_[i + 1] = same;
  }
}

std::optional<TextSearch::Match> TextSearch::find(std::string_view in, std::size_t from) const {
  // Symbols that fold to the same one can differ in their bytes: where each of the last ones began has to be
  // remembered.
  std::vector<std::size_t> begins(what_.size());
  const char* const end = in.data() + in.size();
  std::size_t matched = 0;
  std::size_t symbols = 0;
  for (const char* at = in.data() + from; at < end; ++symbols) {
    begins[symbols % what_.size()] = static_cast<std::size_t>(at - in.data());
    const char32_t symbol = foldCase(nextSymbol(at, end));
    while (matched > 0 && what_[matched] != symbol) matched = fallback_[matched];
    if (what_[matched] == symbol) ++matched;
    if (matched == what_.size())
      return Match{begins[(symbols + 1) % what_.size()], static_cast<std::size_t>(at - in.data())};
  }
  return std::nullopt;
}

}  // namespace QVSa::embedded
