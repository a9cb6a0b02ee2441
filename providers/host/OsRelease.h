// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <map>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The assignments of an os-release file: NAME=value, one on each line, the value bare or in quotes, as a shell reads it.
// Comments and lines of another shape are passed over; the last assignment of a name counts.
std::map<std::string, std::string> ParseOsRelease(std::string_view text);

// The operating system's description of itself.
class TOsRelease {
public:
  // Reads the first of the two standard files that can be opened: /etc/os-release, /usr/lib/os-release.
  static TOsRelease OfThisMachine();

  // `file` tells where the text was read; an empty one, that there was none.
  TOsRelease(std::string file, std::string_view text) : fFile(std::move(file)), fValues(ParseOsRelease(text)) {}

  // The first of the names that has a value, or why none has.
  TFinding<std::string> Value(std::initializer_list<char const*> names) const;

  std::string const& GetFile() const { return fFile; }

private:
  std::string fFile;
  std::map<std::string, std::string> fValues;
};

}  // namespace NQRVZEP20
