// SPDX-License-Identifier: Apache-2.0
#include "TCIMValue.h"

#include "TCIMReference.h"
#include "tests/Support.h"
#include "tests/cim/model/Fakes.h"

#include <algorithm>
#include <functional>
#include <limits>
#include <random>

namespace NQRVZEP20 {
namespace {

using TType = TCIMValue::TCIMType;
using TElements = std::vector<TCIMValue>;

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

TElements& ElementsOf(TCIMValue const& value) { return value; }

TType ArrayOf(TType type) { return TType::ECIMType(type + TType::kCIMTypeArrayFlag); }

boost::shared_ptr<ICIMClass> NewClass() {
  return boost::make_shared<TFakeClass>(boost::shared_ptr<ICIMNamespace>(), "QRVSG_Any");
}

TCIMValue NullOf(TType type, boost::shared_ptr<ICIMClass> referencedClass = nullptr) {
  TCIMValue value(type, 0);
  value.SetReferencedClass(referencedClass);
  return value;
}

TCIMValue ReferenceTo(boost::shared_ptr<ICIMClass> cls) {
  TCIMReference reference(nullptr, TCIMContext());
  reference.SetClass(cls);
  return TCIMValue(reference);
}

// The complete state of a value, to compare it before and after an operation.
struct TState {
  explicit TState(TCIMValue const& value)
      : fType(value.GetType()),
        fIsNull(value.IsNull()),
        fText(value.IsNull() ? "" : value.ToString()),
        fClass(value.GetReferencedClass()),
        fMaxArraySize(value.GetMaxArraySize()) {}
  bool operator==(TState const& other) const {
    return fType == other.fType && fIsNull == other.fIsNull && fText == other.fText && fClass == other.fClass &&
           fMaxArraySize == other.fMaxArraySize;
  }

