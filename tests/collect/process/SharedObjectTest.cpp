// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SharedObject.h"

#include "tests/Support.h"

#include <sys/stat.h>

namespace NQRVZEP20 {
namespace {

TEST(SharedObjectTest, APlugInCanBeMapped) { EXPECT_TRUE(CanBeMapped(TEST_PROVIDER)); }

TEST(SharedObjectTest, OtherFilesCannotBeMapped) {
  TTempDir const dir;
  EXPECT_FALSE(CanBeMapped(dir.Path("missing")));
  EXPECT_FALSE(CanBeMapped(dir.Path()));
  EXPECT_FALSE(CanBeMapped("/dev/null"));
  WriteFile(dir.Path("text"), std::string(1000, 'x'));
  EXPECT_FALSE(CanBeMapped(dir.Path("text")));
  ASSERT_EQ(::mkfifo(dir.Path("fifo").c_str(), 0600), 0);
  EXPECT_FALSE(CanBeMapped(dir.Path("fifo")));
}

TEST(SharedObjectTest, APlugInThatIsCutOffCannotBeMapped) {
  TTempDir const dir;
  std::string const plugIn = ReadFile(TEST_PROVIDER);
  for (std::size_t const size : {std::size_t{3}, std::size_t{40}, std::size_t{70}, std::size_t{5000}}) {
    WriteFile(dir.Path("cut"), plugIn.substr(0, size));
    EXPECT_FALSE(CanBeMapped(dir.Path("cut"))) << size;
  }
}

}  // namespace
}  // namespace NQRVZEP20
