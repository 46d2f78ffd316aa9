#include <algorithm>
#include <array>

#include "providers/tsql/Lexer.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

// Literals that are no values but part of the statement's form stay in the shape: the size of a type, the style of a
// convert, what stands in an order by (a number there is a position), a caption in quotes.
class ShapeWriter {
 public:
  explicit ShapeWriter(const std::vector<Token>& tokens) : tokens_(tokens) { shape_.reserve(tokens.size() * 8); }

  String run() {
    for (at_ = 0; at_ < tokens_.size(); ++at_) {
      const Token& token = tokens_[at_];
      if (token.kind == TokenKind::end) break;
      if (at_ != 0) shape_ += ' ';
      write(token);
    }
    return std::move(shape_);
  }

 private:
  struct Convert {
    std::size_t depth;
    std::size_t commas;
  };

  bool isBehind(std::string_view word) const {
    return at_ > 0 && tokens_[at_ - 1].kind == TokenKind::word && sameWord(tokens_[at_ - 1].text, word);
  }

  void write(const Token& token);
  void writeWord(const String& word);
  void writeSymbol(const String& symbol);
  void writeQuoted(char open, const String& text, char close);
  void writeLiteral(const Token& token);
  void writeDigits(const LiteralSize& size);
  void writeList(const std::vector<Token>& items);
  void open();
  void close();
  bool isForm(const Token& token) const;

  const std::vector<Token>& tokens_;
  std::size_t at_ = 0;
  String shape_;
  std::size_t depth_ = 0;
  std::size_t orderDepth_ = kNone;
  std::size_t typeDepth_ = kNone;
  std::vector<Convert> converts_;

  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);
};

void ShapeWriter::write(const Token& token) {
  switch (token.kind) {
    case TokenKind::word:
      if (token.reserved && isBehind("order") && sameWord(token.text, "by")) orderDepth_ = depth_;
      return writeWord(token.text);
    case TokenKind::variable:
      return writeWord(token.text);
    case TokenKind::quotedName:
      return writeQuoted('[', token.text, ']');
    case TokenKind::symbol:
      return writeSymbol(token.text);
    default:
      return writeLiteral(token);
  }
}

void ShapeWriter::writeWord(const String& word) {
  for (char c : word) shape_ += c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
}

void ShapeWriter::writeSymbol(const String& symbol) {
  shape_ += symbol;
  if (symbol.size() != 1) return;
  if (symbol[0] == '(') open();
  if (symbol[0] == ')') close();
  if (symbol[0] == ',' && !converts_.empty() && converts_.back().depth == depth_) ++converts_.back().commas;
}

void ShapeWriter::open() {
  static constexpr std::string_view kSized[] = {"varchar", "nvarchar", "char",  "nchar",    "decimal",
                                                "numeric", "binary",   "float", "varbinary"};
  ++depth_;
  if (isBehind("convert")) converts_.push_back({depth_, 0});
  for (std::string_view type : kSized)
    if (typeDepth_ == kNone && isBehind(type)) typeDepth_ = depth_;
}

void ShapeWriter::close() {
  if (depth_ == orderDepth_) orderDepth_ = kNone;
  if (depth_ == typeDepth_) typeDepth_ = kNone;
  if (!converts_.empty() && converts_.back().depth == depth_) converts_.pop_back();
  if (depth_ > 0) --depth_;
}

void ShapeWriter::writeQuoted(char open, const String& text, char close) {
  shape_ += open;
  for (char c : text) shape_.append(c == close ? 2 : 1, c);
  shape_ += close;
}

bool ShapeWriter::isForm(const Token& token) const {
  if (token.kind == TokenKind::string) return isBehind("as");
  if (token.kind != TokenKind::integer) return false;
  return orderDepth_ != kNone || typeDepth_ != kNone ||
         (!converts_.empty() && converts_.back().depth == depth_ && converts_.back().commas == 2);
}

constexpr std::string_view kLetters = "idrsnSNb";

char letterOf(const Token& token) {
  if (token.kind == TokenKind::string) return (sizeOf(token).isLong ? "SN" : "sn")[token.unicode ? 1 : 0];
  return "idr?b"[static_cast<std::size_t>(token.kind) - static_cast<std::size_t>(TokenKind::integer)];
}

void ShapeWriter::writeDigits(const LiteralSize& size) {
  shape_ += std::to_string(size.whole) + "." + std::to_string(size.fraction);
}

// All kinds that a list holds, in their own order: its type follows from them, not from how many items there are.
void ShapeWriter::writeList(const std::vector<Token>& items) {
  std::array<bool, kLetters.size()> found{};
  LiteralSize widest;
  for (const Token& item : items) {
    found[kLetters.find(letterOf(item))] = true;
    if (item.kind != TokenKind::decimal) continue;
    const LiteralSize size = sizeOf(item);
    widest.whole = std::max(widest.whole, size.whole);
    widest.fraction = std::max(widest.fraction, size.fraction);
  }
  shape_ += "?l";
  for (std::size_t i = 0; i < found.size(); ++i) {
    if (!found[i]) continue;
    shape_ += kLetters[i];
    if (kLetters[i] == 'd') writeDigits(widest);
  }
}

void ShapeWriter::writeLiteral(const Token& token) {
  if (token.kind == TokenKind::list) return writeList(token.items);
  if (!isForm(token)) {
    shape_ += '?';
    shape_ += letterOf(token);
    if (token.kind == TokenKind::decimal) writeDigits(sizeOf(token));
  } else if (token.kind == TokenKind::string) {
    writeQuoted('\'', token.text, '\'');
  } else {
    shape_ += token.text;
  }
}

}  // namespace

LiteralSize sizeOf(const Token& literal) {
  LiteralSize size;
  if (literal.kind == TokenKind::string) {
    // Bytes are no fewer than characters: what counts as long too early is only not cut.
    size.isLong = literal.text.size() > (literal.unicode ? 4000U : 8000U);
    return size;
  }
  std::string_view digits = literal.text;
  digits.remove_prefix(std::min(digits.find_first_not_of("-+0"), digits.size()));
  const std::size_t point = digits.find('.');
  size.whole = std::min(point, digits.size());
  if (point != std::string_view::npos) size.fraction = digits.size() - point - 1;
  return size;
}

String shapeOf(const std::vector<Token>& tokens) { return ShapeWriter(tokens).run(); }

}  // namespace QVSa::tsql
