// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// String and path utilities. All functions are static, stateless and thread-safe.
class ZEP_EXPORT TCommUtil {
public:
  TCommUtil() {}

  // Splits `path` at each `separator` and appends the pieces to `parts`. With `keepSeparator` each piece includes the first
  // character of the separator that ends it. At each separator only one character is skipped, even if the separator is
  // longer. Kept. "/var/log" gives "", "var", "log", or with `keepSeparator` "/", "var/", "log". A trailing separator adds no
  // empty last piece; an empty path adds nothing.
  static void SplitPath(std::string const& path, std::vector<std::string>& parts, std::string const& separator,
                        bool keepSeparator);

  // Creates every missing directory of the path. Exceptions of TOSSpecific::CreateDir pass through, such as
  // kZEPStatusDirectoryAlreadyExists when a component is a regular file; the directories created before the failure remain. A
  // directory that another thread or process creates at the same time is not a failure.
  static void MkDirHier(std::string const& path);

  // Returns the first line of `text` up to its first carriage return, without leading and trailing blanks. Blanks directly
  // before the carriage return stay. Kept. Tabs are not treated as blanks. The result is empty if the remaining text contains
  // anything but ASCII letters, digits, punctuation and white space.
  static std::string RemoveSpaces(std::string text);
};

}  // namespace NQRVZEP20
