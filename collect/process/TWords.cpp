// SPDX-License-Identifier: Apache-2.0
#include "collect/process/TWords.h"

#include <algorithm>

namespace NQRVZEP20 {

void TWords::Add(std::string_view text) {
  std::size_t const first = std::min(text.size(), fMost - fFirst.size());
  fFirst.append(text.substr(0, first));
  fLast.append(text.substr(first));
  if (fLast.size() <= fMost) return;
  std::size_t const tooMany = fLast.size() - fMost;
  fLast.erase(0, tooMany);
  fLeftOut += tooMany;
}

std::string TWords::Get() const {
  if (fLeftOut == 0) return fFirst + fLast;
  return fFirst + "\n[" + std::to_string(fLeftOut) + " bytes omitted]\n" + fLast;
}

}  // namespace NQRVZEP20
