// SPDX-License-Identifier: Apache-2.0
#include "LinkModes.h"

#include <cstdlib>
#include <cstring>
#include <iterator>

namespace NQRVZEP20 {

namespace {

// By bit, as enum ethtool_link_mode_bit_indices of the kernel defines them.
constexpr char const* kModes[] = {"10baseT/Half",
                                  "10baseT/Full",
                                  "100baseT/Half",
                                  "100baseT/Full",
                                  "1000baseT/Half",
                                  "1000baseT/Full",
                                  "Autoneg",
                                  "TP",
                                  "AUI",
                                  "MII",
                                  "FIBRE",
                                  "BNC",
                                  "10000baseT/Full",
                                  "Pause",
                                  "Asym_Pause",
                                  "2500baseX/Full",
                                  "Backplane",
                                  "1000baseKX/Full",
                                  "10000baseKX4/Full",
                                  "10000baseKR/Full",
                                  "10000baseR_FEC",
                                  "20000baseMLD2/Full",
                                  "20000baseKR2/Full",
                                  "40000baseKR4/Full",
                                  "40000baseCR4/Full",
                                  "40000baseSR4/Full",
                                  "40000baseLR4/Full",
                                  "56000baseKR4/Full",
                                  "56000baseCR4/Full",
                                  "56000baseSR4/Full",
                                  "56000baseLR4/Full",
                                  "25000baseCR/Full",
                                  "25000baseKR/Full",
                                  "25000baseSR/Full",
                                  "50000baseCR2/Full",
                                  "50000baseKR2/Full",
                                  "100000baseKR4/Full",
                                  "100000baseSR4/Full",
                                  "100000baseCR4/Full",
                                  "100000baseLR4_ER4/Full",
                                  "50000baseSR2/Full",
                                  "1000baseX/Full",
                                  "10000baseCR/Full",
                                  "10000baseSR/Full",
                                  "10000baseLR/Full",
                                  "10000baseLRM/Full",
                                  "10000baseER/Full",
                                  "2500baseT/Full",
                                  "5000baseT/Full",
                                  "FEC_NONE",
                                  "FEC_RS",
                                  "FEC_BASER",
                                  "50000baseKR/Full",
                                  "50000baseSR/Full",
                                  "50000baseCR/Full",
                                  "50000baseLR_ER_FR/Full",
                                  "50000baseDR/Full",
                                  "100000baseKR2/Full",
                                  "100000baseSR2/Full",
                                  "100000baseCR2/Full",
                                  "100000baseLR2_ER2_FR2/Full",
                                  "100000baseDR2/Full",
                                  "200000baseKR4/Full",
                                  "200000baseSR4/Full",
                                  "200000baseLR4_ER4_FR4/Full",
                                  "200000baseDR4/Full",
                                  "200000baseCR4/Full",
                                  "100baseT1/Full",
                                  "1000baseT1/Full",
                                  "400000baseKR8/Full",
                                  "400000baseSR8/Full",
                                  "400000baseLR8_ER8_FR8/Full",
                                  "400000baseDR8/Full",
                                  "400000baseCR8/Full",
                                  "FEC_LLRS",
                                  "100000baseKR/Full",
                                  "100000baseSR/Full",
                                  "100000baseLR_ER_FR/Full",
                                  "100000baseCR/Full",
                                  "100000baseDR/Full",
                                  "200000baseKR2/Full",
                                  "200000baseSR2/Full",
                                  "200000baseLR2_ER2_FR2/Full",
                                  "200000baseDR2/Full",
                                  "200000baseCR2/Full",
                                  "400000baseKR4/Full",
                                  "400000baseSR4/Full",
                                  "400000baseLR4_ER4_FR4/Full",
                                  "400000baseDR4/Full",
                                  "400000baseCR4/Full",
                                  "100baseFX/Half",
                                  "100baseFX/Full",
                                  "10baseT1L/Full",
                                  "800000baseCR8/Full",
                                  "800000baseKR8/Full",
                                  "800000baseDR8/Full",
                                  "800000baseDR8_2/Full",
                                  "800000baseSR8/Full",
                                  "800000baseVR8/Full",
                                  "10baseT1S/Full",
                                  "10baseT1S/Half",
                                  "10baseT1S_P2MP/Half"};

struct TPortType {
  char const* fMode;
  std::uint16_t fType;
};

constexpr TPortType kPortTypes[] = {
    {"10baseT/", 50},       {"100baseT/", 52},      {"1000baseT/", 53},      {"2500baseT/", 54},      {"10000baseT/", 55},
    {"1000baseKX/", 57},    {"10000baseKX4/", 58},  {"10000baseKR/", 59},    {"100baseFX/", 100},     {"10000baseSR/", 105},
    {"10000baseLR/", 108},  {"10000baseER/", 110},  {"10000baseLRM/", 112},  {"40000baseKR4/", 200},  {"40000baseCR4/", 201},
    {"40000baseSR4/", 202}, {"40000baseLR4/", 204}, {"100000baseKR4/", 304}, {"100000baseCR4/", 305},
};

// The names of the bits that are set.
std::vector<std::string> NamesIn(std::string_view mask) {
  std::vector<std::string> names;
  for (std::size_t bit = 0; bit < std::size(kModes) && (bit / 32 + 1) * 4 <= mask.size(); ++bit) {
    std::uint32_t word;
    std::memcpy(&word, mask.data() + bit / 32 * 4, sizeof word);
    if (word >> (bit % 32) & 1) names.emplace_back(kModes[bit]);
  }
  return names;
}

}  // namespace

std::vector<TLinkMode> LinkModesIn(std::string_view mask) {
  std::vector<TLinkMode> modes;
  for (std::string const& name : NamesIn(mask))
    if (std::size_t const slash = name.find('/'); slash != std::string::npos)
      modes.push_back({name, std::strtoull(name.c_str(), nullptr, 10) * 1'000'000, name.substr(slash) == "/Full"});
  return modes;
}

std::vector<std::string> LinkFeaturesIn(std::string_view mask) {
  std::vector<std::string> features;
  for (std::string const& name : NamesIn(mask))
    if (name.find('/') == std::string::npos) features.push_back(name);
  return features;
}

std::uint16_t PortTypeOf(TLinkMode const& mode) {
  for (TPortType const& known : kPortTypes)
    if (mode.fName.rfind(known.fMode, 0) == 0) return known.fType;
  return 0;
}

}  // namespace NQRVZEP20
