// SPDX-License-Identifier: Apache-2.0
#include "TMemoryNamespace.h"

#include "Collect.h"

#include <functional>

namespace NQRVZEP20 {
namespace {

// ---- Classes ----

TEST(TMemoryNamespaceTest, HasItsNameAndStartsEmpty) {
  auto const ns = NewNamespace();
  EXPECT_EQ(ns->GetName(kNone), "root/test");
  EXPECT_THAT(ClassNames(*ns), IsEmpty());
  EXPECT_THAT(Names(*ns, &ICIMNamespace::EnumerateQualifierDecls), IsEmpty());
}

TEST(TMemoryNamespaceTest, ClassIsFoundInAnyCaseAndKeepsItsSpelling) {
  auto const ns = NewNamespace();
  auto const created = ns->CreateClass(nullptr, "X_Disk", kNone);
  for (char const* name : {"X_Disk", "x_disk", "X_DISK"}) {
    SCOPED_TRACE(name);
    EXPECT_EQ(ns->GetClass(name, kNone), created);
    EXPECT_EQ(ns->GetClass(name, kNone)->GetName(kNone), "X_Disk");
  }
}

TEST(TMemoryNamespaceTest, MissingClassIsNotFound) {
  auto const ns = NewNamespace();
  ns->CreateClass(nullptr, "X_Disk", kNone);
  for (char const* name : {"X_Dis", "X_Disks", "", "no name"}) {
    SCOPED_TRACE(name);
    EXPECT_STATUS(ns->GetClass(name, kNone), kZEPStatusNotFound);
  }
}

TEST(TMemoryNamespaceTest, SecondClassOfANameIsRefusedInAnyCase) {
  auto const ns = NewNamespace();
  ns->CreateClass(nullptr, "X_Disk", kNone);
  EXPECT_STATUS(ns->CreateClass(nullptr, "X_Disk", kNone), kZEPStatusAlreadyExists);
  EXPECT_STATUS(ns->CreateClass(nullptr, "x_DISK", kNone), kZEPStatusAlreadyExists);
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_Disk"));
}

TEST(TMemoryNamespaceTest, ClassNeedsACIMName) {
  auto const ns = NewNamespace();
  for (char const* name : {"", "1X", "X Disk", "X-Disk", "X.Disk"}) {
    SCOPED_TRACE(name);
    EXPECT_STATUS(ns->CreateClass(nullptr, name, kNone), kZEPStatusInvalidCIMName);
  }
  EXPECT_THAT(ClassNames(*ns), IsEmpty());
}

TEST(TMemoryNamespaceTest, SuperclassOfAnotherNamespaceIsRefused) {
  auto const ns = NewNamespace();
  auto const other = NewNamespace();
  auto const stranger = other->CreateClass(nullptr, "X_Device", kNone);
  EXPECT_STATUS(ns->CreateClass(stranger, "X_Disk", kNone), kZEPStatusInvalidClass);

  ns->CreateClass(nullptr, "X_Device", kNone);  // of the same name, but not the same class
  EXPECT_STATUS(ns->CreateClass(stranger, "X_Disk", kNone), kZEPStatusInvalidClass);
  EXPECT_STATUS(ns->GetClass("X_Disk", kNone), kZEPStatusNotFound);
  EXPECT_THAT(SubClassNames(*stranger), IsEmpty());
}

TEST(TMemoryNamespaceTest, NamespaceEnumeratesRootClassesInTheOrderOfCreation) {
  auto const ns = NewNamespace();
  auto const z = ns->CreateClass(nullptr, "Z", kNone);
  ns->CreateClass(nullptr, "A", kNone);
  ns->CreateClass(z, "Below", kNone);
  ns->CreateClass(nullptr, "M", kNone);
  EXPECT_THAT(ClassNames(*ns), ElementsAre("Z", "A", "M"));
  EXPECT_EQ(VisitsUntilSecond(*ns, &ICIMNamespace::EnumerateClasses), 2);
}

// Classes on nine levels, each with two or three subclasses, created level by level.
void DefineTree(ICIMNamespace& ns, int depth, std::vector<std::string>& created) {
  std::vector<boost::shared_ptr<ICIMClass>> level{nullptr};
  for (int d = 1; d <= depth; ++d) {
    std::vector<boost::shared_ptr<ICIMClass>> next;
    for (auto const& superClass : level)
      for (int i = 0; i < (d == 1 ? 3 : 2); ++i) {
        created.push_back("L" + std::to_string(d) + "_" + std::to_string(next.size()));
        next.push_back(ns.CreateClass(superClass, created.back(), kNone));
      }
    level = next;
  }
}

TEST(TMemoryNamespaceTest, RootClassesAndTheirSubclassesAreEveryClassOnceSuperclassFirst) {
  auto const ns = NewNamespace();
  std::vector<std::string> created;
  DefineTree(*ns, 9, created);
  ASSERT_EQ(created.size(), 3u * ((1u << 9) - 1));

  std::set<std::string> visited;
  auto const visit = [&](boost::shared_ptr<ICIMClass> const& cls) {
    EXPECT_TRUE(visited.insert(cls->GetName(kNone)).second) << cls->GetName(kNone) << " came twice";
    if (!cls->IsRootClass(kNone)) {
      EXPECT_TRUE(visited.count(cls->GetSuperClass(kNone)->GetName(kNone))) << cls->GetName(kNone) << " came first";
    }
    return true;
  };
  ns->EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> const& root) {
        visit(root);
        root->EnumerateSubClasses(visit, kNone);
        return true;
      },
      kNone);
  EXPECT_EQ(visited, std::set<std::string>(created.begin(), created.end()));
}

