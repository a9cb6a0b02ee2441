// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SharedObject.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <algorithm>

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

// The plug-in, with another type of processor or another word size in its header.
TEST(SharedObjectTest, AFileForAnotherProcessorIsNamed) {
  TTempDir const dir;
  std::string const plugIn = ReadFile(TEST_PROVIDER);
  EXPECT_EQ(WhyOfOtherProcessor(TEST_PROVIDER), "");
  EXPECT_EQ(WhyOfOtherProcessor(dir.Path("missing")), "");
  auto const whyWith = [&](char order, char high, char low) {
    std::string changed = plugIn;
    changed[5] = order, changed[18] = order == 1 ? low : high, changed[19] = order == 1 ? high : low;
    WriteFile(dir.Path("changed"), changed);
    return WhyOfOtherProcessor(dir.Path("changed"));
  };
  EXPECT_THAT(whyWith(1, 1, 0x77), testing::StartsWith("it is built for processor type 375, and this process for "));
  EXPECT_THAT(whyWith(2, 0, 22), testing::StartsWith("it is built for s390, and this process for "));
  EXPECT_THAT(whyWith(2, 0, 2), testing::StartsWith("it is built for processor type 2, and this process for "));
}

TEST(SharedObjectTest, ExportedSymbolsAreThoseOfTheDynamicSymbolTable) {
  auto const symbols = ExportedSymbols(TEST_LIBZEPCORE);
  ASSERT_TRUE(symbols);
  EXPECT_EQ(std::count(symbols->begin(), symbols->end(), "_ZNK9NQRVZEP2013TZEPException4whatEv"), 1);
  EXPECT_EQ(std::count(symbols->begin(), symbols->end(), "malloc"), 0) << "it is used, but not defined";
  EXPECT_EQ(std::count(symbols->begin(), symbols->end(), "_init"), 0);
}

TEST(SharedObjectTest, OtherFilesHaveNoExportedSymbols) {
  TTempDir const dir;
  EXPECT_FALSE(ExportedSymbols(dir.Path("missing")));
  EXPECT_FALSE(ExportedSymbols("/dev/null"));
  WriteFile(dir.Path("text"), std::string(1000, 'x'));
  EXPECT_FALSE(ExportedSymbols(dir.Path("text")));
}

// The file is cut off, or has a byte of its headers or section table changed.
TEST(SharedObjectTest, ADamagedFileIsReadWithinItsBounds) {
  TTempDir const dir;
  std::string const plugIn = ReadFile(TEST_PROVIDER);
  for (std::size_t size = 0; size < plugIn.size(); size += plugIn.size() / 50) {
    WriteFile(dir.Path("cut"), plugIn.substr(0, size));
    EXPECT_FALSE(ExportedSymbols(dir.Path("cut"))) << size;
  }
  for (std::size_t at = 0; at < 2000; ++at) {
    std::string changed = plugIn;
    std::size_t const place = at < 64 ? at : changed.size() - at;
    changed[place] = static_cast<char>(changed[place] ^ 0xff);
    WriteFile(dir.Path("changed"), changed);
    auto const symbols = ExportedSymbols(dir.Path("changed"));
    EXPECT_LE(symbols ? symbols->size() : 0, plugIn.size());
  }
}

TEST(SharedObjectTest, MangledNamesInATextBecomeThoseOfTheSource) {
  EXPECT_EQ(Demangled("x.so: undefined symbol: _Z3Fani, _ZN1AC1Ev"), "x.so: undefined symbol: Fan(int), A::A()");
  EXPECT_EQ(Demangled("_Z is no name, plain"), "_Z is no name, plain");
}

}  // namespace
}  // namespace NQRVZEP20
