// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/StoredReportText.h"

#include "tests/collect/stored/StoredDocument.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

TEST(StoredReportTextTest, HasTheHeadTheProblemsTheRowsAndTheTables) {
  std::string const text = StoredReportAsText(StoredReportFrom(StoredDocument(), "a.json"));
  EXPECT_THAT(text, testing::StartsWith("db1: Server Q100\nOperating system: Debian 12\n\nFindings"));
  for (char const* part :
       {"the disk sda is failing. Replace it.", "Host name", "unknown: needs root", "Memory modules\n", "DIMM 2"})
    EXPECT_THAT(text, testing::HasSubstr(part));
}

}  // namespace
}  // namespace NQRVZEP20::zep
