// SPDX-License-Identifier: Apache-2.0

// libzep-packing.so, as zep loads it.

#include "tests/tools/zep/Zep.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/packing/PackingLibrary.h"

#include <gmock/gmock.h>

#include <climits>
#include <new>

namespace NQRVZEP20::zep {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class PackingLoaderTest : public testing::Test {
protected:
  // The dynamic linker's log of the files that it loads.
  std::string LoadedBy(std::vector<std::string> const& arguments) {
    return fZep.Run({arguments, {{"LD_DEBUG", "files"}}}).fErrors;
  }

  TInstallation fZep;
};

TEST_F(PackingLoaderTest, OnlyCommandsThatNeedItLoadIt) {
  for (std::vector<std::string> const& arguments : {std::vector<std::string>{"--version"}, {"report", "--sample"}}) {
    std::string const log = LoadedBy(arguments);
    EXPECT_THAT(log, HasSubstr("file=libzepcore.so"));
    for (char const* library : {"libzep-packing", "libarchive", "libcrypto", "libgcrypt"})
      EXPECT_THAT(log, Not(HasSubstr(std::string("file=") + library))) << arguments.front();
  }
  WriteFile(fZep.Path("text"), "text");
  std::string const log = LoadedBy({"verify", fZep.Path("text")});
  for (char const* library : {"libzep-packing", "libarchive", "libcrypto"})
    EXPECT_THAT(log, HasSubstr(std::string("file=") + library));
}

TEST_F(PackingLoaderTest, AMissingLibraryIsNamedWithTheRemedy) {
  fZep.Remove("libzep-packing.so");
  WriteFile(fZep.Path("text"), "text");
  TRun const run = fZep.Run({{"verify", fZep.Path("text"), "--json"}});
  EXPECT_EQ(run.fStatus, kExitNoLibrary);
  EXPECT_EQ(run.fErrors,
            "zep: libzep-packing.so cannot be loaded: libzep-packing.so: cannot open shared object file: No such file or "
            "directory; it is part of zep, and needs libarchive and OpenSSL's libcrypto: install the package zep again, with "
            "the packages that it needs\n");
  EXPECT_EQ(nlohmann::json::parse(run.fOutput)["exitStatus"], kExitNoLibrary);
  EXPECT_EQ(fZep.Run({{"record", fZep.Path("new")}}).fStatus, kExitNoLibrary);
  EXPECT_FALSE(fs::exists(fZep.Path("new")));
}

TEST_F(PackingLoaderTest, AnotherLibraryOfThatNameIsNotUsed) {
  fZep.Add("libzep-packing.so", fZep.Path("lib/libsmbios.so"));
  WriteFile(fZep.Path("text"), "text");
  TRun const run = fZep.Run({{"verify", fZep.Path("text")}});
  EXPECT_EQ(run.fStatus, kExitNoLibrary);
  EXPECT_THAT(run.fErrors, StartsWith("zep: libzep-packing.so cannot be loaded: "));
  EXPECT_THAT(run.fErrors, HasSubstr("undefined symbol: ZepPacking; it is part of zep"));
}

// Each type has a description in the library, and one in the program.
TEST_F(PackingLoaderTest, ExceptionsOfTheLibraryAreCaughtByTheirTypes) {
  EXPECT_THROW(NewArchiveReader(fZep.Path("none")), TArchiveError);
  EXPECT_THROW(NewVerifier(ETrusted::kAnyone, {})->Verify("text", "signature"), TSignatureError);
  EXPECT_THROW(NewSigner({"key", "text"}, {"key", "text"}), TFailure);
  std::string_view const tooLong("", std::size_t(INT_MAX) + 1);  // refused before it is read
  EXPECT_THROW(NewVerifier(ETrusted::kSigner, {"certificates", tooLong}), std::bad_alloc);
}

}  // namespace
}  // namespace NQRVZEP20::zep
