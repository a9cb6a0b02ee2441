// SPDX-License-Identifier: Apache-2.0
#include "collect/ProductName.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(ProductNameTest, BracketsAreFoundAndRemoved) {
  struct TRow {
    char const* fName;
    bool fHasBrackets;
    char const* fWithout;
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
    EXPECT_EQ(HasBrackets(row.fName), row.fHasBrackets) << row.fName;
    EXPECT_EQ(WithoutBrackets(row.fName), row.fWithout) << row.fName;
  }
}

}  // namespace
}  // namespace NQRVZEP20
