// SPDX-License-Identifier: Apache-2.0
#include "TBoostAssertException.h"

namespace NQRVZEP20 {

TBoostAssertException::~TBoostAssertException() = default;

char const* TBoostAssertException::what() const noexcept { return fMessage.c_str(); }

}  // namespace NQRVZEP20
