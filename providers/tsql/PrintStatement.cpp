#include "providers/tsql/PrintState.h"
#include "providers/tsql/Printer.h"

namespace QVSa::tsql {

String print(const Statement& statement) {
  Writer writer;
  std::visit([&](const auto& one) { writer.write(one); }, statement);
  return writer.take();
}

void Writer::write(const SelectPtr& select) { write(*select); }

void Writer::write(const ObjectName& name) {
  if (!name.database.empty()) add(printName(name.database) + ".");
  if (!name.owner.empty()) add(printName(name.owner));
  if (!name.database.empty() || !name.owner.empty()) add(".");
  add(printName(name.name));
}

void Writer::write(const Insert& insert) {
  add("insert into ");
  write(insert.table);
  add(" ");
  if (!insert.columns.empty()) {
    writeNames(insert.columns);
    add(" ");
  }
  if (insert.select) return write(*insert.select);
  add("values ");
  list(insert.values, [&](const std::vector<ExpressionPtr>& row) {
    add("(");
    list(row, [&](const ExpressionPtr& value) { write(*value); });
    add(")");
  });
}

void Writer::write(const Update& update) {
  add("update ");
  write(update.target);
  writeHints(update.hints);
  add(" set ");
  list(update.assignments, [&](const Assignment& assignment) {
    writeQualified(assignment.qualifier);
    add(printName(assignment.column) + " = ");
    write(*assignment.value);
  });
  writeFrom(update.from);
  writeWhere(update.where);
}

void Writer::write(const Delete& erase) {
  add("delete from ");
  write(erase.target);
  writeFrom(erase.from);
  writeWhere(erase.where);
}

void Writer::write(const CreateTable& table) {
  add("create table ");
  write(table.table);
  add(" (");
  list(table.columns, [&](const ColumnDefinition& column) { write(column); });
  if (!table.columns.empty() && !table.keys.empty()) add(", ");
  list(table.keys, [&](const KeyDefinition& key) { write(key); });
  add(")");
}

void Writer::write(const ColumnDefinition& column) {
  add(printName(column.name) + " ");
  write(column.type);
  if (column.identity) add(" identity(" + std::to_string(column.seed) + ", " + std::to_string(column.increment) + ")");
  if (column.nullable) add(*column.nullable ? " null" : " not null");
  if (column.defaultValue) {
    add(" default ");
    write(*column.defaultValue, strength::sum);
  }
  if (column.primaryKey) add(" primary key");
  if (column.unique) add(" unique");
}

void Writer::write(const KeyDefinition& key) {
  if (!key.name.empty()) add("constraint " + printName(key.name) + " ");
  add(key.primary ? "primary key " : "unique ");
  writeNames(key.columns);
}

void Writer::write(const CreateView& view) {
  add("create view ");
  write(view.view);
  if (!view.columns.empty()) {
    add(" ");
    writeNames(view.columns);
  }
  add(" as ");
  write(*view.select);
}

void Writer::write(const CreateIndex& index) {
  add(index.unique ? "create unique index " : "create index ");
  add(printName(index.name) + " on ");
  write(index.table);
  add(" ");
  writeNames(index.columns);
}

void Writer::write(const CreateSynonym& synonym) {
  add("create synonym ");
  write(synonym.synonym);
  add(" for ");
  write(synonym.target);
}

void Writer::write(const CreateLogin& login) {
  add("create login " + printName(login.name) + " with password = ");
  writeToken(login.password);
}

void Writer::write(const AlterLogin& login) {
  add("alter login " + printName(login.name) + " with password = ");
  writeToken(login.password);
}

void Writer::write(const Drop& drop) {
  static constexpr const char* kKinds[] = {"table ", "view ", "index ", "synonym ", "login "};
  add("drop ");
  add(kKinds[static_cast<std::size_t>(drop.kind)]);
  write(drop.name);
  if (!drop.table) return;
  add(" on ");
  write(*drop.table);
}

void Writer::write(const Use& use) { add("use " + printName(use.database)); }

void Writer::write(const SetOption& set) {
  add("set " + set.option + " ");
  if (set.table) {
    write(*set.table);
    add(" ");
  }
  add(set.on ? "on" : "off");
}

void Writer::write(const Transaction& transaction) {
  static constexpr const char* kWords[] = {"begin", "commit", "rollback"};
  add(kWords[static_cast<std::size_t>(transaction.kind)]);
  add(" transaction");
}

void Writer::write(const Call& call) {
  add("exec ");
  write(call.procedure);
  if (!call.arguments.empty()) add(" ");
  list(call.arguments, [&](const ExpressionPtr& argument) { write(*argument); });
}

}  // namespace QVSa::tsql
