// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TPlugInProgress.h"

#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

std::vector<TPlugInAtWork> const kTwo = {{"Disks", "fill", 1.25}, {"Fans", "open", 0.1}, {"Host", "static construction", 0.5}};

TEST(TPlugInProgressTest, OneLineIsWrittenOverOnATerminal) {
  TPlugInProgress progress(ELayout::kTerminal);
  EXPECT_EQ(progress.TextFor({{"Fans", "open", 0.1}}), "");
  EXPECT_EQ(progress.TextFor(kTwo), "\r\x1b[KDisks: fill, 1.2 s; Host: static construction, 0.5 s");
  EXPECT_EQ(progress.TextFor({}), "\r\x1b[K");
  EXPECT_EQ(progress.TextFor({}), "");
}

TEST(TPlugInProgressTest, TheLineFitsTheTerminal) {
  TPlugInProgress progress(ELayout::kTerminal);
  std::vector<TPlugInAtWork> const many(20, {"Disks\x1b", "fill", 1.25});
  std::string const line = progress.TextFor(many);
  EXPECT_LT(line.size(), 79u + 5);
  EXPECT_EQ(line.find('\x1b', 2), line.npos);
}

TEST(TPlugInProgressTest, EachStageIsOnePlainLineOnADumbTerminal) {
  TPlugInProgress progress(ELayout::kPlain);
  EXPECT_EQ(progress.TextFor(kTwo), "Disks: fill, 1.2 s\nHost: static construction, 0.5 s\n");
  EXPECT_EQ(progress.TextFor(kTwo), "");
  EXPECT_EQ(progress.TextFor({{"Host", "fill", 0.6}}), "Host: fill, 0.6 s\n");
  EXPECT_EQ(progress.TextFor({}), "");
}

TEST(TPlugInProgressTest, NothingIsWrittenToAFile) {
  TPlugInProgress progress(ELayout::kFile);
  EXPECT_EQ(progress.TextFor(kTwo), "");
  EXPECT_EQ(progress.TextFor({}), "");
}

}  // namespace
}  // namespace NQRVZEP20::zep
