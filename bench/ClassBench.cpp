#include <memory>

#include "QVSa/QVSa.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/Storage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

namespace {

// 10,000 report classes in a full tree below Top, which stands below one of two roots.
class Shelf {
 public:
  Shelf();

  std::string server() const { return installation_.server(); }
  const std::filesystem::path& folder() const { return installation_.folder(); }

 private:
  struct Place {
    std::string name, path, fullName, ordPath;
  };
  static Place below(const Place& superior, const std::string& name, int position);

  test::TestInstallation installation_;
};

Shelf::Place Shelf::below(const Place& superior, const std::string& name, int position) {
  return {name, superior.path + name + ".", superior.fullName + "," + name,
          superior.ordPath + ".00" + std::to_string(position)};
}

Shelf::Shelf() {
  constexpr int classesBelow = 8;
  constexpr std::size_t count = 10'001;
  Storage storage(folder());
  storage.execute("begin");
  Query insert(storage,
               "insert into QVSys.RptDirectory(class,superClass,path,fullName,ordNo,ordPath,CreUId,CreUName,UpdUId,"
               "UpdUName,OtherCanUpd) values(?,?,?,?,?,?,1,'Ann',1,'Ann',0)");
  const auto add = [&](const Place& place, const std::string& superior, std::int64_t position) {
    insert.start(place.name, superior, place.path, place.fullName, position, place.ordPath).run();
  };
  const Place left{"Left", ".Left.", "Left", "001"};
  add(left, "", 1);
  add({"Right", ".Right.", "Right", "002"}, "", 2);
  std::vector<Place> places{below(left, "Top", 1)};
  add(places[0], "Left", 1);
  for (std::size_t i = 1; i < count; ++i) {
    const Place& superior = places[(i - 1) / classesBelow];
    const int position = static_cast<int>((i - 1) % classesBelow) + 1;
    Place place = below(superior, "Class " + std::to_string(i), position);
    add(place, superior.name, position);
    places.push_back(std::move(place));
  }
  storage.execute("commit");
}

const Shelf& shelf() {
  static const Shelf theShelf;
  return theShelf;
}

Call listAll() {
  auto tree = std::make_shared<Directory>();
  tree->connect(shelf().server());
  return {[tree] { require(tree->GetAll().size() > 1'000'000, *tree); }};
}

Call listAllFloor() {
  struct Floor {
    Storage storage{shelf().folder()};
    Query query{
        storage,
        "select superClass,path,fullName,CreUId,CreUName,CreateTime,UpdUId,UpdUName,UpdTime,OtherCanUpd,ordNo,"
        "ordPath,class from QVSys.RptDirectory order by length(path)-length(replace(path,'.','')),ordPath,ordNo"};
  };
  return {[floor = std::make_shared<Floor>()] {
    std::vector<Row> rows;
    floor->query.start();
    while (floor->query.step()) rows.push_back(floor->query.row());
  }};
}

Call move() {
  return {[] {
    Directory top;
    top.connect(shelf().server());
    require(top.GetOne(1, "Top"), top);
    top.superClass(top.superClass() == "Left" ? "Right" : "Left");
    require(top.Save(), top);
  }};
}

class MoveFloor {
 public:
  void run() {
    const Row top = read_.start("Top").one();
    const Row superior = read_.start(top.texts[0] == "Left" ? "Right" : "Left").one();
    const std::string& name = superior.texts[3];
    const std::string path = superior.texts[1] + "Top.";
    const std::string full = superior.texts[2] + ",Top";
    const std::string last = top.texts[1] + "\xF4\x8F\xBF\xBF";
    begin_.start().run();
    row_.start(name, full, path, superior.texts[4] + ".001").run();
    below_.start(top.texts[1], path, top.texts[2], full, top.texts[1], last).run();
    order_.start(path, path + "\xF4\x8F\xBF\xBF").run();
    commit_.start().run();
  }

 private:
  Storage storage_{shelf().folder()};
  Query read_{storage_, "select superClass,path,fullName,class,ordPath from QVSys.RptDirectory where class=?"};
  Query row_{storage_,
             "update QVSys.RptDirectory set superClass=?,fullName=?,path=?,ordNo=1,ordPath=? where class='Top'"};
  Query below_{storage_,
               "update QVSys.RptDirectory set path=replace(path,?,?),fullName=replace(fullName,?,?) where path>=? and "
               "path<?"};
  Query order_{
      storage_,
      "update QVSys.RptDirectory as r set ordPath=s.ordPath||printf('.%03d',r.ordNo) from QVSys.RptDirectory s "
      "where r.superClass=s.class and r.path>=? and r.path<?"};
  Query begin_{storage_, "begin"};
  Query commit_{storage_, "commit"};
};

Call moveFloor() {
  return {[floor = std::make_shared<MoveFloor>()] { floor->run(); }};
}

}  // namespace

void addClassPairs() {
  addPair("Directory.GetAll, 10,000 classes", listAll, listAllFloor);
  addPair("Directory.Save, 10,000 classes moved", move, moveFloor);
}

}  // namespace QVSa::bench
