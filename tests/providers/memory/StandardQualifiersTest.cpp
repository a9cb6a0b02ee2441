// SPDX-License-Identifier: Apache-2.0
#include "StandardQualifiers.h"

#include "CIMNames.h"
#include "Collect.h"
#include "ICIMQualifierDecl.h"

#include <set>

namespace NQRVZEP20 {
namespace {

std::string TextOf(TCIMValue const& value) { return value.IsNull() ? "NULL" : value.ToString(); }

TEST(StandardQualifiersTest, EachNameComesOnceInAlphabeticalOrder) {
  std::vector<std::string> names;
  for (auto const& qualifier : StandardQualifiers()) names.push_back(FoldName(qualifier.fName));
  EXPECT_TRUE(std::is_sorted(names.begin(), names.end()));
  EXPECT_EQ(std::set<std::string>(names.begin(), names.end()).size(), names.size());
}

TEST(StandardQualifiersTest, DeclarationsAreThoseOfTheStandard) {
  using Decl = ICIMQualifierDecl;
  constexpr unsigned int kDefault = 0x03, kRestricted = 0x01, kFinal = 0x02, kTranslatable = 0x07;
  struct {
    char const* fName;
    char const* fType;
    char const* fDefaultValue;
    unsigned int fScope, fFlavor;
  } const rows[] = {
      {"Key", "boolean", "false", Decl::kScopeProperty | Decl::kScopeReference, kFinal},
      {"Association", "boolean", "false", Decl::kScopeAssociation, kFinal},
      {"Abstract", "boolean", "false", Decl::kScopeClass | Decl::kScopeAssociation | Decl::kScopeIndication, kRestricted},
      {"Description", "string", "NULL", Decl::kScopeAny, kTranslatable},
      {"Override", "string", "NULL", Decl::kScopeProperty | Decl::kScopeReference | Decl::kScopeMethod, kRestricted},
      {"Static", "boolean", "false", Decl::kScopeProperty | Decl::kScopeMethod, kFinal},
      {"In", "boolean", "true", Decl::kScopeParameter, kFinal},
      {"Out", "boolean", "false", Decl::kScopeParameter, kFinal},
      {"Values", "string[]", "NULL", Decl::kScopeProperty | Decl::kScopeMethod | Decl::kScopeParameter, kTranslatable},
      {"ValueMap", "string[]", "NULL", Decl::kScopeProperty | Decl::kScopeMethod | Decl::kScopeParameter, kDefault},
      {"Read", "boolean", "true", Decl::kScopeProperty, kDefault},
      {"Write", "boolean", "false", Decl::kScopeProperty, kDefault},
      {"Units", "string", "NULL", Decl::kScopeProperty | Decl::kScopeMethod | Decl::kScopeParameter, kTranslatable},
      {"ArrayType", "string", "Bag", Decl::kScopeProperty | Decl::kScopeParameter, kFinal},
      {"MaxLen", "uint32", "NULL", Decl::kScopeProperty | Decl::kScopeMethod | Decl::kScopeParameter, kDefault},
      {"MinValue", "sint64", "NULL", Decl::kScopeProperty | Decl::kScopeMethod | Decl::kScopeParameter, kDefault},
      {"Min", "uint32", "0", Decl::kScopeReference, kDefault},
      {"Version", "string", "NULL", Decl::kScopeClass | Decl::kScopeAssociation | Decl::kScopeIndication, 0x05},
  };
  auto const ns = NewNamespace();
  ns->DeclareStandardQualifiers();
  for (auto const& row : rows) {
    SCOPED_TRACE(row.fName);
    auto const decl = ns->GetQualifierDecl(row.fName, kNone);
    EXPECT_EQ(decl->GetName(kNone), row.fName);
    EXPECT_EQ(decl->GetType(kNone), TMemoryType(row.fType).GetType());
    EXPECT_EQ(TextOf(decl->GetDefaultValue(kNone)), row.fDefaultValue);
    EXPECT_EQ(decl->GetScope(kNone), row.fScope);
    EXPECT_EQ(decl->GetFlavor(kNone), row.fFlavor);
  }
}

}  // namespace
}  // namespace NQRVZEP20
