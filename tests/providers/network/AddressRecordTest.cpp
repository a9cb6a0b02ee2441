// SPDX-License-Identifier: Apache-2.0
#include "providers/network/Address.h"

#include "tests/Support.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <linux/if_addr.h>

namespace NQRVZEP20 {
namespace {

std::string TextOf(TRecord const& record, std::string const& name) {
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fName == name) return property.fValue.IsNull() ? property.fMissing.fReason : property.fValue.ToString();
  return "no such property";
}

TRecord RecordOf(std::string const& text, std::uint32_t flags, std::uint8_t protocol = 0) {
  TTempDir const empty;
  TAddress address;
  address.fFamily = text.find(':') != std::string::npos ? AF_INET6 : AF_INET;
  address.fAddress = text;
  address.fInterface = "eth0";
  address.fPrefixLength = 24;
  address.fFlags = flags;
  address.fProtocol = protocol;
  return AddressRecord(address, TComputerSystem(TMachineFiles(empty.Path())));
}

TEST(AddressRecordTest, TheOriginFollowsFromFlagsAndAddress) {
  std::string const unknown = "the kernel does not report whether the address comes from DHCPv6 or from a router";
  struct TRow {
    char const* fAddress;
    std::uint32_t fFlags;
    std::uint8_t fProtocol;
    std::string fOrigin;
  } const rows[] = {
      {"192.0.2.1", IFA_F_PERMANENT, 0, "3"},
      {"192.0.2.1", 0, 0, "4"},
      {"192.0.2.1", IFA_F_SECONDARY, 0, "4"},
      {"169.254.7.7", 0, 0, "6"},
      {"fe80::1", IFA_F_PERMANENT, 3, "10"},
      {"2001:db8::1", IFA_F_PERMANENT, 0, "3"},
      {"2001:db8::1", IFA_F_MANAGETEMPADDR, 0, "9"},
      {"2001:db8::1", IFA_F_TEMPORARY, 0, "9"},
      {"2001:db8::1", 0, 2, "9"},
      {"2001:db8::1", 0, 0, unknown},
  };
  for (TRow const& row : rows)
    EXPECT_EQ(TextOf(RecordOf(row.fAddress, row.fFlags, row.fProtocol), "AddressOrigin"), row.fOrigin)
        << row.fAddress << row.fFlags;
}

TEST(AddressRecordTest, TheTypeOfAnIPv6AddressFollowsFromItsPrefix) {
  struct TRow {
    char const *fAddress, *fType;
  } const rows[] = {{"::", "2"},      {"::1", "3"},        {"ff02::1", "4"},
                    {"fe80::1", "5"}, {"fd00::1", "6"},    {"::ffff:1.2.3.4", "7"},
                    {"fec0::1", "8"}, {"2001:db8::1", "6"}};
  for (TRow const& row : rows) EXPECT_EQ(TextOf(RecordOf(row.fAddress, 0), "IPv6AddressType"), row.fType) << row.fAddress;
  EXPECT_EQ(TextOf(RecordOf("192.0.2.1", 0), "IPv6AddressType"), "the address is of the other family");
}

TEST(AddressRecordTest, FlagsHaveTheWordsOfIp) {
  EXPECT_EQ(TextOf(RecordOf("2001:db8::1", IFA_F_TEMPORARY | IFA_F_DEPRECATED), "AddressFlags"),
            "{ dynamic, temporary, deprecated }");
  EXPECT_EQ(TextOf(RecordOf("192.0.2.1", IFA_F_PERMANENT | IFA_F_SECONDARY), "AddressFlags"), "{ secondary }");
  EXPECT_EQ(TextOf(RecordOf("192.0.2.1", IFA_F_PERMANENT), "AddressFlags"), "{  }");
}

}  // namespace
}  // namespace NQRVZEP20
