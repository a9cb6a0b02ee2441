// SPDX-License-Identifier: Apache-2.0
#pragma once

// An object model that wraps another one. It records every call that a copy makes, in order, and a test can make any call
// fail.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TZEPException.h"

#include <boost/enable_shared_from_this.hpp>
#include <boost/make_shared.hpp>

#include <functional>
#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

struct TTrace {
  std::vector<std::string> fCalls;
  std::map<std::string, std::function<void()>> fOnCall;  // run before the call is passed on
  std::string fEmptyAnswer;                              // this call returns an empty pointer and is not passed on
  bool fAnswersUnknownClassByEmpty = false;
  std::size_t fContextEntries = 0;  // the number of entries in the contexts of all calls

  void Record(std::string const& call, TCIMContext const& context) {
    fCalls.push_back(call);
    fContextEntries += context.size();
    auto const found = fOnCall.find(call);
    if (found != fOnCall.end()) found->second();
  }

  // Records a call that returns a pointer. False when the call must return an empty one.
  bool RecordQuery(std::string const& call, TCIMContext const& context) {
    Record(call, context);
    return call != fEmptyAnswer;
  }
};

template <class TInterface>
class TTracedElement : public TInterface {
public:
  TTracedElement(TTrace& trace, boost::shared_ptr<TInterface> inner, std::string const& path)
      : fTrace(trace), fInner(inner), fPath(path) {}

  std::string GetName(TCIMContext const& context) const override { return fInner->GetName(context); }
  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const& context) const override {
    fTrace.Record("GetQualifier " + fPath + " " + name, context);
    return fInner->GetQualifier(name, context);
  }
  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback,
                           TCIMContext const& context) const override {
    fTrace.Record("EnumerateQualifiers " + fPath, context);
    fInner->EnumerateQualifiers(callback, context);
  }
  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                unsigned int flavor, TCIMContext const& context) override {
    if (!fTrace.RecordQuery("AddQualifier " + fPath + " " + (declaration ? declaration->GetName(context) : "of no declaration"),
                            context))
      return {};
    return fInner->AddQualifier(declaration, value, flavor, context);
  }

  boost::shared_ptr<TInterface> Inner() const { return fInner; }

protected:
  TTrace& fTrace;
  boost::shared_ptr<TInterface> fInner;
  std::string fPath;
};

class TTracedPropertyDecl : public TTracedElement<ICIMPropertyDecl> {
public:
  using TTracedElement::TTracedElement;
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return fInner->GetType(context); }
  TCIMValue GetDefaultValue(TCIMContext const& context) const override {
    fTrace.Record("GetDefaultValue " + fPath, context);
    return fInner->GetDefaultValue(context);
  }
  bool IsKey(TCIMContext const& context) const override { return fInner->IsKey(context); }
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override { return fInner->GetOwner(context); }
};

class TTracedParameterDecl : public TTracedElement<ICIMParameterDecl> {
public:
  using TTracedElement::TTracedElement;
  TCIMValue::TCIMType GetType(TCIMContext const& context) const override { return fInner->GetType(context); }
  unsigned int GetMaxArraySize(TCIMContext const& context) const override { return fInner->GetMaxArraySize(context); }
  std::string GetReferencedClassName(TCIMContext const& context) const override {
    return fInner->GetReferencedClassName(context);
  }
  boost::weak_ptr<ICIMMethodDecl> GetMethod(TCIMContext const& context) const override { return fInner->GetMethod(context); }
};

class TTracedMethodDecl : public TTracedElement<ICIMMethodDecl> {
public:
  using TTracedElement::TTracedElement;
  TCIMValue::TCIMType GetReturnType(TCIMContext const& context) const override { return fInner->GetReturnType(context); }
  boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const& name, TCIMValue::TCIMType type, unsigned int size,
                                                        std::string const& className, TCIMContext const& context) override {
    if (!fTrace.RecordQuery("AddParameterDecl " + fPath + "." + name, context)) return {};
    return boost::make_shared<TTracedParameterDecl>(fTrace, fInner->AddParameterDecl(name, type, size, className, context),
                                                    fPath + "." + name);
  }
  void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)> callback,
                               TCIMContext const& context) const override {
    fTrace.Record("EnumerateParameterDecls " + fPath, context);
    fInner->EnumerateParameterDecls(callback, context);
  }
  boost::weak_ptr<ICIMNamedElement> GetOwner(TCIMContext const& context) const override { return fInner->GetOwner(context); }
};

