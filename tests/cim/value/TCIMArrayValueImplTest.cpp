// SPDX-License-Identifier: Apache-2.0
#include "TCIMArrayValueImpl.h"

#include "TCIMReference.h"
#include "tests/Support.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

using TImpl = TCIMArrayValueImpl;
using TType = TCIMValue::TCIMType;
using TElements = std::vector<TCIMValue>;

TCIMValue Uint8(unsigned char number) { return TCIMValue(number); }
TCIMValue NullOf(TType type) { return TCIMValue(type, 0); }
TCIMValue ArrayOf(TType type, TElements const& elements) { return TCIMValue(type, 0, elements); }

TElements& ElementsOf(TCIMValue const& value) { return value; }

TEST(TCIMArrayValueImplTest, PrintsItsElementsBetweenBraces) {
  EXPECT_EQ(TImpl(TElements{"a", "b"}).ToString(10), "{ a, b }");
  EXPECT_EQ(TImpl(TElements{TCIMValue(7)}).ToString(10), "{ 7 }");
  EXPECT_EQ(TImpl(TElements{Uint8(1), Uint8(2)}).ToString(16), "{ 01, 02 }");
  EXPECT_EQ(TImpl(TElements{Uint8(8), Uint8(9)}).ToString(8), "{ 10, 11 }");
  EXPECT_EQ(TImpl(TElements{TCIMValue(0.5), TCIMValue(1e6)}).ToString(10), "{ 0.5, 1e+06 }");
}

TEST(TCIMArrayValueImplTest, AnEmptyArrayPrintsBothBlanks) {
  EXPECT_EQ(TImpl(TElements()).ToString(10), "{  }");
  EXPECT_EQ(TImpl(TElements()).ToString(2), "{  }");  // no element refuses the radix
}

TEST(TCIMArrayValueImplTest, StringsAreNotQuoted) {
  EXPECT_EQ(TImpl(TElements{"a, b"}).ToString(10), TImpl(TElements{"a", "b"}).ToString(10));
  EXPECT_EQ(TImpl(TElements{""}).ToString(10), "{  }");
  EXPECT_EQ(TImpl(TElements{"", "b", ""}).ToString(10), "{ , b,  }");
}

TEST(TCIMArrayValueImplTest, PrintsElementsOfEveryLength) {
  std::string expected = "{ ";
  TElements elements;
  for (unsigned long number = 1, i = 0; i < 300; ++i, number = number * 3 + i) {
    elements.push_back(i % 3 == 0 ? TCIMValue(std::string(i, 'x')) : i % 3 == 1 ? TCIMValue(number) : TCIMValue(TCIMChar16(i)));
    expected += (i == 0 ? "" : ", ") + elements.back().ToString();
  }
  EXPECT_EQ(TImpl(elements).ToString(10), expected + " }");
}

TEST(TCIMArrayValueImplTest, AnArrayInAnArrayPrintsItsOwnBraces) {
  EXPECT_EQ(TImpl(TElements{ArrayOf(TType::kCIMTypeUint8, {Uint8(1)}), ArrayOf(TType::kCIMTypeUint8, {})}).ToString(10),
            "{ { 1 }, {  } }");
}

TEST(TCIMArrayValueImplTest, ElementsPrintAsTheyDoOutsideAnArray) {
  TCIMDateTime const day(std::string("00000001000000.000000:000"));
  EXPECT_EQ(TImpl(TElements{TCIMValue(day), TCIMValue(day)}).ToString(10),
            "{ 00000001000000.000000:000, 00000001000000.000000:000 }");
  EXPECT_EQ(TImpl(TElements{TCIMValue(true), TCIMValue(false)}).ToString(16), "{ true, false }");
  EXPECT_EQ(TImpl(TElements{TCIMValue(true)}).ToString(8), "{ true }");
  TCIMValue const most(~0ul);
  EXPECT_EQ(TImpl(TElements{most, most}).ToString(8), "{ 1777777777777777777777, 1777777777777777777777 }");
  EXPECT_EQ(TImpl(TElements{most, most}).ToString(16), "{ FFFFFFFFFFFFFFFF, FFFFFFFFFFFFFFFF }");
}

TEST(TCIMArrayValueImplTest, PrintingThrowsWhatPrintingAnElementThrows) {
  EXPECT_STATUS(TImpl(TElements{Uint8(1), NullOf(TType::kCIMTypeUint8)}).ToString(10), kZEPStatusValueIsNULL);
  EXPECT_STATUS(TImpl(TElements{TCIMValue(0.5), TCIMValue(1.5)}).ToString(8), kZEPStatusNotSupported);
  EXPECT_STATUS(TImpl(TElements{TCIMValue(true)}).ToString(7), kZEPStatusNotSupported);
  EXPECT_STATUS(TImpl(TElements{TCIMValue("a"), NullOf(TType::kCIMTypeString)}).ToString(10), kZEPStatusValueIsNULL);
  EXPECT_STATUS(TImpl(TElements{TCIMValue(1), TCIMValue(2)}).ToString(16), kZEPStatusNotSupported);
  EXPECT_STATUS(TImpl(TElements{Uint8(1)}).ToString(2), kZEPStatusNotSupported);
  EXPECT_STATUS(TImpl(TElements{TCIMValue(TCIMChar16(std::string("a")))}).ToString(10), kZEPStatusInvalidDateTime);
}

TEST(TCIMArrayValueImplTest, ElementsOfAConstantArrayCanBeEditedInPlace) {
  TImpl const data(TElements{Uint8(1)});
  TElements& elements = data;
  elements[0] = TCIMValue("text of any type");
  elements.push_back(TCIMValue(2));
  EXPECT_EQ(data.ToString(10), "{ text of any type, 2 }");
}

