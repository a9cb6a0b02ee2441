// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "TMemoryQualifier.h"
#include "TNamedList.h"
#include "TZEPException.h"

#include <boost/enable_shared_from_this.hpp>
#include <boost/make_shared.hpp>

#include <string>

namespace NQRVZEP20 {

// The name and the qualifiers of an element, for classes and for declarations of properties, methods and parameters.
// `TInterface` is the element's own interface, which derives from ICIMNamedElement.
template <class TInterface>
class TMemoryNamedElement : public TInterface, public boost::enable_shared_from_this<TMemoryNamedElement<TInterface>> {
public:
  std::string GetName(TCIMContext const&) const override { return fName; }

  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const&) const override {
    return fQualifiers.Find(name);
  }

  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback, TCIMContext const&) const override {
    VisitEach(fQualifiers.Elements(), callback);
  }

  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl> declaration, TCIMValue const& value,
                                                unsigned int flavor, TCIMContext const& context) override {
    if (!declaration) throw TZEPException(kZEPStatusNotFound);
    std::string const name = declaration->GetName(context);
    boost::shared_ptr<ICIMNamespace> const ns(fNamespace);
    if (ns->GetQualifierDecl(name, context) != declaration) throw TZEPException(kZEPStatusNotFound);
    if (value.GetType() != declaration->GetType(context)) throw TZEPException(kZEPStatusTypeMismatch);
    if (fQualifiers.Has(name)) throw TZEPException(kZEPStatusAlreadyExists);

    auto const own = boost::static_pointer_cast<TMemoryQualifierDecl>(declaration);  // the namespace created it
    auto const qualifier = boost::make_shared<TMemoryQualifier>(own, this->weak_from_this(), value, flavor);
    fQualifiers.Add(qualifier);
    return qualifier;
  }

  std::string const& Name() const { return fName; }

  // Whether the element itself has the qualifier, with any value except false.
  bool IsMarked(std::string const& qualifierName) const {
    boost::shared_ptr<TMemoryQualifier> const qualifier = fQualifiers.Find(qualifierName);
    return qualifier && qualifier->IsSet();
  }

protected:
  TMemoryNamedElement(std::string const& name, boost::weak_ptr<ICIMNamespace> ns) : fName(name), fNamespace(ns) {}

  boost::weak_ptr<ICIMNamespace> Namespace() const { return fNamespace; }

private:
  std::string fName;
  boost::weak_ptr<ICIMNamespace> fNamespace;
  TNamedList<TMemoryQualifier> fQualifiers;
};

}  // namespace NQRVZEP20
