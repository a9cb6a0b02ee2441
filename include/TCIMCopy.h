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

// Copies the schema of one namespace into another, and the instances of the collector's own product record. The two may
// belong to different plug-ins: everything goes through the interfaces, with empty contexts.
//
// A property declaration that throws TZEPException is logged, at debug severity, and left out. Any other failure (a class
// that is there already, a superclass that is not, a static value whose declaration was left out, whatever a plug-in throws)
// passes through and ends the copy; what was made in the destination by then stays. An empty pointer returned by the
// destination is treated as kZEPStatusNotFound, before anything else is done; only its GetPropertyDecl may return one, for a
// property that is not declared yet. An empty pointer that the caller passes is a failed assertion. Only CopyInstance takes
// a lock.
class ZEP_EXPORT TCIMCopy {
public:
  // Qualifier declarations, then the classes whose flag (ICIMClass::GetClassFlag) is not set, then those whose flag is, so
  // that an association finds the classes that it refers to. Instances are those of the class QRVSG_ZEPProduct itself, not
  // of its subclasses, unless `noProductInstances`, the class is abstract, or it carries the qualifier PLUGINNAME.
  static void CopyClasses(boost::shared_ptr<ICIMNamespace> src, boost::shared_ptr<ICIMNamespace> dst, bool noProductInstances);

  // One class with its qualifiers and declarations, without instances. Its superclass and the qualifier declarations are in
  // `dst` already.
  static void CopyClass(boost::shared_ptr<ICIMClass> cls, boost::shared_ptr<ICIMNamespace> dst);

  // One instance into the class of the same name. A property that is NULL is passed over: in the copy it has the default of
  // the destination class. Holds copyInstMutex throughout, so that of two threads that copy one waits.
  static void CopyInstance(boost::shared_ptr<ICIMInstance> inst, boost::shared_ptr<ICIMNamespace> dst);

  // The value as one of `dst`: a reference, also one that is NULL or an element of an array, refers to the class of the same
  // name there and has its keys carried over. Other values come back as they are. Throws kZEPStatusNotFound when `dst` has
  // no such class.
  static TCIMValue CopyValue(TCIMValue const& v, boost::shared_ptr<ICIMNamespace> dst);
};

}  // namespace NQRVZEP20

// Held by CopyInstance. Whoever keeps instances from being copied for a while holds it, too.
extern ZEP_EXPORT boost::recursive_mutex copyInstMutex;

namespace NQRVZEP20 {
using ::copyInstMutex;
}

// ---- The steps of the copy: callbacks for the enumerations of the source. Each holds where it writes to, and returns true,
//      so that the enumeration goes on. The namespace is held weakly; once it is gone a step works with an empty pointer. ----

class ZEP_EXPORT TCopyQualifierDecls {
public:
  TCopyQualifierDecls(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMQualifierDecl> declaration);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
};

// A class and all below it, as TCopyClass copies each.
class ZEP_EXPORT TCopyClassTree {
public:
  TCopyClassTree(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, bool associations, bool noProductInstances);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMClass> cls);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  bool fAssociations;
  bool fNoProductInstances;
};

// A class whose flag (ICIMClass::GetClassFlag, set for associations) equals `associations`, with its instances when it is the
// product class; any other class is passed over.
class ZEP_EXPORT TCopyClass {
public:
  TCopyClass(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, bool associations, bool noProductInstances);
  bool operator()(boost::shared_ptr<NQRVZEP20::ICIMClass> cls);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  bool fAssociations;
  bool fNoProductInstances;
};

// A qualifier on `target`: a class, a property, a method or a parameter.
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

// A key binding of a reference, into `target`, which has its class and outlives the callback.
class ZEP_EXPORT TCopyReferenceKeys {
public:
  TCopyReferenceKeys(boost::weak_ptr<NQRVZEP20::ICIMNamespace> destination, NQRVZEP20::TCIMReference& target);
  bool operator()(std::pair<std::string, NQRVZEP20::TCIMValue> binding);

private:
  boost::weak_ptr<NQRVZEP20::ICIMNamespace> fDestination;
  NQRVZEP20::TCIMReference& fTarget;
};
