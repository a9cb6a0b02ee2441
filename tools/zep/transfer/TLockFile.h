// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <string>

namespace NQRVZEP20::zep {

// A lock between processes: an empty file that only one process at a time can lock (flock). The destructor removes the file. A
// file left by a killed process is used again. A file that is not empty was not created by zep, and is never removed.
class TLockFile {
public:
  // Does not wait: if another process holds the lock, WhyNotHeld returns the reason.
  explicit TLockFile(std::string path);
  ~TLockFile();
  TLockFile(TLockFile const&) = delete;
  TLockFile& operator=(TLockFile const&) = delete;

  // Why this process does not hold the lock, for the user; empty if it does.
  std::string const& WhyNotHeld() const { return fWhyNotHeld; }

private:
  bool Open();
  bool IsStillThere() const;
  std::string WhyNotLocked(int error) const;

  std::string fPath, fWhyNotHeld;
  TUniqueFd fFile;
};

}  // namespace NQRVZEP20::zep
