// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedClass.h"

#include "TZEPException.h"
#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

TReceivedClass::TReceivedClass(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts)
    : TReceivedElement(ns, std::move(name)), fFacts(std::move(facts)) {}

// A class outside the namespace has none: its instances are not known.
boost::shared_ptr<ICIMNamespace> TReceivedClass::GetNamespace(TCIMContext const&) const {
  return boost::shared_ptr<ICIMNamespace>(fNamespace);
}

bool TReceivedClass::GetClassFlag(TCIMContext const&) const { return fFacts.fIsAssociation; }

bool TReceivedClass::IsAbstract(TCIMContext const&) const { return fFacts.fIsAbstract; }

bool TReceivedClass::IsRootClass(TCIMContext const&) const { return !fFacts.fHasSuperClass; }

boost::shared_ptr<ICIMClass> TReceivedClass::GetSuperClass(TCIMContext const&) const {
  return fFacts.fHasSuperClass ? boost::shared_ptr<ICIMClass>(fFacts.fSuperClass) : boost::shared_ptr<ICIMClass>();
}

void TReceivedClass::EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const&) const {
  if (fFacts.fIsOutside) return;
  for (auto const& cls : boost::shared_ptr<TReceivedNamespace>(fNamespace)->ClassesBelow(fFacts.fNumber))
    if (!callback(cls)) return;
}

boost::shared_ptr<ICIMPropertyDecl> TReceivedClass::AddPropertyDecl(std::string const&, TCIMValue const&, TCIMContext const&) {
  RefuseChange();
}

boost::shared_ptr<ICIMPropertyDecl const> TReceivedClass::GetPropertyDecl(std::string const& name, TCIMContext const&) const {
  if (auto const own = FindPropertyDecl(name)) return own;
  for (auto cls = fFacts.fSuperClass.lock(); cls; cls = cls->fFacts.fSuperClass.lock())
    if (auto const inherited = cls->FindPropertyDecl(name)) return inherited;
  throw TZEPException(kZEPStatusNotFound);
}

void TReceivedClass::EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                                            TCIMContext const&) const {
  for (auto const& property : fPropertyDecls)
    if (!callback(property)) return;
}

void TReceivedClass::EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                               TCIMContext const&) const {
  for (auto const& property : fStaticProperties)
    if (!callback(property)) return;
  if (fStaticFailure) fStaticFailure->Throw();
}

boost::shared_ptr<ICIMInstance> TReceivedClass::CreateInstance(TCIMContext const&) { RefuseChange(); }

void TReceivedClass::EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                                        TCIMContext const&) const {
  if (!fFacts.fIsOutside) boost::shared_ptr<TReceivedNamespace>(fNamespace)->VisitInstances(fFacts.fNumber, callback);
}

void TReceivedClass::EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                                          TCIMContext const&) const {
  for (auto const& method : fMethodDecls)
    if (!callback(method)) return;
}

boost::shared_ptr<TReceivedPropertyDecl> TReceivedClass::FindPropertyDecl(std::string const& name) const {
  auto const found = fNumbers.find(name);
  return found != fNumbers.end() ? fPropertyDecls[found->second] : boost::shared_ptr<TReceivedPropertyDecl>();
}

void TReceivedClass::Add(boost::shared_ptr<TReceivedPropertyDecl> property) {
  fNumbers.emplace(property->Name(), fPropertyDecls.size());
  fPropertyDecls.push_back(std::move(property));
}

}  // namespace NQRVZEP20
