// SPDX-License-Identifier: Apache-2.0
#include "providers/host/Placeholder.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(PlaceholderTest, PlaceholdersAreRecognised) {
  for (char const* text : {"To Be Filled By O.E.M.",
                           "to be filled by o.e.m.",
                           "Default string",
                           "Not Specified",
                           "Not Applicable",
                           "N/A",
                           "None",
                           "(none)",
                           "System Serial Number",
                           "System Product Name",
                           "System manufacturer",
                           "Chassis Serial Number",
                           "0123456789",
                           "123456789",
                           "Asset-1234567890",
                           "No Asset Tag",
                           "Unknown",
                           "INVALID",
                           "O.E.M.",
                           "SKU",
                           "0000",
                           "00000000",
                           "XXXXXXX",
                           "xXxX",
                           "....",
                           "-------",
                           "-",
                           "--\r\n",
                           "\x01None\x7f",
                           "FFFFFFFF",
                           "  None ",
                           "Default string\t",
                           "Manufacturer0",
                           "SerNum00",
                           "PartNum3",
                           "A1_SerNum2",
                           "Array1_PartNumber0"})
    EXPECT_TRUE(IsPlaceholder(text)) << text;
}

TEST(PlaceholderTest, ValuesAreNotTakenForPlaceholders) {
  for (char const* text : {"KQ12345",
                           "Server Q100 -[1234AB7]-",
                           "7",
                           "00",
                           "000",
                           "0",
                           "X",
                           "06",
                           "SKU 5",
                           "Nonesuch",
                           "None of it",
                           "Default string 2",
                           "1234AB7",
                           "Manufacturer",
                           "Manufacturer Zero",
                           "SerNumber1",
                           "0123456",
                           "0000001",
                           "OEM Works",
                           "ABCD",
                           "AAAA"})
    EXPECT_FALSE(IsPlaceholder(text)) << text;
}

TEST(PlaceholderTest, APlaceholderOrBlankTextIsMissing) {
  auto const placeholder = WithoutPlaceholder(std::string("Default string"));
  ASSERT_FALSE(placeholder);
  EXPECT_EQ(placeholder.Why().fCode, "placeholder");
  EXPECT_EQ(placeholder.Why().fReason, "placeholder text of the firmware: \"Default string\"");

  for (char const* blank : {"", " ", " \t ", "\r\n\x01"}) {
    auto const missing = WithoutPlaceholder(std::string(blank));
    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.Why().fCode, "not-given");
    EXPECT_EQ(missing.Why().fReason, "the firmware reports only blanks");
  }
}

TEST(PlaceholderTest, UnwrittenFlashMemoryIsNotProgrammed) {
  for (char const* text : {"\xff", " \xff\xff\xff\n"}) {
    auto const missing = WithoutPlaceholder(std::string(text));
    ASSERT_FALSE(missing);
    EXPECT_EQ(missing.Why().fCode, "not-given");
    EXPECT_EQ(missing.Why().fReason, "not programmed in the firmware's table (0xFF)");
  }
  EXPECT_TRUE(WithoutPlaceholder(std::string("A\xff")));
}

TEST(PlaceholderTest, ThePlaceholderOfTheKernelIsNotAHostName) {
  auto const placeholder = HostNameOf("(none)");
  ASSERT_FALSE(placeholder);
  EXPECT_EQ(placeholder.Why().fCode, "placeholder");
  EXPECT_EQ(placeholder.Why().fReason, "placeholder text of the kernel: \"(none)\"; no host name is set");
  ASSERT_FALSE(HostNameOf(""));
  EXPECT_EQ(HostNameOf("").Why().fCode, "not-given");
  for (char const* name : {"db1", "none", "default", "unknown", "xxxx", "localhost"}) {
    ASSERT_TRUE(HostNameOf(name)) << name;
    EXPECT_EQ(*HostNameOf(name), name);
  }
}

TEST(PlaceholderTest, AValueIsKeptVerbatim) { EXPECT_EQ(*WithoutPlaceholder(std::string(" KQ12345 ")), " KQ12345 "); }

}  // namespace
}  // namespace NQRVZEP20
