// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "TMemoryClassBuilder.h"
#include "TMemoryInstance.h"
#include "TNamedList.h"

#include <boost/enable_shared_from_this.hpp>

#include <string>
#include <vector>

namespace NQRVZEP20 {

class TMemoryClass;
class TMemoryQualifierDecl;

// A CIM namespace in memory, for a provider plug-in to fill, or for a copy of another namespace.
//
//   auto ns = boost::make_shared<TMemoryNamespace>("root/storage");
//   ns->DefineClass("X_Device").Abstract().Key("Id", "uint32");
//   ns->DefineClass("X_Disk", "X_Device").Property("Name", "string").Property("Sizes", "uint64[4]");
//   ns->AddInstance("X_Disk", {{"Id", 5}, {"Name", "sda"}});
//
// Always held by boost::shared_ptr. The namespace owns its contents and releases them when it is destroyed. A class that
// outlives it is empty, and an instance keeps its values except references; an operation that needs the namespace, or a class
// that was destroyed, throws boost::bad_weak_ptr. Lookups by name and by object path take constant time. Contexts are ignored.
// Several threads may read concurrently while none writes.
class TMemoryNamespace : public ICIMNamespace, public boost::enable_shared_from_this<TMemoryNamespace> {
public:
  // Empty: without classes and without qualifier declarations.
  explicit TMemoryNamespace(std::string const& name);
  ~TMemoryNamespace() override;

  std::string GetName(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                           TCIMContext const& context) override;
  boost::shared_ptr<ICIMClass> GetClass(std::string const& className, TCIMContext const& context) const override;
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const& context) const override;

  boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                           unsigned int scope, unsigned int flavor,
                                                           TCIMContext const& context) override;
  boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const override;
  void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                               TCIMContext const& context) const override;

  // A path names an instance by its own class and exactly its keys (those that are not NULL): a path with the name of the
  // superclass finds only instances of the superclass itself. Case does not matter in class and key names. Key values are
  // compared by their text, which has all significant digits of a real. An instance without any key value has no path of its
  // own and is never found; a class may have several such instances.
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override;

  // Whether the namespace has the class. GetClass throws for a missing one, which takes far longer.
  bool HasClass(std::string const& className) const;

  // ---- Filling. A refusal is logged as an error and throws a TZEPFailure whose reason names what was refused. ----

  // Creates a class, below `superClassName` unless that is empty, and returns a builder that describes it. The first call
  // declares the standard qualifiers. Throws everything that CreateClass throws, and kZEPStatusNotFound for a missing superclass.
  TMemoryClassBuilder DefineClass(std::string const& name, std::string const& superClassName = "");

  // Creates an instance of the class, sets the values and commits it; see TMemoryInstance::Set. Throws kZEPStatusNotFound for a
  // missing class or property.
  boost::shared_ptr<TMemoryInstance> AddInstance(std::string const& className, TMemoryValues const& values);

  // Declares the qualifiers that CIM itself defines (StandardQualifiers.cpp lists them), except those already declared.
  void DeclareStandardQualifiers();

private:
  boost::shared_ptr<TMemoryClass> FindClass(std::string const& name) const;  // or throws kZEPStatusNotFound

  std::string fName;
  TNamedList<TMemoryClass> fClasses;
  std::vector<boost::shared_ptr<TMemoryClass>> fRootClasses;
  TNamedList<TMemoryQualifierDecl> fQualifierDecls;
  bool fHasStandardQualifiers = false;
};

}  // namespace NQRVZEP20
