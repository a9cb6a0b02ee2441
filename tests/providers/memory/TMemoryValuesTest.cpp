// SPDX-License-Identifier: Apache-2.0
#include "TMemoryValues.h"

#include "Collect.h"

#include <cstddef>
#include <cstdint>
#include <limits>

namespace NQRVZEP20 {
namespace {

constexpr char const* kIntegerTypes[] = {"uint8", "sint8", "uint16", "sint16", "uint32", "sint32", "uint64", "sint64"};

// The reason of the failure that the action throws.
template <class TAction>
std::string ReasonOf(TAction const& action) {
  try {
    action();
    return "nothing was thrown";
  } catch (TZEPFailure const& failure) {
    return failure.Reason();
  }
}

// One instance for each way to give a value.
class TMemoryValuesTest : public testing::Test {
protected:
  TMemoryValuesTest() {
    auto builder = fNs->DefineClass("X_Disk").Key("Id", "uint32");
    for (char const* type : kIntegerTypes) builder.Property(std::string("A") + type, type);
    builder.Property("Name", "string").Property("Is", "boolean").Property("Real", "real64");
  }

  // Expects that a property of each type that can hold 5 has the value after each way of setting it.
  template <class T>
  void ExpectTaken(T number) {
    for (char const* type : kIntegerTypes) {
      SCOPED_TRACE(type);
      std::string const name = std::string("A") + type;
      TMemoryValues set, emplaced;
      set.Set(name, number);
      emplaced.emplace_back(name, number);
      auto const direct = fNs->AddInstance("X_Disk", {});
      direct->Set(name, number);
      for (auto const& instance : {fNs->AddInstance("X_Disk", {{name, number}}), fNs->AddInstance("X_Disk", set),
                                   fNs->AddInstance("X_Disk", emplaced), direct}) {
        EXPECT_EQ(instance->Get(name).GetType(), TMemoryType(type).GetType());
        EXPECT_EQ(instance->Get(name).ToString(), "5");
      }
    }
  }

