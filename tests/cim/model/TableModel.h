// SPDX-License-Identifier: Apache-2.0
#pragma once

// An object model around another one that has only the operations of a table. One that a plug-in may leave out and that is
// missing from the table has the body of its interface; calling any other that is missing fails the test.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TZEPException.h"

#include <boost/make_shared.hpp>

#include <set>
#include <stdexcept>
#include <string>

namespace NQRVZEP20 {

struct TTable {
  std::set<std::string> fOperations;  // "ICIMClass::GetName"
  mutable std::set<std::string> fCalled;
  mutable bool fIsChecked = true;  // false: every operation is available, and calls are not recorded

  bool Has(std::string const& operation) const {
    if (!fIsChecked) return true;
    fCalled.insert(operation);
    return fOperations.count(operation) != 0;
  }
  void Need(std::string const& operation) const {
    if (!Has(operation)) throw std::logic_error(operation + " is not in the table");
  }
};

class TTableQualifierDecl : public ICIMQualifierDecl {
public:
  TTableQualifierDecl(TTable const& table, boost::shared_ptr<ICIMQualifierDecl> inner) : fTable(table), fInner(inner) {}
  std::string GetName(TCIMContext const& context) const override { return Called("GetName").GetName(context); }
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return Called("GetType").GetType(context); }
  unsigned int GetScope(TCIMContext const& context) const override { return Called("GetScope").GetScope(context); }
  unsigned int GetFlavor(TCIMContext const& context) const override { return Called("GetFlavor").GetFlavor(context); }
  TCIMValue GetDefaultValue(TCIMContext const& context) const override {
    return Called("GetDefaultValue").GetDefaultValue(context);
  }
  boost::shared_ptr<ICIMQualifierDecl> Inner() const { return fInner; }

private:
  ICIMQualifierDecl const& Called(std::string const& operation) const {
    fTable.Need("ICIMQualifierDecl::" + operation);
    return *fInner;
  }
  TTable const& fTable;
  boost::shared_ptr<ICIMQualifierDecl> fInner;
};

class TTableQualifier : public ICIMQualifier {
public:
  TTableQualifier(TTable const& table, boost::shared_ptr<ICIMQualifier> inner) : fTable(table), fInner(inner) {}
  std::string GetName(TCIMContext const& context) const override { return Called("GetName").GetName(context); }
  TCIMValue GetValue(TCIMContext const& context) const override { return Called("GetValue").GetValue(context); }
  unsigned int GetFlavor(TCIMContext const& context) const override { return Called("GetFlavor").GetFlavor(context); }

private:
  ICIMQualifier const& Called(std::string const& operation) const {
    fTable.Need("ICIMQualifier::" + operation);
    return *fInner;
  }
  TTable const& fTable;
  boost::shared_ptr<ICIMQualifier> fInner;
};

// `kind` is the name of the interface.
template <class TInterface>
class TTableElement : public TInterface {
public:
  TTableElement(TTable const& table, std::string const& kind, boost::shared_ptr<TInterface> inner)
      : fTable(table), fKind(kind), fInner(inner) {}

  std::string GetName(TCIMContext const& context) const override { return Called("GetName").GetName(context); }
  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const& context) const override {
    return Called("GetQualifier").GetQualifier(name, context);
  }
  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback,
                           TCIMContext const& context) const override {
    Called("EnumerateQualifiers")
        .EnumerateQualifiers(
            [&](boost::shared_ptr<ICIMQualifier> one) { return callback(boost::make_shared<TTableQualifier>(fTable, one)); },
            context);
  }
  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                unsigned int flavor, TCIMContext const& context) override {
    if (!fTable.Has(fKind + "::AddQualifier")) return TInterface::AddQualifier(declaration, value, flavor, context);
    auto const own = boost::dynamic_pointer_cast<TTableQualifierDecl>(declaration);
    return fInner->AddQualifier(own->Inner(), value, flavor, context);
  }

protected:
  TInterface& Called(std::string const& operation) const {
    fTable.Need(fKind + "::" + operation);
    return *fInner;
  }

  TTable const& fTable;
  std::string const fKind;
  boost::shared_ptr<TInterface> fInner;
};

class TTablePropertyDecl : public TTableElement<ICIMPropertyDecl> {
public:
  TTablePropertyDecl(TTable const& table, boost::shared_ptr<ICIMPropertyDecl> inner)
      : TTableElement(table, "ICIMPropertyDecl", inner) {}
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return Called("GetType").GetType(context); }
  TCIMValue GetDefaultValue(TCIMContext const& context) const override {
    return Called("GetDefaultValue").GetDefaultValue(context);
  }
};

