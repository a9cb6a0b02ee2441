// SPDX-License-Identifier: Apache-2.0
#include "collect/Sample.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace NQRVZEP20 {
namespace {

TEST(SampleTest, ProvidersFindTheSampleInTheEnvironment) {
  TEnvironmentGuard const table("ZEP_SMBIOS_TABLE", "/callers/table"), name("ZEP_HOST_NAME", "db1"), label("ZEP_SAMPLE", nullptr);
  EXPECT_EQ(NamedTableFile(), "/callers/table");
  SetForProviders({"/samples/table", "sample-server", "SAMPLE"});
  EXPECT_EQ(NamedTableFile(), "/samples/table");
  EXPECT_STREQ(std::getenv("ZEP_HOST_NAME"), "sample-server");
  EXPECT_STREQ(std::getenv("ZEP_SAMPLE"), "SAMPLE");
}

TEST(SampleTest, SourcesAreLabelledOnlyWithASample) {
  struct TRow {
    char const *fSource, *fLabelled;
  } const rows[] = {
      {"ZEP_HOST_NAME", "SAMPLE"},
      {"SMBIOS type 1 (file)", "SAMPLE, SMBIOS type 1"},
      {"/etc/os-release", "/etc/os-release (not of the sample)"},
  };
  for (TRow const& row : rows) {
    EXPECT_EQ(LabelledSource(row.fSource, "SAMPLE"), row.fLabelled);
    EXPECT_EQ(LabelledSource(row.fSource, ""), row.fSource);
  }
}

}  // namespace
}  // namespace NQRVZEP20
