// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/secrets/TSecret.h"

#include "tools/zep/secrets/Secrets.h"

#include <string.h>
#include <sys/prctl.h>

namespace NQRVZEP20::zep {

void Wipe(void* bytes, std::size_t size) { ::explicit_bzero(bytes, size); }

TSecret::TSecret(std::string_view text) : fBytes(text.begin(), text.end()) {
  if (text.empty()) return;
  ::prctl(PR_SET_DUMPABLE, 0);
  Hide(text);
}

TSecret SecretOf(std::string&& text) {
  TSecret secret{std::string_view(text)};
  Wipe(text.data(), text.size());
  return secret;
}

}  // namespace NQRVZEP20::zep
