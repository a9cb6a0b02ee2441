// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class TSettings;

// The settings file "zep.cfg" of the working directory: lines of the form KEY=VALUE, without sections, quotes or escapes.
//
//   # a comment: the line's first character is "#"
//   path=a=b        the first "=" ends the key
//   flag            a line without "=" is a key that maps to itself
//
// Nothing is stripped: blanks and carriage returns are part of the key or the value. A line whose key or value is empty is
// skipped. If a key occurs more than once, its first line is used. No operation throws for a missing or malformed file. A
// missing or empty file is logged as an error. A file that cannot be read to its end is also logged as an error, and none of
// its lines is used. A file that cannot be opened, and lines that are not settings, are silently ignored. Kept.
//
// The library uses one TConfig, which reads the file on first use; a file created or changed later has no effect. The first
// call of GetInstance must come from one thread, during start-up; afterwards any thread may read.
class ZEP_EXPORT TConfig {
public:
  // The TConfig of the process. Never null; the library never replaces or destroys it.
  static TConfig* GetInstance();

  // Reads the file.
  TConfig();

  // Destroying any other TConfig also destroys the one of the process, if there is one; GetInstance then returns a dangling
  // pointer. Kept. Therefore do not create another TConfig in a program that uses GetInstance, and do not delete the pointer
  // that GetInstance returns.
  ~TConfig();
  TConfig(TConfig const&) = delete;
  TConfig& operator=(TConfig const&) = delete;

  // Reads the file and adds its settings; settings that already exist are not changed. An empty file is treated as missing.
  void parseConfigFile();

  // The value of a key, verbatim. A missing key is logged as an error and gives an empty string.
  std::string getValue(std::string const& key);

  // Every key, in ascending byte order. When there are no settings at all, logs an error and returns an empty vector.
  std::vector<std::string> listKeys();

  static TConfig* cfgInstance;  // null until GetInstance is first called

private:
  std::unique_ptr<TSettings> fSettings;  // never null
  std::string fFileName;
};

}  // namespace NQRVZEP20
