#pragma once

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::embedded {

struct DatabaseScript {
  String database;  // QVSys, QVApp or QVUpdate
  String script;    // T-SQL with GO between its batches
};

struct InstallationPlan {
  std::filesystem::path folder;
  String userPassword;                  // of the log-in QVUser, which owns the three databases
  String adminPassword;                 // of the log-in sa
  std::vector<DatabaseScript> scripts;  // run in this order, each in its database
  // Called behind the scripts, where one is given, with the folder as it is being built.
  std::function<void(const std::filesystem::path& folder)> lastStep{};
};

// Makes an installation: the folder where it is missing, one file a database, the lock files, the log-ins, then the
// scripts and the last step. It is built in a folder beside the target and renamed, so that a failure leaves nothing
// behind; in an empty folder that no other can replace (the one above can't be written, or it is a mount point) within
// that. Owner and group of an empty folder are kept, and a link to it is followed.
// Throws 58 where the folder exists and is not empty, 70, 75 or 76 where it cannot be made, 0x80004005 on a network
// file system.
void createInstallation(const InstallationPlan& plan);

// Whether the folder holds an installation of the engine.
bool isInstallation(const std::filesystem::path& folder);

}  // namespace QVSa::embedded