  int fType;
  bool fIsNull;
  std::string fText;
  boost::shared_ptr<ICIMClass> fClass;
  unsigned int fMaxArraySize;
};

std::ostream& operator<<(std::ostream& stream, TState const& state) {
  return stream << "tag " << state.fType << (state.fIsNull ? ", NULL" : ", " + state.fText) << ", class " << state.fClass.get()
                << ", size " << state.fMaxArraySize;
}

// ---- Construction and queries ----

TEST(TCIMValueTest, ADefaultValueIsNullWithTagZero) {
  TCIMValue const value;
  EXPECT_TRUE(value.IsNull());
  EXPECT_EQ(value.GetType(), TType::kCIMTypeInvalid);
  EXPECT_FALSE(value.IsArray());
  EXPECT_FALSE(value.IsReference());
  EXPECT_EQ(value.GetMaxArraySize(), 0u);
  EXPECT_FALSE(value.GetReferencedClass());
  EXPECT_STATUS(value.ToString(), kZEPStatusValueIsNULL);
  EXPECT_STATUS(value.GetType().ToString(), kZEPStatusTypeMismatch);
}

TEST(TCIMValueTest, ATypeAndASizeMakeANullArray) {
  TCIMValue const value(TType::kCIMTypeString, 4);
  EXPECT_TRUE(value.IsNull());
  EXPECT_TRUE(value.IsArray());
  EXPECT_EQ(value.GetType(), 29);
  EXPECT_EQ(value.GetMaxArraySize(), 4u);
  EXPECT_EQ(value.GetType().ToString(), "string");
}

TEST(TCIMValueTest, ATypeWithoutASizeIsNotChanged) {
  TCIMValue const scalar(TType::kCIMTypeUint32, 0);
  EXPECT_TRUE(scalar.IsNull());
  EXPECT_FALSE(scalar.IsArray());
  EXPECT_EQ(scalar.GetType(), TType::kCIMTypeUint32);

  TCIMValue const unbounded(ArrayOf(TType::kCIMTypeUint32), 0);
  EXPECT_TRUE(unbounded.IsArray());
  EXPECT_EQ(unbounded.GetType(), 22);
  EXPECT_EQ(unbounded.GetMaxArraySize(), 0u);

  EXPECT_EQ(TCIMValue(ArrayOf(TType::kCIMTypeUint32), 3).GetType(), 22);
}

TEST(TCIMValueTest, OnlyTagFifteenIsAReference) {
  EXPECT_TRUE(NullOf(TType::kCIMTypeReference).IsReference());
  EXPECT_FALSE(NullOf(ArrayOf(TType::kCIMTypeReference)).IsReference());
  EXPECT_TRUE(NullOf(ArrayOf(TType::kCIMTypeReference)).IsArray());
  EXPECT_FALSE(NullOf(TType::kCIMTypeString).IsReference());
}

TEST(TCIMValueTest, SetNullValueSetsTheSizeOfAnArrayOnly) {
  TCIMValue value(TType::kCIMTypeString, 4);
  value.SetNullValue(TType::kCIMTypeUint8, 7);
  EXPECT_EQ(value.GetType(), TType::kCIMTypeUint8);
  EXPECT_EQ(value.GetMaxArraySize(), 4u);

  value.SetNullValue(ArrayOf(TType::kCIMTypeUint8), 7);
  EXPECT_EQ(value.GetType(), 18);
  EXPECT_EQ(value.GetMaxArraySize(), 7u);

  value.SetNullValue(ArrayOf(TType::kCIMTypeUint8), 0);
  EXPECT_EQ(value.GetMaxArraySize(), 0u);
}

TEST(TCIMValueTest, SetNullValueDropsTheDataAndKeepsTheReferencedClass) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TCIMValue value = ReferenceTo(cls);
  value.SetNullValue(TType::kCIMTypeString, 0);
  EXPECT_TRUE(value.IsNull());
  EXPECT_EQ(value.GetReferencedClass(), cls);
}

// ---- Each kind of value: its tag, its text, and what it converts to ----

struct TKindRow {
  char const* fName;
  int fTag;
  TCIMValue fValue;
  std::function<void(TCIMValue&)> fSet;  // the setter with the same argument
  char const* fText;
};

std::vector<TKindRow> Kinds() {
  static TCIMReference reference = ReferenceTo(NewClass());
  static TCIMDateTime const dateTime(std::string("20070315143000.000000+060"));
  static std::string const text = "text";
  return {
      {"bool", 1, TCIMValue(true), [](TCIMValue& v) { v.Set(true); }, "true"},
      {"unsigned char", 2, TCIMValue((unsigned char)200), [](TCIMValue& v) { v.Set((unsigned char)200); }, "200"},
      {"signed char", 3, TCIMValue((signed char)-100), [](TCIMValue& v) { v.Set((signed char)-100); }, "-100"},
      {"unsigned short", 4, TCIMValue((unsigned short)65000), [](TCIMValue& v) { v.Set((unsigned short)65000); }, "65000"},
      {"short", 5, TCIMValue((short)-30000), [](TCIMValue& v) { v.Set((short)-30000); }, "-30000"},
      {"unsigned int", 6, TCIMValue(4000000000u), [](TCIMValue& v) { v.Set(4000000000u); }, "4000000000"},
      {"int", 7, TCIMValue(-2000000000), [](TCIMValue& v) { v.Set(-2000000000); }, "-2000000000"},
      {"unsigned long", 8, TCIMValue(10000000000ul), [](TCIMValue& v) { v.Set(10000000000ul); }, "10000000000"},
      {"long", 9, TCIMValue(-10000000000l), [](TCIMValue& v) { v.Set(-10000000000l); }, "-10000000000"},
      {"float", 10, TCIMValue(1.5f), [](TCIMValue& v) { v.Set(1.5f); }, "1.5"},
      {"double", 11, TCIMValue(2.5), [](TCIMValue& v) { v.Set(2.5); }, "2.5"},
      {"TCIMChar16", 12, TCIMValue(TCIMChar16(65)), [](TCIMValue& v) { v.Set(TCIMChar16(65)); }, "65"},
      {"char const*", 13, TCIMValue("text"), [](TCIMValue& v) { v.Set("text"); }, "text"},
      {"std::string", 13, TCIMValue(text), [](TCIMValue& v) { v.Set(text); }, "text"},
      {"TCIMDateTime", 14, TCIMValue(dateTime), [](TCIMValue& v) { v.Set(dateTime); }, "20070315143000.000000+060"},
      {"TCIMReference", 15, TCIMValue(reference), [](TCIMValue& v) { v.Set(reference); }, "QRVSG_Any"},
      {"array", 18, TCIMValue(TType::kCIMTypeUint8, 5, {TCIMValue((unsigned char)1)}),
       [](TCIMValue& v) { v.Set(TType::kCIMTypeUint8, 5, {TCIMValue((unsigned char)1)}); }, "{ 1 }"},
  };
}

struct TConversionRow {
  char const* fName;
  int fTag;
  std::function<bool(TCIMValue const&)> fConvert;  // whether the result is that of the row in Kinds
};

std::vector<TConversionRow> Conversions() {
  return {
      {"bool", 1, [](TCIMValue const& v) { return v.operator bool(); }},
      {"unsigned char", 2, [](TCIMValue const& v) { return v.operator unsigned char() == 200; }},
      {"signed char", 3, [](TCIMValue const& v) { return v.operator signed char() == -100; }},
      {"unsigned short", 4, [](TCIMValue const& v) { return v.operator unsigned short() == 65000; }},
      {"short", 5, [](TCIMValue const& v) { return v.operator short() == -30000; }},
      {"unsigned int", 6, [](TCIMValue const& v) { return v.operator unsigned int() == 4000000000u; }},
      {"int", 7, [](TCIMValue const& v) { return v.operator int() == -2000000000; }},
      {"unsigned long", 8, [](TCIMValue const& v) { return v.operator unsigned long() == 10000000000ul; }},
      {"long", 9, [](TCIMValue const& v) { return v.operator long() == -10000000000l; }},
      {"float", 10, [](TCIMValue const& v) { return v.operator float() == 1.5f; }},
      {"double", 11, [](TCIMValue const& v) { return v.operator double() == 2.5; }},
      {"std::string", 13, [](TCIMValue const& v) { return v.operator std::string() == "text"; }},
      {"TCIMDateTime", 14,
       [](TCIMValue const& v) { return v.operator TCIMDateTime().ToString() == "20070315143000.000000+060"; }},
      {"TCIMReference", 15, [](TCIMValue const& v) { return v.operator TCIMReference().GetPath() == "QRVSG_Any"; }},
      {"vector", 18, [](TCIMValue const& v) { return v.operator TElements&().size() == 1; }},
  };
}

TEST(TCIMValueTest, EachConstructorSetsItsTagAndItsData) {
  for (auto const& row : Kinds()) {
    EXPECT_EQ(row.fValue.GetType(), row.fTag) << row.fName;
    EXPECT_FALSE(row.fValue.IsNull()) << row.fName;
    EXPECT_EQ(row.fValue.ToString(), row.fText) << row.fName;
    EXPECT_EQ(row.fValue.IsArray(), row.fTag == 18) << row.fName;
    EXPECT_EQ(row.fValue.IsReference(), row.fTag == 15) << row.fName;
  }
}

TEST(TCIMValueTest, EachSetterReplacesTagAndDataOfAnyOtherKind) {
  for (auto const& from : Kinds())
    for (auto const& to : Kinds()) {
      TCIMValue value(from.fValue);
      to.fSet(value);
      EXPECT_EQ(value.GetType(), to.fTag) << from.fName << " to " << to.fName;
      EXPECT_EQ(value.ToString(), to.fText) << from.fName << " to " << to.fName;
    }
}

TEST(TCIMValueTest, ScalarSettersKeepReferencedClassAndSize) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  for (auto const& row : Kinds()) {
    if (row.fTag == 15 || row.fTag == 18) continue;
    TCIMValue value(TType::kCIMTypeString, 4);
    value.SetReferencedClass(cls);
    row.fSet(value);
    EXPECT_EQ(value.GetReferencedClass(), cls) << row.fName;
    EXPECT_EQ(value.GetMaxArraySize(), 4u) << row.fName;
  }
}

