// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TJsonText.h"

#include <nlohmann/json.hpp>

namespace NQRVZEP20::zep {

namespace {

// Whether the text stands between quotes as it is. Every byte is looked at, because such a loop is compiled to vector code.
bool IsPlain(std::string_view text) {
  bool isPlain = true;
  for (char const byte : text) isPlain &= byte >= ' ' && byte <= '~' && byte != '"' && byte != '\\';
  return isPlain;
}

}  // namespace

void TJsonText::Begin(char bracket) {
  fText += bracket;
  fIsEmpty = true;
  ++fDepth;
}

void TJsonText::End(char bracket) {
  --fDepth;
  if (!fIsEmpty) NewLine();
  fText += bracket;
  fIsEmpty = false;
}

void TJsonText::Member(std::string_view name) {
  Element();
  String(name);
  fText += fIsOnOneLine ? ":" : ": ";
}

void TJsonText::Element() {
  if (!fIsEmpty) fText += ',';
  NewLine();
  fIsEmpty = false;
}

void TJsonText::String(std::string_view text) {
  if (!IsPlain(text)) {
    fText += nlohmann::json(text).dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
    return;
  }
  fText += '"';
  fText += text;
  fText += '"';
}

void TJsonText::NewLine() {
  if (fIsOnOneLine) return;
  fText += '\n';
  fText.append(static_cast<std::size_t>(fDepth) * 2, ' ');
}

}  // namespace NQRVZEP20::zep
