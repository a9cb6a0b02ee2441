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

// The sources of values and the reasons for missing values that a provider's namespace records (MissingValueClass.h). The
// namespace may be of any type: only its interfaces are used.
//
// Copies share nothing. Several threads may read concurrently.
class TReasonReader {
public:
  // Reads the instances of ZEP_MissingValue; a namespace without that class records no reasons. Exceptions thrown by the
  // namespace pass through, except kZEPStatusNotFound for the class. Blocks while the namespace enumerates the instances.
  explicit TReasonReader(ICIMNamespace const& ns);

  // The reason why the property of the instance is missing; none if the namespace records none. The name is case-insensitive.
  std::optional<TMissing> WhyMissing(ICIMInstance const& instance, std::string const& property) const;

  // The reason why the class has no instance; none if the namespace records none. The name is case-insensitive.
  std::optional<TMissing> WhyNoInstance(std::string const& className) const;

  // The source of a property's values: its qualifier ValueSource. None if the property has no such qualifier or its value is
  // NULL.
  static std::optional<std::string> SourceOf(ICIMPropertyDecl const& property);

private:
  void Store(std::string const& path, std::string const& property, TMissing const& why);

  std::map<std::pair<std::string, std::string>, TMissing> fOfProperties;  // by path and lower-case property name
  std::map<std::string, TMissing> fOfClasses;                             // by lower-case name
};

}  // namespace NQRVZEP20
