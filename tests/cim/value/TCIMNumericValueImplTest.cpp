// SPDX-License-Identifier: Apache-2.0
#include "TCIMNumericValueImpl.h"

#include "tests/Support.h"

#include <cmath>
#include <cstring>
#include <iomanip>
#include <limits>
#include <locale>
#include <random>

namespace NQRVZEP20 {
namespace {

using TImpl = TCIMNumericValueImpl;
using TType = TCIMValue::TCIMType;

template <class TNumber>
using TLimits = std::numeric_limits<TNumber>;

constexpr double kNaN = TLimits<double>::quiet_NaN();
constexpr double kInfinity = TLimits<double>::infinity();

// ---- Conversions ----

template <class TNumber>
class TCIMNumericConversionTest : public testing::Test {};

using TNumbers = testing::Types<bool, unsigned char, signed char, unsigned short, short, unsigned int, int, unsigned long, long,
                                float, double>;
TYPED_TEST_SUITE(TCIMNumericConversionTest, TNumbers, );

// Converts the data to TAsked: that gives its value when TAsked is exactly the stored type, and otherwise a type mismatch.
template <class TAsked, class TStored, class TData>
void ExpectReadAs(TData const& data, TStored stored) {
  if constexpr (std::is_same_v<TAsked, TStored>)
    EXPECT_EQ(data.TData::operator TAsked(), stored);
  else
    EXPECT_STATUS(data.TData::operator TAsked(), kZEPStatusTypeMismatch);
}

template <class TStored, template <class...> class TList, class... TAsked>
void ExpectReadAsEachOf(TImpl const& data, TStored stored, TList<TAsked...>) {
  (ExpectReadAs<TAsked>(data, stored), ...);
}

TYPED_TEST(TCIMNumericConversionTest, ConvertsOnlyToExactlyTheStoredType) {
  for (TypeParam const number : {TLimits<TypeParam>::lowest(), TypeParam(0), TypeParam(1), TLimits<TypeParam>::max()}) {
    TImpl const data(number);
    ExpectReadAsEachOf(data, number, TNumbers());
    ExpectReadAsEachOf(TImpl(data), number, TNumbers());
    EXPECT_STATUS(data.operator std::string(), kZEPStatusTypeMismatch);
    EXPECT_STATUS(data.operator TCIMChar16(), kZEPStatusTypeMismatch);
    EXPECT_STATUS(data.operator TCIMDateTime(), kZEPStatusTypeMismatch);
    EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
    EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
  }
}

TYPED_TEST(TCIMNumericConversionTest, TheDataIsOneTagAndOneWord) {
  EXPECT_EQ(sizeof(TImpl), sizeof(void*) + sizeof(void*) + 8);  // including the pointer to the virtual table
}

// ---- Text ----

struct TTextRow {
  TImpl fData;
  int fRadix;
  char const* fText;  // nullptr: kZEPStatusNotSupported
};

TTextRow const kTexts[] = {
    {TImpl(true), 10, "true"},
    {TImpl(true), 16, "true"},
    {TImpl(false), 8, "false"},
    {TImpl(false), 10, "false"},

    {TImpl((unsigned char)65), 10, "65"},
    {TImpl((unsigned char)0), 10, "0"},
    {TImpl((unsigned char)255), 10, "255"},
    {TImpl((unsigned char)10), 16, "0A"},
    {TImpl((unsigned char)0), 16, "00"},
    {TImpl((unsigned char)255), 16, "FF"},
    {TImpl((unsigned char)0), 8, "0"},
    {TImpl((unsigned char)255), 8, "377"},

    {TImpl((signed char)65), 10, "65"},
    {TImpl((signed char)-5), 10, "-5"},
    {TImpl((signed char)-128), 10, "-128"},
    {TImpl((signed char)-5), 16, nullptr},
    {TImpl((signed char)5), 8, nullptr},

    {TImpl((unsigned short)65535), 10, "65535"},
    {TImpl((unsigned short)255), 16, "00FF"},
    {TImpl((unsigned short)0), 16, "0000"},
    {TImpl((unsigned short)0xBEEF), 16, "BEEF"},
    {TImpl((unsigned short)8), 8, "10"},

    {TImpl((short)-32768), 10, "-32768"},
    {TImpl((short)1), 16, nullptr},
    {TImpl((short)1), 8, nullptr},

    {TImpl(4294967295u), 10, "4294967295"},
    {TImpl(255u), 16, "000000FF"},
    {TImpl(0xDEADBEEFu), 16, "DEADBEEF"},
    {TImpl(4294967295u), 8, "37777777777"},

    {TImpl(-2147483647 - 1), 10, "-2147483648"},
    {TImpl(2147483647), 10, "2147483647"},
    {TImpl(1), 16, nullptr},
    {TImpl(1), 8, nullptr},

    {TImpl(TLimits<unsigned long>::max()), 10, "18446744073709551615"},
    {TImpl(TLimits<unsigned long>::max()), 16, "FFFFFFFFFFFFFFFF"},
    {TImpl(TLimits<unsigned long>::max()), 8, "1777777777777777777777"},
    {TImpl(1ul), 16, "0000000000000001"},
    {TImpl(0ul), 8, "0"},

    {TImpl(TLimits<long>::min()), 10, "-9223372036854775808"},
    {TImpl(TLimits<long>::max()), 10, "9223372036854775807"},
    {TImpl(1l), 16, nullptr},
    {TImpl(1l), 8, nullptr},

    {TImpl(1.5f), 10, "1.5"},
    {TImpl(0.1f), 10, "0.1"},
    {TImpl(16777216.0f), 10, "1.67772e+07"},
    {TImpl(TLimits<float>::max()), 10, "3.40282e+38"},
    {TImpl(TLimits<float>::denorm_min()), 10, "1.4013e-45"},
    {TImpl(1.5f), 16, nullptr},
    {TImpl(1.5f), 8, nullptr},

    {TImpl(0.1), 10, "0.1"},
    {TImpl(0.0), 10, "0"},
    {TImpl(-0.0), 10, "-0"},
    {TImpl(1.0), 10, "1"},
    {TImpl(100.0), 10, "100"},
    {TImpl(100000.0), 10, "100000"},
    {TImpl(1000000.0), 10, "1e+06"},
    {TImpl(1234567.0), 10, "1.23457e+06"},
    {TImpl(999999.4), 10, "999999"},
    {TImpl(999999.5), 10, "1e+06"},
    {TImpl(0.0001), 10, "0.0001"},
    {TImpl(0.00001), 10, "1e-05"},
    {TImpl(0.00099999995), 10, "0.001"},
    {TImpl(0.5), 10, "0.5"},
    {TImpl(1.000005), 10, "1.00001"},  // the stored number is above the tie
    {TImpl(2.000005), 10, "2"},        // here it is below
    {TImpl(8388608.5), 10, "8.38861e+06"},
    {TImpl(1024.125), 10, "1024.12"},  // a tie goes to the even digit
    {TImpl(1024.375), 10, "1024.38"},
    {TImpl(TLimits<double>::max()), 10, "1.79769e+308"},
    {TImpl(TLimits<double>::min()), 10, "2.22507e-308"},
    {TImpl(TLimits<double>::denorm_min()), 10, "4.94066e-324"},
    {TImpl(-1.0 / 3), 10, "-0.333333"},
    {TImpl(kInfinity), 10, "inf"},
    {TImpl(-kInfinity), 10, "-inf"},
    {TImpl(kNaN), 10, "nan"},
    {TImpl(-kNaN), 10, "-nan"},
    {TImpl(0.1), 16, nullptr},
    {TImpl(0.1), 8, nullptr},
};

TEST(TCIMNumericValueImplTest, PrintsEachTypeInEachRadix) {
  int row = 0;
  for (auto const& [data, radix, text] : kTexts) {
    SCOPED_TRACE("row " + std::to_string(row++) + ", radix " + std::to_string(radix) + ", " + data.ToString(10));
    if (text != nullptr)
      EXPECT_EQ(data.ToString(static_cast<unsigned char>(radix)), text);
    else
      EXPECT_STATUS(data.ToString(static_cast<unsigned char>(radix)), kZEPStatusNotSupported);
  }
}

TYPED_TEST(TCIMNumericConversionTest, EveryOtherRadixIsRefused) {
  TImpl const data(TypeParam(1));
  for (int radix = 0; radix < 256; ++radix) {
    if (radix == 8 || radix == 10 || radix == 16) continue;
    SCOPED_TRACE(radix);
    EXPECT_STATUS(data.ToString(static_cast<unsigned char>(radix)), kZEPStatusNotSupported);
  }
}

template <class TNumber>
std::string StreamText(TNumber number, int radix = 10) {
  std::ostringstream stream;
  stream.imbue(std::locale::classic());
  stream << std::setbase(radix) << (radix == 16 ? std::uppercase : std::nouppercase) << std::setfill('0')
         << std::setw(radix == 16 ? 2 * sizeof number : 0) << +number;
  return stream.str();
}

template <class TNumber>
void ExpectStreamText(TNumber number) {
  for (int const radix : {10, 16, 8}) {
    if (radix != 10 && std::is_signed_v<TNumber>) continue;
    ASSERT_EQ(TImpl(number).ToString(static_cast<unsigned char>(radix)), StreamText(number, radix)) << radix;
    TCIMValue const array(TCIMValue(number).GetType(), 0, {TCIMValue(number)});
    ASSERT_EQ(array.ToString(static_cast<unsigned char>(radix)), "{ " + StreamText(number, radix) + " }") << radix;
  }
}

void ExpectStreamTextOfEachType(unsigned long bits) {
  ExpectStreamText(static_cast<unsigned char>(bits));
  ExpectStreamText(static_cast<signed char>(bits));
  ExpectStreamText(static_cast<unsigned short>(bits));
  ExpectStreamText(static_cast<short>(bits));
  ExpectStreamText(static_cast<unsigned int>(bits));
  ExpectStreamText(static_cast<int>(bits));
  ExpectStreamText(bits);
  ExpectStreamText(static_cast<long>(bits));
}

TEST(TCIMNumericValueImplTest, IntegersPrintAsAStreamPrintsThem) {
  for (unsigned long power = 1, i = 0; i < 20; ++i, power *= 10)  // where the number of digits changes
    for (unsigned long const near : {power - 1, power, power + 1, 0 - power, 9 * power}) ExpectStreamTextOfEachType(near);

  std::mt19937_64 random(20070315);
  for (int i = 0; i < 20000; ++i) ExpectStreamTextOfEachType(random() >> random() % 64);
}

double RealFrom(std::uint64_t bits) {
  double number;
  std::memcpy(&number, &bits, sizeof number);
  return number;
}

TEST(TCIMNumericValueImplTest, RealsPrintAsAStreamPrintsThem) {
  std::mt19937_64 random(20070315);
  for (int i = 0; i < 100000; ++i) {
    double const any = RealFrom(random());
    double const common = RealFrom((1023 - 80 + random() % 160) << 52 | random() >> 12);  // from 1e-24 to 1e24
    for (double const number : {any, common, -common, static_cast<double>(static_cast<float>(common))}) {
      ASSERT_EQ(TImpl(number).ToString(10), StreamText(number)) << std::hexfloat << number;
      ASSERT_EQ(TImpl(static_cast<float>(number)).ToString(10), StreamText(static_cast<float>(number)))
          << std::hexfloat << number;
    }
  }
}

// Powers of 10, where the number of digits before the point changes, and of 2, where the binary exponent changes.
TEST(TCIMNumericValueImplTest, PowersPrintAsAStreamPrintsThem) {
  for (int exponent = -330; exponent <= 310; ++exponent)
    for (double const power : {std::pow(10.0, exponent), std::ldexp(1.0, exponent)})
      for (double const near : {power, std::nextafter(power, kInfinity), std::nextafter(power, -kInfinity), 9.999995 * power})
        ASSERT_EQ(TImpl(near).ToString(10), StreamText(near)) << std::hexfloat << near;
}

// Numbers with few decimal digits, near which the exact stored number decides the sixth digit.
TEST(TCIMNumericValueImplTest, RealsNearATiePrintAsAStreamPrintsThem) {
  std::mt19937_64 random(1983);
  for (int i = 0; i < 100000; ++i) {
    auto const digits = static_cast<double>(random() % 20000000);
    double const number = digits / 2 * std::pow(10.0, static_cast<int>(random() % 40) - 20);
    for (double const near : {number, std::nextafter(number, kInfinity), std::nextafter(number, -kInfinity)})
      ASSERT_EQ(TImpl(near).ToString(10), StreamText(near)) << std::hexfloat << near;
  }
}

class TCommaPunctuation : public std::numpunct<char> {
protected:
  char do_decimal_point() const override { return ','; }
  char do_thousands_sep() const override { return '.'; }
  std::string do_grouping() const override { return "\3"; }
  std::string do_truename() const override { return "wahr"; }
};

TEST(TCIMNumericValueImplTest, TheProcessLocaleHasNoEffect) {
  std::locale const old = std::locale::global(std::locale(std::locale::classic(), new TCommaPunctuation));
  EXPECT_EQ(TImpl(1234.5).ToString(10), "1234.5");
  EXPECT_EQ(TImpl(1234567u).ToString(10), "1234567");
  EXPECT_EQ(TImpl(true).ToString(10), "true");
  std::locale::global(old);
}

// ---- Comparison ----

TYPED_TEST(TCIMNumericConversionTest, ComparesInItsOwnType) {
  TypeParam const lowest = TLimits<TypeParam>::lowest();
  TypeParam const highest = TLimits<TypeParam>::max();
  TImpl const low(lowest), high(highest);
  EXPECT_TRUE(low == TCIMValue(lowest));
  EXPECT_FALSE(low == TCIMValue(highest));
  EXPECT_TRUE(low < TCIMValue(highest));
  EXPECT_FALSE(high < TCIMValue(lowest));
  EXPECT_FALSE(low < TCIMValue(lowest));
}

template <class TMine, template <class...> class TList, class... TTheirs>
void ExpectStrangers(TList<TTheirs...>) {
  for (auto const& [mine, theirs] : {std::pair(1, 1), std::pair(0, 1), std::pair(1, 0)}) {
    TImpl const data{static_cast<TMine>(mine)};
    EXPECT_EQ(((data == TCIMValue(static_cast<TTheirs>(theirs))) + ...), mine == theirs ? 1 : 0);  // its own type
    EXPECT_EQ(((data < TCIMValue(static_cast<TTheirs>(theirs))) + ...), mine < theirs ? 1 : 0);
  }
}

TYPED_TEST(TCIMNumericConversionTest, IsNeitherEqualNorLessAcrossTypes) {
  ExpectStrangers<TypeParam>(TNumbers());
  TImpl const data(TypeParam(1));
  EXPECT_FALSE(data == TCIMValue("1"));
  EXPECT_FALSE(data < TCIMValue("2"));
  EXPECT_FALSE(data == TCIMValue());
}

TYPED_TEST(TCIMNumericConversionTest, ComparingWithANullOfItsTypeThrowsValueIsNull) {
  TCIMValue null(TypeParam(1));
  null.SetNullValue(null.GetType(), 0);
  EXPECT_STATUS((void)(TImpl(TypeParam(1)) == null), kZEPStatusValueIsNULL);
  EXPECT_STATUS((void)(TImpl(TypeParam(1)) < null), kZEPStatusValueIsNULL);
}

TEST(TCIMNumericValueImplTest, SignedTypesCompareAsSigned) {
  EXPECT_TRUE(TImpl((signed char)-1) < TCIMValue((signed char)1));
  EXPECT_TRUE(TImpl((short)-1) < TCIMValue((short)1));
  EXPECT_TRUE(TImpl(-1) < TCIMValue(1));
  EXPECT_TRUE(TImpl(-1l) < TCIMValue(1l));
  EXPECT_TRUE(TImpl((unsigned char)1) < TCIMValue((unsigned char)0xFF));
}

TEST(TCIMNumericValueImplTest, ANaNIsNeitherEqualNorLess) {
  for (double const other : {kNaN, 0.0, kInfinity, -kInfinity}) {
    EXPECT_FALSE(TImpl(kNaN) == TCIMValue(other)) << other;
    EXPECT_FALSE(TImpl(kNaN) < TCIMValue(other)) << other;
    EXPECT_FALSE(TImpl(other) < TCIMValue(kNaN)) << other;
    EXPECT_FALSE(TImpl(float(kNaN)) == TCIMValue(float(other))) << other;
    EXPECT_FALSE(TImpl(float(other)) < TCIMValue(float(kNaN))) << other;
  }
  EXPECT_TRUE(TImpl(0.0) == TCIMValue(-0.0));
  EXPECT_FALSE(TImpl(-0.0) < TCIMValue(0.0));
}

// ---- Tags that no constructor sets ----

class TMistaggedImpl : public TImpl {
public:
  explicit TMistaggedImpl(int tag) : TImpl(1u) { fType = TType::ECIMType(tag); }
};

TEST(TCIMNumericValueImplTest, ATagThatNoConstructorSetsIsRefused) {
  EXPECT_STATUS(TMistaggedImpl(12).ToString(10), kZEPStatusNotImplemented);
  EXPECT_STATUS(TMistaggedImpl(12).ToString(2), kZEPStatusNotSupported);
  EXPECT_STATUS((void)(TMistaggedImpl(12) == TCIMValue(TCIMChar16(1))), kZEPStatusNotImplemented);
  EXPECT_STATUS((void)(TMistaggedImpl(12) < TCIMValue(TCIMChar16(1))), kZEPStatusNotImplemented);
  for (int const tag : {0, 13, 14, 15, 18}) {
    SCOPED_TRACE(tag);
    EXPECT_STATUS(TMistaggedImpl(tag).ToString(10), kZEPStatusTypeMismatch);
  }
  EXPECT_STATUS((void)(TMistaggedImpl(13) == TCIMValue("1")), kZEPStatusTypeMismatch);
  EXPECT_STATUS((void)(TMistaggedImpl(13) < TCIMValue("1")), kZEPStatusTypeMismatch);
  EXPECT_FALSE(TMistaggedImpl(13) == TCIMValue(1u));
}

}  // namespace
}  // namespace NQRVZEP20
