// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/TScratchDirectory.h"

#include "collect/SafeText.h"

#include <ftw.h>
#include <stdio.h>
#include <stdlib.h>

#include <cerrno>
#include <filesystem>
#include <iostream>
#include <new>
#include <system_error>

namespace NQRVZEP20::zep {

namespace fs = std::filesystem;

TScratchDirectory* TScratchDirectory::fNewest = nullptr;

TScratchDirectory::TScratchDirectory(std::string const& name)
    : fPath((fs::temp_directory_path() / (name + ".XXXXXX")).string()), fOlder(fNewest) {
  if (::mkdtemp(fPath.data()) == nullptr)
    throw std::system_error(errno, std::generic_category(), "a temporary directory cannot be created");
  fNewest = this;
}

TScratchDirectory::~TScratchDirectory() {
  TScratchDirectory** newer = &fNewest;
  while (*newer != this) newer = &(*newer)->fOlder;
  *newer = fOlder;
  Remove();
}

void TScratchDirectory::RemoveAll() {
  for (TScratchDirectory* each = fNewest; each != nullptr; each = each->fOlder) try {
      each->Remove();
    } catch (std::bad_alloc const&) {  // for the message
    }
}

void TScratchDirectory::Remove() {
  if (fIsKept) return;
  // Not std::filesystem::remove_all, which ends the program when memory runs out.
  constexpr int descriptors = 16;
  auto const removeEntry = [](char const* path, struct stat const*, int, FTW*) { return ::remove(path); };
  if (::nftw(fPath.c_str(), removeEntry, descriptors, FTW_DEPTH | FTW_PHYS) == 0 || errno == ENOENT) return;
  std::string const why = std::generic_category().message(errno);
  std::cerr << "zep: the temporary directory " << Printable(fPath) << " cannot be removed: " << why << "\n";
}

}  // namespace NQRVZEP20::zep
