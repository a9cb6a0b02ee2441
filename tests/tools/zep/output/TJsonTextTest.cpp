// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TJsonText.h"

#include "tools/zep/output/Json.h"

#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

// Appends a document value by value.
void Append(TJson const& json, TJsonText& text) {
  if (json.is_string()) return text.String(json.get<std::string>());
  if (!json.is_structured()) return text.Literal(json.dump());
  text.Begin(json.is_object() ? '{' : '[');
  for (auto const& entry : json.items()) {
    json.is_object() ? text.Member(entry.key()) : text.Element();
    Append(entry.value(), text);
  }
  text.End(json.is_object() ? '}' : ']');
}

std::string Appended(TJson const& json, int depth) {
  std::string result;
  TJsonText text(result, depth);
  Append(json, text);
  return result;
}

TEST(TJsonTextTest, HasTheFormOfADocument) {
  for (char const* document : {
           R"({})",
           R"([])",
           R"({"a":{},"b":[],"c":[[],[{}]],"d":1})",
           R"([1,-2.5,true,null,"",[],{"x":[{"y":"z"},3]}])",
           R"({"quoted \" \\ / name":"line\nend \u0001 \u007f \t","word":"gr\u00fc\u00df \ud83d\ude00"})",
       }) {
    TJson const json = TJson::parse(document);
    EXPECT_EQ(Appended(json, 0) + "\n", AsVerbatimText(json));
    EXPECT_EQ(Appended(json, TJsonText::kOnOneLine) + "\n", AsVerbatimLine(json));
  }
}

TEST(TJsonTextTest, LinesAreIndentedByTheDepth) {
  EXPECT_EQ(Appended(TJson::parse(R"({"a":[1]})"), 2), "{\n      \"a\": [\n        1\n      ]\n    }");
}

TEST(TJsonTextTest, BytesThatAreNotUtf8AreReplaced) {
  for (char const* bytes : {"\xff", "a\xc3", "\xed\xa0\x80 b", "\xf8\x88\x80\x80\x80", "\xc0\xaf"})
    EXPECT_EQ(Appended(TJson(bytes), 0) + "\n", AsVerbatimText(TJson(bytes)));
}

}  // namespace
}  // namespace NQRVZEP20::zep
