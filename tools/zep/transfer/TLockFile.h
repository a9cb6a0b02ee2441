// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <string>

namespace NQRVZEP20::zep {

// A lock between processes: an empty file that one process at a time has locked. It is removed at the end. The lock file of a
// process that was killed is used again. A file with content was not made by zep, and stays.
class TLockFile {
public:
  // Does not wait for another process: WhyNotHeld then has the reason.
  explicit TLockFile(std::string path);
  ~TLockFile();
  TLockFile(TLockFile const&) = delete;
  TLockFile& operator=(TLockFile const&) = delete;

  // For the user; empty when this process holds the lock.
  std::string const& WhyNotHeld() const { return fWhyNotHeld; }

private:
  bool Open();
  bool IsStillThere() const;
  std::string WhyNotLocked(int error) const;

  std::string fPath, fWhyNotHeld;
  TUniqueFd fFile;
};

}  // namespace NQRVZEP20::zep
