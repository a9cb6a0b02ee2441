#pragma once

#include "ZEPExport.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The settings file "zep.cfg" of the working directory: lines of the form KEY=VALUE, without sections, quotes or escapes.
//
//   # a comment: the line's first character is "#"
//   path=a=b        the first "=" ends the key
//   flag            a line without "=" is a key that maps to itself
//
// Nothing is stripped: blanks and carriage returns belong to the key or the value. A line whose key or value is empty is
// passed over, and of two lines with one key the first counts. No operation throws for a missing or malformed file. A
// missing or empty file is logged as an error, and so is one that cannot be read to its end, of which no line is used. One
// that cannot be opened, and lines that are no settings, are passed over silently. Kept.
//
// The library uses one TConfig, read on its first use; a file that is made or changed later is not seen. The first
// GetInstance is expected from one thread, during start-up; from then on any thread may read.
class ZEP_EXPORT TConfig {
public:
  // The one of the process; never null, never replaced, never destroyed by the library.
  static TConfig* GetInstance();

  // Reads the file.
  TConfig();

  // Destroys the one of the process first, when there is one, and leaves GetInstance with its old address: nobody may use
  // that from then on. So make no other TConfig where GetInstance is used, and never delete what it returned.
  ~TConfig();
  TConfig(TConfig const&) = delete;
  TConfig& operator=(TConfig const&) = delete;

  // Adds the settings of the file to those that are there, which stay. An empty file counts as missing.
  void parseConfigFile();

  // The value of a key, to the letter; empty when there is none.
  std::string getValue(std::string const& key);

  // Every key, in ascending byte order.
  std::vector<std::string> listKeys();

  static TConfig* cfgInstance;  // null until its first use

private:
  std::map<std::string, std::string> fSettings;
  std::string fFileName;
};

}  // namespace NQRVZEP20
