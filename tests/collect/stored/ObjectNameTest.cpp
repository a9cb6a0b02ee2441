// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/ObjectName.h"

#include "tests/Support.h"
#include "tests/collect/stored/StoredDocument.h"

namespace NQRVZEP20 {
namespace {

TEST(ObjectNameTest, HasTheNameAndTheFactsThatAreKnown) {
  TStoredReport const report = StoredReportFrom(StoredDocument(), "a.json");
  EXPECT_EQ(ObjectName(report.fInstances.at(0)), "DIMM 1 (16 GiB)");
  EXPECT_EQ(ObjectName(report.fInstances.at(1)), "DIMM 2");
  EXPECT_EQ(ObjectName(report.fInstances.at(2)), "root/x:CIM_Realizes.A=\"1\"");
}

}  // namespace
}  // namespace NQRVZEP20
