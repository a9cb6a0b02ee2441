// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>
#include <string>

namespace NQRVZEP20::zep {

// The path of a file or directory that is installed with zep: share/zepcore/NAME, relative to the program's own place, in the
// same way in a build tree and installed. It need not exist.
inline std::filesystem::path SharePath(std::string const& name) {
  auto const programs = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  return (programs / "../share/zepcore" / name).lexically_normal();
}

}  // namespace NQRVZEP20::zep
