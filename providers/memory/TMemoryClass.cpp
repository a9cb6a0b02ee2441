#include "TMemoryClass.h"

#include "CIMTypes.h"
#include "FillLog.h"
#include "KeyText.h"
#include "TMemoryNamespace.h"

namespace NQRVZEP20 {

TMemoryClass::TMemoryClass(boost::weak_ptr<TMemoryNamespace> ns, boost::shared_ptr<TMemoryClass> superClass,
                           std::string const& name)
    : TMemoryNamedElement(name, ns), fIsRoot(!superClass), fSuperClass(superClass) {}

boost::shared_ptr<ICIMNamespace> TMemoryClass::GetNamespace(TCIMContext const&) const {
  return boost::shared_ptr<ICIMNamespace>(Namespace());
}

bool TMemoryClass::GetClassFlag(TCIMContext const&) const {
  if (IsMarked("Association")) return true;
  for (boost::shared_ptr<TMemoryClass> cls = SuperClass(); cls; cls = cls->SuperClass())
    if (cls->IsMarked("Association")) return true;
  return false;
}

bool TMemoryClass::IsAbstract(TCIMContext const&) const { return IsMarked("Abstract"); }

bool TMemoryClass::IsRootClass(TCIMContext const&) const { return fIsRoot; }

boost::shared_ptr<ICIMClass> TMemoryClass::GetSuperClass(TCIMContext const&) const { return SuperClass(); }

void TMemoryClass::EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const&) const {
  VisitEach(AllSubClasses(), callback);
}

void TMemoryClass::BeginDeclarations(TCIMContext const&) { fIsDeclaring = true; }

void TMemoryClass::EndDeclarations(TCIMContext const&) { fIsDeclaring = false; }

boost::shared_ptr<ICIMPropertyDecl> TMemoryClass::AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                                  TCIMContext const&) {
  RequireCIMName(name);
  if (!HasTypeName(defaultValue.GetType())) throw TZEPException(kZEPStatusTypeMismatch);
  if (fPropertyDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);
  if (HasMadeInstances()) throw TZEPException(kZEPStatusInvalidOpSequence);

  const auto decl = boost::make_shared<TMemoryPropertyDecl>(name, defaultValue, Self(), Namespace());
  fPropertyDecls.Add(name, decl);
  return decl;
}

boost::shared_ptr<ICIMPropertyDecl const> TMemoryClass::GetPropertyDecl(std::string const& name, TCIMContext const&) const {
  const boost::shared_ptr<TMemoryPropertyDecl const> decl = FindPropertyDecl(name);
  if (!decl && !fIsDeclaring) throw TZEPException(kZEPStatusNotFound);
  return decl;
}

void TMemoryClass::EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                                          TCIMContext const&) const {
  VisitEach(fPropertyDecls.Elements(), callback);
}

void TMemoryClass::SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context) {
  const boost::shared_ptr<TMemoryPropertyDecl> decl = FindPropertyDecl(name);
  if (!decl) throw TZEPException(kZEPStatusNotFound);

  const auto property = boost::make_shared<TMemoryProperty>(decl);
  property->SetValue(value, context);
  fStaticProperties.Put(name, property);
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
  if (!VisitEach(fInstances, callback)) return;
  for (auto const& subClass : AllSubClasses())
    if (!VisitEach(subClass->fInstances, callback)) return;
}

boost::shared_ptr<ICIMMethodDecl> TMemoryClass::AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                              TCIMContext const&) {
  RequireCIMName(name);
  if (!HasTypeName(returnType) || IsArrayType(returnType)) throw TZEPException(kZEPStatusTypeMismatch);
  if (fMethodDecls.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

  const auto decl = boost::make_shared<TMemoryMethodDecl>(name, returnType, Self(), Namespace());
  fMethodDecls.Add(name, decl);
  return decl;
}

void TMemoryClass::EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                                        TCIMContext const&) const {
  VisitEach(fMethodDecls.Elements(), callback);
}

