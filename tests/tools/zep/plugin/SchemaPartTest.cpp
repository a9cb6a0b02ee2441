// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/SchemaPart.h"

#include "ICIMPropertyDecl.h"
#include "Mof.h"
#include "TMemoryNamespace.h"
#include "tests/DmtfSchema.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20::zep {
namespace {

constexpr char kSchema[] =
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);\n"
    "Qualifier Description : string, Scope(any), Flavor(Translatable);\n"
    "Qualifier Version : string, Scope(class, association, indication);\n"
    "Qualifier Unused : boolean = false, Scope(any);\n"
    "\n"
    "class X_Above {\n"
    "  [Key]\n"
    "  string Name;\n"
    "};\n"
    "\n"
    "class X_Unneeded {\n"
    "  string Name;\n"
    "};\n"
    "\n"
    "class X_Target : X_Above {\n"
    "  X_Disk REF Back;\n"
    "};\n"
    "\n"
    "[Version(\"1\")]\n"
    "class X_Disk : X_Above {\n"
    "  [Description(\"The place.\")]\n"
    "  X_Target REF Target;\n"
    "\n"
    "  uint16 State = 5;\n"
    "\n"
    "  [Description(\"Left out.\")]\n"
    "  uint32 Reset(X_Unneeded REF Job);\n"
    "};\n";

boost::shared_ptr<TMemoryNamespace> NamespaceOf(std::string const& mof) {
  auto const ns = boost::make_shared<TMemoryNamespace>("mof");
  ReadMofText(mof, "test", ns);
  return ns;
}

std::string PartOf(std::string const& mof, std::string const& className) {
  auto const ns = NamespaceOf(mof);
  return SchemaPartOf(ns->GetClass(className, TCIMContext()));
}

TEST(SchemaPartTest, HasTheClassesAboveThoseReferredToAndTheQualifiersInUse) {
  EXPECT_EQ(PartOf(kSchema, "X_Disk"),
            "Qualifier Key : boolean = FALSE,\n"
            "    Scope(property, reference),\n"
            "    Flavor(DisableOverride, ToSubclass);\n"
            "\n"
            "Qualifier Description : string,\n"
            "    Scope(any),\n"
            "    Flavor(EnableOverride, ToSubclass, Translatable);\n"
            "\n"
            "Qualifier Version : string,\n"
            "    Scope(class, association, indication),\n"
            "    Flavor(EnableOverride, ToSubclass);\n"
            "\n"
            "class X_Above {\n"
            "\n"
            "  [Key]\n"
            "  string Name;\n"
            "};\n"
            "\n"
            "class X_Target : X_Above {\n"
            "\n"
            "  X_Disk REF Back;\n"
            "};\n"
            "\n"
            "[Version(\"1\")]\n"
            "class X_Disk : X_Above {\n"
            "\n"
            "  [Description(\"The place.\")]\n"
            "  X_Target REF Target;\n"
            "\n"
            "  uint16 State = 5;\n"
            "};\n"
            "\n");
}

TEST(SchemaPartTest, ThePartOfThePartIsTheSame) {
  std::string const part = PartOf(kSchema, "X_Disk");
  EXPECT_EQ(PartOf(part, "X_Disk"), part);
}

TEST(SchemaPartTest, AClassOfTheDmtfIsReadAlone) {
  if (DmtfArchive().empty()) GTEST_SKIP() << "needs " << kNoDmtfSchema;
  TDmtfSchema const schema;
  ASSERT_TRUE(schema.IsThere());
  auto const ns = boost::make_shared<TMemoryNamespace>("mof");
  ReadMofFile(schema.MainFile(), ns);
  for (char const* name : {"CIM_DiskDrive", "CIM_Fan", "CIM_Processor", "CIM_EthernetPort"}) {
    SCOPED_TRACE(name);
    auto const cls = ns->GetClass(name, TCIMContext());
    std::string const part = SchemaPartOf(cls);
    auto const alone = NamespaceOf(part);
    EXPECT_EQ(SchemaPartOf(alone->GetClass(name, TCIMContext())), part);
    EXPECT_EQ(alone->GetClass(name, TCIMContext())->GetPropertyDecl("EnabledState", TCIMContext())->GetType(TCIMContext()),
              cls->GetPropertyDecl("EnabledState", TCIMContext())->GetType(TCIMContext()));
  }
}

}  // namespace
}  // namespace NQRVZEP20::zep
