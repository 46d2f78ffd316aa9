#include "console/SystemRows.h"

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"

namespace QVSa::console {

std::vector<std::vector<Variant>> systemRows(const Console& console, const String& query) {
  Connection connection;
  connection.Open(buildConnString(console.place().server, "", false));
  return connection.Execute(query).GetRows();
}

}  // namespace QVSa::console
