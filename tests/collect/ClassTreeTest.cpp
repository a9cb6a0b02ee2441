// SPDX-License-Identifier: Apache-2.0
#include "collect/ClassTree.h"

#include "ICIMClass.h"
#include "Mof.h"
#include "TMemoryNamespace.h"
#include "TMofError.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

constexpr char kSchema[] =
    "Qualifier Abstract : boolean = false, Scope(class, association, indication), Flavor(Restricted);\n"
    "Qualifier Association : boolean = false, Scope(association);\n"
    "Qualifier Indication : boolean = false, Scope(class, indication);\n"
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride);\n"
    "[Abstract] class X_Device { [Key] uint32 Id; };\n"
    "class X_Disk : X_Device { };\n"
    "[Association] class X_Link { [Key] X_Device REF From; [Key] X_Device REF To; };\n"
    "[Indication, Abstract] class X_Alert { }; class X_Loud : X_Alert { };\n"
    "[Indication(false)] class X_Quiet { };\n";

boost::shared_ptr<ICIMNamespace> Schema() {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/test");
  ReadMofText(kSchema, "schema", ns);
  return ns;
}

TEST(ClassTreeTest, EachClassComesAfterItsSuperclassWithItsKind) {
  struct TRow {
    char const *fName, *fSuperClass;
    bool fIsAbstract, fIsAssociation, fIsIndication;
    std::size_t fDepth;
  } const rows[] = {
      {"X_Device", "", true, false, false, 0},      {"X_Disk", "X_Device", false, false, false, 1},
      {"X_Link", "", false, true, false, 0},        {"X_Alert", "", true, false, true, 0},
      {"X_Loud", "X_Alert", false, false, true, 1}, {"X_Quiet", "", false, false, false, 0},
  };
  auto const entries = ClassesOf(*Schema());
  ASSERT_EQ(entries.size(), std::size(rows));
  for (std::size_t at = 0; at < entries.size(); ++at) {
    TClassEntry const& entry = entries[at];
    TRow const& row = rows[at];
    SCOPED_TRACE(row.fName);
    EXPECT_EQ(entry.fName, row.fName);
    EXPECT_EQ(entry.fClass->GetName(TCIMContext()), row.fName);
    EXPECT_EQ(entry.fSuperClass, row.fSuperClass);
    EXPECT_EQ(entry.fIsAbstract, row.fIsAbstract);
    EXPECT_EQ(entry.fIsAssociation, row.fIsAssociation);
    EXPECT_EQ(entry.fIsIndication, row.fIsIndication);
    EXPECT_EQ(entry.fDepth, row.fDepth);
  }
}

TEST(ClassTreeTest, AQualifierIsSetOnlyOnTheClassItselfAndUnlessFalse) {
  auto const ns = Schema();
  auto const cls = [&](char const* name) { return ns->GetClass(name, TCIMContext()); };
  EXPECT_TRUE(HasSetQualifier(*cls("X_Alert"), "Indication"));
  EXPECT_FALSE(HasSetQualifier(*cls("X_Loud"), "Indication"));
  EXPECT_FALSE(HasSetQualifier(*cls("X_Quiet"), "Indication"));
}

TEST(ClassTreeTest, AnEmptyNamespaceHasNoClasses) {
  EXPECT_TRUE(ClassesOf(*boost::make_shared<TMemoryNamespace>("root/test")).empty());
}

}  // namespace
}  // namespace NQRVZEP20
