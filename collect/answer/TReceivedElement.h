// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMNames.h"
#include "collect/answer/TReceivedQualifier.h"

#include <boost/weak_ptr.hpp>

#include <string>
#include <vector>

namespace NQRVZEP20 {

class TReceivedNamespace;

// Throws kZEPStatusNotSupported, because a received namespace is immutable.
[[noreturn]] void RefuseChange();

// The name and the qualifiers of a received element. `TInterface` is the element's own interface, which derives from
// ICIMNamedElement.
template <class TInterface>
class TReceivedElement : public TInterface {
public:
  TReceivedElement(boost::weak_ptr<TReceivedNamespace> ns, std::string name) : fNamespace(ns), fName(std::move(name)) {}

  std::string GetName(TCIMContext const&) const override { return fName; }

  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const& name, TCIMContext const&) const override {
    for (auto const& qualifier : fQualifiers)
      if (IsSameName(qualifier->Name(), name)) return qualifier;
    return {};
  }

  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)> callback, TCIMContext const&) const override {
    for (auto const& qualifier : fQualifiers)
      if (!callback(qualifier)) return;
  }

  boost::shared_ptr<ICIMQualifier> AddQualifier(boost::shared_ptr<ICIMQualifierDecl>, TCIMValue const&, unsigned int,
                                                TCIMContext const&) override {
    RefuseChange();
  }

  std::string const& Name() const { return fName; }
  void SetQualifiers(std::vector<boost::shared_ptr<TReceivedQualifier>> qualifiers) { fQualifiers = std::move(qualifiers); }

protected:
  boost::weak_ptr<TReceivedNamespace> const fNamespace;

private:
  std::string const fName;
  std::vector<boost::shared_ptr<TReceivedQualifier>> fQualifiers;
};

}  // namespace NQRVZEP20
