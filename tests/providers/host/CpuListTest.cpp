// SPDX-License-Identifier: Apache-2.0
#include "providers/host/CpuList.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(CpuListTest, ListsBecomeNumbersAndBack) {
  struct TRow {
    std::string fList;
    std::vector<unsigned> fCpus;
  } const rows[] = {{"0", {0}}, {"0-3", {0, 1, 2, 3}}, {"0-1,4", {0, 1, 4}}, {"0,2,4-5", {0, 2, 4, 5}}};
  for (TRow const& row : rows) {
    EXPECT_EQ(CpusIn(row.fList), row.fCpus) << row.fList;
    EXPECT_EQ(CpuListOf(row.fCpus), row.fList);
  }
  EXPECT_EQ(CpuListOf({}), "");
}

TEST(CpuListTest, ATextThatIsNotAListHasNoNumbers) {
  for (char const* text : {"", " ", "x", "-1", "1-", "1,", ",1", "1 2", "0-3x", "70000", "0-99999999999"})
    EXPECT_THAT(CpusIn(text), IsEmpty()) << text;
  EXPECT_THAT(CpusIn("3-1"), IsEmpty());
}

TEST(CpuListTest, ALongListIsBounded) {
  std::string list = "0-65535";
  for (int repeat = 0; repeat < 100; ++repeat) list += ",0-65535";
  EXPECT_EQ(CpusIn(list).size(), 65536u);
}

}  // namespace
}  // namespace NQRVZEP20
