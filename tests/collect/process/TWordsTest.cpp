// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TWords.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(TWordsTest, AShortTextIsKeptCompletely) {
  TWords words(4);
  for (char const* piece : {"ab", "", "cdef", "gh"}) words.Add(piece);
  EXPECT_EQ(words.Get(), "abcdefgh");
}

TEST(TWordsTest, TheMiddleOfALongTextIsLeftOut) {
  TWords words(4);
  words.Add("abcdefghi");
  EXPECT_EQ(words.Get(), "abcd\n[1 bytes omitted]\nfghi");
  words.Add("jkl");
  EXPECT_EQ(words.Get(), "abcd\n[4 bytes omitted]\nijkl");
}

}  // namespace
}  // namespace NQRVZEP20
