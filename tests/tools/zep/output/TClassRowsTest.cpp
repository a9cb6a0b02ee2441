// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TClassRows.h"

#include "ICIMQualifierDecl.h"
#include "providers/memory/TMemoryInstance.h"
#include "providers/memory/TMemoryNamespace.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20::zep {
namespace {

boost::shared_ptr<TMemoryNamespace> NamespaceWithSecret() {
  auto space = boost::make_shared<TMemoryNamespace>("root/a");
  space->CreateQualifierDecl("Secret", TMemoryType("string").GetNull(), ICIMQualifierDecl::kScopeProperty,
                             ICIMQualifierDecl::kFlavorDefault, TCIMContext());
  space->DefineClass("X_Base").Key("Id", "uint32").Property("Owner", "string").Qualifier("Secret", TCIMValue("users"));
  space->DefineClass("X_Rack", "X_Base").Property("Row", "string");
  return space;
}

TEST(TClassRowsTest, AClassHasItsSuperclassesAndTheSecretsThatItInherits) {
  auto const space = NamespaceWithSecret();
  TClassRows rows;
  for (int id : {1, 2}) rows.AddClassOf(*space->AddInstance("X_Rack", {{"Id", id}}));
  EXPECT_EQ(rows.AsJson(), TJson::parse(R"([{"class":"X_Rack","superclasses":["X_Base"],"secrets":{"Owner":"users"}}])"));
}

TEST(TClassRowsTest, ClassesOfOneNameHaveOneRow) {
  auto const space = NamespaceWithSecret(), other = boost::make_shared<TMemoryNamespace>("root/b");
  other->DefineClass("CIM_System").Key("Name", "string");
  other->DefineClass("X_Rack", "CIM_System");
  TClassRows rows;
  rows.AddClassOf(*other->AddInstance("X_Rack", {{"Name", "r"}}));
  rows.AddClassOf(*space->AddInstance("X_Rack", {{"Id", 1}}));
  EXPECT_EQ(rows.AsJson(),
            TJson::parse(R"([{"class":"X_Rack","superclasses":["CIM_System","X_Base"],"secrets":{"Owner":"users"}}])"));
}

}  // namespace
}  // namespace NQRVZEP20::zep
