#include <gtest/gtest.h>

#include "tests/processes/Work.h"

int main(int argc, char** argv) {
  if (argc > 2 && std::string(argv[1]) == "--work") return QVSa::test::doWork({argv + 2, argv + argc});
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
