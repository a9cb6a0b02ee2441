// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Sha256.h"

#include "tests/Support.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <system_error>

namespace NQRVZEP20::zep {
namespace {

TEST(Sha256Test, KnownTextsHaveTheChecksumsOfTheStandard) {
  struct TRow {
    std::string fText;
    char const* fSum;
  };
  TRow const rows[] = {
      {"", "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855"},
      {"abc", "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad"},
      {"abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq",
       "248d6a61d20638b8e5c026930c3e6039a33ce45964ff2167f6ecedd419db06c1"},
      {std::string(1000000, 'a'), "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0"},
  };
  TTempDir const dir;
  for (TRow const& row : rows) {
    WriteFile(dir.Path("f"), row.fText);
    EXPECT_EQ(Sha256Of(dir.Path("f")), row.fSum) << row.fText.size();
  }
}

TEST(Sha256Test, AgreesWithSha256sumAroundTheEndsOfBlocksAndChunks) {
  TTempDir const dir;
  for (int const size : {55, 56, 63, 64, 65, 65535, 65536, 65537, 65591, 65592}) {
    WriteFile(dir.Path("f"), std::string(static_cast<std::size_t>(size), 'x'));
    std::string const command = "sha256sum " + dir.Path("f") + " > " + dir.Path("sum");
    ASSERT_EQ(::system(command.c_str()), 0);
    EXPECT_EQ(Sha256Of(dir.Path("f")), ReadFile(dir.Path("sum")).substr(0, 64)) << size;
  }
}

TEST(Sha256Test, UnreadableFileThrows) {
  TTempDir const dir;
  EXPECT_THROW(Sha256Of(dir.Path("none")), std::system_error);
  EXPECT_THROW(Sha256Of(dir.Path()), std::system_error);
}

}  // namespace
}  // namespace NQRVZEP20::zep
