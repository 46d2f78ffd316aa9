#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace QVSa::bench {

// How SQLite goes about a query as the engine hands it over: its own words, one line a step.
std::vector<std::string> storagePlan(const std::filesystem::path& folder, const std::string& database,
                                     const std::string& query);

}  // namespace QVSa::bench
