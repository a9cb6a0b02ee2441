// SPDX-License-Identifier: Apache-2.0
#include "TZEPException.h"

namespace NQRVZEP20 {

TZEPException::~TZEPException() = default;

char const* TZEPException::what() const noexcept { return fStatusCode.TranslateStatusCode().c_str(); }

}  // namespace NQRVZEP20
