// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/SendReport.h"

#include "tests/Support.h"
#include "tools/zep/output/ReportJson.h"
#include "tools/zep/transfer/Gzip.h"

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <unistd.h>

#include <filesystem>

namespace NQRVZEP20::zep {
namespace {

// While it lives, one more descriptor can be opened: a file, but no pipe.
class TOneDescriptorLeft {
public:
  TOneDescriptorLeft() {
    int const next = ::dup(STDIN_FILENO);
    ::close(next);
    ::getrlimit(RLIMIT_NOFILE, &fBefore);
    rlimit const few{static_cast<rlim_t>(next) + 1, fBefore.rlim_max};
    ::setrlimit(RLIMIT_NOFILE, &few);
  }
  ~TOneDescriptorLeft() { ::setrlimit(RLIMIT_NOFILE, &fBefore); }
  TOneDescriptorLeft(TOneDescriptorLeft const&) = delete;
  TOneDescriptorLeft& operator=(TOneDescriptorLeft const&) = delete;

private:
  rlimit fBefore{};
};

TEST(SendReportTest, IsKeptAlsoWhenSendingThrows) {
  if (kIsSanitized) GTEST_SKIP() << "not with a sanitizer, which needs descriptors of its own";
  TTempDir const dir;
  TEnvironmentGuard const directory("TMPDIR", dir.Path().c_str()), netrc("NETRC", "/dev/null");
  TReport const report = MakeReport({});
  TTarget const target = TargetOf("ftp://127.0.0.1:1/d/", false);
  testing::internal::CaptureStderr();
  TSentReport sent;
  {
    TOneDescriptorLeft const oneLeft;
    sent = SendReport(TReportDocument(report, EMessages::kVerbatim), target, {});
  }
  EXPECT_EQ(sent.fTransferred.fOutcome.fExit, kExitNothing);
  EXPECT_THAT(sent.fKeptIn, testing::StartsWith(dir.Path()));
  EXPECT_EQ(testing::internal::GetCapturedStderr(),
            "zep: a pipe cannot be created: Too many open files\nzep: the report is kept in " + sent.fKeptIn + "\n");
  EXPECT_EQ(ReadFile(sent.fKeptIn), Gzipped(TReportDocument(report, EMessages::kVerbatim).Text()));
}

TEST(SendReportTest, TheReasonTellsWhetherTheReportHasArrived) {
  TTransferred transferred;
  transferred.fOutcome = {kZEPStatusFail, kExitTermination, "interrupted"};
  EXPECT_EQ(ReasonOf(transferred), "the report was not sent: interrupted");
  transferred.fHasArrived = true;
  transferred.fOutcome.fReason = "the complete file is on the server; zep was interrupted";
  EXPECT_EQ(ReasonOf(transferred), "the complete file is on the server; zep was interrupted");
}

}  // namespace
}  // namespace NQRVZEP20::zep