TEST(TMemoryNamespaceTest, SubclassesComeDepthFirstAndSiblingsInTheOrderOfCreation) {
  auto const ns = NewNamespace();
  auto const root = ns->CreateClass(nullptr, "Root", kNone);
  auto const b = ns->CreateClass(root, "B", kNone);
  auto const a = ns->CreateClass(root, "A", kNone);
  ns->CreateClass(a, "A2", kNone);
  ns->CreateClass(b, "B1", kNone);
  ns->CreateClass(a, "A1", kNone);
  EXPECT_THAT(SubClassNames(*root), ElementsAre("B", "B1", "A", "A2", "A1"));
  EXPECT_THAT(SubClassNames(*a), ElementsAre("A2", "A1"));
  EXPECT_EQ(VisitsUntilSecond(*root, &ICIMClass::EnumerateSubClasses), 2);
}

TEST(TMemoryNamespaceTest, VeryDeepTreeIsUsedAndFreed) {
  auto const ns = NewNamespace();
  ns->DefineClass("C0").Association().Key("Id", "uint32");
  boost::shared_ptr<ICIMClass> last = ns->GetClass("C0", kNone);
  for (int i = 1; i < 20000; ++i) last = ns->CreateClass(last, "C" + std::to_string(i), kNone);
  auto const id = last->AddPropertyDecl("Id", NullOf("uint32"), kNone);
  EXPECT_EQ(SubClassNames(*ns->GetClass("C0", kNone)).size(), 19999u);
  EXPECT_TRUE(last->GetClassFlag(kNone));
  EXPECT_TRUE(id->IsKey(kNone));
  EXPECT_THAT(Names(*last->CreateInstance(kNone), &ICIMInstance::EnumerateProperties), ElementsAre("Id"));
}

// ---- Qualifier declarations ----

TEST(TMemoryNamespaceTest, QualifierDeclarationsAreEnumeratedInTheOrderOfCreation) {
  auto const ns = NewNamespace();
  ns->CreateQualifierDecl("Zeta", NullOf("string"), ICIMQualifierDecl::kScopeAny, 0, kNone);
  auto const alpha = ns->CreateQualifierDecl("Alpha", NullOf("boolean"), ICIMQualifierDecl::kScopeAny, 0, kNone);
  EXPECT_THAT(Names(*ns, &ICIMNamespace::EnumerateQualifierDecls), ElementsAre("Zeta", "Alpha"));
  EXPECT_EQ(VisitsUntilSecond(*ns, &ICIMNamespace::EnumerateQualifierDecls), 2);
  EXPECT_EQ(ns->GetQualifierDecl("ALPHA", kNone), alpha);
  EXPECT_FALSE(ns->GetQualifierDecl("Beta", kNone));
}

