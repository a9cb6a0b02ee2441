// SPDX-License-Identifier: Apache-2.0

// The steps of the copy, in the order in which it comes to them.

#include "TCIMCopy.h"

#include "Answers.h"
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "ICIMQualifierDecl.h"
#include "TAddToVectorCallback.h"
#include "TCIMReference.h"
#include "TZEPException.h"
#include "core/Log.h"

#include <boost/ref.hpp>

#include <vector>

using namespace NQRVZEP20;

namespace {

constexpr char kProductClassName[] = "QRVSG_ZEPProduct";
constexpr char kPluginNameQualifier[] = "PLUGINNAME";
constexpr char kOverrideQualifier[] = "OVERRIDE";

// Empty when the namespace no longer exists; using the result is then a failed assertion.
boost::shared_ptr<ICIMNamespace> Lock(boost::weak_ptr<ICIMNamespace> const& destination) {
  try {
    return boost::shared_ptr<ICIMNamespace>(destination);
  } catch (boost::bad_weak_ptr const&) {
    return boost::shared_ptr<ICIMNamespace>();
  }
}

// The callback is handed over by reference: it is too large to be held in one without an allocation.
void CopyQualifiers(ICIMNamedElement const& from, boost::weak_ptr<ICIMNamespace> const& destination,
                    boost::shared_ptr<ICIMNamedElement> const& to) {
  TCopyQualifier copyQualifier(destination, to);
  from.EnumerateQualifiers(boost::ref(copyQualifier), TCIMContext());
}

// The default of a declaration; a declaration without a default may omit the default's type, which is then `type`.
TCIMValue TypedDefault(TCIMValue::TCIMType type, TCIMValue defaultValue) {
  if (defaultValue.GetType() == TCIMValue::TCIMType::kCIMTypeInvalid) defaultValue.SetNullValue(type, 0);
  return defaultValue;
}

bool HasProductInstances(ICIMClass const& cls) {
  boost::shared_ptr<ICIMQualifier> const pluginName = cls.GetQualifier(kPluginNameQualifier, TCIMContext());
  bool const isAbstract = cls.IsAbstract(TCIMContext());
  return !isAbstract && !pluginName && cls.GetName(TCIMContext()) == kProductClassName;
}

bool IsProduct(ICIMInstance const& instance) {
  return instance.GetClass(TCIMContext())->GetName(TCIMContext()) == kProductClassName;
}

}  // namespace

// ---- Qualifier declarations ----

TCopyQualifierDecls::TCopyQualifierDecls(boost::weak_ptr<ICIMNamespace> destination) : fDestination(destination) {}

bool TCopyQualifierDecls::operator()(boost::shared_ptr<ICIMQualifierDecl> declaration) {
  TCIMContext const none;
  std::string const name = declaration->GetName(none);
  TCIMValue const defaultValue = TypedDefault(declaration->GetType(none), declaration->GetDefaultValue(none));
  unsigned int const scope = declaration->GetScope(none);
  unsigned int const flavor = declaration->GetFlavor(none);
  Required(Lock(fDestination)->CreateQualifierDecl(name, defaultValue, scope, flavor, none), "qualifier declaration", name);
  return true;
}

// ---- Classes ----

TCopyClassTree::TCopyClassTree(boost::weak_ptr<ICIMNamespace> destination, bool associations, bool noProductInstances)
    : fDestination(destination), fAssociations(associations), fNoProductInstances(noProductInstances) {}

bool TCopyClassTree::operator()(boost::shared_ptr<ICIMClass> cls) {
  TCopyClass copyClass(Lock(fDestination), fAssociations, fNoProductInstances);
  copyClass(cls);
  cls->EnumerateSubClasses(copyClass, TCIMContext());
  return true;
}

TCopyClass::TCopyClass(boost::weak_ptr<ICIMNamespace> destination, bool associations, bool noProductInstances)
    : fDestination(destination), fAssociations(associations), fNoProductInstances(noProductInstances) {}

bool TCopyClass::operator()(boost::shared_ptr<ICIMClass> cls) {
  if (cls->GetClassFlag(TCIMContext()) != fAssociations) return true;
  TCIMCopy::CopyClass(cls, Lock(fDestination));
  if (!HasProductInstances(*cls)) return true;

  std::vector<boost::shared_ptr<ICIMInstance>> instances;
  cls->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
  for (auto const& instance : instances)
    if (IsProduct(*instance) && !fNoProductInstances) TCIMCopy::CopyInstance(instance, Lock(fDestination));
  return true;
}

