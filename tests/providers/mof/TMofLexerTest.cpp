// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofLexer.h"

#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

// "kind text" of each token; "error" for text that is not a token.
std::vector<std::string> TokensOf(std::string const& text) {
  constexpr char const* kKinds[] = {"end", "name", "number", "string", "char", "alias", "pragma", "mark"};
  TMofFile const file{"test.mof", text};
  TMofLexer lexer(file);
  std::vector<std::string> tokens;
  try {
    for (TMofToken token = lexer.Next(); token.fKind != TMofToken::kEnd; token = lexer.Next())
      tokens.push_back(kKinds[token.fKind] + (" " + std::string(token.fText)));
  } catch (TMofError const&) {
    tokens.push_back("error");
  }
  return tokens;
}

TEST(TMofLexerTest, ATextIsSplitIntoTokens) {
  EXPECT_THAT(TokensOf("[Key]class X_A:B{uint8 P[4]=-7;};"),
              ElementsAre("mark [", "name Key", "mark ]", "name class", "name X_A", "mark :", "name B", "mark {", "name uint8",
                          "name P", "mark [", "number 4", "mark ]", "mark =", "number -7", "mark ;", "mark }", "mark ;"));
  EXPECT_THAT(TokensOf("$Disk_1 #PRAGMA \"a\" 'b'"), ElementsAre("alias $Disk_1", "pragma #PRAGMA", "string \"a\"", "char 'b'"));
}

TEST(TMofLexerTest, EachKindOfTokenHasItsText) {
  struct TRow {
    char const* fText;
    std::vector<std::string> fTokens;
  };
  for (TRow const& row : {
           TRow{"_a9 \xc3\xa9", {"name _a9", "name \xc3\xa9"}},
           TRow{"+7 -.5 1.5e-3 1E+2x", {"number +7", "number -.5", "number 1.5e-3", "number 1E+2x"}},
           TRow{"0x1e+5", {"number 0x1e", "number +5"}},
           TRow{"7a.b", {"number 7a.b"}},
           TRow{R"("a\"b" "")", {R"(string "a\"b")", R"(string "")"}},
           TRow{R"("a\\" "b")", {R"(string "a\\")", R"(string "b")"}},
           TRow{R"('\'' '"')", {R"(char '\'')", R"(char '"')"}},
           TRow{"\"// no comment\" // a \"comment\"\n;", {"string \"// no comment\"", "mark ;"}},
           TRow{"a/* \n * b **/c", {"name a", "name c"}},
       }) {
    SCOPED_TRACE(row.fText);
    EXPECT_EQ(TokensOf(row.fText), row.fTokens);
  }
}

TEST(TMofLexerTest, OtherTextIsRefused) {
  for (char const* text : {"+",  "-",   ".", "+.", "$",    "$ a", "#",       "#include", "*",    "/",   "/ /",
                           "/*", "/*/", "@", "\"", "\"\\", "'",   "\"a\n\"", "'a\n'",    "\x01", "\x7f"})
    EXPECT_THAT(TokensOf(text), ElementsAre("error")) << text;
  EXPECT_THAT(TokensOf(std::string("a\0b", 3)), ElementsAre("name a", "error"));
}

TEST(TMofLexerTest, TheEndIsReturnedAtEveryLaterCall) {
  TMofFile const file{"test.mof", "a // b"};
  TMofLexer lexer(file);
  EXPECT_EQ(lexer.Next().fKind, TMofToken::kName);
  for (int call = 0; call < 3; ++call) EXPECT_EQ(lexer.Next().fKind, TMofToken::kEnd) << call;
}

TEST(TMofLexerTest, ATextCanBeReadFromAnyPosition) {
  TMofFile const file{"test.mof", "class X_A"};
  EXPECT_EQ(TMofLexer(file, file.fText.data() + 6).Next().fText, "X_A");
}

TEST(TMofLexerTest, AnErrorHasThePositionOfTheToken) {
  ExpectErrors({
      {"#include", "2:1: unexpected character"},
      {"class X_A { string P = \"a\n\"; };", "2:24: this string is not closed on its line"},
      {"class X_A { string P = \"a\\\"", "2:24: this string is not closed on its line"},
      {"class X_A { string P = \"a\\", "2:24: this string is not closed on its line"},
      {"class X_A { char16 P = 'a", "2:24: this character literal is not closed on its line"},
      {"class /* X_A { };", "2:7: this comment is not closed by \"*/\""},
      {"class / X_A { };", "2:7: unexpected character"},
  });
}

TEST(TMofLexerTest, BlanksCommentsAndLineEndsSeparate) {
  auto const ns = Read("/* a\n * block **/class/**/X_A{// end\r\n\tstring\fP\v;};// no line end");
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_A"));
  EXPECT_THAT(ClassNames(*Read("")), IsEmpty());
  EXPECT_THAT(ClassNames(*Read("// nothing")), IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