class TTracedInstance : public ICIMInstance {
public:
  TTracedInstance(TTrace& trace, boost::shared_ptr<ICIMInstance> inner, std::string const& path)
      : fTrace(trace), fInner(inner), fPath(path) {}

  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override {
    fTrace.Record("GetClass of instance " + fPath, context);
    return fInner->GetClass(context);
  }
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override {
    if (!fTrace.RecordQuery("GetProperty " + fPath + "." + name, context)) return {};
    return fInner->GetProperty(name, context);
  }
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override {
    fTrace.Record("EnumerateProperties " + fPath, context);
    fInner->EnumerateProperties(callback, context);
  }
  TCIMReference GetPath(TCIMContext const& context) const override { return fInner->GetPath(context); }

  boost::shared_ptr<ICIMInstance> Inner() const { return fInner; }

private:
  TTrace& fTrace;
  boost::shared_ptr<ICIMInstance> fInner;
  std::string fPath;
};

class TTracedClass : public TTracedElement<ICIMClass> {
public:
  using TTracedElement::TTracedElement;

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const override {
    return fInner->GetNamespace(context);
  }
  bool GetClassFlag(TCIMContext const& context) const override {
    fTrace.Record("GetClassFlag " + fPath, context);
    return fInner->GetClassFlag(context);
  }
  bool IsAbstract(TCIMContext const& context) const override {
    fTrace.Record("IsAbstract " + fPath, context);
    return fInner->IsAbstract(context);
  }
  bool IsRootClass(TCIMContext const& context) const override { return fInner->IsRootClass(context); }
  boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const override { return fInner->GetSuperClass(context); }
  void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                           TCIMContext const& context) const override {
    fTrace.Record("EnumerateSubClasses " + fPath, context);
    fInner->EnumerateSubClasses([&](boost::shared_ptr<ICIMClass> cls) { return callback(Wrap(cls)); }, context);
  }

  void BeginDeclarations(TCIMContext const& context) override {
    fTrace.Record("BeginDeclarations " + fPath, context);
    fInner->BeginDeclarations(context);
  }
  void EndDeclarations(TCIMContext const& context) override {
    fTrace.Record("EndDeclarations " + fPath, context);
    fInner->EndDeclarations(context);
  }
  boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                      TCIMContext const& context) override {
    if (!fTrace.RecordQuery("AddPropertyDecl " + fPath + "." + name, context)) return {};
    return boost::make_shared<TTracedPropertyDecl>(fTrace, fInner->AddPropertyDecl(name, defaultValue, context),
                                                   fPath + "." + name);
  }
  boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name, TCIMContext const& context) const override {
    fTrace.Record("GetPropertyDecl " + fPath + "." + name, context);
    return fInner->GetPropertyDecl(name, context);
  }
  void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                              TCIMContext const& context) const override {
    fTrace.Record("EnumeratePropertyDecls " + fPath, context);
    fInner->EnumeratePropertyDecls(
        [&](boost::shared_ptr<ICIMPropertyDecl> decl) {
          return callback(boost::make_shared<TTracedPropertyDecl>(fTrace, decl, fPath + "." + decl->GetName(context)));
        },
        context);
  }

  void SetStaticProperty(std::string const& name, TCIMValue const& value, TCIMContext const& context) override {
    fTrace.Record("SetStaticProperty " + fPath + "." + name, context);
    fInner->SetStaticProperty(name, value, context);
  }
  void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                 TCIMContext const& context) const override {
    fTrace.Record("EnumerateStaticProperties " + fPath, context);
    fInner->EnumerateStaticProperties(callback, context);
  }

  boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) override {
    if (!fTrace.RecordQuery("CreateInstance " + fPath, context)) return {};
    return boost::make_shared<TTracedInstance>(fTrace, fInner->CreateInstance(context), fPath);
  }
  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override {
    fTrace.Record("EnumerateInstances " + fPath, context);
    fInner->EnumerateInstances(
        [&](boost::shared_ptr<ICIMInstance> instance) {
          return callback(boost::make_shared<TTracedInstance>(fTrace, instance, fPath));
        },
        context);
  }
  void CommitInstance(boost::shared_ptr<ICIMInstance> instance, TCIMContext const& context) override {
    fTrace.Record("CommitInstance " + fPath, context);
    fInner->CommitInstance(boost::static_pointer_cast<TTracedInstance>(instance)->Inner(), context);
  }

  boost::shared_ptr<ICIMMethodDecl> AddMethodDecl(std::string const& name, TCIMValue::TCIMType returnType,
                                                  TCIMContext const& context) override {
    if (!fTrace.RecordQuery("AddMethodDecl " + fPath + "." + name, context)) return {};
    return boost::make_shared<TTracedMethodDecl>(fTrace, fInner->AddMethodDecl(name, returnType, context), fPath + "." + name);
  }
  void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                            TCIMContext const& context) const override {
    fTrace.Record("EnumerateMethodDecls " + fPath, context);
    fInner->EnumerateMethodDecls(
        [&](boost::shared_ptr<ICIMMethodDecl> method) {
          return callback(boost::make_shared<TTracedMethodDecl>(fTrace, method, fPath + "." + method->GetName(context)));
        },
        context);
  }

