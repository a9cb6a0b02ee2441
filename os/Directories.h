// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPException.h"
#include "core/Handles.h"

#include <dirent.h>

#include <string>
#include <string_view>

namespace NQRVZEP20 {

inline TUniqueDir OpenDirOrThrow(std::string const& path) {
  TUniqueDir dir(::opendir(path.c_str()));
  if (!dir) throw TZEPException(kZEPStatusFileSystemError);
  return dir;
}

inline std::string WithTrailingSeparator(std::string path) {
  if (path.empty() || path.back() != '/') path += '/';
  return path;
}

inline bool IsDotOrDotDot(std::string_view name) { return name == "." || name == ".."; }

}  // namespace NQRVZEP20
