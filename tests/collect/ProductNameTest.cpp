// SPDX-License-Identifier: Apache-2.0
#include "collect/ProductName.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(ProductNameTest, BracketsAreFoundAndRemoved) {
  struct TRow {
    char const* name;
    bool hasBrackets;
    char const* without;
  } const rows[] = {
      {"Server Q100 -[1234AB7]-", true, "Server Q100"},
      {"Server Q100", false, "Server Q100"},
      {"Server Q100  ", false, "Server Q100"},
      {"-[1234AB7]-", true, "-[1234AB7]-"},
      {"  -[1234AB7]-", true, "  -[1234AB7]-"},
      {"Rack -[ 2U", false, "Rack -[ 2U"},
      {"]- Rack", false, "]- Rack"},
      {"", false, ""},
  };
  for (TRow const& row : rows) {
    EXPECT_EQ(HasBrackets(row.name), row.hasBrackets) << row.name;
    EXPECT_EQ(WithoutBrackets(row.name), row.without) << row.name;
  }
}

}  // namespace
}  // namespace NQRVZEP20
