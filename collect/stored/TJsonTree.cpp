// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/TJsonTree.h"

namespace NQRVZEP20 {

TJsonTree::TPart TJsonTree::Add(std::string_view text) {
  TPart const part{static_cast<std::uint32_t>(fTexts.size()), static_cast<std::uint32_t>(text.size())};
  fTexts += text;
  return part;
}

void TJsonTree::Add(EKind kind, std::string_view text) {
  TPart const name = fNextName;
  fNextName = {};
  fValues.push_back({kind, name, Add(text), static_cast<std::uint32_t>(fValues.size() + 1)});
}

void TJsonTree::Open(EKind kind) {
  fOpen.push_back(fValues.size());
  Add(kind, "");
}

void TJsonTree::Close() {
  fValues[fOpen.back()].fEnd = static_cast<std::uint32_t>(fValues.size());
  fOpen.pop_back();
}

}  // namespace NQRVZEP20