TEST(TMemoryNamespaceTest, QualifierDeclarationIsRefusedWithItsReason) {
  auto const ns = NewNamespace();
  ns->CreateQualifierDecl("Key", TCIMValue(false), 0, 0, kNone);
  struct {
    char const* fName;
    TCIMValue fDefaultValue;
    EZEPStatusCode fStatus;
  } const rows[] = {
      {"KEY", TCIMValue(false), kZEPStatusAlreadyExists},
      {"", TCIMValue(false), kZEPStatusInvalidCIMName},
      {"a b", TCIMValue(false), kZEPStatusInvalidCIMName},
      {"A", TCIMValue(), kZEPStatusTypeMismatch},
      {"A", NullOf("reference"), kZEPStatusTypeMismatch},
      {"A", NullOf("reference[]"), kZEPStatusTypeMismatch},
      {"A", TCIMValue(TType::kCIMTypeArrayFlag, 0), kZEPStatusTypeMismatch},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    EXPECT_STATUS(ns->CreateQualifierDecl(row.fName, row.fDefaultValue, 0, 0, kNone), row.fStatus);
  }
  EXPECT_THAT(Names(*ns, &ICIMNamespace::EnumerateQualifierDecls), ElementsAre("Key"));
}

// ---- Instances by object path ----

class TMemoryNamespacePathTest : public testing::Test {
protected:
  TMemoryNamespacePathTest() {
    fNs->DefineClass("X_Device").Key("Id", "uint32").Key("Bus", "string").Property("Name", "string");
    fNs->DefineClass("X_Disk", "X_Device").Property("Size", "uint64");
    fDisk = fNs->AddInstance("X_Disk", {{"Id", 5}, {"Bus", "sata"}, {"Name", "sda"}});
    fDevice = fNs->AddInstance("X_Device", {{"Id", 6}, {"Bus", "sata"}});
  }

  boost::shared_ptr<ICIMInstance> Find(char const* path) {
    return fNs->GetInstance(TCIMReference(fNs, std::string("ns:") + path, kNone), kNone);
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  boost::shared_ptr<TMemoryInstance> fDisk, fDevice;
};

TEST_F(TMemoryNamespacePathTest, InstanceIsFoundUnderItsOwnClassAndAllItsKeys) {
  EXPECT_EQ(fDisk->GetPath(kNone).GetPath(), "X_Disk.Bus=\"sata\",Id=\"5\"");
  EXPECT_EQ(fNs->GetInstance(fDisk->GetPath(kNone), kNone), fDisk);
  struct {
    char const* fPath;
    bool fFinds;
  } const rows[] = {
      {"X_Disk.Bus=\"sata\",Id=\"5\"", true},
      {"X_Disk.Id=\"5\",Bus=\"sata\"", true},
      {"x_DISK.ID=\"5\",bus=\"sata\"", true},
      {"X_Disk.Bus=\"SATA\",Id=\"5\"", false},
      {"X_Disk.Bus=\"sata\",Id=\"6\"", false},
      {"X_Disk.Id=\"5\"", false},
      {"X_Disk.Bus=\"sata\",Id=\"5\",Name=\"sda\"", false},
      {"X_Device.Bus=\"sata\",Id=\"5\"", false},
      {"X_Disk.Bus=\"sata\",Id=\"05\"", true},  // read as the number 5
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fPath);
    EXPECT_EQ(Find(row.fPath), row.fFinds ? fDisk : nullptr);
  }
}

