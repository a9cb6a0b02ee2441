// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofValues.h"

#include "CIMTypes.h"
#include "TZEPException.h"
#include "tests/providers/mof/MofTexts.h"

#include <limits>

namespace NQRVZEP20 {
namespace {

TEST(MofValuesTest, ValuesOfEveryTypeAreRead) {
  struct TRow {
    char const* fDeclaration;
    TCIMValue fValue;
  };
  for (TRow const& row : {
           TRow{"boolean P = TRUE;", TCIMValue(true)},
           TRow{"boolean P = False;", TCIMValue(false)},
           TRow{"uint8 P = 255;", TCIMValue(static_cast<unsigned char>(255))},
           TRow{"uint8 P = 0;", TCIMValue(static_cast<unsigned char>(0))},
           TRow{"uint8 P = -0;", TCIMValue(static_cast<unsigned char>(0))},
           TRow{"sint8 P = -128;", TCIMValue(static_cast<signed char>(-128))},
           TRow{"uint16 P = 0xFfFf;", TCIMValue(static_cast<unsigned short>(65535))},
           TRow{"sint16 P = -0x8000;", TCIMValue(std::numeric_limits<short>::min())},
           TRow{"uint32 P = 0777;", TCIMValue(511u)},
           TRow{"uint32 P = 1011B;", TCIMValue(11u)},
           TRow{"uint32 P = 0x1e;", TCIMValue(30u)},
           TRow{"uint32 P = 0x1b;", TCIMValue(27u)},
           TRow{"sint32 P = +7;", TCIMValue(7)},
           TRow{"uint64 P = 18446744073709551615;", TCIMValue(std::numeric_limits<unsigned long>::max())},
           TRow{"sint64 P = -9223372036854775808;", TCIMValue(std::numeric_limits<long>::min())},
           TRow{"real32 P = 0.1;", TCIMValue(0.1f)},
           TRow{"real64 P = -1.5E+2;", TCIMValue(-150.0)},
           TRow{"real64 P = 1e-2;", TCIMValue(0.01)},
           TRow{"real64 P = +.5;", TCIMValue(0.5)},
           TRow{"real64 P = 3;", TCIMValue(3.0)},
           TRow{"string P = \"a b\";", TCIMValue("a b")},
           TRow{"string P = \"\";", TCIMValue("")},
           TRow{"datetime P = \"20070315143000.000000+060\";", TCIMValue(TCIMDateTime("20070315143000.000000+060"))},
           TRow{"datetime P = \"00000001020304.000005:000\";", TCIMValue(TCIMDateTime("00000001020304.000005:000"))},
           TRow{"uint8 P[] = {1, 2};",
                TCIMValue(TType::kCIMTypeUint8, 0,
                          {TCIMValue(static_cast<unsigned char>(1)), TCIMValue(static_cast<unsigned char>(2))})},
           TRow{"string P[4] = {};", TCIMValue(TType::kCIMTypeString, 4, {})},
           TRow{"string P[] = {\"a\" \"b\", NULL};", TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("ab"), NullOf("string")})},
       }) {
    SCOPED_TRACE(row.fDeclaration);
    TCIMValue const value = DefaultOf(row.fDeclaration);
    EXPECT_EQ(value, row.fValue);
    EXPECT_EQ(value.GetMaxArraySize(), row.fValue.GetMaxArraySize());
  }
  for (char const* declaration : {"uint8 P = NULL;", "string P[3] = null;", "char16 P = Null;"})
    EXPECT_TRUE(DefaultOf(declaration).IsNull()) << declaration;
  EXPECT_EQ(DefaultOf("string P[3] = null;").GetMaxArraySize(), 3u);
}

TEST(MofValuesTest, AValueOfAnotherTypeIsRefused) {
  ExpectErrors({
      {"class X_A { string P = 5; };", "2:24: expected a value of the type string"},
      {"class X_A { uint8 P = \"5\"; };", "2:23: expected a value of the type uint8"},
      {"class X_A { uint8 P = true; };", "2:23: expected a value of the type uint8"},
      {"class X_A { string P = 'a'; };", "2:24: expected a value of the type string"},
      {"class X_A { boolean P = 1; };", "2:25: expected a value of the type boolean"},
      {"class X_A { datetime P = \"today\"; };",
       "2:26: expected a datetime of 25 characters, such as \"20070315143000.000000+060\""},
      {"class X_A { string P[] = \"a\"; };", "2:26: expected an array of values in braces"},
      {"class X_A { string P = {\"a\"}; };", "2:24: expected one value, not an array"},
      {"class X_A { string P = $A; };", "2:24: an alias is allowed only as the value of a reference in an instance"},
      {"class X_A { [Values(\"a\")] string P; };", "2:21: expected an array of values in braces"},
  });
}

