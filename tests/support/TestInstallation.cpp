#include "tests/support/TestInstallation.h"

#include <stdexcept>
#include <unistd.h>

#include "QVSa/frame/ConnectionString.h"
#include "database/Scripts.h"
#include "providers/Installation.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {

namespace {

std::filesystem::path newFolder() {
  const std::filesystem::path base =
      std::filesystem::is_directory("/dev/shm") ? "/dev/shm" : std::filesystem::temp_directory_path();
  std::string name = (base / "qvsa-test-XXXXXX").string();
  if (!mkdtemp(name.data())) throw std::runtime_error("no folder for the test");
  return name;
}

std::vector<embedded::DatabaseScript> shippedScripts() {
  return {{"QVSys", std::string(database::qvSys)},
          {"QVApp", std::string(database::qvApp)},
          {"QVUpdate", std::string(database::qvUpdate)}};
}

// The installation that the others of this process are copies of: making the digests of the log-ins is slow by design.
class Model : public TestFolder {
 public:
  explicit Model(TestInstallation::Content content) {
    embedded::createInstallation(
        {path(), defaultDbPwd(), TestInstallation::administratorPassword,
         content == TestInstallation::Content::shipped ? shippedScripts() : std::vector<embedded::DatabaseScript>{}});
  }
};

const std::filesystem::path& modelOf(TestInstallation::Content content) {
  if (content == TestInstallation::Content::empty) {
    static const Model empty(content);
    return empty.path();
  }
  static const Model shipped(content);
  return shipped.path();
}

bool isServerTaken = false;

void resetServer(TestInstallation::Content content) {
  if (isServerTaken) throw std::logic_error("a server holds one installation");
  if (content == TestInstallation::Content::shipped)
    TestServer::instance().ship();
  else
    TestServer::instance().empty();
  isServerTaken = true;
}

}  // namespace

TestFolder::TestFolder() : path_(newFolder()) {}

TestFolder::~TestFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

TestInstallation::TestInstallation(Content content) {
  if (onServer()) {
    resetServer(content);
    return;
  }
  folder_ = newFolder();
  std::filesystem::copy(modelOf(content), folder_);
}

TestInstallation::~TestInstallation() {
  isServerTaken = false;
  std::error_code ignored;
  std::filesystem::remove_all(folder_, ignored);
}

const std::filesystem::path& TestInstallation::folder() const {
  if (onServer()) throw std::logic_error("a server has no folder");
  return folder_;
}

std::string TestInstallation::server() const {
  return onServer() ? TestServer::instance().server() : "file:" + folder_.string();
}

std::string TestInstallation::administratorString(const std::string& database) const {
  if (onServer()) return TestServer::instance().administratorString(database);
  return "provider=sqloledb;data source=" + server() + ";database=" + database +
         ";uid=sa;pwd=" + administratorPassword + ";";
}

}  // namespace QVSa::test
