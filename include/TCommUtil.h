#pragma once

#include "ZEPExport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// String and path utilities. Static operations only; no state, any thread.
class ZEP_EXPORT TCommUtil {
public:
  TCommUtil() {}

  // Appends the pieces of `path` between separators to `parts`. With `keepSeparator` each piece ends in the separator's
  // first character. Only one character is stepped over at each separator, however long it is. "/var/log" gives
  // "", "var", "log", or "/", "var/", "log"; a trailing separator gives no empty last piece, an empty path nothing.
  static void SplitPath(std::string const& path, std::vector<std::string>& parts, std::string const& separator,
                        bool keepSeparator);

  // Creates every missing directory along the path. Throws what TOSSpecific::CreateDir throws, and leaves the directories
  // made until then; a plain file in the way is kZEPStatusDirectoryAlreadyExists. A directory that another thread or process
  // makes at the same time is no failure.
  static void MkDirHier(std::string const& path);

  // The first line of a text without the blanks around it, and without what follows its first carriage return (a blank
  // before that one stays). Tabs are no blanks. Empty when what is left holds anything but ASCII letters, digits,
  // punctuation and white space.
  static std::string RemoveSpaces(std::string text);
};

}  // namespace NQRVZEP20
