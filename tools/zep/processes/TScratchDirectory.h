// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// A new temporary directory, which the destructor removes with its contents unless Keep has been called. If it cannot be removed,
// its path and the reason are printed to standard error. It may be left when memory runs out in a place where no exception can be
// caught, which ends zep.
class TScratchDirectory {
public:
  // Its name begins with `name`. Throws std::system_error when it cannot be created.
  explicit TScratchDirectory(std::string const& name);
  ~TScratchDirectory();
  TScratchDirectory(TScratchDirectory const&) = delete;
  TScratchDirectory& operator=(TScratchDirectory const&) = delete;

  std::string const& Path() const { return fPath; }
  std::string Path(std::string const& file) const { return fPath + "/" + file; }

  void Keep() { fIsKept = true; }

private:
  std::string fPath;
  bool fIsKept = false;
};

}  // namespace NQRVZEP20::zep
