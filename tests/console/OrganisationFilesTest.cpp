#include <fstream>
#include <gtest/gtest.h>

#include "console/Answer.h"
#include "console/OrganisationFiles.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::console {
namespace {

class OrganisationFiles : public testing::Test {
 protected:
  void write(const char* name, const String& content) { std::ofstream(folder_.path() / name) << content; }

  Organisation read(const String& departments, const String& users) {
    write("departments.csv", "number,name,superior,isOrganisation\n" + departments);
    write("users.csv", "login,name,department\n" + users);
    return readOrganisation(folder_.path());
  }

  String refusalOf(const String& departments, const String& users) {
    try {
      read(departments, users);
      return "";
    } catch (const Refusal& refusal) {
      return refusal.what();
    }
  }

  test::TestFolder folder_;
};

TEST_F(OrganisationFiles, ValuesInQuotesHoldCommasAndQuotes) {
  const Organisation read_ = read("_root,\"Morgan, \"\"Sons\"\" & Co\",,1\r\nd1, Süd ,_root,0\r\n", "ann,Ann,d1\n");
  ASSERT_EQ(read_.departments.size(), 2U);
  EXPECT_EQ(read_.departments[0].name, "Morgan, \"Sons\" & Co");
  EXPECT_TRUE(read_.departments[0].isOrganisation);
  EXPECT_EQ(read_.departments[1].name, "Süd");
  EXPECT_EQ(read_.departments[1].superior, "_root");
  EXPECT_EQ(read_.users.at(0).department, "d1");
}

TEST_F(OrganisationFiles, ColumnsStandInAnyOrderBehindAByteOrderMark) {
  write("departments.csv", "\xEF\xBB\xBFname,superior,isOrganisation,number\nTop,,1,_root\n");
  write("users.csv", "department,login,name\n_root,ann,Ann\n");
  EXPECT_EQ(readOrganisation(folder_.path()).users.at(0).login, "ann");
}

TEST_F(OrganisationFiles, WhatDoesNotFitIsToldWithItsLine) {
  const String root = "_root,Top,,1\n";
  EXPECT_EQ(refusalOf("d1,A,_root,0\n", ""), "departments.csv, line 2: _root must be the first department.");
  EXPECT_EQ(refusalOf(root + "d2,B,d1,0\nd1,A,_root,0\n", ""),
            "departments.csv, line 3: the superior d1 stands in no earlier line.");
  EXPECT_EQ(refusalOf(root + "d1,A,d1,0\n", ""), "departments.csv, line 3: the superior d1 stands in no earlier line.");
  EXPECT_EQ(refusalOf(root + "d1,A,_root,0\nd1,B,_root,0\n", ""),
            "departments.csv, line 4: the number d1 stands there twice.");
  EXPECT_EQ(refusalOf(root + "d1,A,_root,yes\n", ""), "departments.csv, line 3: isOrganisation is yes, not 0 or 1.");
  EXPECT_EQ(refusalOf(root, "ann,Ann,d9\n"), "users.csv, line 2: there is no department d9.");
  EXPECT_EQ(refusalOf(root, "ann,Ann,_root\nann,Bob,_root\n"), "users.csv, line 3: the login ann stands there twice.");
  EXPECT_EQ(refusalOf(root, "ann,,_root\n"), "users.csv, line 2: the name is empty.");
  EXPECT_NE(refusalOf(root + "d1,A\n", ""), "");
  write("holdings.csv", "login,role,department\nann,Clerk,_root\nbob,Clerk,_root\n");
  EXPECT_EQ(refusalOf(root, "ann,Ann,_root\n"), "holdings.csv, line 3: there is no user bob.");
  write("holdings.csv", "login,role,department\nann,Clerk,_root\nann,Clerk,_root\n");
  EXPECT_EQ(refusalOf(root, "ann,Ann,_root\n"), "holdings.csv, line 3: the holding stands there twice.");
  EXPECT_NE(refusalOf(root + "d1,\"A,_root,0\n", ""), "");
}

}  // namespace
}  // namespace QVSa::console
