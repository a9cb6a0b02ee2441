// SPDX-License-Identifier: Apache-2.0
#include "providers/network/LinkModes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

std::string MaskOf(std::vector<unsigned> const& bits, std::size_t words) {
  std::vector<std::uint32_t> mask(words);
  for (unsigned const bit : bits) mask.at(bit / 32) |= 1u << (bit % 32);
  return {reinterpret_cast<char const*>(mask.data()), mask.size() * 4};
}

std::vector<std::string> NamesIn(std::string const& mask) {
  std::vector<std::string> names;
  for (TLinkMode const& mode : LinkModesIn(mask)) names.push_back(mode.fName);
  return names;
}

TEST(LinkModesTest, ModesHaveTheNamesOfEthtool) {
  EXPECT_THAT(NamesIn(MaskOf({0, 5, 32, 64, 101}, 4)), ElementsAre("10baseT/Half", "1000baseT/Full", "25000baseKR/Full",
                                                                   "200000baseLR4_ER4_FR4/Full", "10baseT1S_P2MP/Half"));
  EXPECT_THAT(NamesIn(MaskOf({6, 7, 13, 49}, 2)), IsEmpty()) << "autonegotiation, a connector, pause frames, error correction";
  EXPECT_THAT(NamesIn(MaskOf({102, 127}, 4)), IsEmpty()) << "unknown";
}

TEST(LinkModesTest, OtherBitsAreFeatures) {
  EXPECT_THAT(LinkFeaturesIn(MaskOf({5, 6, 7, 13, 50, 64}, 4)), ElementsAre("Autoneg", "TP", "Pause", "FEC_RS"));
  EXPECT_THAT(LinkFeaturesIn(MaskOf({0, 102}, 4)), IsEmpty());
}

TEST(LinkModesTest, ShortMasksAreRead) {
  std::string const mask = MaskOf({0, 5}, 1);
  for (std::size_t size = 0; size < 4; ++size) EXPECT_THAT(NamesIn(mask.substr(0, size)), IsEmpty());
  EXPECT_THAT(NamesIn(mask), ElementsAre("10baseT/Half", "1000baseT/Full"));
}

TEST(LinkModesTest, SpeedDuplexAndTypeFollowFromTheName) {
  struct TRow {
    unsigned fBit;
    std::uint64_t fSpeed;
    bool fIsFullDuplex;
    std::uint16_t fPortType;
  } const rows[] = {{0, 10'000'000, false, 50},      {3, 100'000'000, true, 52},       {5, 1'000'000'000, true, 53},
                    {12, 10'000'000'000, true, 55},  {18, 10'000'000'000, true, 58},   {19, 10'000'000'000, true, 59},
                    {25, 40'000'000'000, true, 202}, {38, 100'000'000'000, true, 305}, {31, 25'000'000'000, true, 0},
                    {47, 2'500'000'000, true, 54},   {67, 100'000'000, true, 0},       {90, 100'000'000, false, 100}};
  for (TRow const& row : rows) {
    auto const modes = LinkModesIn(MaskOf({row.fBit}, 4));
    ASSERT_EQ(modes.size(), 1u) << row.fBit;
    EXPECT_EQ(modes[0].fSpeed, row.fSpeed) << row.fBit;
    EXPECT_EQ(modes[0].fIsFullDuplex, row.fIsFullDuplex) << row.fBit;
    EXPECT_EQ(PortTypeOf(modes[0]), row.fPortType) << row.fBit;
  }
}

}  // namespace
}  // namespace NQRVZEP20
