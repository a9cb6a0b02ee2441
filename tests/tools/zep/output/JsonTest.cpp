// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Json.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace NQRVZEP20::zep {
namespace {

using TType = TCIMValue::TCIMType;

TEST(JsonTest, EachKindOfValueHasItsKindOfJson) {
  std::vector<TCIMValue> const elements = {"a", TCIMValue(TType::kCIMTypeString, 0)};
  struct TRow {
    TCIMValue fValue;
    char const* fJson;
  } const rows[] = {
      {TCIMValue(), "null"},
      {TCIMValue(TType::kCIMTypeUint32, 0), "null"},
      {TCIMValue(true), "true"},
      {TCIMValue(static_cast<unsigned char>(200)), "200"},
      {TCIMValue(static_cast<signed char>(-100)), "-100"},
      {TCIMValue(static_cast<unsigned short>(65535)), "65535"},
      {TCIMValue(static_cast<short>(-5)), "-5"},
      {TCIMValue(4294967295u), "4294967295"},
      {TCIMValue(-1), "-1"},
      {TCIMValue(std::numeric_limits<unsigned long>::max()), "\"18446744073709551615\""},
      {TCIMValue(7ul), "\"7\""},
      {TCIMValue(-7l), "\"-7\""},
      {TCIMValue(std::numeric_limits<long>::min()), "\"-9223372036854775808\""},
      {TCIMValue(0.5f), "0.5"},
      {TCIMValue(-2.25), "-2.25"},
      {TCIMValue(std::numeric_limits<double>::infinity()), "\"inf\""},
      {TCIMValue("text"), "\"text\""},
      {TCIMValue("7"), "\"7\""},
      {TCIMValue(TCIMDateTime("20070315143000.000000+060")), "\"20070315143000.000000+060\""},
      {TCIMValue(TType::kCIMTypeString, 0, elements), "[\"a\",null]"},
      {TCIMValue(TType::kCIMTypeUint64, 0, std::vector<TCIMValue>{TCIMValue(7ul)}), "[\"7\"]"},
      {TCIMValue(TType::kCIMTypeString, 0, std::vector<TCIMValue>()), "[]"},
  };
  for (TRow const& row : rows) EXPECT_EQ(ValueAsJson(row.fValue).dump(), row.fJson);
}

TEST(JsonTest, TypesHaveTheirNames) {
  EXPECT_EQ(NameOf(TType(TType::kCIMTypeUint16)), "uint16");
  EXPECT_EQ(NameOf(TCIMValue(TType::kCIMTypeString, 4).GetType()), "string[]");
  EXPECT_EQ(NameOf(TCIMValue().GetType()), "none");
}

TEST(JsonTest, BytesThatAreNotUtf8AreReplaced) { EXPECT_EQ(AsText(TJson("\xff-\xc3\xa9")), "\"\xef\xbf\xbd-\xc3\xa9\"\n"); }

}  // namespace
}  // namespace NQRVZEP20::zep
