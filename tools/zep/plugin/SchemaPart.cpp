// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/SchemaPart.h"

#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "ICIMQualifierDecl.h"
#include "Mof.h"
#include "TCIMCopy.h"
#include "TMemoryNamespace.h"

#include <boost/make_shared.hpp>

#include <set>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

TCIMContext const kNone;

// The classes, each after the classes that it needs, and the names of their qualifiers.
struct TNeeds {
  std::vector<boost::shared_ptr<ICIMClass>> fClasses;
  std::set<std::string> fQualifiers;
};

void AddQualifiers(TNeeds& needs, ICIMNamedElement const& element) {
  element.EnumerateQualifiers(
      [&](boost::shared_ptr<ICIMQualifier> qualifier) { return needs.fQualifiers.insert(qualifier->GetName(kNone)), true; },
      kNone);
}

// `seen`: the names of the classes that were begun; a class may refer to itself.
void AddClass(TNeeds& needs, std::set<std::string>& seen, boost::shared_ptr<ICIMClass> cls) {
  if (!cls || !seen.insert(cls->GetName(kNone)).second) return;
  AddClass(needs, seen, cls->GetSuperClass(kNone));
  AddQualifiers(needs, *cls);
  cls->EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> property) {
        AddQualifiers(needs, *property);
        AddClass(needs, seen, property->GetDefaultValue(kNone).GetReferencedClass());
        return true;
      },
      kNone);
  needs.fClasses.push_back(cls);
}

void CopyQualifierDecls(ICIMNamespace const& source, std::set<std::string> const& names, boost::shared_ptr<ICIMNamespace> copy) {
  TCopyQualifierDecls copyDecl(copy);
  source.EnumerateQualifierDecls(
      [&](boost::shared_ptr<ICIMQualifierDecl> declaration) {
        return names.count(declaration->GetName(kNone)) == 0 || copyDecl(declaration);
      },
      kNone);
}

// The class without its properties, which may refer to any other class.
void CopyClass(ICIMClass const& cls, boost::shared_ptr<ICIMNamespace> copy) {
  auto const superClass = cls.GetSuperClass(kNone);
  auto const above = superClass ? copy->GetClass(superClass->GetName(kNone), kNone) : superClass;
  cls.EnumerateQualifiers(TCopyQualifier(copy, copy->CreateClass(above, cls.GetName(kNone), kNone)), kNone);
}

void CopyProperties(ICIMClass const& cls, boost::shared_ptr<ICIMNamespace> copy) {
  auto const target = copy->GetClass(cls.GetName(kNone), kNone);
  target->BeginDeclarations(kNone);
  cls.EnumeratePropertyDecls(TCopyPropertyDecl(copy, target), kNone);
  target->EndDeclarations(kNone);
}

}  // namespace

std::string SchemaPartOf(boost::shared_ptr<ICIMClass> cls) {
  TNeeds needs;
  std::set<std::string> seen;
  AddClass(needs, seen, cls);

  auto const copy = boost::make_shared<TMemoryNamespace>("mof");
  CopyQualifierDecls(*cls->GetNamespace(kNone), needs.fQualifiers, copy);
  for (auto const& needed : needs.fClasses) CopyClass(*needed, copy);
  for (auto const& needed : needs.fClasses) CopyProperties(*needed, copy);
  return WriteMof(*copy);
}

}  // namespace NQRVZEP20::zep