class TTableParameterDecl : public TTableElement<ICIMParameterDecl> {
public:
  TTableParameterDecl(TTable const& table, boost::shared_ptr<ICIMParameterDecl> inner)
      : TTableElement(table, "ICIMParameterDecl", inner) {}
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return Called("GetType").GetType(context); }
  unsigned int GetMaxArraySize(TCIMContext const& context) const override {
    return Called("GetMaxArraySize").GetMaxArraySize(context);
  }
  std::string GetReferencedClassName(TCIMContext const& context) const override {
    return Called("GetReferencedClassName").GetReferencedClassName(context);
  }
};

class TTableMethodDecl : public TTableElement<ICIMMethodDecl> {
public:
  TTableMethodDecl(TTable const& table, boost::shared_ptr<ICIMMethodDecl> inner)
      : TTableElement(table, "ICIMMethodDecl", inner) {}
  TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const override {
    return Called("GetReturnType").GetReturnType(context);
  }
  boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type, unsigned int size,
                                                        std::string const& className, TCIMContext const& context) override {
    return boost::make_shared<TTableParameterDecl>(
        fTable, Called("AddParameterDecl").AddParameterDecl(name, type, size, className, context));
  }
  void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                               TCIMContext const& context) const override {
    Called("EnumerateParameterDecls")
        .EnumerateParameterDecls(
            [&](boost::shared_ptr<ICIMParameterDecl> one) {
              return callback(boost::make_shared<TTableParameterDecl>(fTable, one));
            },
            context);
  }
};

class TTableProperty : public ICIMProperty {
public:
  TTableProperty(TTable const& table, boost::shared_ptr<ICIMProperty> inner) : fTable(table), fInner(inner) {}
  TCIMValue GetValue(TCIMContext const& context) const override { return Called("GetValue").GetValue(context); }
  void SetValue(TCIMValue const& value, TCIMContext const& context) override { Called("SetValue").SetValue(value, context); }
  std::string GetName(TCIMContext const& context) const override {
    return fTable.Has("ICIMProperty::GetName") ? fInner->GetName(context) : ICIMProperty::GetName(context);
  }
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const override {
    if (!fTable.Has("ICIMProperty::GetDeclaration")) return ICIMProperty::GetDeclaration(context);
    auto const declaration = boost::const_pointer_cast<ICIMPropertyDecl>(fInner->GetDeclaration(context));
    return boost::make_shared<TTablePropertyDecl>(fTable, declaration);
  }

private:
  ICIMProperty& Called(std::string const& operation) const {
    fTable.Need("ICIMProperty::" + operation);
    return *fInner;
  }
  TTable const& fTable;
  boost::shared_ptr<ICIMProperty> fInner;
};

class TTableInstance : public ICIMInstance {
public:
  TTableInstance(TTable const& table, boost::shared_ptr<ICIMInstance> inner) : fTable(table), fInner(inner) {}
  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override {
    fTable.Need("ICIMInstance::GetProperty");
    auto const property = fInner->GetProperty(name, context);
    return property ? boost::make_shared<TTableProperty>(fTable, property) : nullptr;
  }
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override {
    fTable.Need("ICIMInstance::EnumerateProperties");
    fInner->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> one) { return callback(boost::make_shared<TTableProperty>(fTable, one)); }, context);
  }
  boost::shared_ptr<ICIMInstance> Inner() const { return fInner; }

private:
  TTable const& fTable;
  boost::shared_ptr<ICIMInstance> fInner;
};