// ---- The functions alone ----

class MofLiteralTest : public testing::Test {
protected:
  // The text of a string literal is given without quotes; that of any other literal is the token.
  TMofLiteral Literal(TMofLiteral::EKind kind, std::string const& text) {
    fFiles.push_back(std::make_unique<TMofFile>(TMofFile{"literal", text}));
    return {kind, {fFiles.back().get(), fFiles.back()->fText}, kind == TMofLiteral::kString ? text : ""};
  }
  TCIMValue Scalar(TMofLiteral::EKind kind, std::string const& text, TType type) {
    TMofLiteral const literal = Literal(kind, text);
    return ReadMofValue({literal.fSpan, false, {literal}}, type, 0, NewNamespace());
  }

  std::vector<std::unique_ptr<TMofFile>> fFiles;
};

TEST_F(MofLiteralTest, ALiteralIsReadAsItsType) {
  EXPECT_EQ(Scalar(TMofLiteral::kBoolean, "TRUE", TType::kCIMTypeBoolean), TCIMValue(true));
  EXPECT_EQ(Scalar(TMofLiteral::kBoolean, "false", TType::kCIMTypeBoolean), TCIMValue(false));
  EXPECT_EQ(Scalar(TMofLiteral::kNumber, "7", TType::kCIMTypeUint32), TCIMValue(7u));
  EXPECT_EQ(Scalar(TMofLiteral::kString, "a b", TType::kCIMTypeString), TCIMValue("a b"));
  EXPECT_EQ(Scalar(TMofLiteral::kChar, "'A'", TType::kCIMTypeChar16), TCIMValue(TCIMChar16(65)));
  EXPECT_TRUE(Scalar(TMofLiteral::kNull, "null", TType::kCIMTypeString).IsNull());
}

TEST_F(MofLiteralTest, ALiteralOfAnotherTypeIsRefused) {
  using T = TType;
  EXPECT_EQ(StatusOf([&] { Scalar(TMofLiteral::kBoolean, "true", T::kCIMTypeString); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([&] { Scalar(TMofLiteral::kString, "true", T::kCIMTypeBoolean); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([&] { Scalar(TMofLiteral::kChar, "'A'", T::kCIMTypeUint16); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([&] { Scalar(TMofLiteral::kAlias, "$A", T::kCIMTypeReference); }), kZEPStatusInvalidFormat);
  EXPECT_EQ(StatusOf([&] { Scalar(TMofLiteral::kString, "X_A.Id=1", T::kCIMTypeReference); }), kZEPStatusInvalidReference);
}

TEST_F(MofLiteralTest, AnArrayHasItsElementsAndItsMaximumSize) {
  TMofLiteral const one = Literal(TMofLiteral::kNumber, "1"), null = Literal(TMofLiteral::kNull, "NULL");
  TCIMValue const value = ReadMofValue({one.fSpan, true, {one, null}}, ArrayOf(TType::kCIMTypeUint32), 4, {});
  EXPECT_EQ(value, TCIMValue(TType::kCIMTypeUint32, 4, {TCIMValue(1u), NullOf("uint32")}));
  EXPECT_EQ(value.GetMaxArraySize(), 4u);
  TCIMValue const none = ReadMofValue({null.fSpan, false, {null}}, ArrayOf(TType::kCIMTypeUint32), 4, {});
  EXPECT_TRUE(none.IsNull());
  EXPECT_EQ(none.GetMaxArraySize(), 4u);
}

TEST(MofValuesTest, AScalarIsWrittenAsALiteral) {
  EXPECT_EQ(MofScalarText(TCIMValue(true)), "TRUE");
  EXPECT_EQ(MofScalarText(TCIMValue(static_cast<unsigned char>(7))), "7");
  EXPECT_EQ(MofScalarText(TCIMValue(-7)), "-7");
  EXPECT_EQ(MofScalarText(TCIMValue(1.5)), "1.5");
  EXPECT_EQ(MofScalarText(TCIMValue("a \"b\"")), R"("a \"b\"")");
  EXPECT_EQ(MofScalarText(TCIMValue(TCIMChar16(65))), "'A'");
  EXPECT_EQ(MofScalarText(TCIMValue(TCIMDateTime("20070315143000.000000+060"))), "\"20070315143000.000000+060\"");
  EXPECT_EQ(MofScalarText(NullOf("string")), "NULL");
}

}  // namespace
}  // namespace NQRVZEP20