TEST(TCIMValueTest, SettingAReferenceSetsTheReferencedClass) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TCIMReference reference(nullptr, TCIMContext());
  reference.SetClass(cls);
  TCIMValue value(TType::kCIMTypeString, 4);
  value.SetReferencedClass(NewClass());
  value.Set(reference);
  EXPECT_EQ(value.GetReferencedClass(), cls);
  EXPECT_EQ(value.GetMaxArraySize(), 4u);
}

TEST(TCIMValueTest, SettersCopyTheirArgument) {
  std::string text = "before";
  TCIMChar16 character(65);
  TCIMValue const value(text), charValue(character);
  text = "after";
  character = TCIMChar16(66);
  EXPECT_EQ(value.ToString(), "before");
  EXPECT_EQ(charValue.ToString(), "65");
}

TEST(TCIMValueTest, ConversionsAreStrict) {
  for (auto const& row : Kinds())
    for (auto const& conversion : Conversions()) {
      SCOPED_TRACE(std::string(row.fName) + " read as " + conversion.fName);
      if (row.fTag == conversion.fTag)
        EXPECT_TRUE(conversion.fConvert(row.fValue));
      else
        EXPECT_STATUS(conversion.fConvert(row.fValue), kZEPStatusTypeMismatch);
    }
}

TEST(TCIMValueTest, ConvertingANullValueOfAnyTagThrows) {
  for (auto const& row : Kinds())
    for (auto const& conversion : Conversions()) {
      SCOPED_TRACE(std::string("NULL ") + row.fName + " read as " + conversion.fName);
      EXPECT_STATUS(conversion.fConvert(NullOf(row.fValue.GetType())), kZEPStatusValueIsNULL);
    }
}

TEST(TCIMValueTest, AnArrayDoesNotConvertToItsElementType) {
  TCIMValue const array(TType::kCIMTypeUint8, 0, {TCIMValue((unsigned char)1)});
  EXPECT_STATUS(array.operator unsigned char(), kZEPStatusTypeMismatch);
  TCIMValue const references(TType::kCIMTypeReference, 0, TElements());
  EXPECT_STATUS(references.operator TCIMReference(), kZEPStatusTypeMismatch);
}

TEST(TCIMValueTest, AnIntDoesNotConvertToALong) {
  TCIMValue const value(5);
  int const asInt = value;
  EXPECT_EQ(asInt, 5);
  EXPECT_STATUS([[maybe_unused]] long const asLong = value, kZEPStatusTypeMismatch);
}

TEST(TCIMValueTest, ToStringPassesTheRadixOn) {
  EXPECT_EQ(TCIMValue(255u).ToString(16), "000000FF");
  EXPECT_EQ(TCIMValue(8u).ToString(8), "10");
  EXPECT_EQ(TCIMValue(8u).ToString(10), "8");
  EXPECT_STATUS(TCIMValue(8u).ToString(2), kZEPStatusNotSupported);
  EXPECT_EQ(TCIMValue("a").ToString(2), "a");
  for (auto const& row : Kinds()) EXPECT_STATUS(NullOf(row.fValue.GetType()).ToString(), kZEPStatusValueIsNULL);
}

TEST(TCIMValueTest, OnlyANullValueAcceptsAReferencedClass) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TCIMValue null;
  null.SetReferencedClass(cls);
  EXPECT_EQ(null.GetReferencedClass(), cls);

  for (auto const& row : Kinds()) {
    TCIMValue value(row.fValue);
    TState const before(value);
    EXPECT_STATUS(value.SetReferencedClass(cls), kZEPStatusInvalidOpSequence);
    EXPECT_EQ(TState(value), before) << row.fName;
  }
}

