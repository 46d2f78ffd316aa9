#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "providers/tsql/Lexer.h"

namespace QVSa::tsql {
namespace {

// The tokens as one text: kind as a letter, then the text.
String tokensOf(const String& batch) {
  static const char* const kKinds[] = {"w:", "q:", "v:", "i:", "d:", "r:", "s:", "b:", "l", "", "end"};
  String text;
  for (const Token& token : tokenize(batch)) {
    if (token.kind == TokenKind::end) break;
    if (!text.empty()) text += ' ';
    text += kKinds[static_cast<std::size_t>(token.kind)] + token.text;
    for (const Token& item : token.items) text += "," + item.text;
  }
  return text;
}

String shape(const String& batch) { return shapeOf(tokenize(batch)); }

Long refusalOf(const String& batch) {
  try {
    tokenize(batch);
  } catch (const Failure& failure) {
    return failure.native();
  }
  return 0;
}

TEST(Lexer, cuts_words_of_any_script_and_names_in_brackets_or_quotes) {
  EXPECT_EQ(tokensOf("select [a]]b],\"c\"\"d\" 名称 _x#1 @v"), "w:select q:a]b , q:c\"d w:名称 w:_x#1 v:@v");
  EXPECT_EQ(tokensOf("n.N'x'"), "w:n . s:x");
  EXPECT_TRUE(tokenize("DESC")[0].reserved);
  EXPECT_FALSE(tokenize("[desc]")[0].reserved);
  EXPECT_FALSE(tokenize("path")[0].reserved);
  EXPECT_FALSE(tokenize("do")[0].reserved);
}

TEST(Lexer, tells_numbers_apart_by_what_they_fit) {
  EXPECT_EQ(tokensOf("1 2147483647 2147483648 0002147483647"), "i:1 i:2147483647 d:2147483648 i:0002147483647");
  EXPECT_EQ(tokensOf("1.5 .5 5. 1e5 1.5E-3 2e 3ex"), "d:1.5 d:.5 d:5. r:1e5 r:1.5E-3 i:2 w:e i:3 w:ex");
  EXPECT_EQ(tokensOf("0xFF0 0x"), "b:FF0 b:");
}

TEST(Lexer, takes_comments_for_blanks) {
  EXPECT_EQ(tokensOf("a--b\nc/* d /* e */ f */g -- end"), "w:a w:c w:g");
  EXPECT_EQ(tokensOf("a-b - -c"), "w:a - w:b - - w:c");
}

TEST(Lexer, makes_one_token_of_a_list_of_literals) {
  EXPECT_EQ(tokensOf("x IN (1, -2,'a''b' ,+3.5)"), "w:x w:IN ( l,1,-2,a'b,3.5 )");
  EXPECT_EQ(tokensOf("in('a')"), "w:in ( l,a )");
  EXPECT_EQ(tokensOf("in ()"), "w:in ( )");
  EXPECT_EQ(tokensOf("in (1,)"), "w:in ( i:1 , )");
  EXPECT_EQ(tokensOf("in (1,x)"), "w:in ( i:1 , w:x )");
  EXPECT_EQ(tokensOf("in (1+2)"), "w:in ( i:1 + i:2 )");
  EXPECT_EQ(tokensOf("in (-'a')"), "w:in ( - s:a )");
  EXPECT_EQ(tokensOf("[in] (1,2)"), "q:in ( i:1 , i:2 )");
}

TEST(Lexer, numbers_literals_through_the_batch_with_a_list_as_one) {
  std::vector<std::size_t> numbers;
  for (const Token& token : tokenize("a=5 and b in (1,-2,3) and c='x' and d in (1,e)"))
    if (isLiteral(token.kind)) numbers.push_back(token.literal);
  EXPECT_EQ(numbers, (std::vector<std::size_t>{0, 1, 2, 3}));
}

TEST(Lexer, refuses_what_does_not_end_or_begin) {
  EXPECT_EQ(refusalOf("select 'abc"), 105);
  EXPECT_EQ(refusalOf("select [abc"), 105);
  EXPECT_EQ(refusalOf("select 1 /* a /* b */"), 113);
  EXPECT_EQ(refusalOf("select []"), 1038);
  EXPECT_EQ(refusalOf("select ?"), 102);
  EXPECT_EQ(refusalOf("a ! b"), 102);
  EXPECT_EQ(refusalOf(String("a\0b", 3)), 102);
}

TEST(Shape, leaves_out_values_case_and_blanks) {
  EXPECT_EQ(shape("select A from t where x='a' and y in (1,2)"),
            shape("SELECT  a FROM t\nWHERE x='b''c' and y in(-7)"));
  EXPECT_EQ(shape("select top 5 a from t"), shape("select top 0 a from t"));
  EXPECT_EQ(shape("select dateadd(day,1,x)"), shape("select dateadd(day,2,x)"));
}

TEST(Shape, tells_kinds_of_literals_apart) {
  EXPECT_NE(shape("select 1"), shape("select '1'"));
  EXPECT_NE(shape("select 1"), shape("select 1.0"));
  EXPECT_NE(shape("select 1.0"), shape("select 1e0"));
  EXPECT_NE(shape("select 1"), shape("select -1"));
  EXPECT_NE(shape("x in (1)"), shape("x in ('1')"));
  EXPECT_NE(shape("x in (1,'1')"), shape("x in (1,1.5)"));
  EXPECT_EQ(shape("x in (1,'1')"), shape("x in ('1',1,2)"));
  EXPECT_NE(shape("select 'a'"), shape("select N'a'"));
  EXPECT_NE(shape("select 1.5"), shape("select 1.25"));
  EXPECT_EQ(shape("select 1.5"), shape("select 02.7"));
  EXPECT_NE(shape("x in (1.5,2)"), shape("x in (1.25,2)"));
  EXPECT_NE(shape("select [select]"), shape("select select"));
  EXPECT_NE(shape("select [a]] , [b]"), shape("select [a] , [b]"));
}

TEST(Shape, keeps_literals_that_are_part_of_the_form) {
  EXPECT_NE(shape("select a,b from t order by 1"), shape("select a,b from t order by 2"));
  EXPECT_EQ(shape("select a from (select a from t order by 1) f where a=1"),
            shape("select a from (select a from t order by 1) f where a=2"));
  EXPECT_NE(shape("select convert(varchar(3),x)"), shape("select convert(varchar(5),x)"));
  EXPECT_NE(shape("select cast(x as decimal(5,2))"), shape("select cast(x as decimal(5,3))"));
  EXPECT_NE(shape("select convert(varchar,x,120)"), shape("select convert(varchar,x,112)"));
  EXPECT_EQ(shape("select convert(varchar,isnull(x,1),120)"), shape("select convert(varchar,isnull(x,2),120)"));
  EXPECT_NE(shape("select x as 'a'"), shape("select x as 'b'"));
  EXPECT_EQ(shape("select replace(x,'a',5)"), shape("select replace(x,'b',6)"));
}

}  // namespace
}  // namespace QVSa::tsql
