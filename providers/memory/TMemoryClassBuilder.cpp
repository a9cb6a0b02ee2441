// SPDX-License-Identifier: Apache-2.0
#include "TMemoryClassBuilder.h"

#include "CIMTypes.h"
#include "FillLog.h"
#include "Fitting.h"
#include "TMemoryClass.h"
#include "TZEPFailure.h"

namespace NQRVZEP20 {

namespace {

TCIMValue TextArray(std::vector<std::string> const& texts) {
  return TCIMValue(TCIMValue::TCIMType::kCIMTypeString, 0, std::vector<TCIMValue>(texts.begin(), texts.end()));
}

// The default value of a property of that type.
TCIMValue DefaultOf(TMemoryType const& type, TCIMValue const& value) {
  TCIMValue const fitted = FittedTo(type.GetNull(), value);
  if (!HasTypeName(type.GetType())) throw TZEPFailure(kZEPStatusTypeMismatch, "a type of that name does not exist");
  if (fitted.GetType() != type.GetType()) throw TZEPFailure(kZEPStatusTypeMismatch, WhyNotOf(type.GetType(), fitted));
  return fitted;
}

TCIMValue NullReferenceTo(boost::shared_ptr<ICIMClass> cls) {
  TCIMValue null = TMemoryType(TCIMValue::TCIMType::kCIMTypeReference).GetNull();
  null.SetReferencedClass(cls);
  return null;
}

}  // namespace

TMemoryClassBuilder::TMemoryClassBuilder(boost::shared_ptr<TMemoryClass> cls) : fClass(cls), fElement(cls) {}

TMemoryClassBuilder& TMemoryClassBuilder::Property(std::string const& name, TMemoryType const& type,
                                                   TCIMValue const& defaultValue) {
  NameRefusal(ClassName(), name, [&] { fElement = fClass->AddPropertyDecl(name, DefaultOf(type, defaultValue), TCIMContext()); });
  return *this;
}

TMemoryClassBuilder& TMemoryClassBuilder::Key(std::string const& name, TMemoryType const& type) {
  return Property(name, type).Qualifier("Key", true);
}

TMemoryClassBuilder& TMemoryClassBuilder::Reference(std::string const& name, std::string const& className) {
  TCIMContext const none;
  NameRefusal(ClassName(), name, [&] {
    boost::shared_ptr<ICIMClass> const referenced = fClass->GetNamespace(none)->GetClass(className, none);
    fElement = fClass->AddPropertyDecl(name, NullReferenceTo(referenced), none);
  });
  return *this;
}

TMemoryClassBuilder& TMemoryClassBuilder::KeyReference(std::string const& name, std::string const& className) {
  return Reference(name, className).Qualifier("Key", true);
}

TMemoryClassBuilder& TMemoryClassBuilder::Static(std::string const& name, TMemoryType const& type, TCIMValue const& value) {
  Property(name, type).Qualifier("Static", true);
  NameRefusal(ClassName(), name, [&] { fClass->SetStaticProperty(name, DefaultOf(type, value), TCIMContext()); });
  return *this;
}

TMemoryClassBuilder& TMemoryClassBuilder::Method(std::string const& name, TMemoryType const& returnType) {
  NameRefusal(ClassName(), name, [&] { fMethod = fClass->AddMethodDecl(name, returnType.GetType(), TCIMContext()); });
  fElement = fMethod;
  return *this;
}

TMemoryClassBuilder& TMemoryClassBuilder::In(std::string const& name, TMemoryType const& type) {
  return Parameter(name, type).Qualifier("In", true);
}

// The qualifier In is true by default: a parameter is an input unless it states otherwise.
TMemoryClassBuilder& TMemoryClassBuilder::Out(std::string const& name, TMemoryType const& type) {
  return Parameter(name, type).Qualifier("In", false).Qualifier("Out", true);
}

TMemoryClassBuilder& TMemoryClassBuilder::Abstract() { return Qualifier("Abstract", true); }

TMemoryClassBuilder& TMemoryClassBuilder::Association() { return Qualifier("Association", true); }

TMemoryClassBuilder& TMemoryClassBuilder::Description(std::string const& text) { return Qualifier("Description", text); }

TMemoryClassBuilder& TMemoryClassBuilder::Override() { return Qualifier("Override", fElement->GetName(TCIMContext())); }

TMemoryClassBuilder& TMemoryClassBuilder::ValueMap(std::vector<std::string> const& values,
                                                   std::vector<std::string> const& words) {
  return Qualifier("ValueMap", TextArray(values)).Qualifier("Values", TextArray(words));
}

TMemoryClassBuilder& TMemoryClassBuilder::Qualifier(std::string const& name, TCIMValue const& value) {
  TCIMContext const none;
  NameRefusal(ClassName(), "[" + name + "]", [&] {
    boost::shared_ptr<ICIMQualifierDecl> const decl = fClass->GetNamespace(none)->GetQualifierDecl(name, none);
    if (!decl) throw TZEPException(kZEPStatusNotFound);
    fElement->AddQualifier(decl, FittedTo(decl->GetDefaultValue(none), value), decl->GetFlavor(none), none);
  });
  return *this;
}

TMemoryClassBuilder& TMemoryClassBuilder::Parameter(std::string const& name, TMemoryType const& type) {
  NameRefusal(ClassName(), name, [&] {
    if (!fMethod) throw TZEPException(kZEPStatusInvalidOpSequence);
    fElement = fMethod->AddParameterDecl(name, type.GetType(), type.GetMaxArraySize(), "", TCIMContext());
  });
  return *this;
}

std::string TMemoryClassBuilder::ClassName() const { return fClass->GetName(TCIMContext()); }

}  // namespace NQRVZEP20
