// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/packing/OpenSsl.h"

#include <openssl/err.h>

#include <stdexcept>

namespace NQRVZEP20::zep {

TReason TakeReason() {
  char const* data = nullptr;
  int flags = 0;
  unsigned long const first = ERR_peek_error();
  ERR_peek_last_error_all(nullptr, nullptr, nullptr, &data, &flags);
  char const* const text = ERR_reason_error_string(first);
  bool const hasData = data != nullptr && (flags & ERR_TXT_STRING) != 0;
  TReason reason{ERR_GET_LIB(first), ERR_GET_REASON(first), text != nullptr ? text : "unknown error", hasData ? data : ""};
  ERR_clear_error();
  if (reason.fCode == ERR_R_MALLOC_FAILURE) throw std::bad_alloc();
  return reason;
}

void ThrowOpenSslFailure() { throw std::runtime_error("OpenSSL: " + TakeReason().fText); }

}  // namespace NQRVZEP20::zep
