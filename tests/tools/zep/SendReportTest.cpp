#include "tools/zep/SendReport.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/resource.h>
#include <unistd.h>

#include <filesystem>
#include <system_error>

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
  {
    TOneDescriptorLeft const oneLeft;
    EXPECT_THROW(SendReport(report, target, {}), std::system_error);
  }
  std::string const said = testing::internal::GetCapturedStderr();
  EXPECT_THAT(said, testing::StartsWith("zep: the report could not be packed: \nzep: the report is kept in " + dir.Path()));
  std::size_t const at = said.find(dir.Path());
  ASSERT_NE(at, std::string::npos);
  EXPECT_EQ(ReadFile(said.substr(at, said.size() - at - 1)), ReportAsJson(report));
}

}  // namespace
}  // namespace NQRVZEP20::zep
