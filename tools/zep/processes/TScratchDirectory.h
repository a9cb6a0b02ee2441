// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// A new temporary directory, which the destructor removes with its contents unless Keep has been called. If it cannot be removed,
// its path and the reason are printed to standard error. For the main thread only.
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

  // Removes those that exist. For an end of the program without destructors.
  static void RemoveAll();

private:
  void Remove();

  static TScratchDirectory* fNewest;

  std::string fPath;
  TScratchDirectory* fOlder;
  bool fIsKept = false;
};

}  // namespace NQRVZEP20::zep