// ---- What belongs to a class ----

TCopyQualifier::TCopyQualifier(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMNamedElement> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyQualifier::operator()(boost::shared_ptr<ICIMQualifier> qualifier) {
  TCIMContext const none;
  std::string const name = qualifier->GetName(none);
  boost::shared_ptr<ICIMQualifierDecl> const declaration =
      Required(Lock(fDestination)->GetQualifierDecl(name, none), "qualifier declaration", name);
  Required(fTarget->AddQualifier(declaration, qualifier->GetValue(none), qualifier->GetFlavor(none), none), "qualifier", name);
  return true;
}

TCopyPropertyDecl::TCopyPropertyDecl(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMClass> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyPropertyDecl::operator()(boost::shared_ptr<ICIMPropertyDecl> declaration) {
  try {
    Copy(*declaration);
  } catch (TZEPException const&) {
    LogDebug("TCopyPropertyDecl::operator() - Get an Exception");
  }
  return true;
}

void TCopyPropertyDecl::Copy(ICIMPropertyDecl const& declaration) {
  TCIMContext const none;
  std::string const name = declaration.GetName(none);
  // The results are not used, but a declaration for which one of these calls throws is left out. Kept.
  fTarget->GetPropertyDecl(name, none);
  declaration.GetQualifier(kOverrideQualifier, none);

  TCIMValue const defaultValue = TCIMCopy::CopyValue(declaration.GetDefaultValue(none), Lock(fDestination));
  boost::shared_ptr<ICIMPropertyDecl> const copy =
      Required(fTarget->AddPropertyDecl(name, defaultValue, none), "property declaration", name);
  CopyQualifiers(declaration, fDestination, copy);
}

TCopyStaticProperty::TCopyStaticProperty(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMClass> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyStaticProperty::operator()(boost::shared_ptr<ICIMProperty> property) {
  TCIMContext const none;
  TCIMValue const value = TCIMCopy::CopyValue(property->GetValue(none), Lock(fDestination));
  fTarget->SetStaticProperty(property->GetDeclaration(none)->GetName(none), value, none);
  return true;
}

TCopyMethodDecl::TCopyMethodDecl(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMClass> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyMethodDecl::operator()(boost::shared_ptr<ICIMMethodDecl> declaration) {
  TCIMContext const none;
  std::string const name = declaration->GetName(none);
  boost::shared_ptr<ICIMMethodDecl> const copy =
      Required(fTarget->AddMethodDecl(name, declaration->GetReturnType(none), none), "method declaration", name);
  CopyQualifiers(*declaration, fDestination, copy);
  TCopyParameterDecl copyParameter(fDestination, copy);
  declaration->EnumerateParameterDecls(boost::ref(copyParameter), none);
  return true;
}

TCopyParameterDecl::TCopyParameterDecl(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMMethodDecl> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyParameterDecl::operator()(boost::shared_ptr<ICIMParameterDecl> declaration) {
  TCIMContext const none;
  std::string const name = declaration->GetName(none);
  boost::shared_ptr<ICIMParameterDecl> const copy =
      Required(fTarget->AddParameterDecl(name, declaration->GetType(none), declaration->GetMaxArraySize(none),
                                         declaration->GetReferencedClassName(none), none),
               "parameter declaration", name);
  CopyQualifiers(*declaration, fDestination, copy);
  return true;
}

// ---- What belongs to an instance or a reference ----

TCopyInstanceProperty::TCopyInstanceProperty(boost::weak_ptr<ICIMNamespace> destination, boost::shared_ptr<ICIMInstance> target)
    : fDestination(destination), fTarget(target) {}

bool TCopyInstanceProperty::operator()(boost::shared_ptr<ICIMProperty> property) {
  TCIMContext const none;
  TCIMValue const value = property->GetValue(none);
  if (value.IsNull()) return true;
  std::string const name = property->GetName(none);
  boost::shared_ptr<ICIMProperty> const copy = Required(fTarget->GetProperty(name, none), "property", name);
  copy->SetValue(TCIMCopy::CopyValue(value, Lock(fDestination)), none);
  return true;
}

TCopyReferenceKeys::TCopyReferenceKeys(boost::weak_ptr<ICIMNamespace> destination, TCIMReference& target)
    : fDestination(destination), fTarget(target) {}

bool TCopyReferenceKeys::operator()(std::pair<std::string, TCIMValue> binding) {
  fTarget.AddKeyValue(binding.first, TCIMCopy::CopyValue(binding.second, Lock(fDestination)));
  return true;
}