TEST_F(TMemoryNamespacePathTest, SuperclassPathFindsInstancesOfTheSuperclassItselfOnly) {
  EXPECT_EQ(Find("X_Device.Bus=\"sata\",Id=\"6\""), fDevice);
  EXPECT_EQ(Find("X_Disk.Bus=\"sata\",Id=\"6\""), nullptr);
}

TEST_F(TMemoryNamespacePathTest, PathWithoutClassOrKeysFindsNothing) {
  TCIMReference const empty(fNs, kNone);
  EXPECT_FALSE(fNs->GetInstance(empty, kNone));
  EXPECT_FALSE(Find("X_Disk"));
}

TEST_F(TMemoryNamespacePathTest, PathOfAnotherNamespaceFindsTheInstanceByItsNames) {
  auto const other = NewNamespace();
  other->DefineClass("x_disk").Key("ID", "uint32").Key("BUS", "string");
  other->DefineClass("X_Tape").Key("Id", "uint32");
  TCIMReference const path(other, "ns:X_Disk.Id=\"5\",Bus=\"sata\"", kNone);
  EXPECT_EQ(fNs->GetInstance(path, kNone), fDisk);
  EXPECT_FALSE(fNs->GetInstance(TCIMReference(other, "ns:X_Tape.Id=\"5\"", kNone), kNone));
}

TEST_F(TMemoryNamespacePathTest, ReferenceResolvesToTheInstance) {
  TCIMReference const path(fNs, "ns:X_Disk.Bus=\"sata\",Id=\"5\"", kNone);
  EXPECT_EQ(path.GetCIMElement(false), fDisk);
  EXPECT_EQ(path.GetCIMElement(true), fNs->GetClass("X_Disk", kNone));
  TCIMReference const missing(fNs, "ns:X_Disk.Bus=\"sata\",Id=\"7\"", kNone);
  EXPECT_STATUS(missing.GetCIMElement(false), kZEPStatusNotFound);
}

TEST_F(TMemoryNamespacePathTest, InstanceThatIsNotCommittedIsNotFound) {
  auto const instance = fNs->GetClass("X_Disk", kNone)->CreateInstance(kNone);
  instance->GetProperty("Id", kNone)->SetValue(9u, kNone);
  instance->GetProperty("Bus", kNone)->SetValue("sata", kNone);
  EXPECT_FALSE(fNs->GetInstance(instance->GetPath(kNone), kNone));
}

TEST_F(TMemoryNamespacePathTest, NullKeyIsOmittedFromThePath) {
  auto const half = fNs->AddInstance("X_Disk", {{"Id", 8}});
  EXPECT_EQ(half->GetPath(kNone).GetPath(), "X_Disk.Id=\"8\"");
  EXPECT_EQ(Find("X_Disk.Id=\"8\""), half);

  TCIMReference withNull(fNs, "ns:X_Disk.Id=\"8\"", kNone);
  withNull.AddKeyValue("Bus", NullOf("string"));
  EXPECT_EQ(fNs->GetInstance(withNull, kNone), half);
}

TEST_F(TMemoryNamespacePathTest, KeyValueThatLooksLikeTwoKeysIsOneKey) {
  fNs->DefineClass("X_Pair").Key("A", "string").Key("B", "string");
  auto const one = fNs->AddInstance("X_Pair", {{"A", "1\",B=\"2"}, {"B", "3"}});
  auto const two = fNs->AddInstance("X_Pair", {{"A", "1"}, {"B", "2\",B=\"3"}});
  auto const three = fNs->AddInstance("X_Pair", {{"A", std::string("1\0b=1:2", 7)}, {"B", ""}});
  for (auto const& instance : {one, two, three}) EXPECT_EQ(fNs->GetInstance(instance->GetPath(kNone), kNone), instance);
}

