#include <algorithm>
#include <gtest/gtest.h>
#include <random>

#include "QVSa/classification/Directory.h"
#include "tests/classification/DirectoryModel.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa {
namespace {

using test::DirectoryModel;

// Saves, deletes and reorders at random, on few names, so that they meet: each step is made on the table and on the
// model, and both have to stand alike.
class RandomSteps {
 public:
  explicit RandomSteps(unsigned seed) : random_(seed) {
    db_.run("insert into RptDirectory(class,superClass,path,fullName) values('N',null,'.N.','N')");
    model_.rows["N"] = {std::nullopt, ".N.", "N", std::nullopt, std::nullopt};
  }

  void step() {
    switch (number(10)) {
      case 0:
      case 1:
      case 2:
        return insert();
      case 3:
        return remove();
      case 4:
      case 5:
        return reorder();
      default:
        return update();
    }
  }

  std::vector<String> expected() const { return model_.lines(); }
  std::vector<String> actual() const {
    return db_.rows("select class,superClass,path,fullName,ordNo,ordPath from RptDirectory order by class");
  }
  const String& told() const { return told_; }

 private:
  int number(int below) { return std::uniform_int_distribution(0, below - 1)(random_); }

  String name() {
    static const char* const names[] = {"A", "AA", "B", "C C", "D", "E", "F", "G", "H", "I", "J", "K", "L", "N"};
    return names[number(std::size(names))];
  }
  String nameOrNone() { return number(4) == 0 ? "" : name(); }

  Directory connected() {
    Directory node;
    node.connect(installation_.server(), "QVApp");
    return node;
  }

  void tell(const String& what, bool done, bool expectedDone, const Directory& node) {
    told_ = what;
    EXPECT_EQ(done, expectedDone) << what << ": " << node.errDescription();
  }

  // Sometimes saved again by the same object, which does not know its superior then.
  void insert() {
    Directory node = connected();
    node.Class(name());
    node.superClass(nameOrNone());
    const bool done = node.Save();
    tell("insert " + node.Class() + " below " + node.superClass(), done, model_.insert(node.Class(), node.superClass()),
         node);
    if (!done || number(3) != 0) return;
    node.ordNo(1);
    save(node, {node.Class(), node.superClass(), node.Class(), "", 1});
  }

  // Sometimes twice by one object, which goes on with the place that it loaded.
  void update() {
    Directory node = connected();
    node.GetOne(1, name());
    if (node.Class().empty()) return insert();
    DirectoryModel::Saved saved{node.Class(), node.superClass(), node.Class(), node.superClass(), node.ordNo()};
    for (int times = number(4) == 0 ? 2 : 1; times > 0; --times) {
      if (number(3) == 0) node.Class(saved.name = name());
      if (number(3) != 0) node.superClass(saved.superClass = nameOrNone());
      if (!save(node, saved)) return;
      saved.oldName = saved.name;
      saved.oldSuperClass = saved.superClass;
    }
  }

  bool save(Directory& node, const DirectoryModel::Saved& saved) {
    const bool done = node.Save();
    tell("save " + saved.oldName + " of " + saved.oldSuperClass + " as " + saved.name + " of " + saved.superClass, done,
         model_.update(saved), node);
    return done;
  }

  void remove() {
    Directory node = connected();
    const String victim = name();
    const bool done = node.Delete(victim);
    tell("delete " + victim, done, model_.remove(victim), node);
  }

  void reorder() {
    const String superior = nameOrNone();
    String superOrdPath;
    std::vector<String> names;
    for (const auto& [own, row] : model_.rows) {
      if (own == superior) superOrdPath = row.ordPath.value_or("") + ".";
      if (row.superClass.value_or("") == superior) names.push_back(own);
    }
    std::ranges::shuffle(names, random_);
    Directory node = connected();
    const bool done = node.updateSubOrder(superOrdPath, join(names, ","));
    tell("reorder " + superior + ": " + join(names, ","), done, model_.reorder(superOrdPath, names), node);
  }

  std::mt19937 random_;
  test::TestInstallation installation_;
  test::PlainSession db_{installation_.server()};
  DirectoryModel model_;
  String told_;
};

TEST(DirectorySteps, KeepTheTableAsTheModelHasItAfterEveryOne) {
  for (const unsigned seed : {1U, 2U, 3U}) {
    RandomSteps steps(seed);
    for (int i = 0; i < 250; ++i) {
      steps.step();
      ASSERT_EQ(steps.actual(), steps.expected()) << "seed " << seed << ", step " << i << ": " << steps.told();
      if (testing::Test::HasFailure()) return;
    }
  }
}

}  // namespace
}  // namespace QVSa
