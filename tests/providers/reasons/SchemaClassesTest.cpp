// SPDX-License-Identifier: Apache-2.0
#include "providers/reasons/SchemaClasses.h"

#include "tests/DmtfSchema.h"

#include "Mof.h"
#include "tests/providers/memory/Collect.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

std::vector<TSchemaClass> Table() { return {BeginOfSchemaClasses(), EndOfSchemaClasses()}; }

TEST(SchemaClassesTest, EveryRowIsFound) {
  ASSERT_GT(Table().size(), 100u);
  for (TSchemaClass const& row : Table()) {
    TSchemaClass const* const found = FindSchemaClass(row.fName);
    ASSERT_NE(found, nullptr) << row.fName;
    EXPECT_STREQ(found->fName, row.fName);
  }
}

TEST(SchemaClassesTest, OtherNamesAreNotFound) {
  for (char const* name : {"", "CIM_", "CIM_Zzz", "Aaa", "cim_chassis", "CIM_ChassisX"})
    EXPECT_EQ(FindSchemaClass(name), nullptr) << name;
}

TEST(SchemaClassesTest, EverySuperclassHasARow) {
  for (TSchemaClass const& row : Table()) {
    std::string const superClass = row.fSuperClass;
    EXPECT_TRUE(superClass.empty() || FindSchemaClass(superClass) != nullptr) << row.fName;
  }
}

TEST(SchemaClassesTest, EveryRowAgreesWithTheSchema) {
  NEEDS(!DmtfArchive().empty(), kNoDmtfSchema);
  TDmtfSchema const schema;
  ASSERT_TRUE(schema.IsThere()) << "unzip failed";
  auto const ns = NewNamespace();
  ReadMofFile(schema.MainFile(), ns);
  for (TSchemaClass const& row : Table()) {
    auto const cls = ns->GetClass(row.fName, kNone);
    auto const superClass = cls->GetSuperClass(kNone);
    EXPECT_EQ(superClass ? superClass->GetName(kNone) : "", row.fSuperClass) << row.fName;
    EXPECT_EQ(cls->IsAbstract(kNone), row.IsAbstract()) << row.fName;
    EXPECT_EQ(cls->GetQualifier("Association", kNone) != nullptr, row.IsAssociation()) << row.fName;
  }
}

}  // namespace
}  // namespace NQRVZEP20
