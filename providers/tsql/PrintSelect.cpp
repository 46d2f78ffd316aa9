#include "providers/tsql/PrintState.h"
#include "providers/tsql/Printer.h"

namespace QVSa::tsql {

String print(const Select& select) {
  Writer writer;
  writer.write(select);
  return writer.take();
}

void Writer::write(const Select& select) {
  if (!select.with.empty()) {
    add("with ");
    list(select.with, [&](const Select::CommonTable& table) { write(table); });
    add(" ");
  }
  for (std::size_t i = 0; i < select.parts.size(); ++i) {
    if (i > 0) add(select.parts[i].all ? " union all " : " union ");
    write(select.parts[i].core);
  }
  if (select.orderBy.empty()) return;
  add(" order by ");
  list(select.orderBy, [&](const OrderItem& item) { write(item); });
}

void Writer::write(const Select::CommonTable& table) {
  add(printName(table.name));
  add(" ");
  if (!table.columns.empty()) {
    writeNames(table.columns);
    add(" ");
  }
  add("as ");
  writeSubquery(*table.select);
}

void Writer::write(const SelectCore& core) {
  add("select ");
  if (core.distinct) add("distinct ");
  if (core.top) add("top " + core.top->text + (core.topPercent ? " percent " : " "));
  list(core.items, [&](const SelectItem& item) { write(item); });
  writeFrom(core.from);
  writeWhere(core.where);
  if (!core.groupBy.empty()) add(" group by ");
  list(core.groupBy, [&](const ExpressionPtr& key) { write(*key); });
  if (!core.having) return;
  add(" having ");
  write(*core.having);
}

void Writer::write(const SelectItem& item) {
  write(*item.expression);
  if (item.alias) add(" as " + printName(*item.alias));
}

void Writer::write(const OrderItem& item) {
  write(*item.expression);
  if (item.descending) add(" desc");
}

void Writer::writeFrom(const std::vector<TableSourcePtr>& from) {
  if (!from.empty()) add(" from ");
  list(from, [&](const TableSourcePtr& source) { write(*source); });
}

void Writer::writeWhere(const ExpressionPtr& where) {
  if (!where) return;
  add(" where ");
  write(*where);
}

void Writer::writeNames(const std::vector<String>& names) {
  add("(");
  list(names, [&](const String& name) { add(printName(name)); });
  add(")");
}

void Writer::write(const TableSource& source) {
  if (source.kind == TableSource::Kind::join) return writeJoin(source);
  if (source.kind == TableSource::Kind::derived)
    writeSubquery(*source.derived);
  else
    write(source.table);
  if (source.alias) add(" as " + printName(*source.alias));
  if (!source.columnNames.empty()) writeNames(source.columnNames);
  writeHints(source.hints);
}

void Writer::writeJoin(const TableSource& source) {
  static constexpr const char* kWords[] = {" join ",      " left join ",  " right join ",
                                           " full join ", " cross join ", " cross join "};
  const bool isOpen = source.right->kind == TableSource::Kind::join;
  write(*source.left);
  add(kWords[static_cast<std::size_t>(source.join)]);
  if (isOpen) add("(");
  write(*source.right);
  if (isOpen) add(")");
  if (!source.on) return;
  add(" on ");
  write(*source.on);
}

void Writer::writeHints(const std::vector<String>& hints) {
  if (hints.empty()) return;
  add(" with (");
  list(hints, [&](const String& hint) { add(hint); });
  add(")");
}

}  // namespace QVSa::tsql
