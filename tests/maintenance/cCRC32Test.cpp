#include "QVSa/maintenance/cCRC32.h"
#include "platform/Files.h"
#include "tests/support/Failures.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {
namespace {

Bytes bytesOf(const String& text) { return Bytes(text.begin(), text.end()); }

// By the definition: bit by bit.
Long slowSum(const Bytes& bytes) {
  std::uint32_t sum = 0xFFFFFFFFU;
  for (const std::uint8_t byte : bytes) {
    sum ^= byte;
    for (int bit = 0; bit < 8; ++bit) sum = (sum >> 1) ^ ((sum & 1U) != 0 ? 0xEDB88320U : 0);
  }
  return static_cast<Long>(~sum);
}

TEST(AChecksum, IsTheStandardOne) {
  const cCRC32 sums;
  EXPECT_EQ(sums.GetByteArrayCrc32({}), 0);
  EXPECT_EQ(sums.GetByteArrayCrc32(bytesOf("123456789")), static_cast<Long>(0xCBF43926U));
}

TEST(AChecksum, OfAFileIsThatOfItsBytes) {
  const TestFolder folder;
  const String path = folder.path().string() + "\\part.bin";
  const cCRC32 sums;
  for (const std::size_t size : {0, 1, 8191, 8192, 8193, 70'000}) {
    Bytes content(size);
    for (std::size_t i = 0; i < size; ++i) content[i] = static_cast<std::uint8_t>(i * 31 + i / 256);
    platform::writeFile(path, content);
    EXPECT_EQ(sums.GetFileCrc32(path), size == 0 ? 0 : slowSum(content)) << size;
  }
  EXPECT_EQ(failureOf([&] { sums.GetFileCrc32(path + "x"); }), number::noFile);
  EXPECT_EQ(failureOf([&] { sums.GetFileCrc32(folder.path().string() + "\\no\\file"); }), number::noPath);
}

}  // namespace
}  // namespace QVSa::test
