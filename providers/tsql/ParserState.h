#pragma once

#include <string_view>
#include <utility>

#include "providers/tsql/Dialect.h"
#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// Reads a batch from left to right with one word or two of looking ahead. Each family of statements has a source of its
// own; all of them work on this one state.
class Parser {
 public:
  Parser(const std::vector<Token>& tokens, Deadline deadline) : tokens_(tokens), deadline_(deadline) {}

  std::vector<Statement> batch();

 private:
  class Nesting;

  // Parser.cpp: the tokens
  const Token& now() const { return tokens_[at_]; }
  const Token& ahead(std::size_t distance) const;
  const Token& take() {
    deadline_.check();
    return tokens_[at_++];
  }
  bool isWord(std::string_view word, std::size_t distance = 0) const;
  bool isSymbol(std::string_view symbol, std::size_t distance = 0) const;
  bool isName(std::size_t distance = 0) const;
  bool takeWord(std::string_view word);
  bool takeSymbol(std::string_view symbol);
  void expectWord(std::string_view word);
  void expectSymbol(std::string_view symbol);
  String expectName();
  String optionalName();
  bool switchedOn();
  [[noreturn]] void refuse() const { refuse(at_); }
  [[noreturn]] void refuse(std::size_t token) const;
  [[noreturn]] void refusePosition(std::size_t position) const;

  // Parser.cpp: names
  std::vector<String> nameParts(std::size_t most);
  ObjectName objectName();
  std::vector<String> columnNames();
  TypeName typeName();
  std::int64_t digits();
  std::int64_t wholeNumber();

  // Parser.cpp: statements
  Statement statement();

  // ParseSession.cpp
  Statement use();
  Statement setOption();
  Statement beginTransaction();
  Statement commitTransaction();
  Statement rollbackTransaction();
  Statement transaction(Transaction::Kind kind);
  Statement execute();
  Statement call();
  ExpressionPtr callArgument();

  // ParseAdministration.cpp
  Statement alter();
  Statement backup();
  Statement restore();
  Statement verify();
  Token text();
  Token disk();

  // ParseWrite.cpp
  Statement insert();
  Statement update();
  Statement erase();
  void insertRows(Insert& insert);
  Assignment assignment();

  // ParseDefinition.cpp
  Statement create();
  Statement drop();
  Statement createTable();
  Statement createView();
  Statement createIndex();
  Statement createSynonym();
  Statement createLogin();
  Statement alterLogin();
  Token loginPassword();
  void tableElement(CreateTable& table);
  ColumnDefinition columnDefinition();
  bool columnOption(ColumnDefinition& column);
  KeyDefinition keyDefinition(String name);
  bool keyKind();
  std::vector<String> keyColumns();

  // ParseSelect.cpp
  Statement query();
  SelectPtr selectWithTables();
  SelectPtr select();
  Select::CommonTable commonTable();
  SelectCore core();
  void top(SelectCore& core);
  SelectItem selectItem();
  std::optional<String> alias();
  bool isStar() const;
  ExpressionPtr star();
  std::vector<TableSourcePtr> from();
  TableSourcePtr tableSource();
  TableSourcePtr tablePrimary();
  TableSourcePtr derivedTable();
  TableSourcePtr joined(TableSourcePtr left, TableSource::Join join);
  std::optional<TableSource::Join> joinWord();
  std::vector<String> hints(bool bare);
  ExpressionPtr where();
  void groupAndHaving(SelectCore& core);
  std::vector<OrderItem> orderBy();

  // ParseExpression.cpp
  ExpressionPtr expression();
  ExpressionPtr value();
  ExpressionPtr condition();
  ExpressionPtr disjunction();
  ExpressionPtr conjunction();
  ExpressionPtr negation();
  ExpressionPtr predicate();
  ExpressionPtr sum();
  ExpressionPtr product();
  ExpressionPtr sign();
  ExpressionPtr primary();
  ExpressionPtr operandValue();
  ExpressionPtr logical(ExpressionPtr left, ExpressionPtr (Parser::*right)());
  ExpressionPtr binary(ExpressionPtr left, Form form, ExpressionPtr (Parser::*right)());
  ExpressionPtr comparison(ExpressionPtr left);
  ExpressionPtr nullTest(ExpressionPtr left);
  ExpressionPtr between(ExpressionPtr left, bool negated);
  ExpressionPtr like(ExpressionPtr left, bool negated);
  ExpressionPtr in(ExpressionPtr left, bool negated);
  ExpressionPtr parenthesised();
  ExpressionPtr exists();
  ExpressionPtr literal();
  ExpressionPtr column();
  ExpressionPtr caseOf();
  void branches(Expression& whole);
  bool isElseOfCaseOnly();
  void requireValue(const Expression& expression) const;
  void requireCondition(const Expression& expression) const;
  bool isOperator(Form form) const;
  void countOperator();

  // ParseFunction.cpp
  bool isCall() const;
  ExpressionPtr function();
  ExpressionPtr convert();
  ExpressionPtr cast();
  ExpressionPtr knownFunction();
  String datePart(std::string_view function);
  void arguments(Expression& call, bool aggregate);

  const std::vector<Token>& tokens_;
  Deadline deadline_;
  std::size_t at_ = 0;
  std::size_t depth_ = 0;
  std::size_t operators_ = 0;          // of the statement
  std::size_t tables_ = 0;             // of the from list
  std::vector<std::size_t> caseEnds_;  // for each token that is a case, its end; empty until the first chain
};

// Guards the stack: parentheses, signs, selects and whatever else the parser calls itself for count by their weight.
class Parser::Nesting {
 public:
  explicit Nesting(Parser& parser, std::size_t weight = 1);
  ~Nesting() { parser_.depth_ -= weight_; }
  Nesting(const Nesting&) = delete;
  Nesting& operator=(const Nesting&) = delete;

 private:
  Parser& parser_;
  std::size_t weight_;
};

}  // namespace QVSa::tsql
