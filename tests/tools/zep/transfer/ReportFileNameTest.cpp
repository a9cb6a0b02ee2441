// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/ReportFileName.h"

#include "tests/Support.h"

#include <gmock/gmock.h>

#include <ctime>

namespace NQRVZEP20::zep {
namespace {

TJson ReportOn(TJson const& hostName) { return {{"identity", {{"hostName", {{"value", hostName}}}}}}; }

TEST(ReportFileNameTest, BearsTheHostNameOfTheReport) {
  struct TRow {
    TJson fHostName;
    std::string fInName;
  };
  TRow const rows[] = {
      {"db1", "db1"},
      {"DB-1.example.com", "DB-1_example_com"},
      {"../a b\xc3\xa4\n", "___a_b___"},
      {std::string(100, 'x'), std::string(64, 'x')},
      {TJson(nullptr), "unknown"},
  };
  for (TRow const& row : rows) {
    SCOPED_TRACE(row.fInName);
    EXPECT_THAT(ReportFileName(ReportOn(row.fHostName), ".txt"),
                testing::MatchesRegex("zep-report-" + row.fInName + "-[0-9]{8}T[0-9]{6}Z\\.txt"));
  }
  EXPECT_THAT(ReportFileName(TJson::object(), ".json"), testing::MatchesRegex("zep-report-unknown-[0-9]{8}T[0-9]{6}Z\\.json"));
}

TEST(ReportFileNameTest, BearsTheTimeInUtc) {
  TEnvironmentGuard const zone("TZ", "EAST-5");
  ::tzset();
  std::time_t const before = std::time(nullptr);
  std::string const name = ReportFileName(ReportOn("db1"), ".json");
  std::tm fields{};
  ASSERT_NE(::strptime(name.c_str(), "zep-report-db1-%Y%m%dT%H%M%SZ.json", &fields), nullptr) << name;
  std::time_t const told = ::timegm(&fields);
  EXPECT_GE(told, before);
  EXPECT_LE(told, std::time(nullptr));
}

}  // namespace
}  // namespace NQRVZEP20::zep
