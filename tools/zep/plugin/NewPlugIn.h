// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

struct TNewPlugIn {
  std::string fDirectory;
  std::string fClass;      // spelt as in the schema
  std::string fNamespace;  // such as "root/disks"
  std::vector<std::string> fFiles;
};

// Writes the project of a provider plug-in into the new directory `name` of the working directory: the plug-in describes one
// object of the class, as an example for its author.
//
// Throws TWrongUsage for a name that cannot be the name of a plug-in. Throws std::exception with the cause and the remedy when
// the directory exists or cannot be written, when the schema cannot be read or has no such class, and when the class cannot have
// instances of its own, or is an association. Then there is no new directory.
TNewPlugIn MakePlugIn(std::string const& name, std::string const& className, std::string const& mofFile);

}  // namespace NQRVZEP20::zep
