#include "providers/tsql/Lexer.h"

#include <algorithm>
#include <array>

#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

enum class Sort : std::uint8_t { stray, blank, letter, digit, inner, mark };

// What a byte can begin. Every byte of a character beyond ASCII is a letter; @ and $ are letters within a word only.
constexpr std::array<Sort, 256> kSorts = [] {
  std::array<Sort, 256> sorts{};
  const auto all = [&](std::string_view bytes, Sort sort) {
    for (char c : bytes) sorts[static_cast<unsigned char>(c)] = sort;
  };
  all(" \t\r\n\f\v", Sort::blank);
  all("abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ_#", Sort::letter);
  all("0123456789", Sort::digit);
  all("@$", Sort::inner);
  all("()+-*/%&|^~=<>!,.;", Sort::mark);
  for (std::size_t byte = 0x80; byte < sorts.size(); ++byte) sorts[byte] = Sort::letter;
  return sorts;
}();

Sort sortOf(char c) { return kSorts[static_cast<unsigned char>(c)]; }

bool isWordByte(char c) {
  const Sort sort = sortOf(c);
  return sort == Sort::letter || sort == Sort::digit || sort == Sort::inner;
}

bool isDigit(char c) { return sortOf(c) == Sort::digit; }

bool isHexDigit(char c) { return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F'); }

bool fitsInteger(std::string_view digits) {
  digits.remove_prefix(std::min(digits.find_first_not_of('0'), digits.size()));
  constexpr std::string_view kLargest = "2147483647";
  return digits.size() < kLargest.size() || (digits.size() == kLargest.size() && digits <= kLargest);
}

bool isNumber(TokenKind kind) {
  return kind == TokenKind::integer || kind == TokenKind::decimal || kind == TokenKind::real;
}

bool isSign(const Token& token) { return token.kind == TokenKind::symbol && (token.text == "-" || token.text == "+"); }

class Lexer {
 public:
  Lexer(const String& batch, Deadline deadline) : batch_(batch), deadline_(deadline) {
    // Lists of columns have a token every three bytes; a long literal must not make room for thousands.
    tokens_.reserve(std::min<std::size_t>(batch.size() / 3 + 8, 400));
  }

  std::vector<Token> run() {
    while (skipBlanks(), at_ < batch_.size()) {
      deadline_.check();
      cut();
    }
    add(TokenKind::end, batch_.size());
    return std::move(tokens_);
  }

 private:
  char ahead(std::size_t distance) const { return at_ + distance < batch_.size() ? batch_[at_ + distance] : '\0'; }

  Token& add(TokenKind kind, std::size_t begin) {
    Token& token = tokens_.emplace_back();
    token.kind = kind;
    token.position = begin;
    if (isLiteral(kind)) token.literal = literals_++;
    return token;
  }

  Token& addRest(TokenKind kind, std::size_t begin) {
    Token& token = add(kind, begin);
    token.text.assign(batch_, begin, at_ - begin);
    return token;
  }

  void skipBlanks();
  void skipComment();
  void cut();
  void cutWord();
  void cutNumber();
  void cutBinary();
  void cutQuoted(TokenKind kind, std::size_t prefix, char close);
  void cutSymbol();
  void skipDigits() {
    while (isDigit(ahead(0))) ++at_;
  }

  void watchList(char symbol);
  bool holdsList() const;
  void foldList();

  const String& batch_;
  Deadline deadline_;
  std::size_t at_ = 0;
  std::vector<Token> tokens_;
  std::size_t literals_ = 0;
  std::size_t listBegin_ = 0;  // the token behind "in (" while nothing but literals followed; 0 outside
};

void Lexer::skipBlanks() {
  while (at_ < batch_.size()) {
    if (sortOf(batch_[at_]) == Sort::blank) {
      ++at_;
    } else if (batch_[at_] == '-' && ahead(1) == '-') {
      at_ = std::min(batch_.find('\n', at_), batch_.size());
    } else if (batch_[at_] == '/' && ahead(1) == '*') {
      skipComment();
    } else {
      return;
    }
  }
}

void Lexer::skipComment() {
  for (std::size_t open = 0; at_ + 1 < batch_.size();) {
    if (batch_[at_] == '/' && batch_[at_ + 1] == '*') {
      ++open;
      at_ += 2;
    } else if (batch_[at_] == '*' && batch_[at_ + 1] == '/') {
      at_ += 2;
      if (--open == 0) return;
    } else {
      ++at_;
    }
  }
  throw sqlFailure(113, "Missing end comment mark '*/'.");
}

void Lexer::cut() {
  const char c = batch_[at_];
  if (c == '\'') return cutQuoted(TokenKind::string, 1, '\'');
  if ((c == 'N' || c == 'n') && ahead(1) == '\'') return cutQuoted(TokenKind::string, 2, '\'');
  if (c == '[') return cutQuoted(TokenKind::quotedName, 1, ']');
  if (c == '"') return cutQuoted(TokenKind::quotedName, 1, '"');
  if (c == '0' && (ahead(1) == 'x' || ahead(1) == 'X')) return cutBinary();
  if (isDigit(c) || (c == '.' && isDigit(ahead(1)))) return cutNumber();
  if (sortOf(c) == Sort::letter || c == '@') return cutWord();
  cutSymbol();
}

void Lexer::cutWord() {
  const std::size_t begin = at_;
  while (at_ < batch_.size() && isWordByte(batch_[at_])) ++at_;
  Token& word = addRest(batch_[begin] == '@' ? TokenKind::variable : TokenKind::word, begin);
  word.reserved = isReserved(word.text);
  listBegin_ = 0;
}

void Lexer::cutNumber() {
  const std::size_t begin = at_;
  TokenKind kind = TokenKind::integer;
  skipDigits();
  if (ahead(0) == '.') {
    kind = TokenKind::decimal;
    ++at_;
    skipDigits();
  }
  const std::size_t sign = ahead(1) == '+' || ahead(1) == '-' ? 1 : 0;
  if ((ahead(0) == 'e' || ahead(0) == 'E') && isDigit(ahead(1 + sign))) {
    kind = TokenKind::real;
    at_ += 1 + sign;
    skipDigits();
  }
  if (kind == TokenKind::integer && !fitsInteger(std::string_view(batch_).substr(begin, at_ - begin)))
    kind = TokenKind::decimal;
  addRest(kind, begin);
}

void Lexer::cutBinary() {
  const std::size_t begin = at_;
  at_ += 2;
  while (isHexDigit(ahead(0))) ++at_;
  add(TokenKind::binary, begin).text.assign(batch_, begin + 2, at_ - begin - 2);
}

// Everything between a mark and the closing one, which stands doubled for itself.
void Lexer::cutQuoted(TokenKind kind, std::size_t prefix, char close) {
  Token& token = add(kind, at_);
  at_ += prefix;
  const std::size_t begin = at_;
  for (;;) {
    const std::size_t end = batch_.find(close, at_);
    if (end == String::npos)
      throw sqlFailure(105, "Unclosed quotation mark after the character string '" + batch_.substr(begin) + "'.");
    token.text.append(batch_, at_, end - at_);
    at_ = end + 1;
    if (ahead(0) != close) break;
    token.text += close;
    ++at_;
  }
  if (kind == TokenKind::string) {
    token.unicode = prefix == 2;
    return;
  }
  if (token.text.find('\0') != String::npos)
    throw sqlFailure(102, "Incorrect syntax near '" + batch_.substr(begin, 1) + "'.");
  if (token.text.empty()) throw sqlFailure(1038, "An object or column name is missing or empty.");
  listBegin_ = 0;
}

bool isDouble(char first, char second) {
  switch (first) {
    case '<':
      return second == '>' || second == '=';
    case '!':
      return second == '<' || second == '>' || second == '=';
    case '=':
      return second == '*';
    default:
      return second == '=' && (first == '>' || first == '*');
  }
}

void Lexer::cutSymbol() {
  const std::size_t begin = at_;
  const char first = batch_[begin];
  const bool isPair = isDouble(first, ahead(1));
  if (sortOf(first) != Sort::mark || (first == '!' && !isPair))
    throw sqlFailure(102, "Incorrect syntax near '" + batch_.substr(begin, 1) + "'.");
  at_ += isPair ? 2 : 1;
  Token& symbol = addRest(TokenKind::symbol, begin);
  if (first == '!') symbol.text = symbol.text == "!=" ? "<>" : symbol.text == "!<" ? ">=" : "<=";
  watchList(first);
}

void Lexer::watchList(char symbol) {
  if (symbol == '(') {
    const Token* before = tokens_.size() > 1 ? &tokens_[tokens_.size() - 2] : nullptr;
    const bool isBehindIn = before && before->kind == TokenKind::word && sameWord(before->text, "in");
    listBegin_ = isBehindIn ? tokens_.size() : 0;
  } else if (listBegin_ != 0 && symbol != ',' && symbol != '-' && symbol != '+') {
    if (symbol == ')' && holdsList()) foldList();
    listBegin_ = 0;
  }
}

// Whether literals, signs before numbers, and commas between them lie before the closing parenthesis.
bool Lexer::holdsList() const {
  const std::size_t close = tokens_.size() - 1;
  std::size_t i = listBegin_;
  while (i < close) {
    const bool isSigned = isSign(tokens_[i]);
    if (isSigned && !isNumber(tokens_[++i].kind)) return false;
    if (!isLiteral(tokens_[i].kind)) return false;
    if (++i == close) return true;
    if (tokens_[i].text != "," || isLiteral(tokens_[i].kind)) return false;
    ++i;
  }
  return false;
}

void Lexer::foldList() {
  Token close = std::move(tokens_.back());
  tokens_.pop_back();
  Token list;
  list.kind = TokenKind::list;
  list.position = tokens_[listBegin_].position;
  String sign;
  for (auto token = tokens_.begin() + static_cast<std::ptrdiff_t>(listBegin_); token != tokens_.end(); ++token) {
    if (isLiteral(token->kind)) {
      if (list.items.empty()) list.literal = token->literal;
      token->literal = list.literal;
      if (sign == "-") token->text.insert(0, sign);
      list.items.push_back(std::move(*token));
    }
    sign = token->kind == TokenKind::symbol ? token->text : String();
  }
  literals_ = list.literal + 1;
  tokens_.resize(listBegin_);
  tokens_.push_back(std::move(list));
  tokens_.push_back(std::move(close));
}

}  // namespace

std::vector<Token> tokenize(const String& batch, Deadline deadline) { return Lexer(batch, deadline).run(); }

bool isLiteral(TokenKind kind) { return kind >= TokenKind::integer && kind <= TokenKind::list; }

}  // namespace QVSa::tsql
