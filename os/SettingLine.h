// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace NQRVZEP20 {

// One line of zep.cfg. The texts are parts of the line that was read.
struct TSettingLine {
  bool fIsComment, fHasSeparator;
  std::string_view fKey, fValue;

  bool IsSetting() const { return !fIsComment && !fKey.empty() && !fValue.empty(); }
};

// The first "=" of the line separates key and value. Without "=" the value starts at the start of the line: a bare word is its
// own value. Kept.
inline TSettingLine ReadSettingLine(std::string_view line) {
  std::size_t const equals = line.find('=');
  return {!line.empty() && line.front() == '#', equals != line.npos, line.substr(0, equals), line.substr(equals + 1)};
}

}  // namespace NQRVZEP20
