#include "TMemoryClass.h"

#include "Collect.h"

namespace NQRVZEP20 {
namespace {

class TMemoryClassTest : public testing::Test {
protected:
  TMemoryClassTest() { ns_->DeclareStandardQualifiers(); }

  boost::shared_ptr<ICIMClass> Create(char const* name, boost::shared_ptr<ICIMClass> superClass = nullptr) {
    return ns_->CreateClass(superClass, name, kNone);
  }

  void Qualify(ICIMNamedElement& element, char const* name, TCIMValue const& value) {
    element.AddQualifier(ns_->GetQualifierDecl(name, kNone), value, 0, kNone);
  }

  boost::shared_ptr<TMemoryNamespace> const ns_ = NewNamespace();
  boost::shared_ptr<ICIMClass> const device_ = Create("X_Device");
  boost::shared_ptr<ICIMClass> const disk_ = Create("X_Disk", device_);
  boost::shared_ptr<ICIMClass> const ssd_ = Create("X_Ssd", disk_);
};

// ---- What it is ----

TEST_F(TMemoryClassTest, KnowsItsNamespaceAndSuperclass) {
  EXPECT_EQ(ssd_->GetName(kNone), "X_Ssd");
  EXPECT_EQ(ssd_->GetNamespace(kNone), ns_);
  EXPECT_EQ(ssd_->GetSuperClass(kNone), disk_);
  EXPECT_FALSE(ssd_->IsRootClass(kNone));
  EXPECT_TRUE(device_->IsRootClass(kNone));
  EXPECT_FALSE(device_->GetSuperClass(kNone));
}

TEST_F(TMemoryClassTest, AssociationIsHandedDown) {
  EXPECT_FALSE(ssd_->GetClassFlag(kNone));
  Qualify(*disk_, "Association", true);
  EXPECT_FALSE(device_->GetClassFlag(kNone));
  EXPECT_TRUE(disk_->GetClassFlag(kNone));
  EXPECT_TRUE(ssd_->GetClassFlag(kNone));
}

TEST_F(TMemoryClassTest, AbstractIsNotHandedDown) {
  EXPECT_FALSE(disk_->IsAbstract(kNone));
  Qualify(*disk_, "Abstract", true);
  EXPECT_TRUE(disk_->IsAbstract(kNone));
  EXPECT_FALSE(ssd_->IsAbstract(kNone));
}

TEST_F(TMemoryClassTest, QualifierWithTheValueFalseMarksNothing) {
  Qualify(*disk_, "Abstract", false);
  Qualify(*disk_, "Association", false);
  EXPECT_FALSE(disk_->IsAbstract(kNone));
  EXPECT_FALSE(disk_->GetClassFlag(kNone));
}

// ---- Property declarations ----

TEST_F(TMemoryClassTest, PropertyDeclarationHasTypeBoundAndReferencedClassOfItsDefault) {
  TCIMValue toDevice = NullOf("reference");
  toDevice.SetReferencedClass(device_);
  struct {
    char const* name;
    TCIMValue defaultValue;
  } const rows[] = {{"Count", TCIMValue(7u)}, {"Name", NullOf("string")}, {"Bytes", NullOf("uint8[16]")}, {"On", toDevice}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.name);
    auto const decl = disk_->AddPropertyDecl(row.name, row.defaultValue, kNone);
    EXPECT_EQ(disk_->GetPropertyDecl(row.name, kNone), decl);
    EXPECT_EQ(decl->GetName(kNone), row.name);
    EXPECT_EQ(decl->GetType(kNone), row.defaultValue.GetType());
    EXPECT_EQ(decl->GetDefaultValue(kNone), row.defaultValue);
    EXPECT_EQ(decl->GetDefaultValue(kNone).GetMaxArraySize(), row.defaultValue.GetMaxArraySize());
    EXPECT_EQ(decl->GetDefaultValue(kNone).GetReferencedClass(), row.defaultValue.GetReferencedClass());
    EXPECT_EQ(decl->GetOwner(kNone).lock(), disk_);
    EXPECT_FALSE(decl->IsKey(kNone));
  }
  EXPECT_THAT(Names(*disk_, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Count", "Name", "Bytes", "On"));
  EXPECT_EQ(VisitsUntilSecond(*disk_, &ICIMClass::EnumeratePropertyDecls), 2);
}

TEST_F(TMemoryClassTest, PropertyDeclarationIsFoundInTheNearestClassInAnyCase) {
  auto const ofDevice = device_->AddPropertyDecl("Name", NullOf("string"), kNone);
  EXPECT_EQ(ssd_->GetPropertyDecl("NAME", kNone), ofDevice);
  auto const ofDisk = disk_->AddPropertyDecl("name", NullOf("string"), kNone);
  EXPECT_EQ(ssd_->GetPropertyDecl("Name", kNone), ofDisk);
  EXPECT_EQ(device_->GetPropertyDecl("Name", kNone), ofDevice);
  EXPECT_THAT(Names(*ssd_, &ICIMClass::EnumeratePropertyDecls), IsEmpty());
}

TEST_F(TMemoryClassTest, PropertyDeclarationIsRefusedWithItsReason) {
  disk_->AddPropertyDecl("Name", NullOf("string"), kNone);
  struct {
    char const* name;
    TCIMValue defaultValue;
    EZEPStatusCode status;
  } const rows[] = {
      {"NAME", NullOf("uint8"), kZEPStatusAlreadyExists},
      {"Id", TCIMValue(), kZEPStatusTypeMismatch},
      {"Id", TCIMValue(TType::kCIMTypeArrayFlag, 0), kZEPStatusTypeMismatch},
      {"1d", NullOf("string"), kZEPStatusInvalidCIMName},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_STATUS(disk_->AddPropertyDecl(row.name, row.defaultValue, kNone), row.status);
  }
  EXPECT_THAT(Names(*disk_, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Name"));
}

TEST_F(TMemoryClassTest, NoPropertyIsDeclaredOnceTheClassOrASubclassHasMadeAnInstance) {
  auto const id = device_->AddPropertyDecl("Id", NullOf("uint32"), kNone);
  auto const key = ns_->GetQualifierDecl("Key", kNone);
  disk_->CommitInstance(disk_->CreateInstance(kNone), kNone);
  EXPECT_STATUS(disk_->AddPropertyDecl("New", NullOf("string"), kNone), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(device_->AddPropertyDecl("New", NullOf("string"), kNone), kZEPStatusInvalidOpSequence);
  EXPECT_STATUS(id->AddQualifier(key, true, 0, kNone), kZEPStatusInvalidOpSequence);
  EXPECT_NO_THROW(Qualify(*id, "Description", "another qualifier is welcome"));
  EXPECT_NO_THROW(ssd_->AddPropertyDecl("New", NullOf("string"), kNone));
}

TEST_F(TMemoryClassTest, UnknownPropertyIsNotFoundExceptWhileDeclaring) {
  EXPECT_STATUS(disk_->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
  disk_->BeginDeclarations(kNone);
  EXPECT_FALSE(disk_->GetPropertyDecl("Name", kNone));
  EXPECT_STATUS(ssd_->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
  EXPECT_STATUS(disk_->SetStaticProperty("Name", "a", kNone), kZEPStatusNotFound);
  auto const name = disk_->AddPropertyDecl("Name", NullOf("string"), kNone);
  EXPECT_EQ(disk_->GetPropertyDecl("Name", kNone), name);
  disk_->EndDeclarations(kNone);
  EXPECT_STATUS(disk_->GetPropertyDecl("Other", kNone), kZEPStatusNotFound);
}

TEST_F(TMemoryClassTest, DeclaringIsNotNested) {
  disk_->EndDeclarations(kNone);  // was not begun
  disk_->BeginDeclarations(kNone);
  disk_->BeginDeclarations(kNone);
  disk_->EndDeclarations(kNone);
  EXPECT_STATUS(disk_->GetPropertyDecl("Name", kNone), kZEPStatusNotFound);
}

TEST_F(TMemoryClassTest, KeyIsInheritedByAnOverride) {
  auto const id = device_->AddPropertyDecl("Id", NullOf("uint32"), kNone);
  auto const name = device_->AddPropertyDecl("Name", NullOf("string"), kNone);
  Qualify(*id, "Key", true);
  Qualify(*name, "Key", false);
  auto const ofSsd = ssd_->AddPropertyDecl("ID", NullOf("uint32"), kNone);
  EXPECT_TRUE(id->IsKey(kNone));
  EXPECT_FALSE(name->IsKey(kNone));
  EXPECT_TRUE(ofSsd->IsKey(kNone));
  EXPECT_FALSE(ssd_->AddPropertyDecl("Size", NullOf("uint64"), kNone)->IsKey(kNone));
}

// ---- Static properties ----

TEST_F(TMemoryClassTest, StaticPropertiesComeInTheOrderInWhichTheyWereFirstSet) {
  disk_->AddPropertyDecl("A", NullOf("string"), kNone);
  disk_->AddPropertyDecl("B", NullOf("string"), kNone);
  device_->AddPropertyDecl("C", NullOf("uint32"), kNone);
  disk_->SetStaticProperty("b", "first", kNone);
  disk_->SetStaticProperty("C", 5u, kNone);  // inherited
  disk_->SetStaticProperty("A", "a", kNone);
  disk_->SetStaticProperty("B", "second", kNone);

  EXPECT_THAT(Names(*disk_, &ICIMClass::EnumerateStaticProperties), ElementsAre("B", "C", "A"));
  EXPECT_EQ(VisitsUntilSecond(*disk_, &ICIMClass::EnumerateStaticProperties), 2);
  auto const b = All(*disk_, &ICIMClass::EnumerateStaticProperties).front();
  EXPECT_EQ(b->GetValue(kNone).ToString(), "second");
  EXPECT_EQ(b->GetDeclaration(kNone), disk_->GetPropertyDecl("B", kNone));
  EXPECT_THAT(Names(*ssd_, &ICIMClass::EnumerateStaticProperties), IsEmpty());
  EXPECT_THAT(Names(*device_, &ICIMClass::EnumerateStaticProperties), IsEmpty());
}

TEST_F(TMemoryClassTest, StaticPropertyIsRefusedWithItsReasonAndKeepsItsValue) {
  disk_->AddPropertyDecl("A", NullOf("string"), kNone);
  disk_->SetStaticProperty("A", "kept", kNone);
  EXPECT_STATUS(disk_->SetStaticProperty("X", "a", kNone), kZEPStatusNotFound);
  EXPECT_STATUS(disk_->SetStaticProperty("A", 5u, kNone), kZEPStatusTypeMismatch);
  EXPECT_STATUS(disk_->SetStaticProperty("A", TCIMValue(), kNone), kZEPStatusTypeMismatch);
  EXPECT_EQ(All(*disk_, &ICIMClass::EnumerateStaticProperties).front()->GetValue(kNone).ToString(), "kept");
}

// ---- Instances ----

class TMemoryClassInstanceTest : public TMemoryClassTest {
protected:
  TMemoryClassInstanceTest() {
    Qualify(*device_->AddPropertyDecl("Id", NullOf("uint32"), kNone), "Key", true);
    device_->AddPropertyDecl("Name", TCIMValue("unnamed"), kNone);
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

TEST_F(TMemoryClassInstanceTest, NewInstanceHasDefaultsAndBelongsToNobody) {
  auto const instance = disk_->CreateInstance(kNone);
  EXPECT_EQ(instance->GetClass(kNone), disk_);
  EXPECT_TRUE(instance->GetProperty("Id", kNone)->GetValue(kNone).IsNull());
  EXPECT_EQ(instance->GetProperty("Name", kNone)->GetValue(kNone).ToString(), "unnamed");
  EXPECT_THAT(InstancePaths(*disk_), IsEmpty());
}

TEST_F(TMemoryClassInstanceTest, AbstractClassMakesNoInstances) {
  Qualify(*disk_, "Abstract", true);
  EXPECT_STATUS(disk_->CreateInstance(kNone), kZEPStatusInvalidClass);
  EXPECT_NO_THROW(Commit(*ssd_, 1));
  EXPECT_THAT(InstancePaths(*disk_), ElementsAre("X_Ssd.Id=\"1\""));
}

TEST_F(TMemoryClassInstanceTest, InstancesComeClassByClassInTheOrderOfTheSubclasses) {
  auto const tape = Create("X_Tape", device_);
  Commit(*tape, 1);
  Commit(*ssd_, 2);
  Commit(*device_, 3);
  Commit(*disk_, 4);
  Commit(*ssd_, 1);
  Commit(*disk_, 0);
  EXPECT_THAT(InstancePaths(*device_), ElementsAre("X_Device.Id=\"3\"", "X_Disk.Id=\"4\"", "X_Disk.Id=\"0\"", "X_Ssd.Id=\"2\"",
                                                   "X_Ssd.Id=\"1\"", "X_Tape.Id=\"1\""));
  EXPECT_THAT(InstancePaths(*disk_), ElementsAre("X_Disk.Id=\"4\"", "X_Disk.Id=\"0\"", "X_Ssd.Id=\"2\"", "X_Ssd.Id=\"1\""));
}

TEST_F(TMemoryClassInstanceTest, EnumerationStopsAtTheFirstFalseInEachClass) {
  for (unsigned int id : {1, 2}) Commit(*device_, id), Commit(*disk_, id), Commit(*ssd_, id);
  for (int stopAt = 1; stopAt <= 6; ++stopAt) {
    SCOPED_TRACE(stopAt);
    int visits = 0;
    device_->EnumerateInstances([&](boost::shared_ptr<ICIMInstance> const&) { return ++visits < stopAt; }, kNone);
    EXPECT_EQ(visits, stopAt);
  }
}

TEST_F(TMemoryClassInstanceTest, OnlyInstancesThatTheClassMadeAreCommitted) {
  auto const other = NewNamespace();
  other->DefineClass("X_Disk").Key("Id", "uint32");
  struct {
    char const* what;
    boost::shared_ptr<ICIMInstance> instance;
  } const rows[] = {{"none", nullptr},
                    {"of the superclass", Make(*device_, 1)},
                    {"of a subclass", Make(*ssd_, 1)},
                    {"of another namespace", Make(*other->GetClass("X_Disk", kNone), 1)}};
  for (auto const& row : rows) {
    SCOPED_TRACE(row.what);
    EXPECT_STATUS(disk_->CommitInstance(row.instance, kNone), kZEPStatusInvalidInstance);
  }
  EXPECT_THAT(InstancePaths(*device_), IsEmpty());
}

TEST_F(TMemoryClassInstanceTest, SameKeysAreCommittedOnce) {
  auto const first = Commit(*disk_, 1);
  EXPECT_STATUS(disk_->CommitInstance(first, kNone), kZEPStatusAlreadyExists);
  auto const second = Make(*disk_, 1);
  second->GetProperty("Name", kNone)->SetValue("other", kNone);
  EXPECT_STATUS(disk_->CommitInstance(second, kNone), kZEPStatusAlreadyExists);
  EXPECT_THAT(InstancePaths(*disk_), ElementsAre("X_Disk.Id=\"1\""));

  second->GetProperty("Id", kNone)->SetValue(2u, kNone);  // was not committed, so its key may change
  EXPECT_NO_THROW(disk_->CommitInstance(second, kNone));
  EXPECT_NO_THROW(Commit(*ssd_, 1));  // another class
}

TEST_F(TMemoryClassInstanceTest, InstancesWithoutAKeyValueAreCommittedOnceEach) {
  auto const plain = Create("X_Plain");
  for (ICIMClass* cls : {plain.get(), disk_.get()}) {
    SCOPED_TRACE(cls->GetName(kNone));
    auto const first = cls->CreateInstance(kNone);
    cls->CommitInstance(first, kNone);
    cls->CommitInstance(cls->CreateInstance(kNone), kNone);
    EXPECT_STATUS(cls->CommitInstance(first, kNone), kZEPStatusAlreadyExists);
    EXPECT_EQ(InstancePaths(*cls).size(), 2u);
    EXPECT_FALSE(ns_->GetInstance(first->GetPath(kNone), kNone));
  }
}

TEST_F(TMemoryClassInstanceTest, AddInstanceSetsAndCommits) {
  auto const disk = boost::dynamic_pointer_cast<TMemoryClass>(disk_);
  auto const instance = disk->AddInstance({{"id", 1}, {"NAME", "sda"}});
  EXPECT_EQ(instance->Get("Name").ToString(), "sda");
  EXPECT_EQ(ns_->GetInstance(instance->GetPath(kNone), kNone), instance);
}

// ---- Methods ----

TEST_F(TMemoryClassTest, MethodDeclarationsAreThoseOfTheClassItselfInTheirOrder) {
  auto const reset = disk_->AddMethodDecl("Reset", TType::kCIMTypeUint32, kNone);
  disk_->AddMethodDecl("Erase", TType::kCIMTypeBoolean, kNone);
  ssd_->AddMethodDecl("reset", TType::kCIMTypeUint32, kNone);  // overrides

  EXPECT_THAT(Names(*disk_, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset", "Erase"));
  EXPECT_THAT(Names(*ssd_, &ICIMClass::EnumerateMethodDecls), ElementsAre("reset"));
  EXPECT_EQ(VisitsUntilSecond(*disk_, &ICIMClass::EnumerateMethodDecls), 2);
  EXPECT_EQ(reset->GetReturnType(kNone), TType::kCIMTypeUint32);
  EXPECT_EQ(reset->GetOwner(kNone).lock(), disk_);
}

TEST_F(TMemoryClassTest, MethodDeclarationIsRefusedWithItsReason) {
  disk_->AddMethodDecl("Reset", TType::kCIMTypeUint32, kNone);
  struct {
    char const* name;
    TType type;
    EZEPStatusCode status;
  } const rows[] = {
      {"RESET", TType::kCIMTypeUint8, kZEPStatusAlreadyExists},
      {"A", TType::kCIMTypeInvalid, kZEPStatusTypeMismatch},
      {"A", TMemoryType("uint8[]").GetType(), kZEPStatusTypeMismatch},
      {"", TType::kCIMTypeUint32, kZEPStatusInvalidCIMName},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_STATUS(disk_->AddMethodDecl(row.name, row.type, kNone), row.status);
  }
  EXPECT_THAT(Names(*disk_, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset"));
}

}  // namespace
}  // namespace NQRVZEP20