// ---- Arrays ----

TEST(TCIMValueTest, AnArrayHoldsACopyOfItsElements) {
  TElements elements{TCIMValue("a"), TCIMValue("b")};
  TCIMValue const value(TType::kCIMTypeString, 1, elements);
  elements[0] = TCIMValue("z");
  EXPECT_EQ(value.ToString(), "{ a, b }");
  EXPECT_EQ(value.GetType(), 29);
  EXPECT_EQ(value.GetMaxArraySize(), 1u);  // never compared with the number of elements
}

TEST(TCIMValueTest, AnArrayTypeMayAlreadyHaveTheArrayFlag) {
  TCIMValue const value(ArrayOf(TType::kCIMTypeString), 0, {TCIMValue("a")});
  EXPECT_EQ(value.GetType(), 29);
  EXPECT_EQ(value.ToString(), "{ a }");
}

TEST(TCIMValueTest, AnArrayMayHoldNullElementsOfItsType) {
  TCIMValue const value(TType::kCIMTypeString, 0, {NullOf(TType::kCIMTypeString)});
  EXPECT_TRUE(ElementsOf(value)[0].IsNull());
}

TEST(TCIMValueTest, SettingAnArrayReplacesTheSizeAndKeepsTheReferencedClass) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TCIMValue value(TType::kCIMTypeString, 4);
  value.SetReferencedClass(cls);
  value.Set(TType::kCIMTypeUint8, 0, TElements());
  EXPECT_EQ(value.GetMaxArraySize(), 0u);
  EXPECT_EQ(value.GetReferencedClass(), cls);
}

std::string ErrorLogged() {
  auto const& log = TRootObject::GetCoreLogger()->GetLog();
  if (log.size() != 1) return std::to_string(log.size()) + " entries";
  return log.front().fSeverity == ILogger::kLogError ? log.front().fMessage : "not an error: " + log.front().fMessage;
}

struct TWrongElementRow {
  TType fType;
  TElements fElements;
  char const* fMessage;
};

TEST(TCIMValueTest, AnElementOfAnotherTypeIsLoggedAndRefused) {
  TWrongElementRow const rows[] = {
      {TType::kCIMTypeUint8,
       {TCIMValue((unsigned char)1), TCIMValue("a"), TCIMValue(true)},
       "Core: ERROR: Attempting to create array of type uint8, but element is of type string."},
      {TType::kCIMTypeUint32,
       {TCIMValue(1)},
       "Core: ERROR: Attempting to create array of type uint32, but element is of type sint32."},
      {ArrayOf(TType::kCIMTypeString),
       {NullOf(TType::kCIMTypeDateTime)},
       "Core: ERROR: Attempting to create array of type string, but element is of type datetime."},
      {TType::kCIMTypeString,
       {TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("a")})},
       "Core: ERROR: Attempting to create array of type string, but element is of type string."},
  };
  OnNewThread([&] {
    for (auto const& row : rows) {
      SCOPED_TRACE(row.fMessage);
      TRootObject::GetCoreLogger()->ClearLog();
      EXPECT_STATUS(TCIMValue(row.fType, 0, row.fElements), kZEPStatusInvalidProperty);
      EXPECT_EQ(ErrorLogged(), row.fMessage);
    }
    TRootObject::GetCoreLogger()->ClearLog();
  });
}

TEST(TCIMValueTest, ReasonForAWrongElementTravelsWithTheFailure) {
  EXPECT_EQ(ReasonOf([] { TCIMValue(TType::kCIMTypeUint8, 0, {TCIMValue("a")}); }),
            "Attempting to create array of type uint8, but element is of type string.");
}

TEST(TCIMValueTest, TheWrongElementIsWrittenToTheLogAsAnError) {
  OnNewThread([] {
    TLogCapture const log;
    EXPECT_STATUS(TCIMValue(TType::kCIMTypeUint8, 0, {TCIMValue("a")}), kZEPStatusInvalidProperty);
    EXPECT_EQ(log.Entries(), std::vector<std::string>{"[Error] Core: ERROR: Attempting to create array of type uint8, but "
                                                      "element is of type string."});
  });
  TRootObject::GetCoreLogger()->ClearLog();
}

TEST(TCIMValueTest, AWrongElementWithoutATypeNameThrowsTypeMismatchUnlogged) {
  TRootObject::GetCoreLogger()->ClearLog();
  EXPECT_STATUS(TCIMValue(TType::kCIMTypeUint8, 0, {TCIMValue()}), kZEPStatusTypeMismatch);
  EXPECT_STATUS(TCIMValue(TType::kCIMTypeInvalid, 0, {TCIMValue("a")}), kZEPStatusTypeMismatch);
  EXPECT_TRUE(LoggedMessages().empty());

  // The tags are equal, so no type name is needed.
  EXPECT_EQ(TCIMValue(TType::kCIMTypeInvalid, 0, {TCIMValue()}).GetType(), TType::kCIMTypeArrayFlag);
}