void TMemoryClass::CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context) {
  const auto own = boost::dynamic_pointer_cast<TMemoryInstance>(instance);
  if (!own || own->GetClass(context).get() != this) throw TZEPException(kZEPStatusInvalidInstance);
  if (own->IsCommitted()) throw TZEPException(kZEPStatusAlreadyExists);

  const std::string keys = KeyText(own->GetPath(context));
  if (!keys.empty() && !fInstancesByKeys.emplace(keys, own).second) throw TZEPException(kZEPStatusAlreadyExists);
  fInstances.push_back(own);
  own->SetCommitted();
}

boost::shared_ptr<TMemoryInstance> TMemoryClass::AddInstance(TMemoryValues const& values) {
  const TCIMContext none;
  const auto created = NameRefusal(Name(), "", [&] { return CreateInstance(none); });
  const auto instance = boost::static_pointer_cast<TMemoryInstance>(created);
  for (auto const& entry : values) NameRefusal(Name(), entry.first, [&] { instance->Set(entry.first, entry.second); });
  NameRefusal(Name(), "", [&] { CommitInstance(instance, none); });
  return instance;
}

boost::shared_ptr<TMemoryClass> TMemoryClass::SuperClass() const {
  return fIsRoot ? boost::shared_ptr<TMemoryClass>() : boost::shared_ptr<TMemoryClass>(fSuperClass);
}

boost::shared_ptr<TMemoryPropertyDecl> TMemoryClass::FindPropertyDecl(std::string const& name) const {
  boost::shared_ptr<TMemoryPropertyDecl> found = fPropertyDecls.Find(name);
  for (boost::shared_ptr<TMemoryClass> cls = SuperClass(); cls && !found; cls = cls->SuperClass())
    found = cls->fPropertyDecls.Find(name);
  return found;
}

boost::shared_ptr<TMemoryInstance> TMemoryClass::FindInstance(TCIMReference const& path) const {
  const auto found = fInstancesByKeys.find(KeyText(path));
  return found == fInstancesByKeys.end() ? boost::shared_ptr<TMemoryInstance>() : found->second;
}

void TMemoryClass::Empty() {
  for (auto const& instance : fInstances) instance->DropReferences();
  fInstancesByKeys.clear();
  fInstances.clear();
  fLayout.reset();
  fStaticProperties.Clear();
  fMethodDecls.Clear();
  fPropertyDecls.Clear();
  fSubClasses.clear();
}

// Depth first, with the classes still to come on a stack, the next one on top.
std::vector<boost::shared_ptr<TMemoryClass>> TMemoryClass::AllSubClasses() const {
  std::vector<boost::shared_ptr<TMemoryClass>> all;
  std::vector<boost::shared_ptr<TMemoryClass>> pending(fSubClasses.rbegin(), fSubClasses.rend());
  while (!pending.empty()) {
    const boost::shared_ptr<TMemoryClass> next = pending.back();
    pending.pop_back();
    all.push_back(next);
    pending.insert(pending.end(), next->fSubClasses.rbegin(), next->fSubClasses.rend());
  }
  return all;
}

// Made from the top class down, because each builds on that of its superclass.
boost::shared_ptr<TMemoryLayout const> TMemoryClass::Layout() {
  std::vector<boost::shared_ptr<TMemoryClass>> without;
  for (boost::shared_ptr<TMemoryClass> cls = Self(); cls && !cls->fLayout; cls = cls->SuperClass()) without.push_back(cls);
  for (auto cls = without.rbegin(); cls != without.rend(); ++cls) (*cls)->MakeLayout();
  return fLayout;
}

// What the superclass has, with this class's own declarations put in or added.
void TMemoryClass::MakeLayout() {
  const auto layout = boost::make_shared<TMemoryLayout>();
  if (const boost::shared_ptr<TMemoryClass> superClass = SuperClass()) layout->fDecls = superClass->fLayout->fDecls;
  for (auto const& decl : fPropertyDecls.Elements()) layout->fDecls.Put(decl->GetName(TCIMContext()), decl);

  auto const& decls = layout->fDecls.Elements();
  for (std::size_t i = 0; i < decls.size(); ++i)
    if (decls[i]->IsKey(TCIMContext())) layout->fKeys.push_back(i);
  fLayout = layout;
}

}  // namespace NQRVZEP20
