// SPDX-License-Identifier: Apache-2.0

// The destructors of the interfaces, which are defined here so that each interface's virtual table is emitted once, in this
// library; and the default bodies of the operations that a plug-in may leave out.

#include "ICIMClass.h"
#include "ICIMElement.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamedElement.h"
#include "ICIMNamespace.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "ICIMQualifierDecl.h"
#include "INamespaceConsumer.h"
#include "INamespaceProvider.h"
#include "INamespaceProviderManager.h"
#include "TCIMReference.h"
#include "core/Failure.h"

#include <boost/core/demangle.hpp>

#include <typeinfo>

namespace NQRVZEP20 {

ICIMClass::~ICIMClass() = default;
ICIMElement::~ICIMElement() = default;
ICIMInstance::~ICIMInstance() = default;
ICIMMethodDecl::~ICIMMethodDecl() = default;
ICIMNamedElement::~ICIMNamedElement() = default;
ICIMNamespace::~ICIMNamespace() = default;
ICIMParameterDecl::~ICIMParameterDecl() = default;
ICIMProperty::~ICIMProperty() = default;
ICIMPropertyDecl::~ICIMPropertyDecl() = default;
ICIMQualifier::~ICIMQualifier() = default;
ICIMQualifierDecl::~ICIMQualifierDecl() = default;
INamespaceConsumer::~INamespaceConsumer() = default;
INamespaceProvider::~INamespaceProvider() = default;
INamespaceProviderManager::~INamespaceProviderManager() = default;

// ---- Default bodies, for operations that a plug-in may leave out ----

namespace {

// `implementer`: the class of the plug-in's object. `operation`: "ICIMClass::CommitInstance".
[[noreturn]] void ThrowNotImplemented(std::type_info const& implementer, char const* operation) {
  LogErrorAndThrow(kZEPStatusNotImplemented, "", boost::core::demangle(implementer.name()) + " does not implement " + operation);
}

}  // namespace

std::string ICIMNamespace::GetName(TCIMContext const&) const { ThrowNotImplemented(typeid(*this), "ICIMNamespace::GetName"); }

boost::shared_ptr<ICIMQualifierDecl> ICIMNamespace::CreateQualifierDecl(std::string const&, TCIMValue const&, unsigned int,
                                                                        unsigned int, TCIMContext const&) {
  ThrowNotImplemented(typeid(*this), "ICIMNamespace::CreateQualifierDecl");
}

boost::shared_ptr<ICIMQualifier> ICIMNamedElement::AddQualifier(boost::shared_ptr<ICIMQualifierDecl>, TCIMValue const&,
                                                                unsigned int, TCIMContext const&) {
  ThrowNotImplemented(typeid(*this), "ICIMNamedElement::AddQualifier");
}

bool ICIMClass::IsAbstract(TCIMContext const&) const { return false; }
void ICIMClass::SetStaticProperty(std::string const&, TCIMValue const&, TCIMContext const&) {
  ThrowNotImplemented(typeid(*this), "ICIMClass::SetStaticProperty");
}
boost::shared_ptr<ICIMMethodDecl> ICIMClass::AddMethodDecl(std::string const&, TCIMValue::TCIMType, TCIMContext const&) {
  ThrowNotImplemented(typeid(*this), "ICIMClass::AddMethodDecl");
}
void ICIMClass::CommitInstance(boost::shared_ptr<ICIMInstance>, TCIMContext const&) {
  ThrowNotImplemented(typeid(*this), "ICIMClass::CommitInstance");
}
void ICIMClass::BeginDeclarations(TCIMContext const&) {}
void ICIMClass::EndDeclarations(TCIMContext const&) {}

boost::shared_ptr<ICIMClass> ICIMInstance::GetClass(TCIMContext const&) const {
  ThrowNotImplemented(typeid(*this), "ICIMInstance::GetClass");
}
TCIMReference ICIMInstance::GetPath(TCIMContext const&) const { ThrowNotImplemented(typeid(*this), "ICIMInstance::GetPath"); }

std::string ICIMProperty::GetName(TCIMContext const&) const { ThrowNotImplemented(typeid(*this), "ICIMProperty::GetName"); }
boost::shared_ptr<ICIMPropertyDecl const> ICIMProperty::GetDeclaration(TCIMContext const&) const {
  ThrowNotImplemented(typeid(*this), "ICIMProperty::GetDeclaration");
}

bool ICIMPropertyDecl::IsKey(TCIMContext const&) const { ThrowNotImplemented(typeid(*this), "ICIMPropertyDecl::IsKey"); }
boost::weak_ptr<ICIMNamedElement> ICIMPropertyDecl::GetOwner(TCIMContext const&) const { return {}; }

boost::weak_ptr<ICIMNamedElement> ICIMMethodDecl::GetOwner(TCIMContext const&) const { return {}; }

boost::weak_ptr<ICIMMethodDecl> ICIMParameterDecl::GetMethod(TCIMContext const&) const { return {}; }

boost::shared_ptr<ICIMQualifierDecl> ICIMQualifier::GetDeclaration(TCIMContext const&) const {
  ThrowNotImplemented(typeid(*this), "ICIMQualifier::GetDeclaration");
}
boost::weak_ptr<ICIMNamedElement> ICIMQualifier::GetOwner(TCIMContext const&) const { return {}; }

}  // namespace NQRVZEP20
