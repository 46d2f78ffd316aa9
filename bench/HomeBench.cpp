#include <fstream>
#include <memory>

#include "QVSa/QVSa.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/Storage.h"
#include "platform/Files.h"
#include "platform/SecretMessage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

namespace {

constexpr std::size_t pictureSize = std::size_t{20} << 20;

// An installation with settings, and a picture of 20 MB.
struct Ground {
  Ground() {
    std::ofstream(picture()) << std::string(pictureSize, 'p');
    Home home;
    home.connect(installation.server(), "QVApp");
    home.homeName("Company");
    home.smtpServer("smtp");
    home.emailPassword("Mail-Secret");
    require(home.Save(), home);
  }
  std::string picture() const { return (files.path() / "picture").string(); }

  test::TestInstallation installation;
  test::TestFolder files;
};

const Ground& ground() {
  static const Ground made;
  return made;
}

std::shared_ptr<Home> loaded() {
  auto home = std::make_shared<Home>();
  require(home->connect(ground().installation.server(), "QVApp"), *home);
  return home;
}

Call load() {
  return {[home = loaded()] { require(home->connect(ground().installation.server(), "QVApp"), *home); }};
}

// The same rows, and the same work on the stored password.
class Floor {
 public:
  Floor() : storage_(ground().installation.folder()) {}

  void load() {
    platform::decryptText(password_.start().one().texts[0], "smtp");
    row_.start().one();
    workflow_.start().one();
  }
  void save(std::string_view picture) {
    storage_.execute("begin immediate");
    const std::string password = platform::encryptText("Mail-Secret", "smtp");
    exists_.start().one();
    update_.start(std::string_view("Company"), std::string_view(password), nowTicks()).run();
    rename_.start(std::string_view("Company")).run();
    picture_.start(picture).run();
    icon_.start().run();
    storage_.execute("commit");
  }

 private:
  Storage storage_;
  Query password_{storage_, "select emailPassword from QVSys.homeinfo where id=1"};
  Query row_{storage_, "select * from QVSys.homeinfo where id=1"};
  Query workflow_{storage_, "select count(*) from QVSys.repTmps t join QVSys.cfprocesses p on t.rtUid=p.rtUid"};
  Query exists_{storage_, "select id from QVSys.homeinfo where id=1"};
  Query update_{storage_,
                "update QVSys.homeinfo set companyName=?1,companyEnName='',address='',zip='',tel='',fax='',email='',"
                "webUrl='',bankName='',BankAccount='',TaxNo='',JPerson='',AcctDay=1,AcctTime=1,timeOut=0,smState=0,"
                "allowOuter=0,roleGrp=0,domainUser=0,autoRegUser=0,regPrompt='',allowSendEmail=1,smtpServer='smtp',"
                "smtpPort=25,emailSender='',emailAddress='',emailSubject='',emailContent='',emailPContent='',"
                "emailRContent='',emailPassword=?2,smtpState=0,smtpAuth=0,smtpUseSSL=0,ldEnable=0,LDSName='',LDHost='',"
                "LDport=389,LDBaseDN='',LDBindDN='',LDPasswd='',UpdTime=?3,LoginNewsUrl='',attLimit='',savePwd=0,"
                "useOTPAuth=0,loginTitle='' where id=1"};
  Query rename_{storage_, "update QVSys.departments set deptName=?1,fullName=?1 where deptNo='_root'"};
  Query picture_{storage_, "update QVSys.homeinfo set LoginImage=cast(nullif(?1,'') as blob) where id=1"};
  Query icon_{storage_, "update QVSys.homeinfo set customFormIcon=null where id=1"};
};

Call loadFloor() {
  return {[floor = std::make_shared<Floor>()] { floor->load(); }};
}

Call save() {
  return {[home = loaded()] { require(home->Save(), *home); }};
}

Call saveFloor() {
  return {[floor = std::make_shared<Floor>()] { floor->save(""); }};
}

Call send() {
  auto home = loaded();
  home->LoginImageFile(ground().picture());
  return {[home] { require(home->Save(), *home); }};
}

Call sendFloor() {
  return {[floor = std::make_shared<Floor>()] {
    const Bytes content = platform::readFile(ground().picture());
    floor->save({reinterpret_cast<const char*>(content.data()), content.size()});
  }};
}

}  // namespace

void addHomePairs() {
  addPair("Home.connect", load, loadFloor);
  addPair("Home.Save", save, saveFloor);
  addPair("Home.Save with a picture of 20 MB", send, sendFloor);
}

}  // namespace QVSa::bench
