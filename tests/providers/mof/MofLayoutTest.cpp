// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofLayout.h"

#include "tests/providers/mof/MofTexts.h"

#include <sstream>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;

std::string TextOfClass(TMemoryNamespace const& ns, std::string const& name) { return WriteMofClass(*ns.GetClass(name, kNone)); }

TEST(MofLayoutTest, LongTextsAndListsAreSplitIntoLines) {
  auto const ns = NewNamespace();
  std::string words;
  for (int at = 0; at < 60; ++at) words += "word" + std::to_string(at) + " ";
  std::vector<std::string> values(80, "a value");
  ns->DefineClass("X_A").Description(words).Property("P", "uint8").ValueMap(values, values).Description(std::string(300, 'x'));
  std::string const text = TextOfClass(*ns, "X_A");
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) EXPECT_LE(line.size(), 105u) << line;
  EXPECT_THAT(text, HasSubstr("[Description(\n     \"word0 word1 "));
  auto const again = ReadBack(WriteMof(*ns));
  EXPECT_EQ(again->GetClass("X_A", kNone)->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), words);
  EXPECT_EQ(WriteMof(*again), WriteMof(*ns));
}

TEST(MofLayoutTest, NoCharacterIsSplit) {
  auto const ns = NewNamespace();
  std::string text;
  for (int at = 0; at < 200; ++at) text += "\xe2\x82\xac";
  ns->DefineClass("X_A").Description(text);
  std::istringstream lines(TextOfClass(*ns, "X_A"));
  for (std::string line; std::getline(lines, line);) {
    std::size_t const quote = line.find('"');
    if (quote == line.npos) continue;
    EXPECT_EQ(line.substr(quote + 1, 3), "\xe2\x82\xac") << line;
  }
}

TEST(MofLayoutTest, AListIsSplitOnlyWhereItMustBe) {
  EXPECT_EQ(MofList({}, 0, 2), "");
  EXPECT_EQ(MofList({"a", "b"}, 10, 2), "a, b");
  std::string const item(60, 'x');
  EXPECT_EQ(MofList({item, item, "b"}, 0, 2), item + ",\n  " + item + ", b");
  EXPECT_EQ(MofList({"a", "b\nc", "d"}, 0, 2), "a,\n  b\nc,\n  d");
}

}  // namespace
}  // namespace NQRVZEP20
