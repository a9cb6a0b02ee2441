// SPDX-License-Identifier: Apache-2.0
#include "TMemoryInstance.h"

#include "Collect.h"

namespace NQRVZEP20 {
namespace {

class TMemoryInstanceTest : public testing::Test {
protected:
  TMemoryInstanceTest() {
    fNs->DefineClass("X_Device").Key("Id", "uint32").Property("Name", "string", "unnamed");
    fNs->DefineClass("X_Disk", "X_Device")
        .Property("Sizes", "uint16[4]")
        .Property("name", "string", "disk")
        .Property("Tail", "real64");
    fNs->DefineClass("X_Ssd", "X_Disk").Property("Cells", "uint8").Property("Letter", "char16");
    fDisk = boost::dynamic_pointer_cast<TMemoryInstance>(fNs->GetClass("X_Disk", kNone)->CreateInstance(kNone));
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  boost::shared_ptr<TMemoryInstance> fDisk;
};

TEST_F(TMemoryInstanceTest, PropertiesOfSuperclassesComeFirstAndOverridesKeepTheFirstPosition) {
  EXPECT_THAT(Names(*fDisk, &ICIMInstance::EnumerateProperties), ElementsAre("Id", "name", "Sizes", "Tail"));
  EXPECT_EQ(VisitsUntilSecond(*fDisk, &ICIMInstance::EnumerateProperties), 2);
  auto const ssd = fNs->GetClass("X_Ssd", kNone)->CreateInstance(kNone);
  EXPECT_THAT(Names(*ssd, &ICIMInstance::EnumerateProperties), ElementsAre("Id", "name", "Sizes", "Tail", "Cells", "Letter"));
}

TEST_F(TMemoryInstanceTest, PropertyIsFoundInAnyCaseWithItsNearestDeclaration) {
  auto const name = fDisk->GetProperty("NAME", kNone);
  EXPECT_EQ(name->GetName(kNone), "name");
  EXPECT_EQ(name->GetDeclaration(kNone), fNs->GetClass("X_Disk", kNone)->GetPropertyDecl("Name", kNone));
  EXPECT_EQ(name->GetValue(kNone).ToString(), "disk");
  EXPECT_FALSE(fDisk->GetProperty("Cells", kNone));
}

TEST_F(TMemoryInstanceTest, PropertyAcceptsItsDeclaredTypeOnly) {
  auto const id = fDisk->GetProperty("Id", kNone);
  id->SetValue(5u, kNone);
  TCIMValue const refused[] = {TCIMValue(5), TCIMValue("5"), TCIMValue(), NullOf("sint32"), NullOf("uint32[]")};
  for (TCIMValue const& value : refused) {
    SCOPED_TRACE(static_cast<int>(value.GetType()));
    EXPECT_STATUS(id->SetValue(value, kNone), kZEPStatusTypeMismatch);
  }
  EXPECT_EQ(id->GetValue(kNone).ToString(), "5");
  id->SetValue(NullOf("uint32"), kNone);
  EXPECT_TRUE(id->GetValue(kNone).IsNull());
}

TEST_F(TMemoryInstanceTest, PropertyAcceptsANewValueOfEachKind) {
  TCIMReference one(fNs, "ns:X_Disk.Id=\"1\"", kNone), two(fNs, "ns:X_Disk.Id=\"2\"", kNone);
  struct {
    char const* fType;
    TCIMValue fFirst, fSecond;
  } const rows[] = {
      {"boolean", true, false},
      {"real64", 0.5, 1.5},
      {"char16", TCIMChar16(65), TCIMChar16(66)},  // equal in comparisons
      {"string", "a", "b"},
      {"datetime", TCIMDateTime("20070315143000.000000+060"), TCIMDateTime("20080315143000.000000+060")},
      {"reference", one, two},
      {"uint32[]", TCIMValue(TType::kCIMTypeUint32, 0, {TCIMValue(1u)}), TCIMValue(TType::kCIMTypeUint32, 0, {TCIMValue(2u)})},
      {"string[2]", TCIMValue(TType::kCIMTypeString, 2, {}), TCIMValue(TType::kCIMTypeString, 2, {TCIMValue("x")})},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fType);
    auto const cls = fNs->DefineClass("X_Of" + std::to_string(&row - rows)).Property("P", row.fType).Class();
    auto const property = cls->CreateInstance(kNone)->GetProperty("P", kNone);
    property->SetValue(row.fFirst, kNone);
    EXPECT_EQ(property->GetValue(kNone).ToString(), row.fFirst.ToString());
    property->SetValue(row.fSecond, kNone);
    EXPECT_EQ(property->GetValue(kNone).ToString(), row.fSecond.ToString());
    property->SetValue(property->GetValue(kNone), kNone);
    EXPECT_EQ(property->GetValue(kNone).ToString(), row.fSecond.ToString());
    EXPECT_EQ(property->GetValue(kNone).GetReferencedClass(), row.fSecond.GetReferencedClass());
  }
}

TEST_F(TMemoryInstanceTest, ValueOfAPropertyIsACopy) {
  fDisk->Set("Sizes", TCIMValue(TType::kCIMTypeUint16, 0, {TCIMValue(static_cast<unsigned short>(1))}));
  TCIMValue value = fDisk->Get("Sizes");
  static_cast<std::vector<TCIMValue>&>(value).clear();
  EXPECT_EQ(fDisk->Get("Sizes").ToString(), "{ 1 }");
}

TEST_F(TMemoryInstanceTest, PropertyOutlivesItsInstance) {
  auto const name = fDisk->GetProperty("Name", kNone);
  fDisk.reset();
  EXPECT_EQ(name->GetValue(kNone).ToString(), "disk");
  EXPECT_EQ(name->GetName(kNone), "name");
}

TEST_F(TMemoryInstanceTest, KeysOfACommittedInstanceCannotChange) {
  fDisk->Set("Id", 1);
  fDisk->Set("Id", 2);
  fNs->GetClass("X_Disk", kNone)->CommitInstance(fDisk, kNone);
  EXPECT_STATUS(fDisk->GetProperty("Id", kNone)->SetValue(3u, kNone), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(fDisk->Set("Id", 3), kZEPStatusInvalidOpSequence);
  EXPECT_EQ(fDisk->Get("Id").ToString(), "2");
  EXPECT_NO_THROW(fDisk->Set("Name", "renamed"));
}

TEST_F(TMemoryInstanceTest, PathHasTheClassAndTheKeysThatAreNotNull) {
  EXPECT_EQ(fDisk->GetPath(kNone).GetPath(), "X_Disk");
  fDisk->Set("Id", 7);
  TCIMReference const path = fDisk->GetPath(kNone);
  EXPECT_EQ(path.GetPath(), "X_Disk.Id=\"7\"");
  EXPECT_EQ(path.GetClass(), fNs->GetClass("X_Disk", kNone));
  EXPECT_EQ(path.GetNamespace(), fNs);
}

TEST_F(TMemoryInstanceTest, SetAcceptsPlainLiterals) {
  fDisk->Set("ID", 5);
  EXPECT_EQ(fDisk->Get("Id").GetType(), TType::kCIMTypeUint32);
  EXPECT_EQ(fDisk->Get("iD").ToString(), "5");
  fDisk->Set("Name", TCIMValue());
  EXPECT_TRUE(fDisk->Get("Name").IsNull());
  EXPECT_EQ(fDisk->Get("Name").GetType(), TType::kCIMTypeString);
  fDisk->Set("Sizes", TCIMValue(TType::kCIMTypeUint16, 0, {TCIMValue(static_cast<unsigned short>(1))}));
  EXPECT_EQ(fDisk->Get("Sizes").GetMaxArraySize(), 4u);

  EXPECT_STATUS(fDisk->Set("Id", -1), kZEPStatusTypeMismatch);
  EXPECT_STATUS(fDisk->Set("Id", "5"), kZEPStatusTypeMismatch);
  EXPECT_STATUS(fDisk->Set("Cells", 5), kZEPStatusNotFound);
  EXPECT_STATUS(fDisk->Get("Cells"), kZEPStatusNotFound);
}

TEST_F(TMemoryInstanceTest, AnInstanceMayReferToItself) {
  fDisk->Set("Id", 5);
  TCIMValue const reference = fDisk->GetReference();
  EXPECT_TRUE(reference.IsReference());
  EXPECT_EQ(reference.ToString(), "X_Disk.Id=\"5\"");
  EXPECT_EQ(reference.GetReferencedClass(), fNs->GetClass("X_Disk", kNone));
}

}  // namespace
}  // namespace NQRVZEP20