TEST(TCIMValueTest, TheElementCheckComesAfterTheAssignment) {
  TCIMValue value("before");
  EXPECT_STATUS(value.Set(TType::kCIMTypeUint8, 7, {TCIMValue((unsigned char)1), TCIMValue("a")}), kZEPStatusInvalidProperty);
  EXPECT_EQ(value.GetType(), 18);
  EXPECT_EQ(value.GetMaxArraySize(), 7u);
  EXPECT_EQ(value.ToString(), "{ 1, a }");

  EXPECT_STATUS(value.Set(TType::kCIMTypeString, 8, {TCIMValue()}), kZEPStatusTypeMismatch);
  EXPECT_EQ(value.GetType(), 29);
  EXPECT_EQ(value.GetMaxArraySize(), 8u);
  EXPECT_EQ(ElementsOf(value).size(), 1u);
  TRootObject::GetCoreLogger()->ClearLog();
}

TEST(TCIMValueTest, AConstructionThatThrowsLeaksNothing) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TElements const elements{ReferenceTo(cls), NullOf(TType::kCIMTypeReference, cls), TCIMValue("a")};
  long const owners = cls.use_count();
  EXPECT_STATUS(TCIMValue(TType::kCIMTypeReference, 0, elements), kZEPStatusInvalidProperty);
  EXPECT_EQ(cls.use_count(), owners);
  TRootObject::GetCoreLogger()->ClearLog();
}

// ---- Equality and order ----

struct TCompareRow {
  char const* fWhat;
  TCIMValue fA, fB;
  bool fEqual, fLess;
};

TEST(TCIMValueTest, ComparesByNullThenTagThenData) {
  boost::shared_ptr<ICIMClass> const cls = NewClass(), other = NewClass();
  TCompareRow const rows[] = {
      {"default values", TCIMValue(), TCIMValue(), true, false},
      {"NULLs of one type", NullOf(TType::kCIMTypeUint32), NullOf(TType::kCIMTypeUint32), true, false},
      {"NULLs of two types", NullOf(TType::kCIMTypeUint32), NullOf(TType::kCIMTypeSint32), false, false},
      {"a NULL first", NullOf(TType::kCIMTypeReference), TCIMValue(false), false, true},
      {"a NULL of the same type first", NullOf(TType::kCIMTypeUint32), TCIMValue(0u), false, true},
      {"a NULL last", TCIMValue(0u), NullOf(TType::kCIMTypeUint32), false, false},
      {"a NULL array and a held one", TCIMValue(TType::kCIMTypeUint8, 4), TCIMValue(TType::kCIMTypeUint8, 4, TElements()), false,
       true},
      {"NULL references without class", NullOf(TType::kCIMTypeReference), NullOf(TType::kCIMTypeReference), true, false},
      {"NULL references to one class", NullOf(TType::kCIMTypeReference, cls), NullOf(TType::kCIMTypeReference, cls), true, false},
      {"NULL references to two classes", NullOf(TType::kCIMTypeReference, cls), NullOf(TType::kCIMTypeReference, other), false,
       false},
      {"NULL references, one without class", NullOf(TType::kCIMTypeReference, cls), NullOf(TType::kCIMTypeReference), false,
       false},
      {"NULL strings with two classes", NullOf(TType::kCIMTypeString, cls), NullOf(TType::kCIMTypeString, other), true, false},
      {"NULL arrays of one size", TCIMValue(TType::kCIMTypeUint8, 4), TCIMValue(TType::kCIMTypeUint8, 4), true, false},
      {"NULL arrays of two sizes", TCIMValue(TType::kCIMTypeUint8, 4), TCIMValue(TType::kCIMTypeUint8, 5), false, false},
      {"NULL arrays of references, by size alone", NullOf(ArrayOf(TType::kCIMTypeReference), cls),
       NullOf(ArrayOf(TType::kCIMTypeReference), other), true, false},
      {"arrays of two sizes", TCIMValue(TType::kCIMTypeUint8, 4, TElements()), TCIMValue(TType::kCIMTypeUint8, 5, TElements()),
       true, false},
      {"equal data", TCIMValue(5u), TCIMValue(5u), true, false},
      {"less data", TCIMValue("a"), TCIMValue("b"), false, true},
      {"greater data", TCIMValue("b"), TCIMValue("a"), false, false},
      {"boolean before uint8", TCIMValue(true), TCIMValue((unsigned char)0), false, true},
      {"real64 before string", TCIMValue(1e300), TCIMValue(""), false, true},
      {"scalars before arrays", TCIMValue("z"), TCIMValue(TType::kCIMTypeBoolean, 0, TElements()), false, true},
      {"arrays of two types by tag", TCIMValue(TType::kCIMTypeUint8, 0, TElements()),
       TCIMValue(TType::kCIMTypeString, 0, TElements()), false, true},
      {"arrays of two types the other way", TCIMValue(TType::kCIMTypeString, 0, TElements()),
       TCIMValue(TType::kCIMTypeUint8, 0, TElements()), false, false},
  };
  for (auto const& row : rows) {
    EXPECT_EQ(row.fA == row.fB, row.fEqual) << row.fWhat;
    EXPECT_EQ(row.fB == row.fA, row.fEqual) << row.fWhat;
    EXPECT_EQ(row.fA != row.fB, !row.fEqual) << row.fWhat;
    if (row.fEqual && row.fA.IsArray() && !row.fA.IsNull()) continue;  // arrays have no order
    EXPECT_EQ(row.fA < row.fB, row.fLess) << row.fWhat;
    EXPECT_EQ(row.fA >= row.fB, !row.fLess) << row.fWhat;
    EXPECT_EQ(row.fA <= row.fB, row.fEqual || row.fLess) << row.fWhat;
    EXPECT_EQ(row.fA > row.fB, !row.fEqual && !row.fLess) << row.fWhat;
  }
}

