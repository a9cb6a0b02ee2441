// SPDX-License-Identifier: Apache-2.0
#include "TMemoryClass.h"

#include "CIMTypes.h"
#include "FillLog.h"
#include "KeyText.h"
#include "TMemoryNamespace.h"

#include <algorithm>

namespace NQRVZEP20 {

TMemoryClass::TMemoryClass(boost::weak_ptr<TMemoryNamespace> ns, boost::shared_ptr<TMemoryClass> superClass,
                           std::string const& name)
    : TMemoryNamedElement(name, ns),
      fIsRoot(!superClass),
      fIsAssociation(superClass && superClass->fIsAssociation),
      fSuperClass(superClass) {}

boost::shared_ptr<ICIMNamespace> TMemoryClass::GetNamespace(TCIMContext const&) const {
  return boost::shared_ptr<ICIMNamespace>(Namespace());
}

bool TMemoryClass::GetClassFlag(TCIMContext const&) const { return fIsAssociation; }

bool TMemoryClass::IsAbstract(TCIMContext const&) const { return IsMarked("Abstract"); }

bool TMemoryClass::IsRootClass(TCIMContext const&) const { return fIsRoot; }

boost::shared_ptr<ICIMClass> TMemoryClass::GetSuperClass(TCIMContext const&) const { return SuperClass(); }

void TMemoryClass::EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const&) const {
  VisitEach(AllSubClasses(), callback);
}

boost::shared_ptr<ICIMQualifier> TMemoryClass::AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration,
                                                            TCIMValue const& value, unsigned int flavor,
                                                            TCIMContext const& context) {
  auto const qualifier = TMemoryNamedElement::AddQualifier(declaration, value, flavor, context);
  if (!fIsAssociation && IsMarked("Association")) MarkAsAssociation();
  return qualifier;
}

void TMemoryClass::BeginDeclarations(TCIMContext const&) { fIsDeclaring = true; }

void TMemoryClass::EndDeclarations(TCIMContext const&) { fIsDeclaring = false; }

boost::shared_ptr<ICIMPropertyDecl> TMemoryClass::AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                                  TCIMContext const&) {
  RequireCIMName(name);
  if (!HasTypeName(defaultValue.GetType())) throw TZEPException(kZEPStatusTypeMismatch);
  if (fPropertyDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);
  if (HasMadeInstances()) throw TZEPException(kZEPStatusInvalidOpSequence);

  auto const decl = boost::make_shared<TMemoryPropertyDecl>(name, defaultValue, Self(), Namespace());
  fPropertyDecls.Add(decl);
  return decl;
}

boost::shared_ptr<ICIMPropertyDecl const> TMemoryClass::GetPropertyDecl(std::string const& name, TCIMContext const&) const {
  boost::shared_ptr<TMemoryPropertyDecl const> const decl = FindPropertyDecl(name);
  if (!decl && !fIsDeclaring) throw TZEPException(kZEPStatusNotFound);
  return decl;
}

void TMemoryClass::EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                                          TCIMContext const&) const {
  VisitEach(fPropertyDecls.Elements(), callback);
}

void TMemoryClass::SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context) {
  boost::shared_ptr<TMemoryPropertyDecl> const decl = FindPropertyDecl(name);
  if (!decl) throw TZEPException(kZEPStatusNotFound);

  auto const property = boost::make_shared<TMemoryProperty>(decl);
  property->SetValue(value, context);
  fStaticProperties.Put(property);
}

void TMemoryClass::EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                             TCIMContext const&) const {
  VisitEach(fStaticProperties.Elements(), callback);
}

boost::shared_ptr<ICIMInstance> TMemoryClass::CreateInstance(TCIMContext const& context) {
  if (IsAbstract(context)) throw TZEPException(kZEPStatusInvalidClass);
  return boost::make_shared<TMemoryInstance>(Self(), Layout());
}

void TMemoryClass::EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback, TCIMContext const&) const {
  if (!VisitInstances(callback)) return;
  for (auto const& subClass : AllSubClasses())
    if (!subClass->VisitInstances(callback)) return;
}

bool TMemoryClass::VisitInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> const& callback) const {
  return !fInstances || VisitEach(fInstances->fAll, callback);
}

boost::shared_ptr<ICIMMethodDecl> TMemoryClass::AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                              TCIMContext const&) {
  RequireCIMName(name);
  if (!HasTypeName(returnType) || IsArrayType(returnType)) throw TZEPException(kZEPStatusTypeMismatch);
  if (fMethodDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

  auto const decl = boost::make_shared<TMemoryMethodDecl>(name, returnType, Self(), Namespace());
  fMethodDecls.Add(decl);
  return decl;
}

void TMemoryClass::EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                                        TCIMContext const&) const {
  VisitEach(fMethodDecls.Elements(), callback);
}

void TMemoryClass::CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context) {
  auto const own = boost::dynamic_pointer_cast<TMemoryInstance>(instance);
  if (!own || own->GetClass(context).get() != this) throw TZEPException(kZEPStatusInvalidInstance);
  if (own->IsCommitted()) throw TZEPException(kZEPStatusAlreadyExists);

  std::string const keys = KeyText(own->GetPath(context));
  if (!fInstances) fInstances = std::make_unique<TInstances>();
  if (!keys.empty() && !fInstances->fByKeys.emplace(keys, own).second) throw TZEPException(kZEPStatusAlreadyExists);
  fInstances->fAll.push_back(own);
  own->SetCommitted();
}

