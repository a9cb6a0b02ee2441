// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/stat.h>

#include <string>
#include <system_error>

namespace NQRVZEP20::zep {

// The system's words for an errno.
inline std::string ReasonOf(int error) { return std::generic_category().message(error); }

inline bool IsSameFile(struct stat const& a, struct stat const& b) { return a.st_dev == b.st_dev && a.st_ino == b.st_ino; }

}  // namespace NQRVZEP20::zep