TEST(TCIMValueTest, EveryKindSortsByItsTag) {
  auto const kinds = Kinds();
  for (auto const& a : kinds)
    for (auto const& b : kinds) {
      if (a.fTag == b.fTag) continue;
      EXPECT_EQ(a.fValue < b.fValue, a.fTag < b.fTag) << a.fName << " and " << b.fName;
      EXPECT_FALSE(a.fValue == b.fValue) << a.fName << " and " << b.fName;
    }
}

// The other comparisons are derived from == and <, which are both false for a NaN.
TEST(TCIMValueTest, ANaNComparesAsGreater) {
  TCIMValue const nan(kNaN), one(1.0);
  EXPECT_FALSE(nan == nan);
  EXPECT_TRUE(nan != nan);
  EXPECT_FALSE(nan < one);
  EXPECT_TRUE(nan >= one);
  EXPECT_FALSE(nan <= one);
  EXPECT_TRUE(nan > one);
}

// ---- Copying and assignment ----

enum class EWay { kConstruct, kSet, kAssign, kMoveConstruct, kMoveAssign };
constexpr std::pair<EWay, char const*> kWays[] = {{EWay::kConstruct, "copy construction"},
                                                  {EWay::kSet, "Set"},
                                                  {EWay::kAssign, "assignment"},
                                                  {EWay::kMoveConstruct, "move construction"},
                                                  {EWay::kMoveAssign, "move assignment"}};

void Transfer(EWay way, TCIMValue& to, TCIMValue source) {
  switch (way) {
    case EWay::kSet:
      return to.Set(source);
    case EWay::kAssign:
      to = source;
      return;
    case EWay::kMoveAssign:
      to = std::move(source);
      return;
    default:
      FAIL() << "not an assignment";
  }
}

TCIMValue Transferred(EWay way, TCIMValue source) {
  if (way == EWay::kConstruct) return TCIMValue(static_cast<TCIMValue const&>(source));
  if (way == EWay::kMoveConstruct) return TCIMValue(std::move(source));
  TCIMValue to;
  Transfer(way, to, source);
  return to;
}

TEST(TCIMValueTest, EveryKindIsCopiedAndMoved) {
  for (auto const& [way, name] : kWays)
    for (auto const& row : Kinds()) {
      SCOPED_TRACE(std::string(row.fName) + " by " + name);
      EXPECT_EQ(TState(Transferred(way, row.fValue)), TState(row.fValue));
    }
}

TEST(TCIMValueTest, CopiesShareNothingButTheReferencedClass) {
  TCIMValue const array(TType::kCIMTypeString, 0, {TCIMValue("a")});
  TCIMValue const copy(array);
  ElementsOf(copy)[0] = TCIMValue("b");
  EXPECT_EQ(array.ToString(), "{ a }");

  TCIMValue const reference = ReferenceTo(NewClass());
  EXPECT_EQ(TCIMValue(reference).GetReferencedClass(), reference.GetReferencedClass());
}

TEST(TCIMValueTest, CopyingANullOfTagZeroMakesTheDestinationNullWithoutAThrow) {
  for (auto const& [way, name] : kWays) {
    SCOPED_TRACE(name);
    EXPECT_EQ(TState(Transferred(way, TCIMValue())), TState(TCIMValue()));
    if (way == EWay::kConstruct || way == EWay::kMoveConstruct) continue;
    for (auto const& row : Kinds()) {
      TCIMValue value(row.fValue);
      Transfer(way, value, TCIMValue());
      EXPECT_TRUE(value.IsNull()) << row.fName;
      EXPECT_EQ(value.GetType(), TType::kCIMTypeInvalid) << row.fName;
    }
  }
}

TEST(TCIMValueTest, ANullIsCopiedWithItsTag) {
  for (auto const& [way, name] : kWays)
    for (int tag = 0; tag < 32; ++tag) {
      SCOPED_TRACE(std::string(name) + ", tag " + std::to_string(tag));
      EXPECT_EQ(TState(Transferred(way, NullOf(TType::ECIMType(tag)))), TState(NullOf(TType::ECIMType(tag))));
    }
}

TEST(TCIMValueTest, OnlyAReferenceTakesOverTheReferencedClass) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  for (auto const& [way, name] : kWays) {
    SCOPED_TRACE(name);
    EXPECT_EQ(Transferred(way, NullOf(TType::kCIMTypeReference, cls)).GetReferencedClass(), cls);
    EXPECT_FALSE(Transferred(way, NullOf(TType::kCIMTypeString, cls)).GetReferencedClass());
    EXPECT_FALSE(Transferred(way, NullOf(ArrayOf(TType::kCIMTypeReference), cls)).GetReferencedClass());
    if (way == EWay::kConstruct || way == EWay::kMoveConstruct) continue;

    TCIMValue value = NullOf(TType::kCIMTypeUint8, cls);
    Transfer(way, value, TCIMValue("a"));
    EXPECT_EQ(value.GetReferencedClass(), cls);  // the old one stays
    Transfer(way, value, NullOf(TType::kCIMTypeReference));
    EXPECT_FALSE(value.GetReferencedClass());
  }
}

