#pragma once

#include <string_view>

#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// How strongly an expression holds its parts together: a part that holds weaker stands in parentheses.
namespace strength {
constexpr int any = 0;
constexpr int disjunction = 1;
constexpr int conjunction = 2;
constexpr int negation = 3;
constexpr int predicate = 4;
constexpr int sum = 5;
constexpr int sign = 6;
constexpr int product = 7;
constexpr int primary = 8;
}  // namespace strength

// Writes one tree; the parser reads the text as the same tree.
class Writer {
 public:
  // One for each alternative of Statement.
  void write(const SelectPtr& select);
  void write(const Insert& insert);
  void write(const Update& update);
  void write(const Delete& erase);
  void write(const CreateTable& table);
  void write(const CreateView& view);
  void write(const CreateIndex& index);
  void write(const CreateSynonym& synonym);
  void write(const CreateLogin& login);
  void write(const AlterLogin& login);
  void write(const Drop& drop);
  void write(const Use& use);
  void write(const SetOption& set);
  void write(const Transaction& transaction);
  void write(const Call& call);
  void write(const AlterDatabase& alter);
  void write(const BackupDatabase& backup);
  void write(const RestoreDatabase& restore);
  void write(const VerifyBackup& verify);

  void write(const Select& select);
  void write(const Expression& expression, int least = strength::any);
  void write(const TypeName& type);

  String take() { return std::move(text_); }

 private:
  void add(std::string_view text) { text_ += text; }
  template <typename Items, typename Write>
  void list(const Items& items, Write writeOne) {
    const char* between = "";
    for (const auto& item : items) {
      add(between);
      writeOne(item);
      between = ", ";
    }
  }

  // PrintExpression.cpp
  void writeInner(const Expression& expression);
  void writeText(const String& text);
  void writeToken(const Token& token);
  void writeQualified(const std::vector<String>& qualifier);
  void writeBinary(const Expression& expression, int own);
  void writeSigned(const Expression& expression);
  void writePredicate(const Expression& expression);
  void writeIn(const Expression& expression);
  void writeFunction(const Expression& expression);
  void writeConvert(const Expression& expression);
  void writeCase(const Expression& expression);
  void writeSubquery(const Select& select);

  // PrintSelect.cpp
  void write(const SelectCore& core);
  void write(const SelectItem& item);
  void write(const Select::CommonTable& table);
  void write(const TableSource& source);
  void write(const OrderItem& item);
  void writeJoin(const TableSource& source);
  void writeHints(const std::vector<String>& hints);
  void writeFrom(const std::vector<TableSourcePtr>& from);
  void writeWhere(const ExpressionPtr& where);
  void writeNames(const std::vector<String>& names);

  // PrintStatement.cpp
  void write(const ObjectName& name);
  void write(const ColumnDefinition& column);
  void write(const KeyDefinition& key);

  String text_;
};

}  // namespace QVSa::tsql
