// SPDX-License-Identifier: Apache-2.0
#pragma once

// A small object model for the tests of this room. It records its calls and fails on demand. An operation that no test needs
// throws kZEPStatusNotImplemented, or is left out when the interface has a default body.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TZEPException.h"

#include <boost/enable_shared_from_this.hpp>
#include <boost/make_shared.hpp>

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

using ECIMType = TCIMValue::TCIMType::ECIMType;

[[noreturn]] inline void Refuse() { throw TZEPException(kZEPStatusNotImplemented); }

// The contexts that an object was called with, the names looked up, and the status that its next lookups throw.
struct TCalls {
  mutable std::vector<TCIMContext> fContexts;
  mutable std::vector<std::string> fNames;  // the names looked up
  std::optional<EZEPStatusCode> fFailure;

  void Record(TCIMContext const& context) const { fContexts.push_back(context); }
  void Record(std::string const& name, TCIMContext const& context) const {
    fNames.push_back(name);
    fContexts.push_back(context);
    if (fFailure) throw TZEPException(*fFailure);
  }
};

class TFakePropertyDecl : public ICIMPropertyDecl {
public:
  TFakePropertyDecl(std::string name, TCIMValue::TCIMType type, TCIMValue defaultValue)
      : fName(std::move(name)), fType(type), fDefaultValue(std::move(defaultValue)) {}

  std::string GetName(TCIMContext const&) const override { return fName; }
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return fCalls.Record(context), fType; }
  TCIMValue GetDefaultValue(TCIMContext const& context) const override { return fCalls.Record(context), fDefaultValue; }
  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const&, TCIMContext const&) const override { Refuse(); }
  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)>, TCIMContext const&) const override {
    Refuse();
  }

  TCalls fCalls;

private:
  std::string fName;
  TCIMValue::TCIMType fType;
  TCIMValue fDefaultValue;
};

class TFakeProperty : public ICIMProperty {
public:
  TFakeProperty(std::string name, TCIMValue value) : fName(std::move(name)), fValue(std::move(value)) {}

  std::string GetName(TCIMContext const&) const override { return fName; }
  TCIMValue GetValue(TCIMContext const& context) const override { return fCalls.Record(context), fValue; }
  void SetValue(TCIMValue const&, TCIMContext const&) override { Refuse(); }
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const&) const override { Refuse(); }

  TCalls fCalls;

private:
  std::string fName;
  TCIMValue fValue;
};

class TFakeInstance : public ICIMInstance {
public:
  boost::shared_ptr<TFakeProperty> Add(std::string const& name, TCIMValue const& value) {
    return fProperties[name] = boost::make_shared<TFakeProperty>(name, value);
  }

  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override {
    fCalls.Record(name, context);
    auto const found = fProperties.find(name);
    return found == fProperties.end() ? nullptr : found->second;
  }

  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const&) const override { Refuse(); }
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)>, TCIMContext const&) const override {
    Refuse();
  }

  TCalls fCalls;

private:
  std::map<std::string, boost::shared_ptr<TFakeProperty>> fProperties;
};

class TFakeClass : public ICIMClass {
public:
  TFakeClass(boost::shared_ptr<ICIMNamespace> ns, std::string name) : fNamespace(ns), fName(std::move(name)) {}

  // Adds a property of that type without a default.
  TFakeClass& Add(std::string const& name, ECIMType type) {
    TCIMValue defaultValue;
    defaultValue.SetNullValue(type, 0);
    return Add(name, type, defaultValue);
  }

  TFakeClass& Add(std::string const& name, TCIMValue::TCIMType type, TCIMValue const& defaultValue) {
    fDecls[name] = boost::make_shared<TFakePropertyDecl>(name, type, defaultValue);
    return *this;
  }

  boost::shared_ptr<TFakeInstance> AddInstance() {
    fInstances.push_back(boost::make_shared<TFakeInstance>());
    return fInstances.back();
  }

  TFakeInstance& OnlyInstance() { return *fInstances.at(0); }

  std::string GetName(TCIMContext const& context) const override { return fCalls.Record(context), fName; }
  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const override {
    fCalls.Record(context);
    return boost::shared_ptr<ICIMNamespace>(fNamespace);
  }

  boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name, TCIMContext const& context) const override {
    fCalls.Record(name, context);
    auto const found = fDecls.find(name);
    if (found != fDecls.end()) return found->second;
    if (fAnswersUnknownByEmpty) return nullptr;
    throw TZEPException(kZEPStatusNotFound);
  }

  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override {
    fCalls.Record(context);
    if (fEnumerationFailure) throw TZEPException(*fEnumerationFailure);
    for (auto const& instance : fInstances)
      if (!callback(instance)) return;
  }

  bool GetClassFlag(TCIMContext const&) const override { Refuse(); }
  bool IsRootClass(TCIMContext const&) const override { Refuse(); }
  boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const&) const override { Refuse(); }
  void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)>, TCIMContext const&) const override { Refuse(); }
  boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const&, TCIMValue const&, TCIMContext const&) override {
    Refuse();
  }
  void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)>, TCIMContext const&) const override {
    Refuse();
  }
  void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)>, TCIMContext const&) const override {
    Refuse();
  }
  boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const&) override { Refuse(); }
  void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)>, TCIMContext const&) const override {
    Refuse();
  }
  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const&, TCIMContext const&) const override { Refuse(); }
  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)>, TCIMContext const&) const override {
    Refuse();
  }

  std::map<std::string, boost::shared_ptr<TFakePropertyDecl>> fDecls;
  bool fAnswersUnknownByEmpty = false;
  std::optional<EZEPStatusCode> fEnumerationFailure;  // thrown by EnumerateInstances
  TCalls fCalls;

private:
  boost::weak_ptr<ICIMNamespace> fNamespace;
  std::string fName;
  std::vector<boost::shared_ptr<TFakeInstance>> fInstances;
};

class TFakeNamespace : public ICIMNamespace, public boost::enable_shared_from_this<TFakeNamespace> {
public:
  TFakeClass& Add(std::string const& name) {
    auto& added = fClasses[name];
    added = boost::make_shared<TFakeClass>(shared_from_this(), name);
    return *added;
  }
  boost::shared_ptr<TFakeClass> Class(std::string const& name) const { return fClasses.at(name); }

  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const& context) const override {
    fCalls.Record(name, context);
    auto const found = fClasses.find(name);
    if (found != fClasses.end()) return found->second;
    if (fAnswersUnknownByEmpty) return nullptr;
    throw TZEPException(kZEPStatusNotFound);
  }

  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override {
    fLookedUp.push_back(&path);
    fLookedUpContexts.push_back(context);
    if (fInstanceFailure) throw TZEPException(*fInstanceFailure);
    return fInstance;
  }

  boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass>, std::string const&, TCIMContext const&) override {
    Refuse();
  }
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)>, TCIMContext const&) const override { Refuse(); }
  boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const&, TCIMContext const&) const override { Refuse(); }
  void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)>, TCIMContext const&) const override {
    Refuse();
  }

  TCalls fCalls;  // calls of GetClass
  bool fAnswersUnknownByEmpty = false;

  boost::shared_ptr<ICIMInstance> fInstance;  // returned by GetInstance
  std::optional<EZEPStatusCode> fInstanceFailure;
  mutable std::vector<TCIMReference const*> fLookedUp;
  mutable std::vector<TCIMContext> fLookedUpContexts;

private:
  std::map<std::string, boost::shared_ptr<TFakeClass>> fClasses;
};

}  // namespace NQRVZEP20
