// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "providers/mof/MofTree.h"

#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

class ICIMInstance;
class ICIMProperty;

// Makes the instances of a document. An alias may be used before and behind the instance that it stands for, also in
// circles, as long as no instance is needed to tell its own keys.
class TMofInstances {
public:
  TMofInstances(TMofDocument const& document, boost::shared_ptr<ICIMNamespace> ns) : fDocument(document), fNamespace(ns) {}

  void Build();

private:
  enum EKeys { kNotSet, kBeingSet, kSet };

  // An alias as the value of a property.
  struct TAliasValue {
    std::size_t fNumber;  // of the instance, in fMade
    TMofPlace fName, fAlias;
  };

  struct TMade {
    TMofPlace fClassName;
    boost::shared_ptr<ICIMClass> fClass;
    boost::shared_ptr<ICIMInstance> fInstance;
    EKeys fKeys;
  };

  void Create(TMofInstance const& instance);
  void SetPlainValues(std::size_t number);
  void SetKeys(std::size_t number);
  void SetAliases(std::size_t number, bool keys);
  void Commit(std::size_t number);
  boost::shared_ptr<ICIMProperty> PropertyOf(std::size_t number, TMofPlace const& name) const;
  TCIMValue PathOf(TMofPlace const& alias);

  TMofDocument const& fDocument;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::size_t fDepth = 0;                                 // of the keys that are being set
  std::vector<TMade> fMade;                               // one for each instance of the document
  std::unordered_map<std::string, std::size_t> fAliases;  // into fMade, by name in small letters
  std::vector<TAliasValue> fAliasValues;                  // in the order of the instances
};

}  // namespace NQRVZEP20
