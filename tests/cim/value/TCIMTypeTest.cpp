// SPDX-License-Identifier: Apache-2.0
#include "TCIMValue.h"

#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

using TType = TCIMValue::TCIMType;

struct TNameRow {
  TType::ECIMType fType;
  int fNumber;
  char const* fName;
};

constexpr TNameRow kNames[] = {
    {TType::kCIMTypeBoolean, 1, "boolean"},      {TType::kCIMTypeUint8, 2, "uint8"},
    {TType::kCIMTypeSint8, 3, "sint8"},          {TType::kCIMTypeUint16, 4, "uint16"},
    {TType::kCIMTypeSint16, 5, "sint16"},        {TType::kCIMTypeUint32, 6, "uint32"},
    {TType::kCIMTypeSint32, 7, "sint32"},        {TType::kCIMTypeUint64, 8, "uint64"},
    {TType::kCIMTypeSint64, 9, "sint64"},        {TType::kCIMTypeReal32, 10, "real32"},
    {TType::kCIMTypeReal64, 11, "real64"},       {TType::kCIMTypeChar16, 12, "char16"},
    {TType::kCIMTypeString, 13, "string"},       {TType::kCIMTypeDateTime, 14, "datetime"},
    {TType::kCIMTypeReference, 15, "reference"},
};

TType ArrayOf(TType type) { return TType::ECIMType(type + TType::kCIMTypeArrayFlag); }

TEST(TCIMTypeTest, TagsHaveTheirNumbers) {
  EXPECT_EQ(TType::kCIMTypeInvalid, 0);
  EXPECT_EQ(TType::kCIMTypeArrayFlag, 16);
  EXPECT_EQ(sizeof(TType), 4u);
  for (auto const& row : kNames) EXPECT_EQ(row.fType, row.fNumber) << row.fName;
}

TEST(TCIMTypeTest, ANameGivesItsTag) {
  for (auto const& row : kNames) EXPECT_EQ(TType(std::string(row.fName)), row.fType) << row.fName;
}

TEST(TCIMTypeTest, NamesAreMatchedWithoutRegardToCase) {
  EXPECT_EQ(TType(std::string("Real64")), TType::kCIMTypeReal64);
  EXPECT_EQ(TType(std::string("STRING")), TType::kCIMTypeString);
  EXPECT_EQ(TType(std::string("uInT8")), TType::kCIMTypeUint8);
}

TEST(TCIMTypeTest, AnUnknownNameSetsNoTag) {
  for (char const* name : {"uint8[]", "", "uint", "uint128", " string", "string ", "array", "int", "\xFF\xC4"})
    EXPECT_EQ(TType(std::string(name)), TType::kCIMTypeInvalid) << name;
  EXPECT_EQ(TType(std::string("string\0", 7)), TType::kCIMTypeInvalid);
}

TEST(TCIMTypeTest, ATagPrintsItsName) {
  for (auto const& row : kNames) EXPECT_EQ(TType(row.fType).ToString(), row.fName);
}

TEST(TCIMTypeTest, AnArrayPrintsTheNameOfItsBaseType) {
  for (auto const& row : kNames) EXPECT_EQ(ArrayOf(row.fType).ToString(), row.fName);
}

TEST(TCIMTypeTest, ATagWithoutNameThrowsTypeMismatch) {
  for (int tag : {0, 16, 32, 33, 48, 1000, -1}) {
    SCOPED_TRACE(tag);
    EXPECT_STATUS(TType(TType::ECIMType(tag)).ToString(), kZEPStatusTypeMismatch);
  }
}

TEST(TCIMTypeTest, StreamingWritesTheName) {
  std::ostringstream stream;
  stream << TType(TType::kCIMTypeSint32) << ' ' << ArrayOf(TType::kCIMTypeString);
  EXPECT_EQ(stream.str(), "sint32 string");
  EXPECT_STATUS(stream << TType(TType::kCIMTypeInvalid), kZEPStatusTypeMismatch);
}

TEST(TCIMTypeTest, ATagIsCopiedAssignedAndReadBack) {
  TType type(TType::kCIMTypeUint8);
  TType const copy(type);
  type = TType::kCIMTypeString;
  EXPECT_EQ(copy, TType::kCIMTypeUint8);
  EXPECT_EQ(static_cast<TType::ECIMType>(type), TType::kCIMTypeString);
}

}  // namespace
}  // namespace NQRVZEP20
