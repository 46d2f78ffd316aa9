#include "QVSa/hosting/Installation.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Secrets.h"
#include "QVSa/hosting/internal/FirstAdministrator.h"
#include "database/Scripts.h"
#include "providers/Installation.h"

namespace QVSa {

namespace {

namespace fs = std::filesystem;

void require(bool holds, const String& otherwise) {
  if (!holds) throw Failure(number::argument, "Installation", otherwise);
}

}  // namespace

Boolean Installation::make(const String& folder, const String& adminPassword, const String& saPassword) {
  return operation(plain(), [&] {
    require(canLieIn(folder), "The path of an installation must hold none of ; | ' and \\.");
    require(saPassword.find(';') == String::npos, "The password of sa must hold no semicolon.");
    embedded::InstallationPlan plan;
    plan.folder = folder;
    plan.userPassword = defaultDbPwd();
    plan.adminPassword = saPassword;
    plan.scripts = {{"QVSys", String(database::qvSys)},
                    {"QVApp", String(database::qvApp)},
                    {"QVUpdate", String(database::qvUpdate)}};
    plan.lastStep = [&](const fs::path& built) { setAdministratorsPassword(serverOf(built.string()), adminPassword); };
    embedded::createInstallation(plan);
    return true;
  });
}

Boolean Installation::canLieIn(const String& folder) { return serverOf(folder).find_first_of(";|'\\") == String::npos; }

Boolean Installation::isThere(const String& folder) { return embedded::isInstallation(folder); }

String Installation::serverOf(const String& folder) {
  fs::path path = fs::absolute(folder).lexically_normal();
  if (!path.has_filename()) path = path.parent_path();
  return "file:" + path.string();
}

Boolean Installation::hasBuiltInSecrets() { return deploymentSecrets().builtIn; }

}  // namespace QVSa
