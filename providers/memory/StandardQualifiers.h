// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

struct TStandardQualifier {
  std::string fName;
  TCIMValue fDefaultValue;
  unsigned int fScope;   // of ICIMQualifierDecl::EScope
  unsigned int fFlavor;  // of ICIMQualifierDecl::EFlavor
};

// The qualifiers that the CIM infrastructure standard (DSP0004) defines and schemas commonly use.
std::vector<TStandardQualifier> StandardQualifiers();

}  // namespace NQRVZEP20