boost::shared_ptr<TMemoryInstance> TMemoryClass::AddInstance(TMemoryValues const& values) {
  TCIMContext const none;
  auto const created = NameRefusal(Name(), "", [&] { return CreateInstance(none); });
  auto const instance = boost::static_pointer_cast<TMemoryInstance>(created);
  for (auto const& entry : values) NameRefusal(Name(), entry.first, [&] { instance->Set(entry.first, entry.second); });
  NameRefusal(Name(), "", [&] { CommitInstance(instance, none); });
  return instance;
}

boost::shared_ptr<TMemoryClass> TMemoryClass::SuperClass() const {
  return fIsRoot ? boost::shared_ptr<TMemoryClass>() : boost::shared_ptr<TMemoryClass>(fSuperClass);
}

boost::shared_ptr<TMemoryPropertyDecl> TMemoryClass::FindPropertyDecl(std::string const& name) const {
  if (fLayout) return boost::const_pointer_cast<TMemoryPropertyDecl>(fLayout->fDecls.Find(name));
  boost::shared_ptr<TMemoryPropertyDecl> found = fPropertyDecls.Find(name);
  for (boost::shared_ptr<TMemoryClass> cls = SuperClass(); cls && !found; cls = cls->SuperClass())
    found = cls->fPropertyDecls.Find(name);
  return found;
}

boost::shared_ptr<TMemoryInstance> TMemoryClass::FindInstance(TCIMReference const& path) const {
  if (!fInstances) return {};
  auto const found = fInstances->fByKeys.find(KeyText(path));
  return found == fInstances->fByKeys.end() ? boost::shared_ptr<TMemoryInstance>() : found->second;
}

void TMemoryClass::Empty() {
  if (fInstances) {  // and not reset: a callback may empty the class while its instances are visited
    for (auto const& instance : fInstances->fAll) instance->DropReferences();
    fInstances->fByKeys.clear();
    fInstances->fAll.clear();
  }
  fLayout.reset();
  fHasMadeInstances = false;
  fStaticProperties.Clear();
  fMethodDecls.Clear();
  fPropertyDecls.Clear();
  fSubClasses.clear();
}

// Depth first, with a stack of the pending classes, the next one on top.
std::vector<boost::shared_ptr<TMemoryClass>> TMemoryClass::AllSubClasses() const {
  std::vector<boost::shared_ptr<TMemoryClass>> all;
  std::vector<boost::shared_ptr<TMemoryClass>> pending(fSubClasses.rbegin(), fSubClasses.rend());
  while (!pending.empty()) {
    boost::shared_ptr<TMemoryClass> const next = pending.back();
    pending.pop_back();
    all.push_back(next);
    pending.insert(pending.end(), next->fSubClasses.rbegin(), next->fSubClasses.rend());
  }
  return all;
}

// Marks the class and all classes below it. Below a marked class, all are marked already.
void TMemoryClass::MarkAsAssociation() {
  std::vector<TMemoryClass*> pending{this};
  while (!pending.empty()) {
    TMemoryClass* const next = pending.back();
    pending.pop_back();
    if (next->fIsAssociation) continue;
    next->fIsAssociation = true;
    for (auto const& subClass : next->fSubClasses) pending.push_back(subClass.get());
  }
}

// Created from the layout of the nearest superclass that has one. Some of the classes between get a layout, too, so that the
// steps to the next layout are few compared with its size, however deep the class is. A class that declares nothing shares the
// layout of its superclass.
boost::shared_ptr<TMemoryLayout const> TMemoryClass::Layout() {
  std::vector<boost::shared_ptr<TMemoryClass>> without;
  boost::shared_ptr<TMemoryClass> cls = Self();
  for (; cls && !cls->fLayout; cls = cls->SuperClass()) without.push_back(cls);

  boost::shared_ptr<TMemoryLayout const> last = cls ? cls->fLayout : boost::make_shared<TMemoryLayout>();
  TMemoryLayout layout = *last;
  std::size_t steps = 0;  // since `last`
  for (auto next = without.rbegin(); next != without.rend(); ++next) {
    (*next)->fHasMadeInstances = true;
    (*next)->DeclareIn(layout);
    bool const isSame = steps == 0 && (*next)->fPropertyDecls.Elements().empty();
    if (!isSame && ++steps < layout.fDecls.Elements().size() && next->get() != this) continue;
    if (!isSame) last = boost::make_shared<TMemoryLayout>(layout);
    (*next)->fLayout = last;
    steps = 0;
  }
  return fLayout;
}

// Replaces the declarations that its own ones override, and adds the others.
void TMemoryClass::DeclareIn(TMemoryLayout& layout) const {
  for (auto const& decl : fPropertyDecls.Elements()) {
    layout.fDecls.Put(decl);
    if (!decl->IsMarked("Key")) continue;
    std::size_t const position = layout.fDecls.PositionOf(decl->Name());
    auto const at = std::lower_bound(layout.fKeys.begin(), layout.fKeys.end(), position);
    if (at == layout.fKeys.end() || *at != position) layout.fKeys.insert(at, position);
  }
}

}  // namespace NQRVZEP20
