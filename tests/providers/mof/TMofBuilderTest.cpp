// SPDX-License-Identifier: Apache-2.0
#include "tests/providers/mof/MofTexts.h"

namespace NQRVZEP20 {
namespace {

TEST(TMofBuilderTest, AQualifierDeclarationHasTypeDefaultScopeAndFlavor) {
  using Q = ICIMQualifierDecl;
  struct TRow {
    std::string fText;
    int fType;
    std::string fValue;
    unsigned int fScope, fFlavor;
  };
  for (TRow const& row : {
           TRow{"Qualifier Q : boolean = TRUE, Scope(any);", TType::kCIMTypeBoolean, "true", Q::kScopeAny, Q::kFlavorDefault},
           TRow{"QUALIFIER Q : STRING, SCOPE(Class, ASSOCIATION, indication), FLAVOR(disableoverride);", TType::kCIMTypeString,
                "NULL", Q::kScopeClass | Q::kScopeAssociation | Q::kScopeIndication, Q::kFlavorToSubclass},
           TRow{"qualifier Q : sint64 = -5, scope(property, reference), flavor(EnableOverride, Restricted);",
                TType::kCIMTypeSint64, "-5", Q::kScopeProperty | Q::kScopeReference, Q::kFlavorEnableOverride},
           TRow{"Qualifier Q : string[] = {\"a\", \"b\"}, Scope(method, parameter), Flavor(DisableOverride, Restricted, "
                "Translatable);",
                TType::kCIMTypeString | TType::kCIMTypeArrayFlag, "{ a, b }", Q::kScopeMethod | Q::kScopeParameter,
                Q::kFlavorTranslatable},
           TRow{"Qualifier Q : uint8[3], Scope(), Flavor(ToSubclass Translatable);",
                TType::kCIMTypeUint8 | TType::kCIMTypeArrayFlag, "NULL", 0, Q::kFlavorDefault | Q::kFlavorTranslatable},
       }) {
    SCOPED_TRACE(row.fText);
    auto const decl = Read(row.fText)->GetQualifierDecl("Q", kNone);
    EXPECT_EQ(decl->GetType(kNone), row.fType);
    TCIMValue const value = decl->GetDefaultValue(kNone);
    EXPECT_EQ(value.IsNull() ? "NULL" : value.ToString(), row.fValue);
    EXPECT_EQ(decl->GetScope(kNone), row.fScope);
    EXPECT_EQ(decl->GetFlavor(kNone), row.fFlavor);
  }
  EXPECT_EQ(Read("Qualifier Q : uint8[3], Scope(any);")->GetQualifierDecl("Q", kNone)->GetDefaultValue(kNone).GetMaxArraySize(),
            3u);
}

TEST(TMofBuilderTest, ClassesPropertiesAndReferencesAreDeclared) {
  auto const ns = Read(
      "[Abstract, Description(\"what\" \" it is\")] class X_A { [Key] uint32 Id; string Names[]; uint8 Bytes[16]; };\n"
      "class X_B : x_a { string P = \"d\"; };\n"
      "[Association] CLASS X_Link AS $L { [Key] X_A REF From; X_B ref To; };");
  EXPECT_THAT(ClassNames(*ns), ElementsAre("X_A", "X_Link"));
  EXPECT_THAT(SubClassNames(*ns->GetClass("X_A", kNone)), ElementsAre("X_B"));
  EXPECT_TRUE(ns->GetClass("X_A", kNone)->IsAbstract(kNone));
  EXPECT_FALSE(ns->GetClass("X_B", kNone)->IsAbstract(kNone));
  EXPECT_TRUE(ns->GetClass("X_Link", kNone)->GetClassFlag(kNone));
  EXPECT_EQ(ns->GetClass("X_A", kNone)->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "what it is");
  EXPECT_TRUE(Property(*ns, "X_B", "Id")->IsKey(kNone));
  EXPECT_EQ(Property(*ns, "X_A", "Names")->GetType(kNone), TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(Property(*ns, "X_A", "Names")->GetDefaultValue(kNone).GetMaxArraySize(), 0u);
  EXPECT_EQ(Property(*ns, "X_A", "Bytes")->GetDefaultValue(kNone).GetMaxArraySize(), 16u);
  EXPECT_EQ(Property(*ns, "X_B", "P")->GetDefaultValue(kNone).ToString(), "d");
  TCIMValue const to = Property(*ns, "X_Link", "To")->GetDefaultValue(kNone);
  EXPECT_TRUE(to.IsReference() && to.IsNull());
  EXPECT_EQ(to.GetReferencedClass(), ns->GetClass("X_B", kNone));
}

TEST(TMofBuilderTest, MethodsHaveParameters) {
  auto const ns = Read(
      "class X_A { uint32 Reset(); [Description(\"f\")] boolean Find([Description(\"n\")] string Names[8], X_A REF Where, "
      "X_A REF All[], datetime When); };");
  auto const methods = All(*ns->GetClass("X_A", kNone), &ICIMClass::EnumerateMethodDecls);
  ASSERT_EQ(methods.size(), 2u);
  EXPECT_THAT(Names(*methods[0], &ICIMMethodDecl::EnumerateParameterDecls), IsEmpty());
  EXPECT_EQ(methods[1]->GetReturnType(kNone), TType::kCIMTypeBoolean);
  EXPECT_EQ(methods[1]->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "f");
  auto const parameters = All(*methods[1], &ICIMMethodDecl::EnumerateParameterDecls);
  ASSERT_EQ(parameters.size(), 4u);
  EXPECT_EQ(parameters[0]->GetType(kNone), TType::kCIMTypeString | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[0]->GetMaxArraySize(kNone), 8u);
  EXPECT_EQ(parameters[0]->GetQualifier("Description", kNone)->GetValue(kNone).ToString(), "n");
  EXPECT_EQ(parameters[1]->GetType(kNone), TType::kCIMTypeReference);
  EXPECT_EQ(parameters[1]->GetReferencedClassName(kNone), "X_A");
  EXPECT_EQ(parameters[2]->GetType(kNone), TType::kCIMTypeReference | TType::kCIMTypeArrayFlag);
  EXPECT_EQ(parameters[2]->GetReferencedClassName(kNone), "X_A");
  EXPECT_EQ(parameters[3]->GetType(kNone), TType::kCIMTypeDateTime);
}

TEST(TMofBuilderTest, ReferencesMayNameLaterClassesAndOneAnother) {
  auto const ns = Read("class X_A { X_B REF B; }; class X_B { X_A REF A; X_B REF Self; };");
  EXPECT_EQ(Property(*ns, "X_A", "B")->GetDefaultValue(kNone).GetReferencedClass(), ns->GetClass("X_B", kNone));
  EXPECT_EQ(Property(*ns, "X_B", "A")->GetDefaultValue(kNone).GetReferencedClass(), ns->GetClass("X_A", kNone));
}

TEST(TMofBuilderTest, AQualifierWithoutValueIsTrueOrTheDeclaredDefault) {
  auto const ns = Read("class X_A { [Key, Max, Values, Description] string P; [Key(false), Max(3)] string Q; };");
  auto const valueOf = [&](char const* property, char const* qualifier) {
    return Property(*ns, "X_A", property)->GetQualifier(qualifier, kNone)->GetValue(kNone);
  };
  EXPECT_EQ(valueOf("P", "Key"), TCIMValue(true));
  EXPECT_EQ(valueOf("P", "Max"), TCIMValue(7u));
  EXPECT_TRUE(valueOf("P", "Values").IsNull());
  EXPECT_TRUE(valueOf("P", "Description").IsNull());
  EXPECT_EQ(valueOf("Q", "Key"), TCIMValue(false));
  EXPECT_EQ(valueOf("Q", "Max"), TCIMValue(3u));
}

TEST(TMofBuilderTest, AQualifierHasTheDeclaredFlavorUnlessItStatesAnother) {
  using Q = ICIMQualifierDecl;
  struct TRow {
    char const* fText;
    unsigned int fFlavor;
  };
  for (TRow const& row : {TRow{"Description(\"a\")", Q::kFlavorDefault | Q::kFlavorTranslatable},
                          TRow{"Description(\"a\") : DisableOverride", Q::kFlavorToSubclass},
                          TRow{"Description(\"a\") : Restricted translatable", Q::kFlavorEnableOverride | Q::kFlavorTranslatable},
                          TRow{"Values {\"a\"} : ToSubclass", Q::kFlavorDefault},
                          TRow{"Key : Restricted", Q::kFlavorEnableOverride}, TRow{"Key", Q::kFlavorToSubclass}}) {
    auto const ns = Read(std::string("class X_A { [") + row.fText + "] string P; };");
    auto const qualifiers = All(*Property(*ns, "X_A", "P"), &ICIMNamedElement::EnumerateQualifiers);
    ASSERT_EQ(qualifiers.size(), 1u) << row.fText;
    EXPECT_EQ(qualifiers.front()->GetFlavor(kNone), row.fFlavor) << row.fText;
  }
}

TEST(TMofBuilderTest, TheValueOfAStaticPropertyBelongsToTheClass) {
  auto const ns =
      Read("class X_A { [Static] uint16 Count = 3; [Static(false)] uint16 Plain = 4; [Static(null)] uint8 No = 5; };");
  auto const statics = All(*ns->GetClass("X_A", kNone), &ICIMClass::EnumerateStaticProperties);
  ASSERT_EQ(statics.size(), 1u);
  EXPECT_EQ(statics.front()->GetName(kNone), "Count");
  EXPECT_EQ(statics.front()->GetValue(kNone).ToString(), "3");
  EXPECT_TRUE(Property(*ns, "X_A", "Count")->GetDefaultValue(kNone).IsNull());
  EXPECT_EQ(Property(*ns, "X_A", "Plain")->GetDefaultValue(kNone).ToString(), "4");
}

TEST(TMofBuilderTest, AWrongDeclarationIsNamed) {
  ExpectErrors({
      {"class X_B : X_A { };", "2:13: X_A is not declared: a superclass must come before its subclasses"},
      {"class X_A { };\nclass x_a { };", "3:7: x_a is already declared"},
      {"class X_A { string P; uint8 p; };", "2:29: p is already declared in this class"},
      {"class X_A { uint8 M(); uint8 m(); };", "2:30: m is already declared in this class"},
      {"class X_A { uint8 M(string a, string A); };", "2:38: A is already declared in this method"},
      {"class X_A { X_B REF P; };", "2:13: X_B is not a declared class"},
      {"class X_A { uint8 M(X_B REF P); };", "2:21: X_B is not a declared class"},
      {"class X_A { X_A REF P[]; };", "2:13: a property cannot be an array of references"},
      {"class X_A { X_A REF M(); };", "2:21: a method cannot return a reference or an array"},
      {"class X_A { string M[](); };", "2:20: a method cannot return a reference or an array"},
      {"[Unheard] class X_A { };", "2:2: Unheard is not a declared qualifier"},
      {"class X_A { [Key, key] string P; };", "2:19: key is given twice"},
      {"Qualifier key : string, Scope(any);", "2:11: key is already declared"},
  });
}

}  // namespace
}  // namespace NQRVZEP20
