// SPDX-License-Identifier: Apache-2.0
#include "TMemoryQualifier.h"

#include "Collect.h"
#include "ICIMQualifierDecl.h"

namespace NQRVZEP20 {
namespace {

TEST(TMemoryQualifierDeclTest, DeclarationHasItsNameTypeScopeFlavorAndDefault) {
  auto const ns = NewNamespace();
  TCIMValue const defaultValue(TType::kCIMTypeString, 4, {TCIMValue("a")});
  auto const decl =
      ns->CreateQualifierDecl("Words", defaultValue, ICIMQualifierDecl::kScopeClass | ICIMQualifierDecl::kScopeMethod,
                              ICIMQualifierDecl::kFlavorTranslatable, kNone);
  EXPECT_EQ(decl->GetName(kNone), "Words");
  EXPECT_EQ(decl->GetType(kNone), 29);
  EXPECT_EQ(decl->GetScope(kNone), 0x21u);
  EXPECT_EQ(decl->GetFlavor(kNone), 0x04u);
  EXPECT_EQ(decl->GetDefaultValue(kNone), defaultValue);
  EXPECT_EQ(decl->GetDefaultValue(kNone).GetMaxArraySize(), 4u);
}

// The qualifiers of every kind of element.
class TMemoryQualifierTest : public testing::TestWithParam<char const*> {
protected:
  TMemoryQualifierTest() {
    fNs->DefineClass("X_Disk").Property("Name", "string").Method("Reset", "uint32").In("Force", "boolean");
    fUnits = fNs->CreateQualifierDecl("Unit", NullOf("string"), ICIMQualifierDecl::kScopeAny, 0, kNone);
    fSize = fNs->CreateQualifierDecl("Size", NullOf("uint32"), ICIMQualifierDecl::kScopeAny, 0, kNone);
    fElement = Element(GetParam());
  }

  boost::shared_ptr<ICIMNamedElement> Element(std::string const& kind) {
    auto const cls = fNs->GetClass("X_Disk", kNone);
    auto const method = All(*cls, &ICIMClass::EnumerateMethodDecls).front();
    if (kind == "class") return cls;
    if (kind == "property") return All(*cls, &ICIMClass::EnumeratePropertyDecls).front();
    if (kind == "method") return method;
    return All(*method, &ICIMMethodDecl::EnumerateParameterDecls).front();
  }

  std::vector<std::string> QualifierNames() {
    std::vector<std::string> names = Names(*fElement, &ICIMNamedElement::EnumerateQualifiers);
    if (!names.empty() && names.front() == "In") names.erase(names.begin());  // the parameter has it from the builder
    return names;
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
  boost::shared_ptr<ICIMQualifierDecl> fUnits, fSize;
  boost::shared_ptr<ICIMNamedElement> fElement;
};

INSTANTIATE_TEST_SUITE_P(Elements, TMemoryQualifierTest, testing::Values("class", "property", "method", "parameter"),
                         [](auto const& test) { return std::string(test.param); });

TEST_P(TMemoryQualifierTest, QualifierHasItsNameValueFlavorAndDeclaration) {
  auto const qualifier = fElement->AddQualifier(fUnits, "bytes", ICIMQualifierDecl::kFlavorToSubclass, kNone);
  EXPECT_EQ(qualifier->GetName(kNone), "Unit");
  EXPECT_EQ(qualifier->GetValue(kNone).ToString(), "bytes");
  EXPECT_EQ(qualifier->GetFlavor(kNone), 0x02u);
  EXPECT_EQ(qualifier->GetDeclaration(kNone), fUnits);
  EXPECT_EQ(qualifier->GetOwner(kNone).lock(), fElement);
}

TEST_P(TMemoryQualifierTest, QualifiersComeInTheOrderOfAdditionAndAreFoundInAnyCase) {
  auto const size = fElement->AddQualifier(fSize, NullOf("uint32"), 0, kNone);
  fElement->AddQualifier(fUnits, "bytes", 0, kNone);
  EXPECT_THAT(QualifierNames(), ElementsAre("Size", "Unit"));
  EXPECT_EQ(VisitsUntilSecond(*fElement, &ICIMNamedElement::EnumerateQualifiers), 2);
  EXPECT_EQ(fElement->GetQualifier("SIZE", kNone), size);
  EXPECT_TRUE(size->GetValue(kNone).IsNull());
  EXPECT_FALSE(fElement->GetQualifier("Other", kNone));
}

TEST_P(TMemoryQualifierTest, QualifierIsRefusedWithItsReason) {
  auto const other = NewNamespace();
  auto const stranger = other->CreateQualifierDecl("Unit", NullOf("string"), 0, 0, kNone);
  auto const unknown = other->CreateQualifierDecl("Unknown", NullOf("string"), 0, 0, kNone);
  fElement->AddQualifier(fUnits, "bytes", 0, kNone);
  EXPECT_STATUS(fElement->AddQualifier(fUnits, "bytes", 0, kNone), kZEPStatusAlreadyExists);
  EXPECT_STATUS(fElement->AddQualifier(fSize, "5", 0, kNone), kZEPStatusTypeMismatch);
  EXPECT_STATUS(fElement->AddQualifier(fSize, TCIMValue(), 0, kNone), kZEPStatusTypeMismatch);
  EXPECT_STATUS(fElement->AddQualifier(stranger, "bytes", 0, kNone), kZEPStatusNotFound);
  EXPECT_STATUS(fElement->AddQualifier(unknown, "bytes", 0, kNone), kZEPStatusNotFound);
  EXPECT_STATUS(fElement->AddQualifier(nullptr, "bytes", 0, kNone), kZEPStatusNotFound);
  EXPECT_THAT(QualifierNames(), ElementsAre("Unit"));
}

TEST(TMemoryQualifierInheritanceTest, QualifierOfASuperclassIsNotItsSubclasses) {
  auto const ns = NewNamespace();
  ns->DefineClass("X_Device").Description("A device.").Key("Id", "uint32");
  ns->DefineClass("X_Disk", "X_Device").Property("Id", "uint32").Override();
  auto const disk = ns->GetClass("X_Disk", kNone);
  EXPECT_FALSE(disk->GetQualifier("Description", kNone));
  EXPECT_FALSE(disk->GetPropertyDecl("Id", kNone)->GetQualifier("Key", kNone));
}

TEST(TMemoryQualifierInheritanceTest, ElementThatOutlivesItsNamespaceRefusesQualifiers) {
  auto ns = NewNamespace();
  auto const cls = ns->CreateClass(nullptr, "X_Disk", kNone);
  auto const decl = ns->CreateQualifierDecl("Unit", NullOf("string"), 0, 0, kNone);
  ns.reset();
  EXPECT_THROW(cls->AddQualifier(decl, "bytes", 0, kNone), boost::bad_weak_ptr);
}

}  // namespace
}  // namespace NQRVZEP20
