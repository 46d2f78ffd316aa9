#include <filesystem>
#include <gtest/gtest.h>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/FieldFile.h"
#include "platform/Files.h"
#include "platform/Services.h"
#include "tests/support/FakeSession.h"

namespace QVSa {

using test::FakeServer;
using test::FakeTable;

namespace {

Bytes pattern(std::size_t size) {
  Bytes bytes(size);
  for (std::size_t i = 0; i < size; ++i) bytes[i] = static_cast<std::uint8_t>(i * 7 + i / 4096);
  return bytes;
}

}  // namespace

class FieldFileTest : public testing::Test {
 protected:
  FieldFileTest() : services_(platform::services()) {
    platform::Services recording = services_;
    recording.eventLog = [this](const String& line) { events.push_back(line); };
    platform::replaceServices(recording);
    std::filesystem::create_directories(folder);
    table = &server.answer("pictures", {{{"picture", true}}, {{Variant::null()}}});
    connection.Open("data source=db1");
    rows.Open("pictures", connection, 1, 3);
  }
  ~FieldFileTest() override {
    platform::replaceServices(services_);
    std::filesystem::remove_all(folder);
  }

  String file(const String& name) const { return (folder / name).string(); }

  const std::filesystem::path folder =
      std::filesystem::temp_directory_path() / ("qvsa-field-file-" + std::to_string(::getpid()));
  FakeServer server;
  FakeTable* table = nullptr;
  Connection connection;
  Recordset rows;
  std::vector<String> events;
  String errText;

 private:
  platform::Services services_;
};

TEST_F(FieldFileTest, FilesOfEverySizeComeBackAsTheyWere) {
  for (const std::size_t size : {std::size_t{1}, std::size_t{4096}, std::size_t{4097}, std::size_t{10000}}) {
    platform::writeFile(file("in"), pattern(size));
    ASSERT_TRUE(fileToField(rows["picture"], file("in"), errText));
    rows.Update();
    EXPECT_EQ(table->rows[0][0], Variant(pattern(size)));
    ASSERT_TRUE(fieldToFile(rows["picture"], file("out"), errText));
    EXPECT_EQ(platform::readFile(file("out")), pattern(size));
  }
  EXPECT_TRUE(events.empty());
}

TEST_F(FieldFileTest, AnEmptyFileAppendsNothing) {
  platform::writeFile(file("in"), {});
  EXPECT_TRUE(fileToField(rows["picture"], file("in"), errText));
  rows.Update();
  EXPECT_TRUE(table->rows[0][0].isNull());
}

TEST_F(FieldFileTest, ANullFieldMakesNoFile) {
  EXPECT_TRUE(fieldToFile(rows["picture"], file("out"), errText));
  EXPECT_FALSE(std::filesystem::exists(file("out")));
}

TEST_F(FieldFileTest, FailuresAreToldAndLogged) {
  EXPECT_FALSE(fileToField(rows["picture"], file("missing"), errText));
  EXPECT_EQ(errText, "File not found");
  rows["picture"].Value(pattern(5));
  EXPECT_FALSE(fieldToFile(rows["picture"], file("missing/out"), errText));
  EXPECT_EQ(errText, "Path not found");
  rows.Close();
  EXPECT_EQ(events, (std::vector<String>{"File not found", "Path not found"}));
}

}  // namespace QVSa