// GetPropertyDecl returns an empty pointer for an undeclared name, so the class does not need BeginDeclarations and
// EndDeclarations.
class TTableClass : public TTableElement<ICIMClass> {
public:
  TTableClass(TTable const& table, boost::shared_ptr<ICIMClass> inner) : TTableElement(table, "ICIMClass", inner) {}

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const override;
  bool GetClassFlag(TCIMContext const& context) const override { return Called("GetClassFlag").GetClassFlag(context); }
  bool IsRootClass(TCIMContext const& context) const override { return Called("IsRootClass").IsRootClass(context); }
  boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const override {
    return boost::make_shared<TTableClass>(fTable, Called("GetSuperClass").GetSuperClass(context));
  }
  void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                           TCIMContext const& context) const override {
    Called("EnumerateSubClasses")
        .EnumerateSubClasses(
            [&](boost::shared_ptr<ICIMClass> one) { return callback(boost::make_shared<TTableClass>(fTable, one)); }, context);
  }
  boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                      TCIMContext const& context) override {
    return boost::make_shared<TTablePropertyDecl>(fTable, Called("AddPropertyDecl").AddPropertyDecl(name, defaultValue, context));
  }
  boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name, TCIMContext const& context) const override {
    Called("GetPropertyDecl").BeginDeclarations(context);
    auto const declaration = boost::const_pointer_cast<ICIMPropertyDecl>(fInner->GetPropertyDecl(name, context));
    fInner->EndDeclarations(context);
    return declaration ? boost::make_shared<TTablePropertyDecl>(fTable, declaration) : nullptr;
  }
  void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                              TCIMContext const& context) const override {
    Called("EnumeratePropertyDecls")
        .EnumeratePropertyDecls(
            [&](boost::shared_ptr<ICIMPropertyDecl> one) {
              return callback(boost::make_shared<TTablePropertyDecl>(fTable, one));
            },
            context);
  }
  void SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context) override {
    if (!fTable.Has("ICIMClass::SetStaticProperty")) return ICIMClass::SetStaticProperty(name, value, context);
    fInner->SetStaticProperty(name, value, context);
  }
  void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                 TCIMContext const& context) const override {
    Called("EnumerateStaticProperties")
        .EnumerateStaticProperties(
            [&](boost::shared_ptr<ICIMProperty> one) { return callback(boost::make_shared<TTableProperty>(fTable, one)); },
            context);
  }
  boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) override {
    return boost::make_shared<TTableInstance>(fTable, Called("CreateInstance").CreateInstance(context));
  }
  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override {
    Called("EnumerateInstances")
        .EnumerateInstances(
            [&](boost::shared_ptr<ICIMInstance> one) { return callback(boost::make_shared<TTableInstance>(fTable, one)); },
            context);
  }
  boost::shared_ptr<ICIMMethodDecl> AddMethodDecl(std::string const& name, TCIMValue::TCIMType type,
                                                  TCIMContext const& context) override {
    if (!fTable.Has("ICIMClass::AddMethodDecl")) return ICIMClass::AddMethodDecl(name, type, context);
    return boost::make_shared<TTableMethodDecl>(fTable, fInner->AddMethodDecl(name, type, context));
  }
  void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                            TCIMContext const& context) const override {
    Called("EnumerateMethodDecls")
        .EnumerateMethodDecls(
            [&](boost::shared_ptr<ICIMMethodDecl> one) { return callback(boost::make_shared<TTableMethodDecl>(fTable, one)); },
            context);
  }
  void CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context) override {
    if (!fTable.Has("ICIMClass::CommitInstance")) return ICIMClass::CommitInstance(instance, context);
    fInner->CommitInstance(boost::dynamic_pointer_cast<TTableInstance>(instance)->Inner(), context);
  }
  boost::shared_ptr<ICIMClass> Inner() const { return fInner; }
};

inline boost::shared_ptr<ICIMClass> TTableInstance::GetClass(TCIMContext const& context) const {
  if (!fTable.Has("ICIMInstance::GetClass")) return ICIMInstance::GetClass(context);
  return boost::make_shared<TTableClass>(fTable, fInner->GetClass(context));
}

class TTableNamespace : public ICIMNamespace {
public:
  TTableNamespace(TTable const& table, boost::shared_ptr<ICIMNamespace> inner) : fTable(table), fInner(inner) {}

  boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                           TCIMContext const& context) override {
    auto const own = boost::dynamic_pointer_cast<TTableClass>(superClass);
    return boost::make_shared<TTableClass>(fTable,
                                           Called("CreateClass").CreateClass(own ? own->Inner() : nullptr, name, context));
  }
  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const& context) const override {
    return boost::make_shared<TTableClass>(fTable, Called("GetClass").GetClass(name, context));
  }
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const& context) const override {
    Called("EnumerateClasses")
        .EnumerateClasses(
            [&](boost::shared_ptr<ICIMClass> one) { return callback(boost::make_shared<TTableClass>(fTable, one)); }, context);
  }
  boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                           unsigned int scope, unsigned int flavor,
                                                           TCIMContext const& context) override {
    if (!fTable.Has("ICIMNamespace::CreateQualifierDecl"))
      return ICIMNamespace::CreateQualifierDecl(name, defaultValue, scope, flavor, context);
    return boost::make_shared<TTableQualifierDecl>(fTable,
                                                   fInner->CreateQualifierDecl(name, defaultValue, scope, flavor, context));
  }
  boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const override {
    return boost::make_shared<TTableQualifierDecl>(fTable, Called("GetQualifierDecl").GetQualifierDecl(name, context));
  }
  void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                               TCIMContext const& context) const override {
    Called("EnumerateQualifierDecls")
        .EnumerateQualifierDecls(
            [&](boost::shared_ptr<ICIMQualifierDecl> one) {
              return callback(boost::make_shared<TTableQualifierDecl>(fTable, one));
            },
            context);
  }
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override {
    auto const instance = Called("GetInstance").GetInstance(path, context);
    return instance ? boost::make_shared<TTableInstance>(fTable, instance) : nullptr;
  }

private:
  ICIMNamespace& Called(std::string const& operation) const {
    fTable.Need("ICIMNamespace::" + operation);
    return *fInner;
  }
  TTable const& fTable;
  boost::shared_ptr<ICIMNamespace> fInner;
};

inline boost::shared_ptr<ICIMNamespace> TTableClass::GetNamespace(TCIMContext const& context) const {
  return boost::make_shared<TTableNamespace>(fTable, Called("GetNamespace").GetNamespace(context));
}

}  // namespace NQRVZEP20
