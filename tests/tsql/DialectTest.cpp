#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "providers/tsql/Dialect.h"

namespace QVSa::tsql {
namespace {

TEST(Dialect, is_printed_in_the_documents_as_it_is) {
  std::ifstream file(std::filesystem::path(QVSA_SOURCE_DIR) / "docs" / "dialect.md");
  std::stringstream text;
  text << file.rdbuf();
  EXPECT_NE(text.str().find("<!-- table -->\n" + dialectReference() + "<!-- end of the table -->\n"), String::npos)
      << "make docs prints it";
}

TEST(Dialect, finds_functions_without_regard_to_case_and_operators_by_their_form) {
  ASSERT_NE(functionNamed("CharIndex"), nullptr);
  EXPECT_EQ(functionNamed("soundex"), nullptr);
  EXPECT_EQ(operatorNamed("-", Form::sign)->least, 1U);
  EXPECT_EQ(operatorNamed("-", Form::sum)->least, 2U);
  EXPECT_EQ(operatorNamed("-", Form::product), nullptr);
}

}  // namespace
}  // namespace QVSa::tsql
