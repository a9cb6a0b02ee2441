// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ILogger.h"
#include "collect/PlugIns.h"
#include "loaders/TLoadedLibrary.h"
#include "tools/zep/output/ExitStatus.h"

#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// What one check of this host found.
struct TCheck {
  std::string fName;  // such as "libcurl"
  bool fWorks;
  std::string fFinding;  // what was found, such as "/usr/bin/lsblk"
  std::string fRemedy;   // empty when it works
};

// How libsmbios.so opened the SMBIOS tables.
struct TSmbiosOutcome {
  TLoadOutcome fLibrary;
  int fStatus;             // of smBiosLoad
  int fError;              // errno after it
  std::string fNamedFile;  // that ZEP_SMBIOS_TABLE names; empty for the kernel's tables
};

// Each check takes what it judges, so that it does not depend on the machine. No check changes anything.
TCheck CheckRoot(bool isRoot);
TCheck CheckSmbios(TSmbiosOutcome const& outcome);
TCheck CheckLibcurl(TLoadOutcome const& outcome);

// A device of a management controller, in that directory ("/dev"), that this user may read and write.
TCheck CheckControllerDevice(std::string const& directory);

// A program in the directories of `path`, which has the form of PATH; `package` is the Debian package that contains it.
TCheck CheckProgram(std::string const& program, std::string const& path, std::string const& package);

// Whether the logger can write files there. The directory need not exist: the logger creates it with its parents.
TCheck CheckLogDirectory(std::string const& directory);

// At debug severity the library logs the passwords of controllers' sessions. `threshold`: of this process, which the plug-ins
// have changed only if they were loaded into it.
TCheck CheckLogThreshold(ILogger::EZEPLogSeverity threshold, std::vector<TPlugIn> const& plugIns);

// One check for each plug-in, or one that there are none.
std::vector<TCheck> CheckPlugIns(std::vector<TPlugIn> const& plugIns, std::string const& directory);

// kExitComplete when everything works, otherwise kExitPartial.
EExitStatus StatusOf(std::vector<TCheck> const& checks);

}  // namespace NQRVZEP20::zep
