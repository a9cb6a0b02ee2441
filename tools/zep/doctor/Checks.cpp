// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/doctor/Checks.h"

#include "platform/include/smbios.h"
#include "tools/zep/output/Text.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

constexpr char const* kRunAsRoot = "run zep as root";
constexpr char const* kControllerDevices[] = {"ipmi0", "ipmi/0", "ipmidev/0"};  // the names that Linux distributions use

TCheck Works(std::string const& name, std::string const& finding) { return {name, true, finding, ""}; }

TCheck Fails(std::string const& name, std::string const& finding, std::string const& remedy) {
  return {name, false, finding, remedy};
}

std::string ReasonOf(TLoadOutcome const& outcome) {
  std::string const what = outcome.fKind == TLoadOutcome::kNotLoaded ? "cannot be loaded" : "lacks a function";
  return what + (outcome.fReason.empty() ? "" : ": " + outcome.fReason);
}

// The directory itself, or the nearest existing one above it.
fs::path NearestExisting(fs::path path) {
  std::error_code ignored;
  while (!fs::exists(path, ignored) && path.has_relative_path()) path = path.parent_path();
  return path;
}

bool IsProgram(fs::path const& path) {
  std::error_code ignored;
  return fs::is_regular_file(path, ignored) && ::access(path.c_str(), X_OK) == 0;
}

}  // namespace

TCheck CheckRoot(bool isRoot) {
  if (isRoot) return Works("root", "zep runs as root");
  return Fails("root", "zep does not run as root, which the kernel's SMBIOS tables, media and DHCP need", kRunAsRoot);
}

TCheck CheckSmbios(TSmbiosOutcome const& outcome) {
  constexpr char const* kName = "SMBIOS";
  bool const isNamed = !outcome.fNamedFile.empty();
  std::string const tables = isNamed ? outcome.fNamedFile : "the kernel's tables";
  std::string const otherFile =
      isNamed ? "name another file in ZEP_SMBIOS_TABLE" : "name a dump of the tables in ZEP_SMBIOS_TABLE";
  if (!outcome.fLibrary)
    return Fails(kName, "libsmbios.so " + ReasonOf(outcome.fLibrary), "install the package libzepcore1 anew");
  switch (outcome.fStatus) {
    case kSmbiosOk:
      return Works(kName, tables + (isNamed ? ", which ZEP_SMBIOS_TABLE names," : "") + " can be read");
    case kSmbiosFileNotFound:
      return Fails(kName,
                   isNamed ? tables + ", which ZEP_SMBIOS_TABLE names, does not exist" : "the kernel exports no SMBIOS tables",
                   otherFile);
    case kSmbiosAccessDenied:
      return Fails(kName, "this user may not read " + tables, kRunAsRoot);
    case kSmbiosFileSystemError:
      return Fails(kName, tables + " cannot be read: " + std::strerror(outcome.fError), otherFile);
    default:
      return Fails(kName, "there is no SMBIOS table in " + tables, otherFile);
  }
}

TCheck CheckLibcurl(TLoadOutcome const& outcome) {
  if (outcome) return Works("libcurl", "it can be loaded: send, get and proxy-check work");
  return Fails("libcurl", "libcurl " + ReasonOf(outcome), "install the package libcurl4");
}

TCheck CheckControllerDevice(std::string const& directory) {
  constexpr char const* kName = "controller device";
  for (char const* device : kControllerDevices) {
    std::string const path = directory + "/" + device;
    if (::access(path.c_str(), R_OK | W_OK) == 0) return Works(kName, path);
    if (errno != ENOENT && errno != ENOTDIR) return Fails(kName, path + " cannot be used: " + std::strerror(errno), kRunAsRoot);
  }
  return Fails(kName, "there is no " + directory + "/" + kControllerDevices[0],
               "if this server has a management controller: modprobe ipmi_si ipmi_devintf");
}

TCheck CheckProgram(std::string const& program, std::string const& path, std::string const& package) {
  std::istringstream directories(path);
  for (std::string directory; std::getline(directories, directory, ':');) {
    fs::path const file = fs::path(directory.empty() ? "." : directory) / program;
    if (IsProgram(file)) return Works(program, file.string());
  }
  return Fails(program, program + " is in no directory of PATH", "install the package " + package);
}

TCheck CheckLogDirectory(std::string const& directory) {
  constexpr char const* kName = "log directory";
  std::error_code ignored;
  fs::path const nearest = NearestExisting(directory);
  if (!fs::is_directory(nearest, ignored))
    return Fails(kName, nearest.string() + " is not a directory", "remove or rename " + nearest.string());
  if (::access(nearest.c_str(), W_OK | X_OK) != 0)
    return Fails(kName, nearest.string() + " cannot be written: " + std::strerror(errno), kRunAsRoot);
  bool const exists = fs::exists(directory, ignored);
  return Works(kName, directory + (exists ? " can be written" : " can be created"));
}

TCheck CheckLogThreshold(ILogger::EZEPLogSeverity threshold, std::vector<TPlugIn> const& plugIns) {
  constexpr char const* kName = "log threshold";
  std::vector<std::string> files;  // of the plug-ins that lower it
  for (TPlugIn const& plugIn : plugIns)
    if (plugIn.fLogsDebug) files.push_back(plugIn.fFile);
  if (files.empty() && threshold < ILogger::kLogDebug) return Works(kName, "debug entries are dropped");
  return Fails(kName, "debug entries are logged: the log contains the passwords of controllers' sessions",
               "set the threshold to status (TLogger::SetLogThreshold)" + (files.empty() ? "" : " in " + Joined(files, ", ")));
}

namespace {

std::string RemedyFor(TPlugIn const& plugIn) {
  std::string const& file = plugIn.fFile;
  switch (plugIn.fRule) {
    case EPlugInRule::kMissing:
      return "correct the path after --plugin, or remove the broken link";
    case EPlugInRule::kKind:
      return "replace " + file + " with a regular file, or remove it";
    case EPlugInRule::kPermission:
      return "let this user read " + file;
    case EPlugInRule::kWritable:
      return "let only root write " + file + " and the directories above it, or pass --allow-writable";
    case EPlugInRule::kReplaced:
      return "name one plug-in of a name with --plugin";
    case EPlugInRule::kName:
      return "rename " + file + " to lib<NAME>.nsp.so, or remove it";
    default:
      return "mend " + file + ", or remove it";
  }
}

}  // namespace

std::vector<TCheck> CheckPlugIns(std::vector<TPlugIn> const& plugIns, std::string const& directory) {
  std::vector<TCheck> checks;
  for (TPlugIn const& plugIn : plugIns) {
    std::string const name = "plug-in " + plugIn.fName;
    std::vector<std::string> failures = FailuresOf({plugIn});
    if (failures.empty() && plugIn.fProviders.empty()) failures.emplace_back("it registers no provider");
    checks.push_back(failures.empty() ? Works(name, plugIn.fFile) : Fails(name, Joined(failures, "; "), RemedyFor(plugIn)));
  }
  if (checks.empty())
    checks.push_back(Fails("plug-ins", "there is no plug-in in " + directory,
                           "install the package zep-provider-host, or copy plug-ins there"));
  return checks;
}

EExitStatus StatusOf(std::vector<TCheck> const& checks) {
  bool const works = std::all_of(checks.begin(), checks.end(), [](TCheck const& check) { return check.fWorks; });
  return works ? kExitComplete : kExitPartial;
}

}  // namespace NQRVZEP20::zep
