#include "TSecret.h"

#include "Secrets.h"

#include <string.h>
#include <sys/prctl.h>

namespace NQRVZEP20::zep {

void Wipe(void* bytes, std::size_t size) { ::explicit_bzero(bytes, size); }

TSecret::TSecret(std::string_view text) : fBytes(text.begin(), text.end()) {
  if (text.empty()) return;
  ::prctl(PR_SET_DUMPABLE, 0);
  Hide(text);
}

}  // namespace NQRVZEP20::zep