TEST_F(TMemoryNamespacePathTest, KeysOfEachKindAreFoundByValue) {
  TCIMReference diskPath = fDisk->GetPath(kNone);
  TCIMReference devicePath = fDevice->GetPath(kNone);
  struct {
    char const* fType;
    TCIMValue fValue, fOther;
  } const rows[] = {
      {"boolean", TCIMValue(true), TCIMValue(false)},
      {"uint8", TCIMValue(static_cast<unsigned char>(65)), TCIMValue(static_cast<unsigned char>(66))},
      {"sint64", TCIMValue(-1L), TCIMValue(1L)},
      {"real32", TCIMValue(1.0000001f), TCIMValue(1.0000002f)},  // with the same printed text
      {"real64", TCIMValue(0.5), TCIMValue(0.25)},
      {"char16", TCIMValue(TCIMChar16(65)), TCIMValue(TCIMChar16(66))},
      {"string", TCIMValue("a"), TCIMValue("A")},
      {"datetime", TCIMValue(TCIMDateTime("20070315143000.000000+060")), TCIMValue(TCIMDateTime("20070315143000.000001+060"))},
      {"reference", TCIMValue(diskPath), TCIMValue(devicePath)},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fType);
    std::string const name = std::string("X_By_") + row.fType;
    fNs->DefineClass(name).Key("K", row.fType);
    auto const instance = fNs->AddInstance(name, {{"K", row.fValue}});
    auto const other = fNs->AddInstance(name, {{"K", row.fOther}});
    EXPECT_EQ(fNs->GetInstance(instance->GetPath(kNone), kNone), instance);
    EXPECT_EQ(fNs->GetInstance(other->GetPath(kNone), kNone), other);
    EXPECT_STATUS(fNs->AddInstance(name, {{"K", row.fValue}}), kZEPStatusAlreadyExists);
  }
}

TEST_F(TMemoryNamespacePathTest, Char16KeyIsNotFoundByAPathReadFromText) {
  fNs->DefineClass("X_Drive").Key("Letter", "char16");
  auto const drive = fNs->AddInstance("X_Drive", {{"Letter", TCIMChar16(67)}});
  EXPECT_EQ(fNs->GetInstance(drive->GetPath(kNone), kNone), drive);
  EXPECT_FALSE(Find("X_Drive.Letter=\"67\""));  // a char16 that is read from text is NULL
}

TEST_F(TMemoryNamespacePathTest, DatetimesOfOneInstantInTwoZonesAreDifferentKeys) {
  fNs->DefineClass("X_Event").Key("Time", "datetime");
  fNs->AddInstance("X_Event", {{"Time", TCIMDateTime("20070315140000.000000+060")}});
  EXPECT_NO_THROW(fNs->AddInstance("X_Event", {{"Time", TCIMDateTime("20070315130000.000000+000")}}));
}

TEST_F(TMemoryNamespacePathTest, ReferenceKeyIsComparedByItsNamesInAnyCase) {
  fNs->DefineClass("X_Uses").Association().KeyReference("What", "X_Device");
  auto const uses = fNs->AddInstance("X_Uses", {{"What", fDisk->GetReference()}});

  TCIMReference what(fNs, "ns:x_disk.ID=\"5\",BUS=\"sata\"", kNone);
  TCIMReference path(fNs, "X_Uses", kNone);
  path.AddKeyValue("what", TCIMValue(what));
  EXPECT_EQ(fNs->GetInstance(path, kNone), uses);
}

// ---- Filling ----

TEST(TMemoryNamespaceTest, DefineClassCreatesASubclass) {
  auto const ns = NewNamespace();
  auto const device = ns->DefineClass("X_Device").Class();
  auto const disk = ns->DefineClass("X_Disk", "x_device").Class();
  EXPECT_EQ(ns->GetClass("X_Disk", kNone), disk);
  EXPECT_EQ(disk->GetSuperClass(kNone), device);
  EXPECT_TRUE(device->IsRootClass(kNone));
}

std::vector<std::string> ErrorsOf(std::function<void()> const& action) {
  std::vector<std::string> errors;
  OnNewThread([&] {
    TRootObject::GetCoreLogger()->ClearLog();
    action();
    errors = LoggedMessages();
  });
  return errors;
}

