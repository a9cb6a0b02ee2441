// SPDX-License-Identifier: Apache-2.0
#include "TMemoryClassBuilder.h"

#include "Collect.h"
#include "ICIMQualifierDecl.h"

#include <functional>

namespace NQRVZEP20 {
namespace {

class TMemoryClassBuilderTest : public testing::Test {
protected:
  // "Key(true) MaxLen(64)": the qualifiers of an element with their values.
  static std::string Qualifiers(ICIMNamedElement const& element) {
    std::string text;
    for (auto const& qualifier : All(element, &ICIMNamedElement::EnumerateQualifiers))
      text += (text.empty() ? "" : " ") + qualifier->GetName(kNone) + "(" + qualifier->GetValue(kNone).ToString() + ")";
    return text;
  }

  boost::shared_ptr<TMemoryNamespace> const fNs = NewNamespace();
};

TEST_F(TMemoryClassBuilderTest, PropertiesAreDescribedInTheirOrder) {
  auto const cls = fNs->DefineClass("X_Disk")
                       .Key("Id", "uint32")
                       .Property("Name", "string")
                       .Property("Sectors", "uint16", 512)
                       .Property("Tags", "string[4]", TCIMValue(TType::kCIMTypeString, 0, {TCIMValue("a")}))
                       .Class();
  EXPECT_THAT(Names(*cls, &ICIMClass::EnumeratePropertyDecls), ElementsAre("Id", "Name", "Sectors", "Tags"));
  EXPECT_TRUE(cls->GetPropertyDecl("Id", kNone)->IsKey(kNone));
  EXPECT_FALSE(cls->GetPropertyDecl("Name", kNone)->IsKey(kNone));
  EXPECT_TRUE(cls->GetPropertyDecl("Name", kNone)->GetDefaultValue(kNone).IsNull());
  EXPECT_EQ(cls->GetPropertyDecl("Sectors", kNone)->GetType(kNone), TType::kCIMTypeUint16);
  EXPECT_EQ(cls->GetPropertyDecl("Sectors", kNone)->GetDefaultValue(kNone).ToString(), "512");
  EXPECT_EQ(cls->GetPropertyDecl("Tags", kNone)->GetDefaultValue(kNone).GetMaxArraySize(), 4u);
  EXPECT_EQ(cls->GetPropertyDecl("Tags", kNone)->GetDefaultValue(kNone).ToString(), "{ a }");
}

TEST_F(TMemoryClassBuilderTest, ReferencesToOtherClassesAndToTheClassItselfAreDescribed) {
  auto const disk = fNs->DefineClass("X_Disk").Class();
  auto const link = fNs->DefineClass("X_Link").Association().KeyReference("Disk", "X_Disk").Reference("Other", "x_link").Class();
  EXPECT_TRUE(link->GetClassFlag(kNone));
  EXPECT_TRUE(link->GetPropertyDecl("Disk", kNone)->IsKey(kNone));
  EXPECT_TRUE(link->GetPropertyDecl("Disk", kNone)->GetDefaultValue(kNone).IsReference());
  EXPECT_EQ(link->GetPropertyDecl("Disk", kNone)->GetDefaultValue(kNone).GetReferencedClass(), disk);
  EXPECT_FALSE(link->GetPropertyDecl("Other", kNone)->IsKey(kNone));
  EXPECT_EQ(link->GetPropertyDecl("Other", kNone)->GetDefaultValue(kNone).GetReferencedClass(), link);
}

TEST_F(TMemoryClassBuilderTest, StaticPropertiesAreDescribed) {
  auto const cls = fNs->DefineClass("X_Disk").Static("Count", "uint16", 3).Class();
  auto const count = All(*cls, &ICIMClass::EnumerateStaticProperties).front();
  EXPECT_EQ(count->GetName(kNone), "Count");
  EXPECT_EQ(count->GetValue(kNone).GetType(), TType::kCIMTypeUint16);
  EXPECT_EQ(count->GetValue(kNone).ToString(), "3");
  EXPECT_EQ(Qualifiers(*cls->GetPropertyDecl("Count", kNone)), "Static(true)");
}

TEST_F(TMemoryClassBuilderTest, MethodsAndTheirParametersAreDescribed) {
  auto const cls = fNs->DefineClass("X_Disk")
                       .Method("Reset", "uint32")
                       .In("Force", "boolean")
                       .Out("Log", "string[8]")
                       .Method("Eject", "boolean")
                       .Class();
  EXPECT_THAT(Names(*cls, &ICIMClass::EnumerateMethodDecls), ElementsAre("Reset", "Eject"));
  auto const methods = All(*cls, &ICIMClass::EnumerateMethodDecls);
  auto const parameters = All(*methods[0], &ICIMMethodDecl::EnumerateParameterDecls);
  ASSERT_THAT(Names(*methods[0], &ICIMMethodDecl::EnumerateParameterDecls), ElementsAre("Force", "Log"));
  EXPECT_EQ(methods[0]->GetReturnType(kNone), TType::kCIMTypeUint32);
  EXPECT_EQ(Qualifiers(*parameters[0]), "In(true)");
  EXPECT_EQ(Qualifiers(*parameters[1]), "In(false) Out(true)");
  EXPECT_EQ(parameters[1]->GetType(kNone), 29);
  EXPECT_EQ(parameters[1]->GetMaxArraySize(kNone), 8u);
  EXPECT_THAT(Names(*methods[1], &ICIMMethodDecl::EnumerateParameterDecls), IsEmpty());
}

TEST_F(TMemoryClassBuilderTest, QualifierBelongsToTheElementDescribedLast) {
  fNs->DefineClass("X_Device").Property("State", "uint16");
  auto const cls = fNs->DefineClass("X_Disk", "X_Device")
                       .Abstract()
                       .Description("A disk.")
                       .Property("state", "uint16")
                       .Override()
                       .ValueMap({"0", "1"}, {"Unknown", "Ready"})
                       .Static("Count", "uint16", 3)
                       .Description("How many.")
                       .Key("Name", "string")
                       .Qualifier("MaxLen", 64)
                       .Method("Reset", "uint32")
                       .Description("Start anew.")
                       .In("Force", "boolean")
                       .Description("At once.")
                       .Class();
  auto const reset = All(*cls, &ICIMClass::EnumerateMethodDecls).front();
  EXPECT_EQ(Qualifiers(*cls), "Abstract(true) Description(A disk.)");
  EXPECT_EQ(Qualifiers(*cls->GetPropertyDecl("State", kNone)), "Override(state) ValueMap({ 0, 1 }) Values({ Unknown, Ready })");
  EXPECT_EQ(Qualifiers(*cls->GetPropertyDecl("Count", kNone)), "Static(true) Description(How many.)");
  EXPECT_EQ(Qualifiers(*cls->GetPropertyDecl("Name", kNone)), "Key(true) MaxLen(64)");
  EXPECT_EQ(Qualifiers(*reset), "Description(Start anew.)");
  EXPECT_EQ(Qualifiers(*All(*reset, &ICIMMethodDecl::EnumerateParameterDecls).front()), "In(true) Description(At once.)");
}

TEST_F(TMemoryClassBuilderTest, QualifierHasItsDeclaredFlavor) {
  auto const cls = fNs->DefineClass("X_Disk").Abstract().Description("A disk.").Class();
  EXPECT_EQ(cls->GetQualifier("Abstract", kNone)->GetFlavor(kNone), ICIMQualifierDecl::kFlavorEnableOverride);
  EXPECT_EQ(cls->GetQualifier("Description", kNone)->GetFlavor(kNone),
            ICIMQualifierDecl::kFlavorDefault | ICIMQualifierDecl::kFlavorTranslatable);
}

TEST_F(TMemoryClassBuilderTest, RefusalIsLoggedAndEarlierElementsRemain) {
  struct {
    std::function<void(TMemoryClassBuilder&)> fAction;
    EZEPStatusCode fStatus;
    char const* fMessage;
  } const rows[] = {
      {[](auto& cls) { cls.Property("Name", "text"); }, kZEPStatusTypeMismatch,
       "X_Disk.Name refused: kZEPStatusTypeMismatch: a type of that name does not exist"},
      {[](auto& cls) { cls.Property("Id", "uint8"); }, kZEPStatusAlreadyExists, "X_Disk.Id refused: kZEPStatusAlreadyExists"},
      {[](auto& cls) { cls.Property("N", "uint8", 256); }, kZEPStatusTypeMismatch,
       "X_Disk.N refused: kZEPStatusTypeMismatch: 256 is outside the range of uint8, 0 to 255"},
      {[](auto& cls) { cls.Key("a-b", "uint8"); }, kZEPStatusInvalidCIMName, "X_Disk.a-b refused: kZEPStatusInvalidCIMName"},
      {[](auto& cls) { cls.Reference("R", "X_Dsk"); }, kZEPStatusNotFound, "X_Disk.R refused: kZEPStatusNotFound"},
      {[](auto& cls) { cls.Static("S", "uint8", "a"); }, kZEPStatusTypeMismatch,
       "X_Disk.S refused: kZEPStatusTypeMismatch: the value is a string instead of a uint8"},
      {[](auto& cls) { cls.Method("M", "uint8[]"); }, kZEPStatusTypeMismatch, "X_Disk.M refused: kZEPStatusTypeMismatch"},
      {[](auto& cls) { cls.In("P", "uint8"); }, kZEPStatusInvalidOpSequence, "X_Disk.P refused: kZEPStatusInvalidOpSequence"},
      {[](auto& cls) { cls.Qualifier("Huh", true); }, kZEPStatusNotFound, "X_Disk.[Huh] refused: kZEPStatusNotFound"},
      {[](auto& cls) { cls.Qualifier("Units", 5); }, kZEPStatusTypeMismatch, "X_Disk.[Units] refused: kZEPStatusTypeMismatch"},
  };
  auto builder = fNs->DefineClass("X_Disk").Key("Id", "uint32");
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fMessage);
    std::vector<std::string> errors;
    OnNewThread([&] {
      TRootObject::GetCoreLogger()->ClearLog();
      EXPECT_STATUS(row.fAction(builder), row.fStatus);
      errors = LoggedMessages();
    });
    EXPECT_THAT(errors, ElementsAre(row.fMessage));
  }
  EXPECT_TRUE(builder.Class()->GetPropertyDecl("Id", kNone)->IsKey(kNone));
}

}  // namespace
}  // namespace NQRVZEP20