private:
  boost::shared_ptr<ICIMClass> Wrap(boost::shared_ptr<ICIMClass> cls) const {
    return boost::make_shared<TTracedClass>(fTrace, cls, fPath.substr(0, fPath.find(':') + 1) + cls->GetName(TCIMContext()));
  }
};

// `label` precedes every class name, as in "src:X_Disk".
class TTracedNamespace : public ICIMNamespace {
public:
  TTracedNamespace(TTrace& trace, boost::shared_ptr<ICIMNamespace> inner, std::string const& label)
      : fTrace(trace), fInner(inner), fLabel(label + ":") {}

  std::string GetName(TCIMContext const& context) const override { return fInner->GetName(context); }
  boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                           TCIMContext const& context) override {
    auto const traced = boost::dynamic_pointer_cast<TTracedClass>(superClass);
    if (!fTrace.RecordQuery("CreateClass " + fLabel + name + (traced ? " under " + traced->GetName(context) : ""), context))
      return {};
    return Wrap(fInner->CreateClass(traced ? traced->Inner() : superClass, name, context));
  }
  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const& context) const override {
    if (!fTrace.RecordQuery("GetClass " + fLabel + name, context)) return {};
    try {
      return Wrap(fInner->GetClass(name, context));
    } catch (TZEPException const&) {
      if (fTrace.fAnswersUnknownClassByEmpty) return nullptr;
      throw;
    }
  }
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const& context) const override {
    fTrace.Record("EnumerateClasses " + fLabel, context);
    fInner->EnumerateClasses([&](boost::shared_ptr<ICIMClass> cls) { return callback(Wrap(cls)); }, context);
  }
  boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                           unsigned int scope, unsigned int flavor,
                                                           TCIMContext const& context) override {
    if (!fTrace.RecordQuery("CreateQualifierDecl " + fLabel + name, context)) return {};
    return fInner->CreateQualifierDecl(name, defaultValue, scope, flavor, context);
  }
  boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const override {
    if (!fTrace.RecordQuery("GetQualifierDecl " + fLabel + name, context)) return {};
    return fInner->GetQualifierDecl(name, context);
  }
  void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                               TCIMContext const& context) const override {
    fTrace.Record("EnumerateQualifierDecls " + fLabel, context);
    fInner->EnumerateQualifierDecls(callback, context);
  }
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override {
    return fInner->GetInstance(path, context);
  }

private:
  boost::shared_ptr<ICIMClass> Wrap(boost::shared_ptr<ICIMClass> cls) const {
    return boost::make_shared<TTracedClass>(fTrace, cls, fLabel + cls->GetName(TCIMContext()));
  }

  TTrace& fTrace;
  boost::shared_ptr<ICIMNamespace> fInner;
  std::string fLabel;
};

}  // namespace NQRVZEP20
