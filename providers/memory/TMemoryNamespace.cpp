// SPDX-License-Identifier: Apache-2.0
#include "TMemoryNamespace.h"

#include "CIMTypes.h"
#include "FillLog.h"
#include "StandardQualifiers.h"
#include "TMemoryClass.h"
#include "TMemoryQualifierDecl.h"
#include "TZEPException.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TMemoryNamespace::TMemoryNamespace(std::string const& name) : fName(name) {}

TMemoryNamespace::~TMemoryNamespace() {
  for (auto const& cls : fClasses.Elements()) cls->Empty();
}

std::string TMemoryNamespace::GetName(TCIMContext const&) const { return fName; }

boost::shared_ptr<ICIMClass> TMemoryNamespace::CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                                           TCIMContext const& context) {
  RequireCIMName(name);
  boost::shared_ptr<TMemoryClass> ownSuperClass;
  if (superClass) {
    ownSuperClass = fClasses.Find(superClass->GetName(context));
    if (ownSuperClass != superClass) throw TZEPException(kZEPStatusInvalidClass);
  }
  if (fClasses.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

  auto const cls = boost::make_shared<TMemoryClass>(shared_from_this(), ownSuperClass, name);
  fClasses.Add(cls);
  if (ownSuperClass)
    ownSuperClass->AddSubClass(cls);
  else
    fRootClasses.push_back(cls);
  return cls;
}

boost::shared_ptr<ICIMClass> TMemoryNamespace::GetClass(std::string const& className, TCIMContext const&) const {
  return FindClass(className);
}

bool TMemoryNamespace::HasClass(std::string const& className) const { return fClasses.Has(className); }

void TMemoryNamespace::EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const&) const {
  VisitEach(fRootClasses, callback);
}

boost::shared_ptr<ICIMQualifierDecl> TMemoryNamespace::CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                                           unsigned int scope, unsigned int flavor,
                                                                           TCIMContext const&) {
  RequireCIMName(name);
  TCIMValue::TCIMType const type = defaultValue.GetType();
  if (!HasTypeName(type) || BaseTypeOf(type) == TCIMValue::TCIMType::kCIMTypeReference)
    throw TZEPException(kZEPStatusTypeMismatch);
  if (fQualifierDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

  auto const decl = boost::make_shared<TMemoryQualifierDecl>(name, defaultValue, scope, flavor);
  fQualifierDecls.Add(decl);
  return decl;
}

boost::shared_ptr<ICIMQualifierDecl> TMemoryNamespace::GetQualifierDecl(std::string const& name, TCIMContext const&) const {
  return fQualifierDecls.Find(name);
}

void TMemoryNamespace::EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                                               TCIMContext const&) const {
  VisitEach(fQualifierDecls.Elements(), callback);
}

boost::shared_ptr<ICIMInstance> TMemoryNamespace::GetInstance(TCIMReference const& path, TCIMContext const& context) const {
  boost::shared_ptr<ICIMClass> const named = path.GetClass();
  boost::shared_ptr<TMemoryClass> const cls = named ? fClasses.Find(named->GetName(context)) : nullptr;
  return cls ? cls->FindInstance(path) : boost::shared_ptr<TMemoryInstance>();
}

TMemoryClassBuilder TMemoryNamespace::DefineClass(std::string const& name, std::string const& superClassName) {
  DeclareStandardQualifiers();
  return NameRefusal(name, "", [&] {
    boost::shared_ptr<ICIMClass> const superClass = superClassName.empty() ? nullptr : FindClass(superClassName);
    boost::shared_ptr<ICIMClass> const cls = CreateClass(superClass, name, TCIMContext());
    return TMemoryClassBuilder(boost::static_pointer_cast<TMemoryClass>(cls));
  });
}

boost::shared_ptr<TMemoryInstance> TMemoryNamespace::AddInstance(std::string const& className, TMemoryValues const& values) {
  return NameRefusal(className, "", [&] { return FindClass(className); })->AddInstance(values);
}

void TMemoryNamespace::DeclareStandardQualifiers() {
  if (fHasStandardQualifiers) return;
  for (auto const& standard : StandardQualifiers())
    if (!fQualifierDecls.Has(standard.fName))
      CreateQualifierDecl(standard.fName, standard.fDefaultValue, standard.fScope, standard.fFlavor, TCIMContext());
  fHasStandardQualifiers = true;
}

boost::shared_ptr<TMemoryClass> TMemoryNamespace::FindClass(std::string const& name) const {
  boost::shared_ptr<TMemoryClass> const cls = fClasses.Find(name);
  if (!cls) throw TZEPException(kZEPStatusNotFound);
  return cls;
}

}  // namespace NQRVZEP20
