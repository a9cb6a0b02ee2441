// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/ValueBytes.h"

#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TReceivedNamespace.h"
#include "providers/memory/TMemoryNamespace.h"
#include "tests/collect/answer/Bytes.h"
#include "tests/collect/answer/DumpOf.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

#include <cmath>
#include <cstring>
#include <limits>

namespace NQRVZEP20 {
namespace {

std::uint64_t gValues = 0;  // that were checked

using TType = TCIMValue::TCIMType;

template <class TReal, class TBits>
TCIMValue RealOf(TBits bits) {
  TReal real;
  std::memcpy(&real, &bits, sizeof real);
  return real;
}

TCIMValue Array(TType type, unsigned int bound, std::vector<TCIMValue> const& elements) {
  return TCIMValue(type, bound, elements);
}

TCIMValue NullOf(int type, unsigned int bound = 0) {
  TCIMValue value;
  value.SetNullValue(static_cast<TType::ECIMType>(type), bound);
  return value;
}

std::vector<TCIMValue> Values() {
  TCIMDateTime precise("20070315143000.000001-060");
  precise.SetPrecision(true);
  TCIMDateTime cleared("20070315143000.000000+060");
  cleared.Clear();
  TCIMDateTime interval("20070315143000.000000+060");
  interval.Set(123456789u, 1, 2, 3, 4);
  TCIMValue mixed = Array(TType::kCIMTypeUint8, 0, {});
  static_cast<std::vector<TCIMValue>&>(mixed).assign({TCIMValue("text"), Array(TType::kCIMTypeBoolean, 2, {true}), TCIMValue()});
  return {
      TCIMValue(),
      true,
      false,
      std::numeric_limits<unsigned char>::max(),
      std::numeric_limits<signed char>::min(),
      std::numeric_limits<unsigned short>::max(),
      std::numeric_limits<short>::min(),
      std::numeric_limits<unsigned int>::max(),
      std::numeric_limits<int>::min(),
      std::numeric_limits<unsigned long>::max(),
      std::numeric_limits<long>::min(),
      -0.0f,
      -0.0,
      0.1f,
      0.1,
      std::numeric_limits<float>::denorm_min(),
      std::numeric_limits<double>::infinity(),
      RealOf<float>(0xffc12345u),
      RealOf<double>(0x7ff8000000000001u),
      RealOf<double>(0xfff7feedfacecafeu),
      TCIMChar16(0),
      TCIMChar16(65535),
      TCIMChar16(std::string("A")),
      "",
      std::string("a\0\xff\r\n", 5),
      std::string(100000, '\x80'),
      TCIMDateTime(),
      TCIMDateTime("00000001020304.000005:000"),
      TCIMDateTime("20070315143000.999999+060"),
      precise,
      cleared,
      interval,
      Array(TType::kCIMTypeString, 0, {}),
      Array(TType::kCIMTypeString, 7, {"a", NullOf(TType::kCIMTypeString), ""}),
      Array(TType::kCIMTypeReal64, 0, {-0.0, RealOf<double>(0x7ff8000000000001u)}),
      mixed,
      NullOf(TType::kCIMTypeUint16),
      NullOf(TType::kCIMTypeReference),
      NullOf(TType::kCIMTypeUint16 | TType::kCIMTypeArrayFlag, 9),
      NullOf(TType::kCIMTypeReference | TType::kCIMTypeArrayFlag),
      NullOf(1000000),
  };
}

class ValueBytesTest : public testing::Test {
protected:
  std::string BytesOfValue(TCIMValue const& value) const {
    TByteWriter writer;
    WriteValue(writer, value, {});
    return writer.Bytes();
  }

  boost::shared_ptr<TReceivedNamespace> const fNamespace =
      TReceivedNamespace::From(BytesOf(*boost::make_shared<TMemoryNamespace>("root/x")));
};

TEST_F(ValueBytesTest, EveryValueIsReadAgainToTheLastBit) {
  for (TCIMValue const& value : Values()) {
    std::string const bytes = BytesOfValue(value);
    TByteReader checked(bytes), reader(bytes);
    TValueChecker(0, gValues).CheckValue(checked);
    EXPECT_EQ(checked.Left(), 0u);
    EXPECT_EQ(DumpOf(ReadValue(reader, *fNamespace)), DumpOf(value));
    EXPECT_EQ(reader.Left(), 0u);
  }
}

TEST_F(ValueBytesTest, AValueThatIsCutOffIsRefused) {
  for (TCIMValue const& value : Values()) {
    std::string const bytes = BytesOfValue(value);
    for (std::size_t size = 0; size < bytes.size() && size < 100; ++size) {
      TByteReader reader(std::string_view(bytes).substr(0, size));
      EXPECT_THROW(TValueChecker(0, gValues).CheckValue(reader), TBadAnswer) << DumpOf(value) << " at " << size;
    }
  }
}

std::string WhyRefused(std::string const& bytes) {
  TByteReader reader(bytes);
  try {
    TValueChecker(1, gValues).CheckValue(reader);
  } catch (TBadAnswer const& refusal) {
    return refusal.what();
  }
  return "";
}

TEST_F(ValueBytesTest, WrongTagsAndClassesAreRefused) {
  EXPECT_EQ(WhyRefused(std::string(1, '\0')), "a value has the type 0");
  EXPECT_EQ(WhyRefused(std::string("\x80\x20", 2)), "a value has the type 32");
  EXPECT_EQ(WhyRefused(std::string("\x40", 1)), "a failure is in the place of a value");
  EXPECT_EQ(WhyRefused(std::string("\x2f\x02", 2)), "");  // a NULL reference to the only class
  EXPECT_EQ(WhyRefused(std::string("\x2f\x03", 2)), "a value refers to a class that does not exist");
  EXPECT_EQ(WhyRefused(std::string("\x0f\x01\x00\x00\x01\x00\x20", 7)), "a reference has keys, but no class");
  EXPECT_EQ(WhyRefused(std::string("\x11\x00\x7f", 3)), "the size of an array: 127, more than 0");
}

TEST_F(ValueBytesTest, ValuesThatAreNestedTooDeeplyAreRefused) {
  std::string bytes;
  for (int depth = 0; depth < 101; ++depth) bytes += std::string("\x11\x00\x01", 3);  // an array with one element
  EXPECT_EQ(WhyRefused(bytes + "\x20"), "a value is nested too deeply");
}

}  // namespace
}  // namespace NQRVZEP20
