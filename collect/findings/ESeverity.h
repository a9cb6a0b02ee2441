// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>

namespace NQRVZEP20 {

// How bad a problem is, in ascending order.
enum class ESeverity {
  kInformation,  // worth knowing; the machine works as it should
  kWarning,      // something works less well than it could, or will need attention
  kError,        // something has failed, or protection against a failure is lost
  kCritical      // data or the service is lost, or may be lost at any moment
};

// For programs and for options: "information", "warning", "error" and "critical".
std::string NameOf(ESeverity severity);

// The severity of that name; none if it is not one of the four.
std::optional<ESeverity> SeverityFrom(std::string const& name);

}  // namespace NQRVZEP20
