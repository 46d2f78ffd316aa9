#include "StrictSession.h"

namespace QVSa::odbc {
namespace {

class UpdatableRows : public StrictSession {
 protected:
  void SetUp() override {
    StrictSession::SetUp();
    if (!session_) return;
    run("create table rep(uid nvarchar(20), no int, pwd nvarchar(40), pic blob, made datetime, primary key(uid, no))");
    run("insert into rep values('a',1,'x',null,null),('a',2,'x',null,null),('b',1,'x',null,null),('c',1,'',null,null)");
  }

  std::unique_ptr<QVSa::Rows> open(const String& text) {
    Batch batch{text};
    batch.updatable = true;
    return session_->run(batch).rows;
  }
};

TEST_F(UpdatableRows, AreWrittenBackWhileTheyAreRead) {
  const auto found = open("select uid,pwd from rep where pwd<>'' order by uid,no");
  ASSERT_EQ(found->columns().size(), 2U);  // the key's other column is the provider's own business
  int seen = 0;
  while (found->next()) {
    if (++seen != 2) found->update({{1, Variant("")}});
  }
  EXPECT_EQ(seen, 3);
  EXPECT_EQ(texts(*rows("select uid||no from rep where pwd='' order by 1")), "a1 b1 c1 ");
}

TEST_F(UpdatableRows, TakeEveryKindOfValue) {
  const String text = "\xE4\xB8\xAD\xF0\x9F\x98\x80";
  Bytes picture(50000);
  for (std::size_t i = 0; i < picture.size(); ++i) picture[i] = static_cast<std::uint8_t>(i * 7);
  const auto found = open("select * from rep where uid='b'");
  ASSERT_TRUE(found->next());
  found->update({{2, Variant(text)}, {3, Variant(picture)}, {4, Variant(*Date::parse("2024-02-03 04:05:06.789"))}});
  EXPECT_EQ(found->value(2), Variant(text));
  EXPECT_EQ(value("select pwd from rep where uid='b'"), Variant(text));
  EXPECT_EQ(value("select pic from rep where uid='b'"), Variant(picture));
  const Date made = value("select made from rep where uid='b'").toDate();
  EXPECT_EQ(made.sqlText() + "." + std::to_string(made.millisecond()), "20240203 04:05:06.789");
  found->update({{2, Variant("")}, {3, Variant::null()}, {4, Variant::null()}});
  EXPECT_EQ(value("select count(*) from rep where uid='b' and pwd='' and pic is null and made is null").toLong(), 1);
}

TEST_F(UpdatableRows, FindTheirTableBehindASynonym) {
  const auto found = open("select pwd from rep_synonym where uid='c'");
  ASSERT_TRUE(found->next());
  found->update({{0, Variant("seen")}});
  EXPECT_EQ(value("select pwd from rep where uid='c'"), Variant("seen"));
}

// The server refuses what is too long or does not convert: it has to see it.
TEST_F(UpdatableRows, SendValuesAsTheyAre) {
  run("create table short(i int primary key, a varchar(3), n int, d datetime, x varbinary(2))");
  run("insert into short(i) values(1)");
  const auto found = open("select * from short");
  ASSERT_TRUE(found->next());
  const String text = "longer than 3 \xE4\xB8\xAD";
  found->update({{1, Variant(text)}, {2, Variant("no number")}, {3, Variant("no date")}, {4, Variant(Bytes(9000, 7))}});
  EXPECT_EQ(texts(*rows("select a||n||d||length(x) from short")), text + "no numberno date9000 ");
}

TEST_F(UpdatableRows, FollowAKeyThatIsWritten) {
  const auto found = open("select no n,uid from rep where uid='c'");
  ASSERT_TRUE(found->next());
  found->update({{0, Variant(Long{9})}});
  found->update({{0, Variant(Long{10})}});
  EXPECT_EQ(value("select no from rep where uid='c'"), Variant(Long{10}));
}

TEST_F(UpdatableRows, TellWhenTheirRowIsGone) {
  const auto found = open("select pwd from rep where uid='c'");
  ASSERT_TRUE(found->next());
  run("delete from rep where uid='c'");
  EXPECT_THROW(found->update({{0, Variant("y")}}), Failure);
}

TEST_F(UpdatableRows, CanBeReadButNotWrittenWhereNoSingleRowStandsBehindThem) {
  const auto expectReadOnly = [](QVSa::Rows& found) {
    ASSERT_TRUE(found.next());
    try {
      found.update({{0, Variant("y")}});
      ADD_FAILURE() << "written";
    } catch (const Failure& failure) {
      EXPECT_EQ(failure.number(), number::readOnly);
    }
  };
  for (const String text :
       {"select a.pwd from rep a,rep b", "select max(pwd) from rep", "select distinct pwd from rep", "select 1"}) {
    SCOPED_TRACE(text);
    expectReadOnly(*open(text));
  }
  expectReadOnly(*rows("select pwd from rep"));
}

}  // namespace
}  // namespace QVSa::odbc
