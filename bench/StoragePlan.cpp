#include "bench/StoragePlan.h"

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Emitter.h"
#include "providers/embedded/storage/Catalogue.h"
#include "providers/embedded/storage/Handle.h"
#include "providers/tsql/Lexer.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/Parser.h"

namespace QVSa::bench {

std::vector<std::string> storagePlan(const std::filesystem::path& folder, const std::string& database,
                                     const std::string& query) {
  embedded::Handle handle(folder);
  const embedded::Catalogue catalogue(handle);
  auto statements = tsql::parse(tsql::tokenize(query));
  tsql::rewriteOuterJoins(statements.front());
  embedded::Binder binder(catalogue, embedded::databaseByName(database).value());
  const auto bound = binder.bindQuery(*std::get<tsql::SelectPtr>(statements.front()), false);
  embedded::Prepared plan(handle.get(), "explain query plan " + emit(*bound.select).text);
  std::vector<std::string> steps;
  while (plan.step()) steps.push_back(std::get<std::string>(plan.column(3)));
  return steps;
}

}  // namespace QVSa::bench