TEST(TCIMValueTest, OnlyAnArrayTakesOverTheMaximumSize) {
  for (auto const& [way, name] : kWays) {
    SCOPED_TRACE(name);
    EXPECT_EQ(Transferred(way, TCIMValue(TType::kCIMTypeString, 4)).GetMaxArraySize(), 4u);
    EXPECT_EQ(Transferred(way, TCIMValue(TType::kCIMTypeString, 4, TElements())).GetMaxArraySize(), 4u);
    TCIMValue scalar(TType::kCIMTypeString, 4);
    scalar.SetNullValue(TType::kCIMTypeString, 0);
    EXPECT_EQ(Transferred(way, scalar).GetMaxArraySize(), 0u);
    if (way == EWay::kConstruct || way == EWay::kMoveConstruct) continue;

    TCIMValue value(TType::kCIMTypeString, 4);
    Transfer(way, value, TCIMValue("a"));
    EXPECT_EQ(value.GetMaxArraySize(), 4u);  // the old one stays
    Transfer(way, value, TCIMValue(TType::kCIMTypeString, 0, TElements()));
    EXPECT_EQ(value.GetMaxArraySize(), 0u);
  }
}

constexpr std::pair<EWay, char const*> kAssignments[] = {
    {EWay::kSet, "Set"}, {EWay::kAssign, "assignment"}, {EWay::kMoveAssign, "move assignment"}};

TEST(TCIMValueTest, AssigningAnEqualValueChangesNothingNotEvenTheReferencedClass) {
  boost::shared_ptr<ICIMClass> const mine = NewClass(), theirs = NewClass();
  for (auto const& [way, name] : kAssignments) {
    SCOPED_TRACE(name);
    TCIMValue array(TType::kCIMTypeString, 4, {TCIMValue("a")});
    Transfer(way, array, TCIMValue(TType::kCIMTypeString, 5, {TCIMValue("a")}));
    EXPECT_EQ(array.GetMaxArraySize(), 4u);

    TCIMValue null = NullOf(TType::kCIMTypeString, mine);
    Transfer(way, null, NullOf(TType::kCIMTypeString, theirs));
    EXPECT_EQ(null.GetReferencedClass(), mine);

    TCIMValue character{TCIMChar16(65)};
    Transfer(way, character, TCIMValue(TCIMChar16(66)));  // any two characters are equal
    EXPECT_EQ(character.ToString(), "65");

    TCIMValue zero(0.0);
    Transfer(way, zero, TCIMValue(-0.0));
    EXPECT_EQ(zero.ToString(), "0");
  }
}

TEST(TCIMValueTest, AssignmentThrowsWhatEqualityThrows) {
  for (auto const& [way, name] : kAssignments) {
    SCOPED_TRACE(name);
    TCIMValue character{TCIMChar16(65)};
    EXPECT_STATUS(Transfer(way, character, TCIMValue(TCIMChar16(std::string("A")))), kZEPStatusInvalidDateTime);
    EXPECT_EQ(character.ToString(), "65");

    TCIMValue dateTime{TCIMDateTime(1, 2, 3, 4, 5)};
    EXPECT_STATUS(Transfer(way, dateTime, TCIMValue(TCIMDateTime())), kZEPStatusInvalidDateTime);
    EXPECT_EQ(dateTime.ToString(), "00000001020304.000005:000");
  }
}

TEST(TCIMValueTest, AssignmentFromItselfKeepsTheValue) {
  for (auto const& row : Kinds()) {
    TCIMValue value(row.fValue);
    TCIMValue& itself = value;
    value = itself;
    value.Set(itself);
    value = std::move(itself);
    EXPECT_EQ(TState(value), TState(row.fValue)) << row.fName;
  }
  // A NaN is not equal to itself, so assignment copies it.
  TCIMValue nan(kNaN);
  TCIMValue& itself = nan;
  nan = itself;
  nan = std::move(itself);
  EXPECT_EQ(nan.ToString(), "nan");
}

TEST(TCIMValueTest, AValueMayBeAssignedFromOneOfItsElements) {
  auto const nested = [] {
    return TCIMValue(ArrayOf(TType::kCIMTypeString), 3, {TCIMValue("first"), TCIMValue("a text too long for the string itself")});
  };
  TCIMValue value = nested();
  value = ElementsOf(value)[1];
  EXPECT_EQ(value.ToString(), "a text too long for the string itself");

  value = nested();
  value.Set(ElementsOf(value)[1]);
  EXPECT_EQ(value.ToString(), "a text too long for the string itself");

  value = nested();
  value = std::move(ElementsOf(value)[1]);
  EXPECT_EQ(value.ToString(), "a text too long for the string itself");

  value = nested();
  value.Set(TType::kCIMTypeString, 9, ElementsOf(value));
  EXPECT_EQ(value.ToString(), "{ first, a text too long for the string itself }");

  value = nested();
  EXPECT_STATUS(value.Set(TType::kCIMTypeUint8, 9, ElementsOf(value)), kZEPStatusInvalidProperty);
  EXPECT_EQ(value.ToString(), "{ first, a text too long for the string itself }");
  TRootObject::GetCoreLogger()->ClearLog();
}

