// SPDX-License-Identifier: Apache-2.0
#pragma once

// Enumerations as lists of elements and names, for tests of namespaces.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TAddToVectorCallback.h"
#include "TMemoryClass.h"
#include "TMemoryNamespace.h"
#include "tests/Support.h"

#include <gmock/gmock.h>
#include <boost/make_shared.hpp>

#include <string>
#include <vector>

namespace NQRVZEP20 {

using testing::ElementsAre;
using testing::IsEmpty;
using TType = TCIMValue::TCIMType;

inline TCIMContext const kNone;

// An enumeration of the interface TOwner over elements of the kind X.
template <class TOwner, class X>
using TEnumeration = void (TOwner::*)(boost::function<bool(boost::shared_ptr<X>)>, TCIMContext const&) const;

template <class TAny, class TOwner, class X>
std::vector<boost::shared_ptr<X>> All(TAny const& owner, TEnumeration<TOwner, X> enumerate) {
  std::vector<boost::shared_ptr<X>> elements;
  (owner.*enumerate)(TAddToVectorCallback<X>(elements), kNone);
  return elements;
}

template <class TAny, class TOwner, class X>
std::vector<std::string> Names(TAny const& owner, TEnumeration<TOwner, X> enumerate) {
  std::vector<std::string> names;
  for (auto const& element : All(owner, enumerate)) names.push_back(element->GetName(kNone));
  return names;
}

// How many elements an enumeration visits when the second call returns false.
template <class TAny, class TOwner, class X>
int VisitsUntilSecond(TAny const& owner, TEnumeration<TOwner, X> enumerate) {
  int visits = 0;
  (owner.*enumerate)([&](boost::shared_ptr<X> const&) { return ++visits < 2; }, kNone);
  return visits;
}

inline std::vector<std::string> ClassNames(ICIMNamespace const& ns) { return Names(ns, &ICIMNamespace::EnumerateClasses); }
inline std::vector<std::string> SubClassNames(ICIMClass const& cls) { return Names(cls, &ICIMClass::EnumerateSubClasses); }

// The object paths of the instances that a class enumerates.
inline std::vector<std::string> InstancePaths(ICIMClass const& cls) {
  std::vector<std::string> paths;
  for (auto const& instance : All(cls, &ICIMClass::EnumerateInstances)) paths.push_back(instance->GetPath(kNone).GetPath());
  return paths;
}

inline boost::shared_ptr<TMemoryNamespace> NewNamespace() { return boost::make_shared<TMemoryNamespace>("root/test"); }

inline TCIMValue NullOf(char const* type) { return TMemoryType(type).GetNull(); }

}  // namespace NQRVZEP20
