// SPDX-License-Identifier: Apache-2.0
#include "TMemoryClass.h"

#include "Collect.h"

namespace NQRVZEP20 {
namespace {

class TMemoryClassTest : public testing::Test {
protected:
  TMemoryClassTest() { fNs->DeclareStandardQualifiers(); }

  boost::shared_ptr<ICIMClass> Create(char const* name, boost::shared_ptr<ICIMClass> superClass = nullptr) {
    return fNs->CreateClass(superClass, name, kNone);
  }

  void Qualify(ICIMNamedElement& element, char const* name, TCIMValue const& value) {
    element.AddQualifier(fNs->GetQualifierDecl(name, kNone), value, 0, kNone);
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  boost::shared_ptr<ICIMClass> const fDevice = Create("X_Device");
  boost::shared_ptr<ICIMClass> const fDisk = Create("X_Disk", fDevice);
  boost::shared_ptr<ICIMClass> const fSsd = Create("X_Ssd", fDisk);
};

// ---- Properties of a class ----

TEST_F(TMemoryClassTest, ClassHasItsNamespaceAndSuperclass) {
  EXPECT_EQ(fSsd->GetName(kNone), "X_Ssd");
  EXPECT_EQ(fSsd->GetNamespace(kNone), fNs);
  EXPECT_EQ(fSsd->GetSuperClass(kNone), fDisk);
  EXPECT_FALSE(fSsd->IsRootClass(kNone));
  EXPECT_TRUE(fDevice->IsRootClass(kNone));
  EXPECT_FALSE(fDevice->GetSuperClass(kNone));
}

TEST_F(TMemoryClassTest, AssociationIsInherited) {
  EXPECT_FALSE(fSsd->GetClassFlag(kNone));
  Qualify(*fDisk, "Association", true);
  EXPECT_FALSE(fDevice->GetClassFlag(kNone));
  EXPECT_TRUE(fDisk->GetClassFlag(kNone));
  EXPECT_TRUE(fSsd->GetClassFlag(kNone));
}

TEST_F(TMemoryClassTest, AbstractIsNotInherited) {
  EXPECT_FALSE(fDisk->IsAbstract(kNone));
  Qualify(*fDisk, "Abstract", true);
  EXPECT_TRUE(fDisk->IsAbstract(kNone));
  EXPECT_FALSE(fSsd->IsAbstract(kNone));
}

TEST_F(TMemoryClassTest, QualifierWithTheValueFalseCountsAsAbsent) {
  Qualify(*fDisk, "Abstract", false);
  Qualify(*fDisk, "Association", false);
  EXPECT_FALSE(fDisk->IsAbstract(kNone));
  EXPECT_FALSE(fDisk->GetClassFlag(kNone));
}

// ---- Property declarations ----

TEST_F(TMemoryClassTest, PropertyDeclarationHasTypeBoundAndReferencedClassOfItsDefault) {
  TCIMValue toDevice = NullOf("reference");
  toDevice.SetReferencedClass(fDevice);
  struct {
    char const* fName;
    TCIMValue fDefaultValue;
  } const rows[] = {{"Count", TCIMValue(7u)}, {"Name", NullOf("string")}, {"Bytes", NullOf("uint8[16]")}, {"On", toDevice}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    auto const decl = fDisk->AddPropertyDecl(row.fName, row.fDefaultValue, kNone);
    EXPECT_EQ(fDisk->GetPropertyDecl(row.fName, kNone), decl);
    EXPECT_EQ(decl->GetName(kNone), row.fName);
    EXPECT_EQ(decl->GetType(kNone), row.fDefaultValue.GetType());
    EXPECT_EQ(decl->GetDefaultValue(kNone), row.fDefaultValue);
    EXPECT_EQ(decl->GetDefaultValue(kNone).GetMaxArraySize(), row.fDefaultValue.GetMaxArraySize());
    EXPECT_EQ(decl->GetDefaultValue(kNone).GetReferencedClass(), row.fDefaultValue.GetReferencedClass());
    EXPECT_EQ(decl->GetOwner(kNone).lock(), fDisk);
    EXPECT_FALSE(decl->IsKey(kNone));
  }
  EXPECT_THAT(Names(*fDisk, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Count", "Name", "Bytes", "On"));
  EXPECT_EQ(VisitsUntilSecond(*fDisk, &ICIMClass::EnumeratePropertyDecls), 2);
}

TEST_F(TMemoryClassTest, PropertyDeclarationIsFoundInTheNearestClassInAnyCase) {
  auto const ofDevice = fDevice->AddPropertyDecl("Name", NullOf("string"), kNone);
  EXPECT_EQ(fSsd->GetPropertyDecl("NAME", kNone), ofDevice);
  auto const ofDisk = fDisk->AddPropertyDecl("name", NullOf("string"), kNone);
  EXPECT_EQ(fSsd->GetPropertyDecl("Name", kNone), ofDisk);
  EXPECT_EQ(fDevice->GetPropertyDecl("Name", kNone), ofDevice);
  EXPECT_THAT(Names(*fSsd, &ICIMClass::EnumeratePropertyDecls), IsEmpty());
}

TEST_F(TMemoryClassTest, PropertyDeclarationIsRefusedWithItsReason) {
  fDisk->AddPropertyDecl("Name", NullOf("string"), kNone);
  struct {
    char const* fName;
    TCIMValue fDefaultValue;
    EZEPStatusCode fStatus;
  } const rows[] = {
      {"NAME", NullOf("uint8"), kZEPStatusAlreadyExists},
      {"Id", TCIMValue(), kZEPStatusTypeMismatch},
      {"Id", TCIMValue(TType::kCIMTypeArrayFlag, 0), kZEPStatusTypeMismatch},
      {"1d", NullOf("string"), kZEPStatusInvalidCIMName},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    EXPECT_STATUS(fDisk->AddPropertyDecl(row.fName, row.fDefaultValue, kNone), row.fStatus);
  }
  EXPECT_THAT(Names(*fDisk, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Name"));
}

TEST_F(TMemoryClassTest, NoPropertyIsDeclaredAfterTheFirstInstanceOfTheClassOrASubclass) {
  auto const id = fDevice->AddPropertyDecl("Id", NullOf("uint32"), kNone);
  auto const key = fNs->GetQualifierDecl("Key", kNone);
  fDisk->CommitInstance(fDisk->CreateInstance(kNone), kNone);
  EXPECT_STATUS(fDisk->AddPropertyDecl("New", NullOf("string"), kNone), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(fDevice->AddPropertyDecl("New", NullOf("string"), kNone), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(id->AddQualifier(key, true, 0, kNone), kZEPStatusInvalidOpSequence);
  EXPECT_NO_THROW(Qualify(*id, "Description", "another qualifier is welcome"));
  EXPECT_NO_THROW(fSsd->AddPropertyDecl("New", NullOf("string"), kNone));
}

TEST_F(TMemoryClassTest, UnknownPropertyIsNotFoundExceptWhileDeclaring) {
  EXPECT_STATUS(fDisk->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
  fDisk->BeginDeclarations(kNone);
  EXPECT_FALSE(fDisk->GetPropertyDecl("Name", kNone));
  EXPECT_STATUS(fSsd->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
  EXPECT_STATUS(fDisk->SetStaticProperty("Name", "a", kNone), kZEPStatusNotFound);
  auto const name = fDisk->AddPropertyDecl("Name", NullOf("string"), kNone);
  EXPECT_EQ(fDisk->GetPropertyDecl("Name", kNone), name);
  fDisk->EndDeclarations(kNone);
  EXPECT_STATUS(fDisk->GetPropertyDecl("Other", kNone), kZEPStatusNotFound);
}

TEST_F(TMemoryClassTest, DeclaringIsNotNested) {
  fDisk->EndDeclarations(kNone);  // without BeginDeclarations
  fDisk->BeginDeclarations(kNone);
  fDisk->BeginDeclarations(kNone);
  fDisk->EndDeclarations(kNone);
  EXPECT_STATUS(fDisk->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
}

TEST_F(TMemoryClassTest, KeyIsInheritedByAnOverride) {
  auto const id = fDevice->AddPropertyDecl("Id", NullOf("uint32"), kNone);
  auto const name = fDevice->AddPropertyDecl("Name", NullOf("string"), kNone);
  Qualify(*id, "Key", true);
  Qualify(*name, "Key", false);
  auto const ofSsd = fSsd->AddPropertyDecl("ID", NullOf("uint32"), kNone);
  EXPECT_TRUE(id->IsKey(kNone));
  EXPECT_FALSE(name->IsKey(kNone));
  EXPECT_TRUE(ofSsd->IsKey(kNone));
  EXPECT_FALSE(fSsd->AddPropertyDecl("Size", NullOf("uint64"), kNone)->IsKey(kNone));
}

// ---- Static properties ----

TEST_F(TMemoryClassTest, StaticPropertiesHaveTheOrderInWhichTheyWereFirstSet) {
  fDisk->AddPropertyDecl("A", NullOf("string"), kNone);
  fDisk->AddPropertyDecl("B", NullOf("string"), kNone);
  fDevice->AddPropertyDecl("C", NullOf("uint32"), kNone);
  fDisk->SetStaticProperty("b", "first", kNone);
  fDisk->SetStaticProperty("C", 5u, kNone);  // inherited
  fDisk->SetStaticProperty("A", "a", kNone);
  fDisk->SetStaticProperty("B", "second", kNone);

  EXPECT_THAT(Names(*fDisk, &ICIMClass::EnumerateStaticProperties), ElementsAre("B", "C", "A"));
  EXPECT_EQ(VisitsUntilSecond(*fDisk, &ICIMClass::EnumerateStaticProperties), 2);
  auto const b = All(*fDisk, &ICIMClass::EnumerateStaticProperties).front();
  EXPECT_EQ(b->GetValue(kNone).ToString(), "second");
  EXPECT_EQ(b->GetDeclaration(kNone), fDisk->GetPropertyDecl("B", kNone));
  EXPECT_THAT(Names(*fSsd, &ICIMClass::EnumerateStaticProperties), IsEmpty());
  EXPECT_THAT(Names(*fDevice, &ICIMClass::EnumerateStaticProperties), IsEmpty());
}

TEST_F(TMemoryClassTest, StaticPropertyIsRefusedWithItsReasonAndKeepsItsValue) {
  fDisk->AddPropertyDecl("A", NullOf("string"), kNone);
  fDisk->SetStaticProperty("A", "kept", kNone);
  EXPECT_STATUS(fDisk->SetStaticProperty("X", "a", kNone), kZEPStatusNotFound);
  EXPECT_STATUS(fDisk->SetStaticProperty("A", 5u, kNone), kZEPStatusTypeMismatch);
  EXPECT_STATUS(fDisk->SetStaticProperty("A", TCIMValue(), kNone), kZEPStatusTypeMismatch);
  EXPECT_EQ(All(*fDisk, &ICIMClass::EnumerateStaticProperties).front()->GetValue(kNone).ToString(), "kept");
}

// ---- Instances ----

class TMemoryClassInstanceTest : public TMemoryClassTest {
protected:
  TMemoryClassInstanceTest() {
    Qualify(*fDevice->AddPropertyDecl("Id", NullOf("uint32"), kNone), "Key", true);
    fDevice->AddPropertyDecl("Name", TCIMValue("unnamed"), kNone);
  }

  boost::shared_ptr<ICIMInstance> Make(ICIMClass& cls, unsigned int id) {
    auto const instance = cls.CreateInstance(kNone);
    instance->GetProperty("Id", kNone)->SetValue(id, kNone);
    return instance;
  }

  boost::shared_ptr<ICIMInstance> Commit(ICIMClass& cls, unsigned int id) {
    auto const instance = Make(cls, id);
    cls.CommitInstance(instance, kNone);
    return instance;
  }
};

TEST_F(TMemoryClassInstanceTest, NewInstanceHasDefaultsAndIsNotEnumerated) {
  auto const instance = fDisk->CreateInstance(kNone);
  EXPECT_EQ(instance->GetClass(kNone), fDisk);
  EXPECT_TRUE(instance->GetProperty("Id", kNone)->GetValue(kNone).IsNull());
  EXPECT_EQ(instance->GetProperty("Name", kNone)->GetValue(kNone).ToString(), "unnamed");
  EXPECT_THAT(InstancePaths(*fDisk), IsEmpty());
}

TEST_F(TMemoryClassInstanceTest, AbstractClassCreatesNoInstances) {
  Qualify(*fDisk, "Abstract", true);
  EXPECT_STATUS(fDisk->CreateInstance(kNone), kZEPStatusInvalidClass);
  EXPECT_NO_THROW(Commit(*fSsd, 1));
  EXPECT_THAT(InstancePaths(*fDisk), ElementsAre("X_Ssd.Id=\"1\""));
}

TEST_F(TMemoryClassInstanceTest, InstancesComeClassByClassInTheOrderOfTheSubclasses) {
  auto const tape = Create("X_Tape", fDevice);
  Commit(*tape, 1);
  Commit(*fSsd, 2);
  Commit(*fDevice, 3);
  Commit(*fDisk, 4);
  Commit(*fSsd, 1);
  Commit(*fDisk, 0);
  EXPECT_THAT(InstancePaths(*fDevice), ElementsAre("X_Device.Id=\"3\"", "X_Disk.Id=\"4\"", "X_Disk.Id=\"0\"", "X_Ssd.Id=\"2\"",
                                                   "X_Ssd.Id=\"1\"", "X_Tape.Id=\"1\""));
  EXPECT_THAT(InstancePaths(*fDisk), ElementsAre("X_Disk.Id=\"4\"", "X_Disk.Id=\"0\"", "X_Ssd.Id=\"2\"", "X_Ssd.Id=\"1\""));
}

TEST_F(TMemoryClassInstanceTest, EnumerationStopsAtTheFirstFalseInEachClass) {
  for (unsigned int id : {1, 2}) Commit(*fDevice, id), Commit(*fDisk, id), Commit(*fSsd, id);
  for (int stopAt = 1; stopAt <= 6; ++stopAt) {
    SCOPED_TRACE(stopAt);
    int visits = 0;
    fDevice->EnumerateInstances([&](boost::shared_ptr<ICIMInstance> const&) { return ++visits < stopAt; }, kNone);
    EXPECT_EQ(visits, stopAt);
  }
}

TEST_F(TMemoryClassInstanceTest, OnlyInstancesOfTheClassItselfAreCommitted) {
  auto const other = NewNamespace();
  other->DefineClass("X_Disk").Key("Id", "uint32");
  struct {
    char const* fDescription;
    boost::shared_ptr<ICIMInstance> fInstance;
  } const rows[] = {{"none", nullptr},
                    {"of the superclass", Make(*fDevice, 1)},
                    {"of a subclass", Make(*fSsd, 1)},
                    {"of another namespace", Make(*other->GetClass("X_Disk", kNone), 1)}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fDescription);
    EXPECT_STATUS(fDisk->CommitInstance(row.fInstance, kNone), kZEPStatusInvalidInstance);
  }
  EXPECT_THAT(InstancePaths(*fDevice), IsEmpty());
}

TEST_F(TMemoryClassInstanceTest, SameKeysAreCommittedOnce) {
  auto const first = Commit(*fDisk, 1);
  EXPECT_STATUS(fDisk->CommitInstance(first, kNone), kZEPStatusAlreadyExists);
  auto const second = Make(*fDisk, 1);
  second->GetProperty("Name", kNone)->SetValue("other", kNone);
  EXPECT_STATUS(fDisk->CommitInstance(second, kNone), kZEPStatusAlreadyExists);
  EXPECT_THAT(InstancePaths(*fDisk), ElementsAre("X_Disk.Id=\"1\""));

  second->GetProperty("Id", kNone)->SetValue(2u, kNone);  // not committed, so its key may change
  EXPECT_NO_THROW(fDisk->CommitInstance(second, kNone));
  EXPECT_NO_THROW(Commit(*fSsd, 1));  // another class
}

TEST_F(TMemoryClassInstanceTest, InstancesWithoutAKeyValueAreCommittedOnceEach) {
  auto const plain = Create("X_Plain");
  for (ICIMClass* cls : {plain.get(), fDisk.get()}) {
    SCOPED_TRACE(cls->GetName(kNone));
    auto const first = cls->CreateInstance(kNone);
    cls->CommitInstance(first, kNone);
    cls->CommitInstance(cls->CreateInstance(kNone), kNone);
    EXPECT_STATUS(cls->CommitInstance(first, kNone), kZEPStatusAlreadyExists);
    EXPECT_EQ(InstancePaths(*cls).size(), 2u);
    EXPECT_FALSE(fNs->GetInstance(first->GetPath(kNone), kNone));
  }
}

TEST_F(TMemoryClassInstanceTest, AddInstanceSetsAndCommits) {
  auto const disk = boost::dynamic_pointer_cast<TMemoryClass>(fDisk);
  auto const instance = disk->AddInstance({{"id", 1}, {"NAME", "sda"}});
  EXPECT_EQ(instance->Get("Name").ToString(), "sda");
  EXPECT_EQ(fNs->GetInstance(instance->GetPath(kNone), kNone), instance);
}

// ---- Methods ----

TEST_F(TMemoryClassTest, MethodDeclarationsAreThoseOfTheClassItselfInTheirOrder) {
  auto const reset = fDisk->AddMethodDecl("Reset", TType::kCIMTypeUint32, kNone);
  fDisk->AddMethodDecl("Erase", TType::kCIMTypeBoolean, kNone);
  fSsd->AddMethodDecl("reset", TType::kCIMTypeUint32, kNone);  // overrides

  EXPECT_THAT(Names(*fDisk, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset", "Erase"));
  EXPECT_THAT(Names(*fSsd, &ICIMClass::EnumerateMethodDecls), ElementsAre("reset"));
  EXPECT_EQ(VisitsUntilSecond(*fDisk, &ICIMClass::EnumerateMethodDecls), 2);
  EXPECT_EQ(reset->GetReturnType(kNone), TType::kCIMTypeUint32);
  EXPECT_EQ(reset->GetOwner(kNone).lock(), fDisk);
}

TEST_F(TMemoryClassTest, MethodDeclarationIsRefusedWithItsReason) {
  fDisk->AddMethodDecl("Reset", TType::kCIMTypeUint32, kNone);
  struct {
    char const* fName;
    TType fType;
    EZEPStatusCode fStatus;
  } const rows[] = {
      {"RESET", TType::kCIMTypeUint8, kZEPStatusAlreadyExists},
      {"A", TType::kCIMTypeInvalid, kZEPStatusTypeMismatch},
      {"A", TMemoryType("uint8[]").GetType(), kZEPStatusTypeMismatch},
      {"", TType::kCIMTypeUint32, kZEPStatusInvalidCIMName},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    EXPECT_STATUS(fDisk->AddMethodDecl(row.fName, row.fType, kNone), row.fStatus);
  }
  EXPECT_THAT(Names(*fDisk, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset"));
}

}  // namespace
}  // namespace NQRVZEP20
