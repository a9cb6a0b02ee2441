// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMClass.h"
#include "TMemoryInstance.h"
#include "TMemoryMethodDecl.h"
#include "TMemoryNamedElement.h"
#include "TMemoryPropertyDecl.h"

#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

class TMemoryNamespace;

// A class. Created and owned by TMemoryNamespace; a class that outlives its namespace is empty.
class TMemoryClass : public TMemoryNamedElement<ICIMClass> {
public:
  TMemoryClass(boost::weak_ptr<TMemoryNamespace> ns, boost::shared_ptr<TMemoryClass> superClass, std::string const& name);

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const override;
  bool GetClassFlag(TCIMContext const& context) const override;
  bool IsAbstract(TCIMContext const& context) const override;
  bool IsRootClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const override;
  void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                           TCIMContext const& context) const override;

  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                unsigned int flavor, TCIMContext const& context) override;

  void BeginDeclarations(TCIMContext const& context) override;
  void EndDeclarations(TCIMContext const& context) override;
  boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                      TCIMContext const& context) override;
  boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name, TCIMContext const& context) const override;
  void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                              TCIMContext const& context) const override;

  void SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context) override;
  void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                 TCIMContext const& context) const override;

  boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) override;
  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override;

  boost::shared_ptr<ICIMMethodDecl> AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                  TCIMContext const& context) override;
  void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                            TCIMContext const& context) const override;

  void CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context) override;

  // ---- Filling ----

  // Creates an instance, sets the values and commits it. A refusal is logged as an error and throws a TZEPFailure whose
  // reason names what was refused.
  boost::shared_ptr<TMemoryInstance> AddInstance(TMemoryValues const& values);

  // ---- For the other classes of this library ----

  boost::shared_ptr<TMemoryClass> SuperClass() const;  // empty for a root class

  // The declaration in this class or in the nearest superclass; empty when there is none.
  boost::shared_ptr<TMemoryPropertyDecl> FindPropertyDecl(std::string const& name) const;

  bool HasMadeInstances() const { return fHasMadeInstances; }  // or a subclass has made some

  // The committed instance of this class itself that has the keys of the path; empty when there is none.
  boost::shared_ptr<TMemoryInstance> FindInstance(TCIMReference const& path) const;

  void AddSubClass(boost::shared_ptr<TMemoryClass> subClass) { fSubClasses.push_back(subClass); }

  // Releases everything except the name. A value owns the class that it refers to, so ownership cycles between classes are
  // possible, which the namespace breaks when it is destroyed.
  void Empty();

private:
  boost::shared_ptr<TMemoryClass> Self() { return boost::static_pointer_cast<TMemoryClass>(shared_from_this()); }
  struct TInstances {
    std::vector<boost::shared_ptr<TMemoryInstance>> fAll;
    std::unordered_map<std::string, boost::shared_ptr<TMemoryInstance>> fByKeys;  // those that have a key value
  };

  boost::shared_ptr<TMemoryLayout const> Layout();  // created by the first call
  bool VisitInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> const& callback) const;
  void DeclareIn(TMemoryLayout& layout) const;
  void MarkAsAssociation();
  std::vector<boost::shared_ptr<TMemoryClass>> AllSubClasses() const;  // in the order of EnumerateSubClasses

  bool const fIsRoot;
  bool fIsDeclaring = false;
  bool fIsAssociation;             // it or a superclass has the qualifier
  bool fHasMadeInstances = false;  // or a subclass has made some
  boost::weak_ptr<TMemoryClass> fSuperClass;
  std::vector<boost::shared_ptr<TMemoryClass>> fSubClasses;  // the direct ones

  TNamedList<TMemoryPropertyDecl> fPropertyDecls;
  TNamedList<TMemoryMethodDecl> fMethodDecls;
  TNamedList<TMemoryProperty> fStaticProperties;

  boost::shared_ptr<TMemoryLayout const> fLayout;  // created for the first instance; some superclasses have one, too
  std::unique_ptr<TInstances> fInstances;          // null before the first instance: most classes have none
};

}  // namespace NQRVZEP20
