// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>
#include <boost/thread/recursive_mutex.hpp>
#include <boost/weak_ptr.hpp>

#include <string>
#include <utility>

namespace NQRVZEP20 {

class ICIMClass;
class ICIMInstance;
class ICIMMethodDecl;
class ICIMNamedElement;
class ICIMNamespace;
class ICIMParameterDecl;
class ICIMProperty;
class ICIMPropertyDecl;
class ICIMQualifier;
class ICIMQualifierDecl;
class TCIMReference;

// Copies the schema of one namespace into another, and the instances of QRVSG_ZEPProduct, the collector's own product record.
// The two namespaces may belong to different plug-ins: the copy uses only the interfaces, with empty contexts.
//
// If copying a property declaration throws TZEPException, the copy logs that at debug severity and skips the declaration. Any
// other exception passes through and ends the copy, for example because a class already exists, a superclass is missing, or a
// static value belongs to a declaration that was skipped. The elements created by then remain in the destination. An empty
// pointer returned by the destination is treated as if the call had thrown kZEPStatusNotFound; only GetPropertyDecl may
// return one, for a property that is not declared yet. An empty pointer passed by the caller is a failed assertion. Only
// CopyInstance takes a lock.
class ZEP_EXPORT TCIMCopy {
public:
  // Copies the qualifier declarations, then the classes that are not associations (ICIMClass::GetClassFlag), then the
  // associations, because the classes that they refer to must exist. Copies the instances of the class QRVSG_ZEPProduct
  // itself, not of its subclasses, unless `noProductInstances` is true, the class is abstract, or it has the qualifier
  // PLUGINNAME.
  static void CopyClasses(boost::shared_ptr<ICIMNamespace> src, boost::shared_ptr<ICIMNamespace> dst, bool noProductInstances);

  // Copies one class with its qualifiers, declarations and static values, without instances. Its superclass and the qualifier
  // declarations must already exist in `dst`.
  static void CopyClass(boost::shared_ptr<ICIMClass> cls, boost::shared_ptr<ICIMNamespace> dst);

  // Copies one instance into the class of the same name. A property that is NULL is skipped: in the copy it has the default
  // of the destination class. Holds copyInstMutex during the call, so only one thread at a time copies an instance.
  static void CopyInstance(boost::shared_ptr<ICIMInstance> inst, boost::shared_ptr<ICIMNamespace> dst);

  // Returns the value for use in `dst`. Each reference, including NULL references and those in an array, then refers to the
  // class of the same name in `dst`; its keys are copied. Throws kZEPStatusNotFound when `dst` has no such class. Any other
  // value is returned unchanged.
  static TCIMValue CopyValue(TCIMValue const& v, boost::shared_ptr<ICIMNamespace> dst);
};

}  // namespace NQRVZEP20

// Held by CopyInstance during the copy of an instance. A caller may hold it to delay such copies.
extern ZEP_EXPORT boost::recursive_mutex copyInstMutex;

namespace NQRVZEP20 {
using ::copyInstMutex;
}

// ---- The steps of the copy: callbacks for the enumerations of the source. Each stores its destination and always returns
//      true, so that the enumeration continues. The namespace is held by a weak pointer; a step that needs the namespace
//      after its destruction causes a failed assertion. ----

class ZEP_EXPORT TCopyQualifierDecls {
public:
  TCopyQualifierDecls(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMQualifierDecl> declaration);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
};

// Copies a class and every class below it, each as TCopyClass does.
class ZEP_EXPORT TCopyClassTree {
public:
  TCopyClassTree(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, bool associations, bool noProductInstances);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMClass> cls);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  bool fAssociations;
  bool fNoProductInstances;
};

// Copies a class whose ICIMClass::GetClassFlag (true for associations) equals `associations`, with its instances if it is the
// product class. Skips any other class.
class ZEP_EXPORT TCopyClass {
public:
  TCopyClass(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, bool associations, bool noProductInstances);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMClass> cls);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  bool fAssociations;
  bool fNoProductInstances;
};

// Copies a qualifier to `target`: a class, or the declaration of a property, a method or a parameter.
class ZEP_EXPORT TCopyQualifier {
public:
  TCopyQualifier(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMNamedElement> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMQualifier> qualifier);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMNamedElement> fTarget;
};

class ZEP_EXPORT TCopyPropertyDecl {
public:
  TCopyPropertyDecl(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMClass> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMPropertyDecl> declaration);

private:
  void Copy(NQRVZEP20::ICIMPropertyDecl const& declaration);

  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMClass> fTarget;
};

class ZEP_EXPORT TCopyStaticProperty {
public:
  TCopyStaticProperty(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMClass> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMProperty> property);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMClass> fTarget;
};

class ZEP_EXPORT TCopyMethodDecl {
public:
  TCopyMethodDecl(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMClass> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMMethodDecl> declaration);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMClass> fTarget;
};

class ZEP_EXPORT TCopyParameterDecl {
public:
  TCopyParameterDecl(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMMethodDecl> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMParameterDecl> declaration);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMMethodDecl> fTarget;
};

class ZEP_EXPORT TCopyInstanceProperty {
public:
  TCopyInstanceProperty(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, boost::shared_ptr<NQRVZEP20::ICIMInstance> target);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMProperty> property);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  boost::shared_ptr<NQRVZEP20::ICIMInstance> fTarget;
};

// Copies a key binding of a reference into `target`. The class of `target` must be set, and `target` must outlive the
// callback.
class ZEP_EXPORT TCopyReferenceKeys {
public:
  TCopyReferenceKeys(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, NQRVZEP20::TCIMReference& target);
  bool operator()(std::pair<std::string, NQRVZEP20::TCIMValue> binding);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  NQRVZEP20::TCIMReference& fTarget;
};