TEST(TMemoryNamespaceTest, RefusalIsLoggedAndTravelsWithTheFailure) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Disk").Key("Id", "uint32");
  ns->AddInstance("X_Disk", {{"Id", 5}});
  ns->DefineClass("X_Idea", "X_Disk").Abstract();
  struct {
    std::function<void()> fAction;
    EZEPStatusCode fStatus;
    char const* fMessage;
  } const rows[] = {
      {[&] { ns->DefineClass("x_disk"); }, kZEPStatusAlreadyExists, "x_disk refused: kZEPStatusAlreadyExists"},
      {[&] { ns->DefineClass("X-Disk"); }, kZEPStatusInvalidCIMName, "X-Disk refused: kZEPStatusInvalidCIMName"},
      {[&] { ns->DefineClass("X_Ssd", "X_Disc"); }, kZEPStatusNotFound, "X_Ssd refused: kZEPStatusNotFound"},
      {[&] { ns->AddInstance("X_Disc", {}); }, kZEPStatusNotFound, "X_Disc refused: kZEPStatusNotFound"},
      {[&] { ns->AddInstance("X_Idea", {}); }, kZEPStatusInvalidClass, "X_Idea refused: kZEPStatusInvalidClass"},
      {[&] {
         ns->AddInstance("X_Disk", {{"Name", "a"}});
       },
       kZEPStatusNotFound, "X_Disk.Name refused: kZEPStatusNotFound"},
      {[&] {
         ns->AddInstance("X_Disk", {{"Id", "a"}});
       },
       kZEPStatusTypeMismatch, "X_Disk.Id refused: kZEPStatusTypeMismatch: the value is a string instead of a uint32"},
      {[&] {
         ns->AddInstance("X_Disk", {{"id", 5}});
       },
       kZEPStatusAlreadyExists, "X_Disk refused: kZEPStatusAlreadyExists"},
  };
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fMessage);
    EXPECT_THAT(ErrorsOf([&] { EXPECT_STATUS(row.fAction(), row.fStatus); }), ElementsAre(row.fMessage));
    EXPECT_EQ(ReasonOf(row.fAction), row.fMessage);
  }
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_Disk"));
  EXPECT_THAT(InstancePaths(*ns->GetClass("X_Disk", kNone)), ElementsAre("X_Disk.Id=\"5\""));
}

TEST(TMemoryNamespaceTest, StandardQualifiersAreDeclaredOnceAndReplaceNoOthers) {
  auto const ns = NewNamespace();
  auto const own = ns->CreateQualifierDecl("DESCRIPTION", TCIMValue("mine"), 0, 0, kNone);
  ns->DeclareStandardQualifiers();
  auto const names = Names(*ns, &ICIMNamespace::EnumerateQualifierDecls);
  EXPECT_EQ(ns->GetQualifierDecl("Description", kNone), own);

  ns->DeclareStandardQualifiers();
  ns->DefineClass("X_Disk");
  EXPECT_EQ(Names(*ns, &ICIMNamespace::EnumerateQualifierDecls), names);
}

// ---- Lifetime ----

class TMemoryNamespaceLifeTest : public testing::Test {
protected:
  TMemoryNamespaceLifeTest() {
    fNs->DefineClass("X_Node").Key("Id", "uint32").Reference("Next", "X_Node").Property("Others", "reference[]");
    fNs->DefineClass("X_Leaf", "X_Node").Method("Cut", "uint32").In("Deep", "boolean");
    fNode = fNs->AddInstance("X_Node", {{"Id", 1}});
    fClass = fNs->GetClass("X_Node", kNone);
  }

  boost::shared_ptr<TMemoryNamespace> fNs = NewNamespace();
  boost::shared_ptr<TMemoryInstance> fNode;
  boost::shared_ptr<ICIMClass> fClass;
};

