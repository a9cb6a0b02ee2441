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

// Creates the instances of a document. An alias may be used before and after its instance, and instances may refer to one
// another cyclically, as long as no instance's keys depend on themselves.
class TMofInstances {
public:
  TMofInstances(TMofDocument const& document, boost::shared_ptr<ICIMNamespace> ns) : fDocument(document), fNamespace(ns) {}

  void Build();

private:
  enum EKeys { kNotSet, kBeingSet, kSet };

  // A property whose value is an alias.
  struct TAliasValue {
    std::size_t fNumber;  // of the instance, in fCreated
    TMofSpan fName, fAlias;
  };

  struct TCreated {
    boost::shared_ptr<ICIMInstance> fInstance;
    EKeys fKeys;
  };

  void Create(TMofInstance const& instance);
  void SetPlainValues(std::size_t number);
  void SetKeys(std::size_t number);
  void SetAliases(std::size_t number, bool keys);
  void Commit(std::size_t number);
  boost::shared_ptr<ICIMProperty> PropertyOf(std::size_t number, TMofSpan const& name) const;
  TCIMValue PathOf(TMofSpan const& alias);

  TMofDocument const& fDocument;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::size_t fDepth = 0;                                 // of nested keys being set
  std::vector<TCreated> fCreated;                         // one for each instance of the document
  std::unordered_map<std::string, std::size_t> fAliases;  // indexes of fCreated, by lower-case name
  std::vector<TAliasValue> fAliasValues;                  // in the order of the instances
};

}  // namespace NQRVZEP20
