// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TMachineFiles.h"

#include <map>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The assignments in an os-release file: NAME=value, one per line, with the value unquoted or quoted as in a shell. Comments
// and other lines are ignored; if a name is assigned more than once, the last value is used.
std::map<std::string, std::string> ParseOsRelease(std::string_view text);

// The os-release file of an operating system.
class TOsRelease {
public:
  // Reads the first of the two standard files that can be read: /etc/os-release, /usr/lib/os-release.
  static TOsRelease ReadFrom(TMachineFiles const& files);

  // `file`: the path of the file; empty when there is none.
  TOsRelease(std::string file, std::string_view text) : fFile(std::move(file)), fValues(ParseOsRelease(text)) {}

  // The value of the first name that has one.
  TFinding<std::string> Value(std::initializer_list<char const*> names) const;

  std::string const& GetFile() const { return fFile; }

private:
  std::string fFile;
  std::map<std::string, std::string> fValues;
};

}  // namespace NQRVZEP20
