#include <algorithm>

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

char letterOf(TokenKind kind) {
  constexpr std::string_view kLetters = "idrsb";
  return kLetters[static_cast<std::size_t>(kind) - static_cast<std::size_t>(TokenKind::integer)];
}

// All kinds that a list holds, in their own order: its type follows from them, not from how many items there are.
void ShapeWriter::writeList(const std::vector<Token>& items) {
  shape_ += "?l";
  for (TokenKind kind : {TokenKind::integer, TokenKind::decimal, TokenKind::real, TokenKind::string, TokenKind::binary})
    if (std::any_of(items.begin(), items.end(), [&](const Token& item) { return item.kind == kind; }))
      shape_ += letterOf(kind);
}

void ShapeWriter::writeLiteral(const Token& token) {
  if (token.kind == TokenKind::list) return writeList(token.items);
  if (!isForm(token)) {
    shape_ += '?';
    shape_ += letterOf(token.kind);
  } else if (token.kind == TokenKind::string) {
    writeQuoted('\'', token.text, '\'');
  } else {
    shape_ += token.text;
  }
}

}  // namespace

String shapeOf(const std::vector<Token>& tokens) { return ShapeWriter(tokens).run(); }

}  // namespace QVSa::tsql
