// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// A fresh directory among the temporary files, removed with everything in it at the end, unless it is to be kept.
class TScratchDirectory {
public:
  // Its name begins with this one. Throws std::system_error when none can be made.
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
