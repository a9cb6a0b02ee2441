// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Missing.h"

#include <map>
#include <optional>
#include <string>
#include <utility>

namespace NQRVZEP20 {

class ICIMInstance;
class ICIMNamespace;
class ICIMPropertyDecl;

// The sources of values and the reasons for missing ones that a provider's namespace states (MissingValueClass.h). The
// namespace may be of any kind: only its interfaces are used.
//
// Copies share nothing. Several threads may read at once.
class TReasonReader {
public:
  // Reads the instances of ZEP_MissingValue; a namespace without that class states no reasons. Passes on what the namespace
  // throws, except kZEPStatusNotFound for the class. Blocks while the namespace enumerates the instances.
  explicit TReasonReader(ICIMNamespace const& ns);

  // The reason why the property of the instance is missing; none when the namespace states none. Case does not matter in the
  // name.
  std::optional<TMissing> WhyMissing(ICIMInstance const& instance, std::string const& property) const;

  // The reason why the class has no instance; none when the namespace states none. Case does not matter in the name.
  std::optional<TMissing> WhyNoInstance(std::string const& className) const;

  // The source of a property's values: its qualifier ValueSource. None when the property has no such qualifier, or a NULL one.
  static std::optional<std::string> SourceOf(ICIMPropertyDecl const& property);

private:
  void Store(std::string const& path, std::string const& property, TMissing const& why);

  std::map<std::pair<std::string, std::string>, TMissing> fOfProperties;  // by path and lower-case property name
  std::map<std::string, TMissing> fOfClasses;                             // by lower-case name
};

}  // namespace NQRVZEP20