TEST(TCIMValueTest, AReferenceMayBeMovedFromAnElement) {
  boost::shared_ptr<ICIMClass> const cls = NewClass();
  TCIMValue value(TType::kCIMTypeReference, 0, {ReferenceTo(cls)});
  value = std::move(ElementsOf(value)[0]);
  EXPECT_EQ(value.GetReferencedClass(), cls);
  EXPECT_EQ(value.ToString(), "QRVSG_Any");
}

// ---- Moving ----

TEST(TCIMValueTest, AMovedValueIsInTheDefaultState) {
  for (auto const& row : Kinds()) {
    TCIMValue from(row.fValue);
    TCIMValue const constructed(std::move(from));
    EXPECT_EQ(TState(from), TState(TCIMValue())) << row.fName;

    from = row.fValue;
    TCIMValue assigned;
    assigned = std::move(from);
    EXPECT_EQ(TState(from), TState(TCIMValue())) << row.fName;
  }
}

TEST(TCIMValueTest, MovingDoesNotCopyTheElements) {
  TCIMValue array(TType::kCIMTypeString, 0, {TCIMValue("a")});
  TElements const* const elements = &ElementsOf(array);
  TCIMValue moved(std::move(array));
  EXPECT_EQ(&ElementsOf(moved), elements);
  TCIMValue assigned;
  assigned = std::move(moved);
  EXPECT_EQ(&ElementsOf(assigned), elements);
}

TEST(TCIMValueTest, AVectorOfValuesGrowsWithoutADeepCopy) {
  EXPECT_TRUE(std::is_nothrow_move_constructible_v<TCIMValue>);
  TElements values;
  values.push_back(TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("a")}));
  TElements const* const elements = &ElementsOf(values[0]);
  for (int i = 0; i < 100; ++i) values.push_back(TCIMValue(i));
  EXPECT_EQ(&ElementsOf(values[0]), elements);
}

TCIMValue RandomValue(std::mt19937& random, int depth = 0) {
  switch (random() % (depth == 0 ? 7 : 5)) {
    case 0:
      return TCIMValue();
    case 1:
      return TCIMValue(TType::kCIMTypeString, 0);
    case 2:
      return TCIMValue(static_cast<unsigned int>(random()));
    case 3:
      return TCIMValue(std::string(random() % 40, static_cast<char>('a' + random() % 26)));  // short and long
    case 4:
      return TCIMValue(static_cast<double>(random()) / 7);
    case 5:
      return TCIMValue(TCIMDateTime(random() % 1000, 1, 2, 3, 4));
    default:
      TElements const elements(random() % 4, TCIMValue(std::string(random() % 40, 'e')));
      return TCIMValue(TType::kCIMTypeString, random() % 10, elements);
  }
}

// Without the maximum size, which an assignment may keep.
TState TypeAndDataOf(TCIMValue const& value) {
  TState state(value);
  state.fMaxArraySize = 0;
  return state;
}

// The states that the values must have are kept apart from them.
TEST(TCIMValueTest, RandomCopiesMovesAndAssignmentsKeepTheData) {
  std::mt19937 random(18);
  TElements values;
  std::vector<TState> expected;
  auto const add = [&](TCIMValue value, TState const& state) {
    values.push_back(std::move(value));
    expected.push_back(state);
  };
  for (int i = 0; i < 20; ++i) {
    TCIMValue const value = RandomValue(random);
    add(value, TypeAndDataOf(value));
  }
  for (int round = 0; round < 20000; ++round) {
    std::size_t const to = random() % values.size(), from = random() % values.size();
    TCIMValue const fresh = RandomValue(random);
    switch (random() % 5) {
      case 0:
        if (!(values[to] == values[from])) values[to] = values[from], expected[to] = expected[from];
        break;
      case 1:
        if (!(values[to] == fresh)) values[to] = TCIMValue(fresh), expected[to] = TypeAndDataOf(fresh);
        break;
      case 2:
        std::swap(values[to], values[from]), std::swap(expected[to], expected[from]);
        break;
      case 3:
        if (values.size() < 100) add(values[from], TState(expected[from]));
        break;
      default:
        if (values.size() > 10) values.erase(values.begin() + to), expected.erase(expected.begin() + to);
    }
    if (round % 100 != 0) continue;
    for (std::size_t i = 0; i < values.size(); ++i) ASSERT_EQ(TypeAndDataOf(values[i]), expected[i]) << "round " << round;
  }
}

TEST(TCIMValueTest, ValuesAreSwappedAndSorted) {
  TCIMValue a(TType::kCIMTypeString, 4, {TCIMValue("x")}), b(TType::kCIMTypeString, 5, {TCIMValue("x")});
  std::swap(a, b);
  EXPECT_EQ(a.GetMaxArraySize(), 5u);
  EXPECT_EQ(b.GetMaxArraySize(), 4u);

  TElements values{TCIMValue("b"), TCIMValue(2u), TCIMValue(), TCIMValue("a"), TCIMValue(1u)};
  std::sort(values.begin(), values.end());
  EXPECT_TRUE(values[0].IsNull());
  values.erase(values.begin());
  std::string texts;
  for (auto const& value : values) texts += value.ToString();
  EXPECT_EQ(texts, "12ab");
}

}  // namespace
}  // namespace NQRVZEP20
