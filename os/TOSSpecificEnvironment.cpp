// SPDX-License-Identifier: Apache-2.0
#include "TOSSpecific.h"
#include "TZEPException.h"
#include "os/Directories.h"

#include <unistd.h>

#include <cstdlib>

namespace NQRVZEP20 {

std::string TOSSpecific::GetCurrentDir() {
  char buffer[1024];
  if (::getcwd(buffer, sizeof buffer) == nullptr) throw TZEPException(kZEPStatusFail);
  return buffer;
}

std::string TOSSpecific::GetEnvironment(std::string name) {
  char const* const value = std::getenv(name.c_str());
  if (value != nullptr) return value;
  DebugOut("[ERROR]GetEnvironment:Cannt get environmnet.");
  return "";
}

bool TOSSpecific::PutEnvironment(std::string name, std::string value) {
  if (::setenv(name.c_str(), value.c_str(), 1) == 0) return true;
  DebugOut("[ERROR]PutEnvironment occured errors.");
  return false;
}

std::string TOSSpecific::RelocateRelativePath(std::string base, std::string path) {
  if (!path.empty() && path.back() == '/') path.pop_back();
  bool const isAbsolute = !path.empty() && path.front() == '/';
  if (base.empty() || isAbsolute) return path;
  return WithTrailingSeparator(base) + path;
}

bool TOSSpecific::isOEMBuild() { return FileExists("docs/oem_zep_preboot_readme.txt"); }

}  // namespace NQRVZEP20
