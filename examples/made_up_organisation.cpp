// Writes departments.csv, users.csv and holdings.csv of a made-up organisation, for the demonstration and the tests
// where no real one is at hand: always the same, and of a real one's size: 839 departments up to 5 levels deep, 1,509
// users, 6,281 holdings of 3 roles.
//   made_up_organisation FOLDER

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <random>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace {

struct Department {
  std::string number;
  int level;
};

constexpr std::size_t departmentCount = 839;
constexpr int userCount = 1509;
constexpr std::size_t holdingCount = 6281;
constexpr int deepest = 5;
constexpr std::size_t organisationCount = 9;
// Of these names about one in fifteen comes again somewhere else in the tree.
constexpr std::size_t namesOfAKind = 750;

const char* const kinds[] = {"Admins", "Docs", "Maintainers", "Release", "Reviewers", "Security", "Support", "Tests"};

class Generator {
 public:
  explicit Generator(std::filesystem::path folder) : folder_(std::move(folder)) {}

  void departments() {
    std::ofstream file(folder_ / "departments.csv");
    file << "number,name,superior,isOrganisation\n_root,The Made-up Company,,1\n";
    departments_.push_back({"_root", 1});
    while (departments_.size() < departmentCount) writeDepartment(file);
  }

  void users() {
    std::ofstream file(folder_ / "users.csv");
    file << "login,name,department\n";
    for (int i = 1; i <= userCount; ++i) {
      char name[16];
      std::snprintf(name, sizeof name, "%04d", i);
      file << "user" << name << ",User " << name << "," << home(i).number << "\n";
    }
  }

  // Nearly all are members; one in 40 maintains, one in 70 administers.
  void holdings() {
    std::ofstream file(folder_ / "holdings.csv");
    file << "login,role,department\n";
    std::set<std::string> written;
    while (written.size() < holdingCount) {
      char login[16];
      std::snprintf(login, sizeof login, "user%04d", static_cast<int>(below(userCount)) + 1);
      const std::size_t draw = below(280);
      const char* const role = draw < 7 ? "Maintainer" : draw < 11 ? "Admin" : "Member";
      const std::string line = std::string(login) + "," + role + "," + departments_[below(departments_.size())].number;
      if (written.insert(line).second) file << line << "\n";
    }
  }

 private:
  // The branches come first, directly below the root.
  void writeDepartment(std::ofstream& file) {
    const std::size_t count = departments_.size();
    const bool isBranch = count <= organisationCount;
    const Department superior = isBranch ? departments_[0] : superiorOfTeam();
    const std::string number = "d" + std::to_string(count);
    const std::string name = isBranch ? "Branch " + std::to_string(count) : nameBelow(superior);
    file << number << "," << name << "," << superior.number << "," << (isBranch ? 1 : 0) << "\n";
    departments_.push_back({number, superior.level + 1});
  }

  Department superiorOfTeam() {
    while (true) {
      const Department& candidate = departments_[1 + below(departments_.size() - 1)];
      if (candidate.level < deepest) return candidate;
    }
  }

  // Names repeat under different superiors, as they do in life, and never under one, or full names would repeat.
  std::string nameBelow(const Department& superior) {
    while (true) {
      const std::string kind = kinds[below(std::size(kinds))];
      const std::string name = kind + " " + std::to_string(1 + below(namesOfAKind));
      if (siblings_.insert({superior.number, name}).second) return name;
    }
  }

  // The first user sits at the bottom of the tree, so that a change above him shows.
  const Department& home(int user) {
    if (user > 1) return departments_[below(departments_.size())];
    for (const Department& department : departments_)
      if (department.level == deepest) return department;
    return departments_.back();
  }

  // Taken from the engine itself: the library's distributions differ from one implementation to the next.
  std::size_t below(std::size_t limit) { return engine_() % limit; }

  std::filesystem::path folder_;
  std::vector<Department> departments_;
  std::set<std::pair<std::string, std::string>> siblings_;  // superior and name
  std::mt19937 engine_{20240229};
};

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: made_up_organisation FOLDER\n");
    return 2;
  }
  try {
    std::filesystem::create_directories(argv[1]);
    Generator generator(argv[1]);
    generator.departments();
    generator.users();
    generator.holdings();
    return 0;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "made_up_organisation: %s\n", error.what());
    return 1;
  }
}
