// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TOSSpecific.h"
#include "loaders/CurlLibrary.h"

namespace NQRVZEP20 {

// Lets libcurl append what arrives to the file of `context`.
inline void SetWriteContext(TCurl& curl, TCurlWriteContext& context) {
  constexpr char const* kMessage = "TOSSpecific|CurlTransferFile: Error setting curl write function";
  curl.Set(CURLOPT_WRITEFUNCTION, &curl_fwrite, kMessage);
  curl.Set(CURLOPT_WRITEDATA, &context, kMessage);
}

}  // namespace NQRVZEP20
