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

// A CIM namespace that lies in memory: what a provider plug-in fills, and what CIM objects are copied into.
//
//   auto ns = boost::make_shared<TMemoryNamespace>("root/storage");
//   ns->DefineClass("X_Device").Abstract().Key("Id", "uint32");
//   ns->DefineClass("X_Disk", "X_Device").Property("Name", "string").Property("Sizes", "uint64[4]");
//   ns->AddInstance("X_Disk", {{"Id", 5}, {"Name", "sda"}});
//
// Always held by boost::shared_ptr. It owns everything in it and lets go of everything when it goes: a class that someone
// still holds then is empty, an instance keeps its values but for references, and what looks for the namespace, or for a
// class that nobody holds, throws boost::bad_weak_ptr. Lookups by name and by object path take constant time. Contexts are
// ignored. Several threads may read at once while none writes.
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
  // superclass finds only instances of the superclass itself. Class and key names are compared without regard to case, key
  // values by their text, which for reals has every digit. An instance without any key value has no path of its own and is never
  // found; nothing keeps a class from having several such instances.
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override;

  // ---- Filling. Whatever is refused is named in the log, as an error, before the exception passes on. ----

  // Creates a class, under `superClassName` unless that is empty, and hands out a builder that describes it. Declares the
  // standard qualifiers first if that was not done yet. Throws what CreateClass throws, and kZEPStatusNotFound for a
  // superclass that is not there.
  TMemoryClassBuilder DefineClass(std::string const& name, std::string const& superClassName = "");

  // Creates an instance of the class, sets the values and commits it; see TMemoryInstance::Set. Throws kZEPStatusNotFound
  // for a class or property that is not there.
  boost::shared_ptr<TMemoryInstance> AddInstance(std::string const& className, TMemoryValues const& values);

  // Declares the qualifiers that CIM itself defines (StandardQualifiers.cpp lists them), but for those already there.
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
