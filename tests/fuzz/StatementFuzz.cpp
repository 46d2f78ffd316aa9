// Any bytes at all end in prepared statements of SQLite or in a Failure with a number of SQL Server, and a tree
// survives being printed and read again.

#include <cstdlib>
#include <iostream>

#include "database/Scripts.h"
#include "providers/embedded/administration/Script.h"
#include "providers/embedded/session/Plan.h"
#include "providers/embedded/session/Provider.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/tsql/OuterJoins.h"
#include "tests/embedded/InstallationFolder.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

constexpr Long kTooDeep = 191;
constexpr Long kTooManyTables = 106;

[[noreturn]] void report(const String& what, const String& first, const String& second) {
  std::cerr << what << "\n" << first << "\n" << second << "\n";
  std::abort();
}

void checkPrint(const Statement& statement) {
  const String text = print(statement);
  try {
    const std::vector<Statement> again = parseText(text);
    if (again.size() != 1) report("not one statement", text, "");
    if (treeOf(again[0]) != treeOf(statement)) report("another tree", treeOf(statement), treeOf(again[0]));
  } catch (const Failure& failure) {
    // Parentheses of the printer's own, or joins that were a list, may reach a limit that the original kept.
    if (failure.native() != kTooDeep && failure.native() != kTooManyTables)
      report("no longer read", text, failure.description());
  }
}

// An installation with the shipped tables and some of its own, made once, and what a session has of it.
class Database {
 public:
  Database() {
    embedded::runScript(folder_.data(), "QVSys", String(database::qvSys));
    session_->run(
        {"create table t (a int identity primary key, b nvarchar(20) null unique, c decimal(9,2) not null "
         "default 0.5, d datetime null, x image null)"});
    session_->run({"create table u (a int not null, b varchar(9) not null, primary key(a,b))"});
    session_->run({"create view v as select t.a, u.b from t left join u on t.a=u.a"});
    session_->run({"create synonym s for QVSys..t"});
    session_->run({"create index ix on t(d)"});
    catalogue_ = std::make_unique<embedded::Catalogue>(*handle_);
  }

  void check(Statement statement) {
    const String text = print(statement);
    try {
      if (embedded::isDefinition(statement))
        define(text);
      else
        prepare(std::move(statement));
    } catch (const Failure& failure) {
      if (failure.native() == 0) report("without a number", text, failure.description());
    }
  }

 private:
  void prepare(Statement statement) {
    embedded::LiteralUses uses;
    embedded::Step step = embedded::compile(std::move(statement), *catalogue_, 1, true, Deadline(), uses);
    if (step.main) step.main->take(*handle_);
    if (step.candidates) step.candidates->take(*handle_);
  }

  void define(const String& text) {
    session_->begin();
    try {
      session_->run({text});
    } catch (...) {
      session_->rollback();
      throw;
    }
    session_->rollback();
  }

  static ConnectionOptions options(const embedded::InstallationFolder& folder) {
    ConnectionOptions options;
    options.dataSource = "file:" + folder.data().string();
    options.database = "QVSys";
    options.user = "QVUser";
    options.password = folder.plan().userPassword;
    return options;
  }

  embedded::InstallationFolder folder_;
  std::unique_ptr<ProviderSession> session_ = embedded::provider().open(options(folder_));
  std::unique_ptr<embedded::Handle> handle_ = std::make_unique<embedded::Handle>(folder_.data());
  std::unique_ptr<embedded::Catalogue> catalogue_;
};

Database& database() {
  try {
    static Database made;
    return made;
  } catch (const Failure& failure) {
    report("no database", failure.description(), "");
  }
}

void checkBatch(const String& batch) {
  const std::vector<Token> tokens = tokenize(batch);
  const String shape = shapeOf(tokens);
  if (shape.empty() != (tokens.size() == 1)) report("no shape", batch, shape);
  for (Statement& statement : parse(tokens)) {
    checkPrint(statement);
    rewriteOuterJoins(statement);
    checkPrint(statement);
    database().check(std::move(statement));
  }
}

}  // namespace
}  // namespace QVSa::tsql

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  try {
    QVSa::tsql::checkBatch(QVSa::String(data, data + size));
  } catch (const QVSa::Failure&) {
    return 0;
  }
  return 0;
}
