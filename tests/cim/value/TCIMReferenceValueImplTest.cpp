// SPDX-License-Identifier: Apache-2.0
#include "TCIMReferenceValueImpl.h"

#include "tests/Support.h"
#include "tests/cim/model/Fakes.h"

namespace NQRVZEP20 {
namespace {

using TType = TCIMValue::TCIMType;
using TImpl = TCIMReferenceValueImpl;

class TCIMReferenceValueImplTest : public testing::Test {
protected:
  TCIMReferenceValueImplTest() { fNamespace->Add("X_Disk").Add("Id", TType::kCIMTypeUint32); }

  TCIMReference Disk(unsigned int id) {
    TCIMReference reference(fNamespace, TCIMContext());
    reference.SetClassName("X_Disk");
    reference.AddKeyValue("Id", TCIMValue(id));
    return reference;
  }

  TCIMValue DiskValue(unsigned int id) {
    TCIMReference reference = Disk(id);
    return TCIMValue(reference);
  }

  boost::shared_ptr<TFakeNamespace> const fNamespace = boost::make_shared<TFakeNamespace>();
};

TEST_F(TCIMReferenceValueImplTest, PrintsThePathForAnyRadix) {
  TImpl const data(Disk(255));
  for (int radix : {0, 2, 8, 10, 16}) EXPECT_EQ(data.ToString(static_cast<unsigned char>(radix)), "X_Disk.Id=\"255\"") << radix;
  EXPECT_EQ(TImpl(data).ToString(10), "X_Disk.Id=\"255\"");
}

TEST_F(TCIMReferenceValueImplTest, ConvertsToACopyOfTheReference) {
  TImpl const data(Disk(5));
  TCIMReference copy = data;
  EXPECT_TRUE(copy == Disk(5));
  copy.Clear();
  EXPECT_EQ(data.ToString(10), "X_Disk.Id=\"5\"");
}

TEST_F(TCIMReferenceValueImplTest, CopiesShareNothing) {
  TCIMReference reference = Disk(5);
  TImpl const data(reference);
  TImpl const copy(data);
  reference.Clear();
  EXPECT_EQ(data.ToString(10), "X_Disk.Id=\"5\"");
  EXPECT_EQ(copy.ToString(10), "X_Disk.Id=\"5\"");
}

TEST_F(TCIMReferenceValueImplTest, RefusesEveryOtherConversion) {
  TImpl const data(Disk(5));
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
  EXPECT_STATUS(data.operator std::vector<TCIMValue>&(), kZEPStatusTypeMismatch);
}

TEST_F(TCIMReferenceValueImplTest, ComparesAsReferencesCompare) {
  TImpl const data(Disk(5));
  EXPECT_TRUE(data == DiskValue(5));
  EXPECT_FALSE(data == DiskValue(6));
  EXPECT_TRUE(data < DiskValue(6));
  EXPECT_FALSE(data < DiskValue(5));
  EXPECT_FALSE(data < DiskValue(4));

  EXPECT_TRUE(DiskValue(4) < DiskValue(5));
  EXPECT_TRUE(DiskValue(5) == DiskValue(5));
}

TEST_F(TCIMReferenceValueImplTest, IsNeitherEqualNorLessAcrossTypes) {
  TImpl const data(Disk(5));
  for (TCIMValue const& other :
       {TCIMValue("X_Disk.Id=\"5\""), TCIMValue(5u), TCIMValue(), TCIMValue(TType::kCIMTypeReference, 0, {DiskValue(5)})}) {
    EXPECT_FALSE(data == other) << int(other.GetType());
    EXPECT_FALSE(data < other) << int(other.GetType());
  }
}

TEST_F(TCIMReferenceValueImplTest, ComparingWithANullReferenceThrowsValueIsNull) {
  TCIMValue const null(TType::kCIMTypeReference, 0);
  EXPECT_STATUS((void)(TImpl(Disk(5)) == null), kZEPStatusValueIsNULL);
  EXPECT_STATUS((void)(TImpl(Disk(5)) < null), kZEPStatusValueIsNULL);
}

}  // namespace
}  // namespace NQRVZEP20
