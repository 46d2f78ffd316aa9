#include <gtest/gtest.h>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/Recordset.h"
#include "QVSa/values/Text.h"
#include "tests/support/Failures.h"
#include "tests/support/FakeSession.h"

namespace QVSa {

using test::failureOf;
using test::FakeServer;
using test::FakeTable;

class RecordsetTest : public testing::Test {
 protected:
  RecordsetTest() {
    server.answer("jobs", {{{"jobId"}, {"Name"}, {""}, {"name"}},
                           {{1, "first", Variant::null(), "x"}, {2, "second", 5.0, "y"}, {3, "third", "", "z"}}});
    server.answer("none", {{{"jobId"}}, {}});
    pictures = &server.answer("pictures", {{{"id"}, {"picture", true}}, {{1, Bytes{9, 9}}, {2, Variant::null()}}});
    connection.Open("data source=db1");
  }

  Recordset opened(const String& source, Long cursor = -1, Long lock = -1) {
    Recordset rows;
    rows.Open(source, connection, cursor, lock);
    return rows;
  }

  FakeServer server;
  Connection connection;
  FakeTable* pictures = nullptr;
};

TEST_F(RecordsetTest, StreamsRowByRow) {
  Recordset rows = connection.Execute("jobs");
  EXPECT_EQ(rows.State(), 1);
  EXPECT_FALSE(server.lastBatch.updatable);
  EXPECT_EQ(rows.RecordCount(), -1);
  std::vector<String> names;
  for (; !rows.EOF_(); rows.MoveNext()) {
    names.push_back(rows["NAME"].asText());
    EXPECT_EQ(server.fetchedRows, static_cast<int>(names.size()));
  }
  EXPECT_EQ(join(names, " "), "first second third");
}

TEST_F(RecordsetTest, AtTheEndThereIsNothingToRead) {
  Recordset rows = connection.Execute("none");
  EXPECT_TRUE(rows.EOF_());
  EXPECT_EQ(failureOf([&] { rows["jobId"].Value(); }), number::noRow);
  EXPECT_EQ(failureOf([&] { rows.MoveNext(); }), number::noRow);
  EXPECT_EQ(failureOf([&] { rows.MoveFirst(); }), number::noRow);
  EXPECT_TRUE(rows.GetRows().empty());
  EXPECT_EQ(failureOf([&] { rows.Update(); }), 0);
}

TEST_F(RecordsetTest, AClosedOneRefusesEverything) {
  Recordset rows = connection.Execute("jobs");
  rows.Close();
  EXPECT_EQ(server.rowSets, 0);
  EXPECT_EQ(rows.State(), 0);
  EXPECT_EQ(failureOf([&] { rows.EOF_(); }), number::closed);
  EXPECT_EQ(failureOf([&] { rows["Name"]; }), number::closed);
  EXPECT_EQ(failureOf([&] { rows.Close(); }), number::closed);
  rows.Open("none", connection);
  EXPECT_TRUE(rows.EOF_());
  EXPECT_EQ(failureOf([&] { rows.Open("none", connection); }), number::open);
}

TEST_F(RecordsetTest, ClosingTheConnectionClosesWhatStreamsFromIt) {
  Recordset streaming = connection.Execute("jobs");
  Recordset kept = opened("jobs", 3);
  connection.Close();
  EXPECT_EQ(server.rowSets, 0);
  EXPECT_EQ(streaming.State(), 0);
  EXPECT_EQ(failureOf([&] { streaming.MoveNext(); }), number::closed);
  EXPECT_EQ(failureOf([&] { kept.RecordCount(); }), number::closed);
}

TEST_F(RecordsetTest, KeptRowsCanBeCountedAndWalkedBack) {
  connection.CursorLocation(3);
  Recordset rows = connection.Execute("jobs");
  EXPECT_EQ(server.fetchedRows, 1);
  rows.MoveNext();
  rows.MoveNext();
  EXPECT_EQ(server.fetchedRows, 3);
  EXPECT_EQ(rows.RecordCount(), 3);
  EXPECT_EQ(rows["jobId"].asLong(), 3);
  rows.MoveFirst();
  EXPECT_EQ(rows["jobId"].asLong(), 1);
  rows.MoveLast();
  EXPECT_EQ(rows["jobId"].asLong(), 3);
  rows.MoveNext();
  EXPECT_TRUE(rows.EOF_());
  rows.MoveFirst();
  EXPECT_EQ(rows.GetRows().size(), 3U);
  EXPECT_TRUE(rows.EOF_());
}

TEST_F(RecordsetTest, AStreamCannotBeWalkedBackOnceRowsArePassed) {
  Recordset rows = connection.Execute("jobs");
  rows.MoveFirst();
  rows.MoveNext();
  EXPECT_EQ(failureOf([&] { rows.MoveFirst(); }), number::context);
  rows.MoveLast();
  EXPECT_EQ(rows["jobId"].asLong(), 3);
  EXPECT_EQ(failureOf([&] { rows.MoveFirst(); }), number::context);
}

TEST_F(RecordsetTest, ADetachedOneOutlivesItsConnection) {
  Recordset kept = opened("jobs", 3, 3);
  Recordset streaming = connection.Execute("jobs");
  streaming.MoveNext();
  kept.ActiveConnection(nullptr);
  streaming.ActiveConnection(nullptr);
  connection.Close();
  EXPECT_EQ(kept.RecordCount(), 3);
  EXPECT_EQ(kept["Name"].asText(), "first");
  EXPECT_EQ(streaming.RecordCount(), 2);
  const auto rest = streaming.GetRows();
  ASSERT_EQ(rest.size(), 2U);
  EXPECT_EQ(rest[0], (std::vector<Variant>{2, "second", 5.0, "y"}));
  EXPECT_EQ(failureOf([&] { kept["Name"].Value("new"); }), number::readOnly);
}

TEST_F(RecordsetTest, ChangesAreWrittenByUpdateAndByMovingOn) {
  for (const Long location : {2, 3}) {
    connection.CursorLocation(location);
    Recordset rows = opened("pictures", 1, 3);
    EXPECT_TRUE(server.lastBatch.updatable);
    rows["id"].Value(10);
    rows.Update();
    EXPECT_EQ(pictures->rows[0][0], Variant(10));
    EXPECT_EQ(rows["id"].asLong(), 10);
    rows["id"].Value(11);
    EXPECT_EQ(pictures->rows[0][0], Variant(10));
    rows.MoveNext();
    EXPECT_EQ(pictures->rows[0][0], Variant(11));
    rows.MoveNext();
    rows.Update();
  }
  EXPECT_EQ(std::count(server.log.begin(), server.log.end(), "update"), 4);

  Recordset rows = opened("pictures", 2, 3);
  rows["id"].Value(12);
  rows.MoveLast();
  EXPECT_EQ(pictures->rows[0][0], Variant(12));
}

TEST_F(RecordsetTest, ARefusedWriteKeepsTheRowAndItsChange) {
  server.fail("update", Failure(number::integrity, "Provider", "Violation of PRIMARY KEY constraint."));
  Recordset rows = opened("pictures", 2, 2);
  rows["id"].Value(2);
  EXPECT_EQ(failureOf([&] { rows.MoveNext(); }), number::integrity);
  EXPECT_EQ(rows["id"].asLong(), 2);
  EXPECT_EQ(pictures->rows[0][0], Variant(1));
}

TEST_F(RecordsetTest, OnlyTheRowOnWhichTheServerStandsCanBeChanged) {
  EXPECT_EQ(failureOf([&] { opened("pictures", 1, 1)["id"].Value(5); }), number::readOnly);
  EXPECT_EQ(failureOf([&] { opened("pictures", 3, 3)["id"].Value(5); }), number::readOnly);
  connection.CursorLocation(3);
  Recordset rows = opened("pictures", 1, 3);
  rows.MoveNext();
  rows.MoveFirst();
  EXPECT_EQ(failureOf([&] { rows["id"].Value(5); }), number::readOnly);
}

TEST_F(RecordsetTest, LongColumnsAreReadAndWrittenInChunks) {
  Recordset rows = opened("pictures", 1, 3);
  Field picture = rows["picture"];
  EXPECT_EQ(picture.ActualSize(), 2);
  EXPECT_EQ(rows["picture"].GetChunk(1), Bytes{9});
  picture.AppendChunk({1, 2, 3});
  rows["picture"].AppendChunk({4});
  EXPECT_EQ(picture.Value(), Variant(Bytes{1, 2, 3, 4}));
  rows.Update();
  EXPECT_EQ(pictures->rows[0][1], Variant(Bytes{1, 2, 3, 4}));
  EXPECT_EQ(rows["picture"].GetChunk(3), (Bytes{1, 2, 3}));
  EXPECT_EQ(rows["picture"].GetChunk(3), Bytes{4});
  EXPECT_TRUE(rows["picture"].GetChunk(3).empty());
  rows.MoveNext();
  EXPECT_EQ(rows["picture"].ActualSize(), 0);
  EXPECT_TRUE(rows["picture"].GetChunk(8).empty());
}

TEST_F(RecordsetTest, ATextsChunksAreItsUtf16Form) {
  server.answer("text", {{{"memo", true}}, {{"a部"}}});
  Recordset rows = connection.Execute("text");
  EXPECT_EQ(rows[0].ActualSize(), 4);
  EXPECT_EQ(rows[0].GetChunk(100), (Bytes{'a', 0, 0xE8, 0x90}));
}

}  // namespace QVSa
