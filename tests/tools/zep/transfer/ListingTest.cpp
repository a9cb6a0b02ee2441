// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Listing.h"

#include <gtest/gtest.h>

namespace NQRVZEP20::zep {
namespace {

constexpr char const* kListing =
    "drwxr-xr-x    2 0        0            4096 Nov 22 04:00 .\n"
    "-rw-r-----    1 zep      users           4 Nov 22 04:00 report\n"
    "-rwsr-xr-t    1 zep      users           4 Jan  2  2025 a b\n"
    "d-wx-wx-wx    2 zep      users        4096 Nov 22 04:00 uploads\n"
    "lrwxrwxrwx    1 zep      users           2 Nov 22 04:00 latest -> v1\n"
    "prw-------    1 zep      users           0 Nov 22 04:00 pipe\n"
    "-rw-r--r--    1 zep      domain users    4 Nov 22 04:00 group with a blank\n"
    "-\n"
    "total 7\n";

TEST(ListingTest, AnEntryHasTypeAndMode) {
  struct TRow {
    char const* fName;
    char fType;
    int fMode;
  };
  TRow const rows[] = {{"report", '-', 0640}, {"a b", '-', 0755},  {"uploads", 'd', 0333},
                       {"latest", 'l', 0777}, {"pipe", 'p', 0600}, {".", 'd', 0755}};
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fName);
    TListedEntry const entry = EntryIn(kListing, row.fName);
    EXPECT_EQ(entry.fType, row.fType);
    EXPECT_EQ(entry.fMode, row.fMode);
  }
}

TEST(ListingTest, AnotherNameOrFormatIsNotFound) {
  for (char const* name : {"b", "repor", "eport", "latest -> v1 -> v2", "v1", "group with a blank", "7", ""}) {
    SCOPED_TRACE(name);
    EXPECT_EQ(EntryIn(kListing, name).fType, 0);
    EXPECT_EQ(EntryIn(kListing, name).fMode, -1);
  }
  EXPECT_EQ(EntryIn("", "report").fType, 0);
}

}  // namespace
}  // namespace NQRVZEP20::zep
