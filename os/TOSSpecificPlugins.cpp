// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "core/Failure.h"
#include "core/Handles.h"
#include "os/Directories.h"

#include <dlfcn.h>

#include <algorithm>

namespace NQRVZEP20 {

// All in this file and in this order, because one is built from others when the library is loaded.
std::string const TOSSpecific::kFileSeparator = "/";
std::string const TOSSpecific::kDynamicModuleExtension = ".so";
std::string const TOSSpecific::kZEPPluginExtension = "pi";
std::string const TOSSpecific::kPluginExtension = "." + kZEPPluginExtension + kDynamicModuleExtension;
std::string const TOSSpecific::kSpecificationExtension = ".properties.xml";
std::string const TOSSpecific::kRegistrationExtension = ".registration.xml";
std::string const TOSSpecific::libx86IntrAddrFile = "/tmp/intr_address.tmp";
std::string const kNSPExtension = ".nsp.so";

namespace {

constexpr std::size_t kLongestFileName = 511;  // of the core library

// The file of the core library: the loaded object that contains this function. The function is local to this file, because the
// address of an exported one may be that of its stub in a program.
char const* FileOfThisLibrary() {
  Dl_info info{};
  if (::dladdr(reinterpret_cast<void*>(&FileOfThisLibrary), &info) == 0) return nullptr;
  return info.dli_fname;
}

bool Holds(std::string const& text, std::string const& piece) { return text.find(piece) != std::string::npos; }

void AddPluginsOfDirectory(std::string const& path, std::string const& ending, std::vector<std::string>& plugins) {
  TUniqueDir const dir = OpenDirOrThrow(path);
  while (dirent const* const entry = ::readdir(dir.get()))
    if (Holds(entry->d_name, ending)) plugins.push_back(path + TOSSpecific::kFileSeparator + entry->d_name);
}

// "libFan.nsp.so" without "lib" and ".nsp.so"; any other name is cut at the same places, down to nothing. Kept.
std::string BaseNameOf(std::string const& name) {
  constexpr std::size_t kPrefixLength = 3, kEndingLength = 7;
  if (name.size() <= kPrefixLength + kEndingLength) return "";
  return name.substr(kPrefixLength, name.size() - kPrefixLength - kEndingLength);
}

std::string CompanionPath(std::string const& pluginPath, std::string const& kind, std::string const& documentEnding) {
  std::size_t const end = pluginPath.find("." + kind + TOSSpecific::kDynamicModuleExtension);
  if (end == std::string::npos) throw TZEPException(kZEPStatusFail);
  std::string path = pluginPath.substr(0, end);

  if (kind != "cmpi") {
    // The first "lib" in the path is removed, even when it is part of a directory: "/usr/lib/p/libDisk.pi.so" gives
    // "/usr//p/libDisk.properties.xml". Kept.
    std::size_t const prefix = pluginPath.find("lib");
    if (prefix == std::string::npos) throw TZEPException(kZEPStatusFail);
    path.erase(prefix, 3);
  }
  return path + documentEnding;
}

// Null when it cannot be loaded. No handle is ever closed: a loaded plug-in stays until the end of the process.
void* Load(std::string const& path) { return ::dlopen(path.c_str(), RTLD_NOW | RTLD_GLOBAL); }

}  // namespace

std::string TOSSpecific::GetZEPRootPath() {
  char const* const file = FileOfThisLibrary();
  if (file == nullptr || *file == '\0') throw TZEPException(kZEPStatusFileSystemError);
  std::string const path = file;
  // Refused, not cut: the beginning of a longer name would be another directory.
  if (path.size() > kLongestFileName) throw TZEPException(kZEPStatusFileSystemError);
  std::size_t const separator = path.rfind(kFileSeparator);
  return separator == path.npos ? "."
                                : path.substr(0, separator);  // a name without a directory was found in the working directory
}

std::vector<std::string> TOSSpecific::FindPlugins(std::string root, std::string kind) {
  TUniqueDir const dir = OpenDirOrThrow(root);
  std::vector<std::string> plugins;
  while (dirent const* const entry = ::readdir(dir.get())) {
    std::string const path = root + kFileSeparator + entry->d_name;
    if (IsDotOrDotDot(entry->d_name) || !DirExists(path)) continue;
    AddPluginsOfDirectory(path, "." + kind + kDynamicModuleExtension, plugins);
  }
  std::sort(plugins.begin(), plugins.end());  // the order of loading does not depend on the order of the directory
  return plugins;
}

std::vector<std::string> TOSSpecific::FindPlugins(std::string root) { return FindPlugins(root, kZEPPluginExtension); }

std::vector<std::string> TOSSpecific::FindNSServices(std::string kind) {
  std::string const root = GetZEPRootPath();
  TUniqueDir const dir = OpenDirOrThrow(root);
  std::vector<std::string> baseNames;
  while (dirent const* const entry = ::readdir(dir.get())) {
    if (!FileExists(root + kFileSeparator + entry->d_name)) continue;
    if (Holds(entry->d_name, "." + kind)) baseNames.push_back(BaseNameOf(entry->d_name));
  }
  return baseNames;
}

std::vector<std::string> TOSSpecific::FindNSPs() { return FindNSServices("nsp"); }

std::vector<std::string> TOSSpecific::FindNSCs() { return FindNSServices("nsc"); }

std::string TOSSpecific::BuildRegistrationPath(std::string pluginPath, std::string kind) {
  return CompanionPath(pluginPath, kind, kRegistrationExtension);
}

std::string TOSSpecific::BuildSpecificationPath(std::string pluginPath, std::string kind) {
  return CompanionPath(pluginPath, kind, kSpecificationExtension);
}

std::string TOSSpecific::BuildSpecificationPath(std::string pluginPath) {
  return BuildSpecificationPath(pluginPath, kZEPPluginExtension);
}

void* TOSSpecific::LoadPluginLibrary(std::string path) {
  void* const library = Load(path);
  if (library == nullptr) LogErrorAndThrow(kZEPStatusFileSystemError, "ERROR: Failed to load plugin.  Reason: ", LinkerReason());
  return library;
}

void TOSSpecific::LoadNSPLibrary(std::string baseName) {
  if (Load(GetZEPRootPath() + "/lib" + baseName + kNSPExtension) == nullptr)
    LogErrorAndThrow(kZEPStatusFileSystemError, "Couldn't load NSP: " + baseName + " (", LinkerReason(), ")");
}

INamespaceConsumer* TOSSpecific::LoadNSCLibrary(std::string baseName) {
  std::string const path = GetZEPRootPath() + "/lib" + baseName + ".nsc.so";
  void* const library = Load(path);
  if (library == nullptr)
    LogErrorAndThrow(kZEPStatusFileSystemError, "Couldn't load NSC: " + baseName + " (", LinkerReason(), ")");

  auto* const createConsumer = FunctionOf<INamespaceConsumer*()>(library, (baseName + "_CreateINamespaceConsumer").c_str());
  if (createConsumer == nullptr) LogErrorAndThrow(kZEPStatusNotFound, "", "Couldn't find 'CreateINamespaceConsumer' in " + path);
  return createConsumer();
}

}  // namespace NQRVZEP20
