// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TStoredNode.h"

#include "collect/stored/BoundedJson.h"
#include "collect/stored/StoredReport.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

constexpr TJsonBounds kBounds{16, 100, 1000};
constexpr char const* kText = R"({ "a": [1, -2, 1.50, "x\n\"", null, true, []], "b": {"c": "1", "d\u0001": {}}, "e": 1e3 })";

TEST(TStoredNodeTest, TheJsonTextOfAValueHasNoSpaces) {
  TJsonTree const document = BoundedTree(kText, kBounds);
  EXPECT_EQ(TStoredNode(document).AsJson(), R"({"a":[1,-2,1.50,"x\n\"",null,true,[]],"b":{"c":"1","d\u0001":{}},"e":1e3})");
}

TEST(TStoredNodeTest, AValueHasItsKindItsTextAndItsNumber) {
  TJsonTree const document = BoundedTree(kText, kBounds);
  std::vector<std::string> names, texts;
  TStoredNode const array = TStoredNode(document).Member("a");
  array.ForEachElement([&](TStoredNode const& element) {
    names.push_back(element.Name());
    texts.push_back(element.ScalarText());
  });
  EXPECT_EQ(names, (std::vector<std::string>{"0", "1", "2", "3", "4", "5", "6"}));
  EXPECT_EQ(texts, (std::vector<std::string>{"1", "-2", "1.50", "x\n\"", "null", "true", ""}));
  EXPECT_EQ(TStoredNode(document).Member("e").Number(), 1000);
  EXPECT_EQ(TStoredNode(document).Member("b").Name(), "b");
  EXPECT_FALSE(TStoredNode(document).Optional("c"));  // it is below another value
}

TEST(TStoredNodeTest, AValueOfAnotherKindIsRefusedWithItsPlace) {
  TJsonTree const document = BoundedTree(kText, kBounds);
  auto const why = [](std::function<void()> const& read) -> std::string {
    try {
      read();
    } catch (TStoredReportError const& failure) {
      return failure.what();
    }
    return "";
  };
  TStoredNode const root(document), inner = root.Member("b");
  EXPECT_EQ(why([&] { root.Text(); }), "the document is not a string");
  EXPECT_EQ(why([&] { inner.Member("c").Number(); }), "/b/c: is not a number");
  EXPECT_EQ(why([&] { inner.Member("d"); }), "/b: has no member \"d\"");
  EXPECT_EQ(why([&] { inner.ForEachElement([](TStoredNode const&) {}); }), "/b: is not an array");
  EXPECT_EQ(why([&] { root.Member("a").Elements([](TStoredNode const& element) { return element.TextOf("x"); }); }),
            "/a/0: is not an object");
}

}  // namespace
}  // namespace NQRVZEP20
