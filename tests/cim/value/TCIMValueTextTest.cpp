// SPDX-License-Identifier: Apache-2.0

// Reading values from text.

#include "TCIMReference.h"
#include "TCIMValue.h"
#include "tests/Support.h"
#include "tests/cim/model/Fakes.h"

#include <cstring>
#include <limits>
#include <random>

namespace NQRVZEP20 {
namespace {

using TType = TCIMValue::TCIMType;

TCIMValue Parse(TType type, std::string text, boost::shared_ptr<ICIMNamespace> ns = nullptr) { return TCIMValue(type, text, ns); }

// ---- Numbers and booleans ----

struct TReadRow {
  TType::ECIMType fType;
  char const* fText;
  char const* fPrinted;
};

constexpr TReadRow kReads[] = {
    {TType::kCIMTypeBoolean, "true", "true"},
    {TType::kCIMTypeBoolean, " \ttrue", "true"},
    {TType::kCIMTypeBoolean, "trueish", "true"},
    {TType::kCIMTypeBoolean, "false", "false"},
    {TType::kCIMTypeBoolean, "True", "false"},  // not accepted
    {TType::kCIMTypeBoolean, "TRUE", "false"},
    {TType::kCIMTypeBoolean, "tru", "false"},
    {TType::kCIMTypeBoolean, "1", "false"},
    {TType::kCIMTypeBoolean, "", "false"},

    {TType::kCIMTypeUint8, "255", "255"},
    {TType::kCIMTypeUint8, "256", "0"},
    {TType::kCIMTypeUint8, "300", "44"},
    {TType::kCIMTypeUint8, "-1", "255"},
    {TType::kCIMTypeUint8, "65", "65"},  // a number, not a character
    {TType::kCIMTypeUint8, "A", "0"},
    {TType::kCIMTypeUint8, "4294967295", "255"},
    {TType::kCIMTypeUint8, "4294967296", "0"},  // does not fit 32 bits either

    {TType::kCIMTypeSint8, "-128", "-128"},
    {TType::kCIMTypeSint8, "127", "127"},
    {TType::kCIMTypeSint8, "200", "-56"},
    {TType::kCIMTypeSint8, "-200", "56"},
    {TType::kCIMTypeSint8, "2147483648", "0"},

    {TType::kCIMTypeUint16, "65535", "65535"},
    {TType::kCIMTypeUint16, "65536", "0"},
    {TType::kCIMTypeUint16, "-1", "65535"},
    {TType::kCIMTypeUint16, "-65535", "1"},
    {TType::kCIMTypeUint16, "-65536", "0"},

    {TType::kCIMTypeSint16, "32767", "32767"},
    {TType::kCIMTypeSint16, "32768", "0"},
    {TType::kCIMTypeSint16, "-32768", "-32768"},
    {TType::kCIMTypeSint16, "-32769", "0"},

    {TType::kCIMTypeUint32, "42", "42"},
    {TType::kCIMTypeUint32, "42abc", "42"},
    {TType::kCIMTypeUint32, "  42", "42"},
    {TType::kCIMTypeUint32, "\t\n\v\f\r 42", "42"},
    {TType::kCIMTypeUint32, "+42", "42"},
    {TType::kCIMTypeUint32, "-42", "4294967254"},
    {TType::kCIMTypeUint32, "- 42", "0"},
    {TType::kCIMTypeUint32, "+-42", "0"},
    {TType::kCIMTypeUint32, "--42", "0"},
    {TType::kCIMTypeUint32, "00042", "42"},
    {TType::kCIMTypeUint32, "0x1F", "0"},
    {TType::kCIMTypeUint32, "017", "17"},
    {TType::kCIMTypeUint32, "1,234", "1"},
    {TType::kCIMTypeUint32, "1.9", "1"},
    {TType::kCIMTypeUint32, "1e3", "1"},
    {TType::kCIMTypeUint32, "abc", "0"},
    {TType::kCIMTypeUint32, "", "0"},
    {TType::kCIMTypeUint32, "   ", "0"},
    {TType::kCIMTypeUint32,
     "\xA0"
     "42",
     "0"},
    {TType::kCIMTypeUint32, "4294967295", "4294967295"},
    {TType::kCIMTypeUint32, "4294967296", "0"},
    {TType::kCIMTypeUint32, "-4294967295", "1"},
    {TType::kCIMTypeUint32, "99999999999999999999999999", "0"},

    {TType::kCIMTypeSint32, "-2147483648", "-2147483648"},
    {TType::kCIMTypeSint32, "2147483647", "2147483647"},
    {TType::kCIMTypeSint32, "2147483648", "0"},
    {TType::kCIMTypeSint32, "-2147483649", "0"},
    {TType::kCIMTypeSint32, "-0", "0"},

    {TType::kCIMTypeUint64, "18446744073709551615", "18446744073709551615"},
    {TType::kCIMTypeUint64, "18446744073709551616", "0"},
    {TType::kCIMTypeUint64, "-1", "18446744073709551615"},

    {TType::kCIMTypeSint64, "-9223372036854775808", "-9223372036854775808"},
    {TType::kCIMTypeSint64, "9223372036854775807", "9223372036854775807"},
    {TType::kCIMTypeSint64, "9223372036854775808", "0"},
    {TType::kCIMTypeSint64, "-9223372036854775809", "0"},

    {TType::kCIMTypeReal32, "1.5", "1.5"},
    {TType::kCIMTypeReal32, "3.4e38", "3.4e+38"},
    {TType::kCIMTypeReal32, "3.5e38", "0"},
    {TType::kCIMTypeReal32, "-1e-46", "-0"},
    {TType::kCIMTypeReal32, "-1e39", "0"},

    {TType::kCIMTypeReal64, "1.5", "1.5"},
    {TType::kCIMTypeReal64, "+1.5", "1.5"},
    {TType::kCIMTypeReal64, " -1.5e3xyz", "-1500"},
    {TType::kCIMTypeReal64, "1E3", "1000"},
    {TType::kCIMTypeReal64, "1e+3", "1000"},
    {TType::kCIMTypeReal64, ".5", "0.5"},
    {TType::kCIMTypeReal64, "5.", "5"},
    {TType::kCIMTypeReal64, "1.2.3", "1.2"},
    {TType::kCIMTypeReal64, "1e2.5", "100"},
    {TType::kCIMTypeReal64, "1e2e3", "100"},
    {TType::kCIMTypeReal64, "1,5", "1"},
    {TType::kCIMTypeReal64, ".", "0"},
    {TType::kCIMTypeReal64, "e5", "0"},
    {TType::kCIMTypeReal64, "1e", "0"},  // an exponent without digits
    {TType::kCIMTypeReal64, "1e+", "0"},
    {TType::kCIMTypeReal64, "1ex", "0"},
    {TType::kCIMTypeReal64, "inf", "0"},
    {TType::kCIMTypeReal64, "nan", "0"},
    {TType::kCIMTypeReal64, "infinity", "0"},
    {TType::kCIMTypeReal64, "0x1p3", "0"},
    {TType::kCIMTypeReal64, "1e308", "1e+308"},
    {TType::kCIMTypeReal64, "1e309", "0"},
    {TType::kCIMTypeReal64, "-1e309", "0"},
    {TType::kCIMTypeReal64, "1e-400", "0"},
    {TType::kCIMTypeReal64, "-1e-400", "-0"},
    {TType::kCIMTypeReal64, "4.9e-324", "4.94066e-324"},
    {TType::kCIMTypeReal64, "-0", "-0"},
    {TType::kCIMTypeReal64, "-", "0"},
    {TType::kCIMTypeReal64, "", "0"},
};

TEST(TCIMValueTextTest, NumbersAndBooleansAreReadAsAStreamReadsThem) {
  for (auto const& row : kReads) {
    TCIMValue const value = Parse(row.fType, row.fText);
    EXPECT_EQ(value.GetType(), row.fType) << row.fText;
    EXPECT_EQ(value.ToString(), row.fPrinted) << TType(row.fType) << " '" << row.fText << "'";
  }
}

TEST(TCIMValueTextTest, AZeroByteEndsANumber) {
  EXPECT_EQ(Parse(TType::kCIMTypeUint32, std::string("4\0002", 3)).ToString(), "4");
  EXPECT_EQ(Parse(TType::kCIMTypeReal64, std::string("1.\0005", 4)).ToString(), "1");
  EXPECT_EQ(Parse(TType::kCIMTypeUint32, std::string("\0004", 2)).ToString(), "0");
}

// The number that a stream reads; 0 when the stream fails.
template <class TNumber>
TNumber Extracted(std::string const& text) {
  std::istringstream stream(text);
  stream.imbue(std::locale::classic());
  TNumber number{};
  stream >> std::boolalpha >> number;
  return stream ? number : TNumber{};
}

// Compares the bits, which distinguishes 0 from -0.
template <class TStored, class TRead = TStored>
testing::AssertionResult ReadsAsAStream(TType type, std::string const& text) {
  auto const expected = static_cast<TStored>(Extracted<TRead>(text));
  auto const actual = Parse(type, text).operator TStored();
  if (std::memcmp(&expected, &actual, sizeof expected) == 0) return testing::AssertionSuccess();
  return testing::AssertionFailure() << type << " '" << testing::PrintToString(text) << "': " << +actual << ", stream "
                                     << +expected;
}

testing::AssertionResult EveryTypeReadsAsAStream(std::string const& text) {
  for (auto const& result :
       {ReadsAsAStream<bool>(TType::kCIMTypeBoolean, text),
        ReadsAsAStream<unsigned char, unsigned int>(TType::kCIMTypeUint8, text),
        ReadsAsAStream<signed char, int>(TType::kCIMTypeSint8, text), ReadsAsAStream<unsigned short>(TType::kCIMTypeUint16, text),
        ReadsAsAStream<short>(TType::kCIMTypeSint16, text), ReadsAsAStream<unsigned int>(TType::kCIMTypeUint32, text),
        ReadsAsAStream<int>(TType::kCIMTypeSint32, text), ReadsAsAStream<unsigned long>(TType::kCIMTypeUint64, text),
        ReadsAsAStream<long>(TType::kCIMTypeSint64, text), ReadsAsAStream<float>(TType::kCIMTypeReal32, text),
        ReadsAsAStream<double>(TType::kCIMTypeReal64, text)})
    if (!result) return result;
  return testing::AssertionSuccess();
}

TEST(TCIMValueTextTest, GeneratedTextsAreReadAsAStreamReadsThem) {
  int count = 0;
  for (char const* blanks : {"", "\t\n\v\f\r ", "\xA0"})
    for (char const* sign : {"", "+", "-", "+-"})
      for (char const* digits : {"",
                                 "0",
                                 "00",
                                 "7",
                                 "0x1F",
                                 "127",
                                 "128",
                                 "129",
                                 "255",
                                 "256",
                                 "257",
                                 "32767",
                                 "32768",
                                 "32769",
                                 "65535",
                                 "65536",
                                 "65537",
                                 "2147483647",
                                 "2147483648",
                                 "2147483649",
                                 "4294967295",
                                 "4294967296",
                                 "4294967297",
                                 "9223372036854775807",
                                 "9223372036854775808",
                                 "9223372036854775809",
                                 "18446744073709551615",
                                 "18446744073709551616",
                                 "18446744073709551617",
                                 "340282346638528859811704183484516925440",
                                 "340282356779733661637539395458142568448",
                                 "000000000000000000000000000000000000000000000000000000000012",
                                 "inf",
                                 "nan",
                                 "true",
                                 "false"})
        for (char const* fraction : {"", ".", ".5", ".0000000000000000000000000000000000000000000000000001", "..", ".5.5"})
          for (char const* exponent : {"", "e", "E5", "e+", "e-5", "e+38", "e-45", "e-46", "e308", "e309", "e-324", "e-325",
                                       "e99999999999999999999", "e-99999999999999999999", "e1e1", "e1.5", "p3"})
            for (char const* tail : {"", "x", " 1"}) {
              ASSERT_TRUE(EveryTypeReadsAsAStream(std::string(blanks) + sign + digits + fraction + exponent + tail));
              ++count;
            }
  EXPECT_GT(count, 100000);
}

std::string RandomText(std::mt19937_64& random, std::string const& alphabet, std::size_t longest) {
  std::string text(random() % (longest + 1), '\0');
  for (char& c : text) c = alphabet.empty() ? static_cast<char>(random()) : alphabet[random() % alphabet.size()];
  return text;
}

TEST(TCIMValueTextTest, RandomTextIsReadAsAStreamReadsIt) {
  std::mt19937_64 random(20070315);
  for (int i = 0; i < 20000; ++i) {
    ASSERT_TRUE(EveryTypeReadsAsAStream(RandomText(random, "", 12)));
    ASSERT_TRUE(EveryTypeReadsAsAStream(RandomText(random, "0123456789", 25)));
    ASSERT_TRUE(EveryTypeReadsAsAStream(RandomText(random, std::string("0123456789+-.eE \txXinfa,\0", 25), 16)));
    ASSERT_TRUE(EveryTypeReadsAsAStream(RandomText(random, "012349.e-", 40)));
    ASSERT_TRUE(EveryTypeReadsAsAStream(RandomText(random, " truefals", 7)));
  }
}

// Numbers halfway between two neighbouring reals, where the last digit decides.
TEST(TCIMValueTextTest, RealsOfManyDigitsAreReadAsAStreamReadsThem) {
  std::mt19937_64 random(1983);
  for (int i = 0; i < 20000; ++i) {
    std::uint64_t const bits = random();
    double number;
    std::memcpy(&number, &bits, sizeof number);
    char text[1100];
    std::snprintf(text, sizeof text, "%.*g", int(random() % 780) + 1, number);
    ASSERT_TRUE(ReadsAsAStream<double>(TType::kCIMTypeReal64, text));
    std::snprintf(text, sizeof text, "%.*g", int(random() % 150) + 1, static_cast<double>(static_cast<float>(number)));
    ASSERT_TRUE(ReadsAsAStream<float>(TType::kCIMTypeReal32, text));
  }
}

class TCommaPunctuation : public std::numpunct<char> {
protected:
  char do_decimal_point() const override { return ','; }
  char do_thousands_sep() const override { return '.'; }
  std::string do_grouping() const override { return "\3"; }
  std::string do_truename() const override { return "wahr"; }
};

TEST(TCIMValueTextTest, TheProcessLocaleHasNoEffect) {
  std::locale const old = std::locale::global(std::locale(std::locale::classic(), new TCommaPunctuation));
  EXPECT_EQ(Parse(TType::kCIMTypeReal64, "1.5").ToString(), "1.5");
  EXPECT_EQ(Parse(TType::kCIMTypeReal64, "-1e-400").ToString(), "-0");
  EXPECT_EQ(Parse(TType::kCIMTypeUint32, "1.234").ToString(), "1");
  EXPECT_EQ(Parse(TType::kCIMTypeBoolean, "true").ToString(), "true");
  std::locale::global(old);
}

// ---- The other types ----

TEST(TCIMValueTextTest, AStringIsTheCompleteText) {
  for (std::string const& text : {std::string("  leading and trailing  "), std::string(), std::string("a\0b", 3)})
    EXPECT_EQ(Parse(TType::kCIMTypeString, text).operator std::string(), text);
}

TEST(TCIMValueTextTest, Char16FromTextHoldsANullCharacter) {
  for (char const* text : {"65", "A", ""}) {
    SCOPED_TRACE(text);
    TCIMValue const value = Parse(TType::kCIMTypeChar16, text);
    EXPECT_FALSE(value.IsNull());
    EXPECT_EQ(value.GetType(), TType::kCIMTypeChar16);
    EXPECT_STATUS(value.ToString(), kZEPStatusInvalidDateTime);
    EXPECT_STATUS((void)(value == value), kZEPStatusInvalidDateTime);
  }
}

TEST(TCIMValueTextTest, ADateTimeIsReadFromItsText) {
  for (char const* text : {"20070315143000.000000+060", "00000002030405.000006:000"})
    EXPECT_EQ(Parse(TType::kCIMTypeDateTime, text).ToString(), text);
  EXPECT_STATUS(Parse(TType::kCIMTypeDateTime, "2007"), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(Parse(TType::kCIMTypeDateTime, ""), kZEPStatusInvalidDateTime);
  EXPECT_STATUS(Parse(TType::kCIMTypeDateTime, " 20070315143000.000000+060"), kZEPStatusInvalidDateTime);
}

TEST(TCIMValueTextTest, AReferenceIsReadAsAPathInTheNamespace) {
  auto const ns = boost::make_shared<TFakeNamespace>();
  ns->Add("X_Disk").Add("Id", TType::kCIMTypeUint32);
  TCIMValue const value = Parse(TType::kCIMTypeReference, "ns:X_Disk.Id=\"5\"", ns);
  EXPECT_TRUE(value.IsReference());
  EXPECT_EQ(value.GetReferencedClass(), ns->Class("X_Disk"));
  EXPECT_EQ(value.ToString(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(value.operator TCIMReference().GetNamespace(), ns);
  ASSERT_EQ(ns->fCalls.fContexts.size(), 1u);
  EXPECT_TRUE(ns->fCalls.fContexts[0].empty());
}

TEST(TCIMValueTextTest, AMalformedReferenceThrowsWhatItsParserThrows) {
  auto const ns = boost::make_shared<TFakeNamespace>();
  EXPECT_STATUS(Parse(TType::kCIMTypeReference, "ns:X_Disk", ns), kZEPStatusInvalidReference);
  EXPECT_STATUS(Parse(TType::kCIMTypeReference, "ns:X_Disk"), kZEPStatusInvalidOpSequence);
  TRootObject::GetCoreLogger()->ClearLog();
}

TEST(TCIMValueTextTest, OtherTypesAreNotReadFromText) {
  for (int tag : {0, 16, 17, 18, 29, 31, 32, 33, -1}) {
    SCOPED_TRACE(tag);
    EXPECT_STATUS(Parse(TType::ECIMType(tag), "1"), kZEPStatusTypeMismatch);
  }
}

TEST(TCIMValueTextTest, TheTextIsNotModifiedAndOtherFieldsAreDefault) {
  std::string text = "  42abc";
  TCIMValue const value(TType::kCIMTypeUint32, text, nullptr);
  EXPECT_EQ(text, "  42abc");
  EXPECT_EQ(value.GetMaxArraySize(), 0u);
  EXPECT_FALSE(value.GetReferencedClass());
}

}  // namespace
}  // namespace NQRVZEP20