TEST_F(TMemoryNamespaceLifeTest, EverythingIsFreedWithTheNamespace) {
  boost::weak_ptr<ICIMNamespace> const ns = fNs;
  boost::weak_ptr<ICIMClass> const cls = fClass;
  boost::weak_ptr<ICIMClass> const leaf = fNs->GetClass("X_Leaf", kNone);
  boost::weak_ptr<ICIMInstance> const instance = fNode;
  boost::weak_ptr<ICIMPropertyDecl const> const property = fClass->GetPropertyDecl("Id", kNone);
  boost::weak_ptr<ICIMQualifierDecl> const qualifier = fNs->GetQualifierDecl("Key", kNone);
  fClass.reset();
  fNode.reset();
  ASSERT_EQ(ns.use_count(), 1);
  fNs.reset();
  EXPECT_TRUE(ns.expired());
  EXPECT_TRUE(cls.expired());
  EXPECT_TRUE(leaf.expired());
  EXPECT_TRUE(instance.expired());
  EXPECT_TRUE(property.expired());
  EXPECT_TRUE(qualifier.expired());
}

TEST_F(TMemoryNamespaceLifeTest, CirclesOfReferencesAreFreedToo) {
  TCIMReference path = fNode->GetPath(kNone);
  path.GetCIMElement(false);  // afterwards it owns the instance
  fNode->Set("Next", path);
  fNode->Set("Others", TCIMValue(TType::kCIMTypeReference, 0, {TCIMValue(path)}));
  path.Clear();

  boost::weak_ptr<ICIMInstance> const instance = fNode;
  boost::weak_ptr<ICIMClass> const cls = fClass;
  fClass.reset();
  fNode.reset();
  fNs.reset();
  EXPECT_TRUE(instance.expired());
  EXPECT_TRUE(cls.expired());
}

TEST_F(TMemoryNamespaceLifeTest, ClassThatOutlivesItsNamespaceIsEmpty) {
  auto const leaf = fNs->GetClass("X_Leaf", kNone);
  auto const method = All(*leaf, &ICIMClass::EnumerateMethodDecls).front();
  auto const parameter = All(*method, &ICIMMethodDecl::EnumerateParameterDecls).front();
  auto const declaration = fClass->GetPropertyDecl("Id", kNone);
  fNode.reset();
  fClass.reset();
  fNs.reset();

  EXPECT_EQ(leaf->GetName(kNone), "X_Leaf");
  EXPECT_FALSE(leaf->IsRootClass(kNone));
  EXPECT_THROW(leaf->GetNamespace(kNone), boost::bad_weak_ptr);
  EXPECT_THROW(leaf->GetSuperClass(kNone), boost::bad_weak_ptr);
  EXPECT_THROW(leaf->GetPropertyDecl("Id", kNone), boost::bad_weak_ptr);
  EXPECT_THAT(Names(*leaf, &ICIMClass::EnumerateMethodDecls), IsEmpty());

  EXPECT_EQ(method->GetOwner(kNone).lock(), leaf);
  EXPECT_EQ(parameter->GetMethod(kNone).lock(), method);
  EXPECT_EQ(declaration->GetName(kNone), "Id");
  EXPECT_TRUE(declaration->GetOwner(kNone).expired());
}

TEST_F(TMemoryNamespaceLifeTest, InstanceThatOutlivesItsNamespaceKeepsItsValuesExceptReferences) {
  fNode->Set("Next", fNode->GetReference());
  fClass.reset();
  fNs.reset();
  EXPECT_EQ(fNode->Get("Id").ToString(), "1");
  EXPECT_TRUE(fNode->Get("Next").IsNull());
  EXPECT_THROW(fNode->GetPath(kNone), boost::bad_weak_ptr);
}

TEST_F(TMemoryNamespaceLifeTest, NamespaceMayBeDestroyedWhileItIsEnumerated) {
  fNs->AddInstance("X_Node", {{"Id", 2}});
  int visits = 0;
  fClass->EnumerateInstances(
      [&](boost::shared_ptr<ICIMInstance> const&) {
        fNs.reset();
        return ++visits < 10;
      },
      kNone);
  EXPECT_EQ(visits, 1);
}

}  // namespace
}  // namespace NQRVZEP20