TEST(TCIMArrayValueImplTest, CopiesShareNothing) {
  TElements elements{Uint8(1), Uint8(2)};
  TImpl const first(elements);
  elements[0] = Uint8(9);
  TImpl const second(first);
  first.operator TElements&()[1] = Uint8(8);
  EXPECT_EQ(first.ToString(10), "{ 1, 8 }");
  EXPECT_EQ(second.ToString(10), "{ 1, 2 }");
}

TEST(TCIMArrayValueImplTest, RefusesEveryScalarConversion) {
  TImpl const data(TElements{TCIMValue(true)});
  EXPECT_STATUS(data.operator bool(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned char(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator signed char(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned short(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator short(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned int(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator int(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator unsigned long(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator long(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator float(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator double(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator std::string(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMChar16(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMDateTime(), kZEPStatusTypeMismatch);
  EXPECT_STATUS(data.operator TCIMReference(), kZEPStatusTypeMismatch);
}

struct TEqualityRow {
  char const* fWhat;
  TElements fMine;
  TCIMValue fOther;
  bool fEqual;
};

TEST(TCIMArrayValueImplTest, ArraysWithEqualElementsInOrderAreEqual) {
  TEqualityRow const rows[] = {
      {"the same", {Uint8(1), Uint8(2)}, ArrayOf(TType::kCIMTypeUint8, {Uint8(1), Uint8(2)}), true},
      {"another order", {Uint8(1), Uint8(2)}, ArrayOf(TType::kCIMTypeUint8, {Uint8(2), Uint8(1)}), false},
      {"fewer elements", {Uint8(1), Uint8(2)}, ArrayOf(TType::kCIMTypeUint8, {Uint8(1)}), false},
      {"more elements", {Uint8(1)}, ArrayOf(TType::kCIMTypeUint8, {Uint8(1), Uint8(2)}), false},
      {"empty and not", {}, ArrayOf(TType::kCIMTypeUint8, {Uint8(1)}), false},
      {"both empty", {}, ArrayOf(TType::kCIMTypeUint8, {}), true},
      {"both empty, whatever their types", {}, ArrayOf(TType::kCIMTypeString, {}), true},
      {"elements of different types", {TCIMValue(1)}, ArrayOf(TType::kCIMTypeUint32, {TCIMValue(1u)}), false},
      {"NULL elements of one type",
       {NullOf(TType::kCIMTypeUint8)},
       ArrayOf(TType::kCIMTypeUint8, {NullOf(TType::kCIMTypeUint8)}),
       true},
      {"NULL elements of different types",
       {NullOf(TType::kCIMTypeSint8)},
       ArrayOf(TType::kCIMTypeUint8, {NullOf(TType::kCIMTypeUint8)}),
       false},
      {"a NULL and a held element", {NullOf(TType::kCIMTypeUint8)}, ArrayOf(TType::kCIMTypeUint8, {Uint8(0)}), false},
      {"a scalar", {Uint8(1)}, Uint8(1), false},
      {"a NULL scalar", {}, TCIMValue(), false},
  };
  for (auto const& row : rows) EXPECT_EQ(TImpl(row.fMine) == row.fOther, row.fEqual) << row.fWhat;
}

TEST(TCIMArrayValueImplTest, ComparingWithANullArrayThrowsValueIsNull) {
  EXPECT_STATUS((void)(TImpl(TElements{Uint8(1)}) == TCIMValue(TType::kCIMTypeUint8, 4)), kZEPStatusValueIsNULL);
}

TEST(TCIMArrayValueImplTest, OrderIsNotImplemented) {
  TImpl const data(TElements{Uint8(1)});
  for (TCIMValue const& other :
       {ArrayOf(TType::kCIMTypeUint8, {Uint8(2)}), ArrayOf(TType::kCIMTypeString, {}), Uint8(1), TCIMValue()})
    EXPECT_STATUS((void)(data < other), kZEPStatusNotImplemented);
}

// ---- Through TCIMValue ----

TEST(TCIMArrayValueImplTest, ArrayLessThanThrows) {
  TCIMValue const one = ArrayOf(TType::kCIMTypeUint8, {Uint8(1)}), two = ArrayOf(TType::kCIMTypeUint8, {Uint8(2)});
  EXPECT_STATUS((void)(one < two), kZEPStatusNotImplemented);
  EXPECT_STATUS((void)(one >= two), kZEPStatusNotImplemented);
  EXPECT_STATUS((void)(one > two), kZEPStatusNotImplemented);
  EXPECT_STATUS((void)(one <= two), kZEPStatusNotImplemented);
  EXPECT_TRUE(one <= TCIMValue(one));  // == is evaluated first
  EXPECT_FALSE(one > TCIMValue(one));
  EXPECT_TRUE(one < ArrayOf(TType::kCIMTypeSint8, {}));  // decided by the tag
}

TEST(TCIMArrayValueImplTest, SortingArraysThrows) {
  TElements arrays{ArrayOf(TType::kCIMTypeUint8, {Uint8(2)}), ArrayOf(TType::kCIMTypeUint8, {Uint8(1)})};
  EXPECT_STATUS(std::sort(arrays.begin(), arrays.end()), kZEPStatusNotImplemented);
}

TEST(TCIMArrayValueImplTest, EditingTheVectorChangesTheTextOfTheValue) {
  TCIMValue const value(TType::kCIMTypeString, 1, {TCIMValue("a")});
  ElementsOf(value).push_back(TCIMValue("b"));
  EXPECT_EQ(value.ToString(), "{ a, b }");
  EXPECT_EQ(value.GetMaxArraySize(), 1u);  // not checked against the number of elements
}

}  // namespace
}  // namespace NQRVZEP20
