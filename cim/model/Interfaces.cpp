// The destructors of the interfaces stand here, so that each interface's virtual table is made once, in this library.

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

}  // namespace NQRVZEP20
