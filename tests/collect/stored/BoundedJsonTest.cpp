// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/BoundedJson.h"

#include "collect/stored/StoredReport.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

// Why the text is refused by those bounds; empty if it is read whole.
std::string WhyRefused(std::string const& text) {
  TJsonBounds const bounds{2, 3, 9, 4};
  try {
    EXPECT_EQ(BoundedJson(text, bounds), nlohmann::ordered_json::parse(text));
    return "";
  } catch (TStoredReportError const& refusal) {
    return refusal.what();
  }
}

TEST(BoundedJsonTest, EachBoundIsReachedAndRefusedBeyond) {
  EXPECT_EQ(WhyRefused("[[]]"), "");
  EXPECT_EQ(WhyRefused("[[[]]]"), "the document is nested too deeply");
  EXPECT_EQ(WhyRefused(R"({"a":0,"b":1.5,"c":"x"})"), "");
  EXPECT_EQ(WhyRefused(R"({"a":0,"b":1.5,"c":"x","d":0})"), "an object has more than 3 members");
  EXPECT_EQ(WhyRefused("[0,-1,2,3,4,5,6,true]"), "");
  EXPECT_EQ(WhyRefused("[0,-1,2,3,4,5,6,null,8]"), "it has more than 9 values");
  EXPECT_EQ(WhyRefused(R"([{"a":0,"b":1,"c":2},{"a":0,"b":1}])"), "");
  EXPECT_EQ(WhyRefused(R"([{"a":0,"b":1,"c":2},{"a":0,"b":1,"c":2}])"), "too many of its objects have many members");
}

}  // namespace
}  // namespace NQRVZEP20
