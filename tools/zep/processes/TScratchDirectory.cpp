// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/processes/TScratchDirectory.h"

#include "collect/SafeText.h"

#include <stdlib.h>

#include <cerrno>
#include <filesystem>
#include <iostream>
#include <new>
#include <system_error>

namespace NQRVZEP20::zep {

namespace fs = std::filesystem;

TScratchDirectory::TScratchDirectory(std::string const& name) : fPath((fs::temp_directory_path() / (name + ".XXXXXX")).string()) {
  if (::mkdtemp(fPath.data()) == nullptr)
    throw std::system_error(errno, std::generic_category(), "a temporary directory cannot be created");
}

TScratchDirectory::~TScratchDirectory() {
  if (fIsKept) return;
  std::error_code failure;
  try {
    fs::remove_all(fPath, failure);
  } catch (std::bad_alloc const&) {
    failure = std::make_error_code(std::errc::not_enough_memory);
  }
  if (failure)
    std::cerr << "zep: the temporary directory " << Printable(fPath) << " cannot be removed: " << failure.message() << "\n";
}

}  // namespace NQRVZEP20::zep