  template <class T>
  std::string WhyRefused(std::string const& name, T value) {
    TMemoryValues values;
    values.Set(name, value);
    return ReasonOf([&] { fNs->AddInstance("X_Disk", values); });
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
};

TEST_F(TMemoryValuesTest, EveryIntegerTypeIsTakenAndTheDeclaredTypeCounts) {
  ExpectTaken(static_cast<signed char>(5));
  ExpectTaken(static_cast<unsigned char>(5));
  ExpectTaken(static_cast<char>(5));
  ExpectTaken(static_cast<short>(5));
  ExpectTaken(static_cast<unsigned short>(5));
  ExpectTaken(5);
  ExpectTaken(5U);
  ExpectTaken(5L);
  ExpectTaken(5UL);
  ExpectTaken(5LL);
  ExpectTaken(5ULL);
  ExpectTaken(std::uint8_t{5});
  ExpectTaken(std::int8_t{5});
  ExpectTaken(std::uint16_t{5});
  ExpectTaken(std::int16_t{5});
  ExpectTaken(std::uint32_t{5});
  ExpectTaken(std::int32_t{5});
  ExpectTaken(std::uint64_t{5});
  ExpectTaken(std::int64_t{5});
  ExpectTaken(std::size_t{5});
  ExpectTaken(std::ptrdiff_t{5});
  ExpectTaken(std::intmax_t{5});
  ExpectTaken(std::uintmax_t{5});
}

TEST_F(TMemoryValuesTest, LimitsOfLongLongArePreserved) {
  auto const instance = fNs->AddInstance("X_Disk", {{"Asint64", std::numeric_limits<long long>::min()},
                                                    {"Auint64", std::numeric_limits<unsigned long long>::max()}});
  EXPECT_EQ(instance->Get("Asint64").ToString(), "-9223372036854775808");
  EXPECT_EQ(instance->Get("Auint64").ToString(), "18446744073709551615");
}

TEST_F(TMemoryValuesTest, ANumberOutsideTheRangeIsRefusedWithTheRange) {
  std::string const refused = " refused: kZEPStatusTypeMismatch: ";
  EXPECT_EQ(WhyRefused("Auint8", 256), "X_Disk.Auint8" + refused + "256 is outside the range of uint8, 0 to 255");
  EXPECT_EQ(WhyRefused("Asint8", -129L), "X_Disk.Asint8" + refused + "-129 is outside the range of sint8, -128 to 127");
  EXPECT_EQ(WhyRefused("Auint16", -1), "X_Disk.Auint16" + refused + "-1 is outside the range of uint16, 0 to 65535");
  EXPECT_EQ(WhyRefused("Asint16", 32768U), "X_Disk.Asint16" + refused + "32768 is outside the range of sint16, -32768 to 32767");
  EXPECT_EQ(WhyRefused("Auint32", 4294967296LL),
            "X_Disk.Auint32" + refused + "4294967296 is outside the range of uint32, 0 to 4294967295");
  EXPECT_EQ(WhyRefused("Asint32", 2147483648ULL),
            "X_Disk.Asint32" + refused + "2147483648 is outside the range of sint32, -2147483648 to 2147483647");
  EXPECT_EQ(WhyRefused("Auint64", -1LL),
            "X_Disk.Auint64" + refused + "-1 is outside the range of uint64, 0 to 18446744073709551615");
  EXPECT_EQ(WhyRefused("Asint64", 9223372036854775808ULL),
            "X_Disk.Asint64" + refused +
                "9223372036854775808 is outside the range of sint64, -9223372036854775808 to 9223372036854775807");
}

TEST_F(TMemoryValuesTest, AValueOfAnotherTypeIsRefusedWithBothTypesAndNotRepeated) {
  std::string const refused = " refused: kZEPStatusTypeMismatch: the value is a ";
  EXPECT_EQ(WhyRefused("Name", 5LL), "X_Disk.Name" + refused + "sint64 instead of a string");
  EXPECT_EQ(WhyRefused("Auint8", "5"), "X_Disk.Auint8" + refused + "string instead of a uint8");
  EXPECT_EQ(WhyRefused("Is", 1), "X_Disk.Is" + refused + "sint32 instead of a boolean");
  EXPECT_EQ(WhyRefused("Real", 1), "X_Disk.Real" + refused + "sint32 instead of a real64");
  EXPECT_EQ(WhyRefused("Auint8", TMemoryType("uint8[]").GetNull()),
            "X_Disk.Auint8" + refused + "NULL uint8[] instead of a uint8");
}

TEST_F(TMemoryValuesTest, ABooleanStaysABoolean) {
  EXPECT_EQ(fNs->AddInstance("X_Disk", {{"Is", true}})->Get("Is").ToString(), "true");
  EXPECT_EQ(WhyRefused("Auint8", true),
            "X_Disk.Auint8 refused: kZEPStatusTypeMismatch: the value is a boolean instead of a uint8");
}

TEST_F(TMemoryValuesTest, OfTwoValuesForAPropertyTheLaterRemains) {
  TMemoryValues values{{"Name", "a"}};
  values.Set("Name", "b");
  EXPECT_EQ(fNs->AddInstance("X_Disk", values)->Get("Name").ToString(), "b");
}

TEST_F(TMemoryValuesTest, EntriesAreMadeFromPairsAndFromBraces) {
  std::pair<std::string, TCIMValue> const pair("Name", "a");
  TMemoryValues values{pair, {"Auint8", {}}};
  values.push_back({"Auint16", 5ULL});
  auto const instance = fNs->AddInstance("X_Disk", values);
  EXPECT_EQ(instance->Get("Name").ToString(), "a");
  EXPECT_TRUE(instance->Get("Auint8").IsNull());
  EXPECT_EQ(instance->Get("Auint16").ToString(), "5");
}

TEST_F(TMemoryValuesTest, TheBuilderTakesLongLong) {
  auto const cls = fNs->DefineClass("X_Fan")
                       .Property("Speed", "uint16", 5LL)
                       .Qualifier("MaxValue", 9ULL)
                       .Static("Count", "uint64", 7ULL)
                       .Class();
  auto const speed = cls->GetPropertyDecl("Speed", kNone);
  EXPECT_EQ(speed->GetDefaultValue(kNone).ToString(), "5");
  EXPECT_EQ(speed->GetQualifier("MaxValue", kNone)->GetValue(kNone).ToString(), "9");
  EXPECT_EQ(All(*cls, &ICIMClass::EnumerateStaticProperties).at(0)->GetValue(kNone).ToString(), "7");
}

}  // namespace
}  // namespace NQRVZEP20
