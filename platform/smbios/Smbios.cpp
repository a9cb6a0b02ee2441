// SPDX-License-Identifier: Apache-2.0

// The functions of libsmbios.so.

#include "platform/include/smbios.h"

#include "core/Handles.h"
#include "core/TNeverDestroyed.h"
#include "platform/smbios/SmbiosTable.h"

#include <errno.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <memory>
#include <mutex>
#include <new>
#include <string>
#include <tuple>

namespace {

constexpr char const* kKernelTable = "/sys/firmware/dmi/tables/DMI";  // below the root
constexpr std::size_t kMaxFileSize = 16u << 20;

// The contents of a file, and the table in them.
struct TTableFile {
  std::string fContents;
  std::string_view fTable;  // into fContents
};
using TSharedTableFile = std::shared_ptr<TTableFile const>;

// An open handle: the file, and the position after the structure that was copied last.
struct THandle {
  TSharedTableFile fFile;
  smbios::TStructureReader fPlace;
};

// The value of an environment variable; empty when it is not set.
std::string Variable(char const* name) {
  char const* const value = std::getenv(name);
  return value != nullptr ? value : "";
}

std::string TablePath() {
  std::string const named = Variable("ZEP_SMBIOS_TABLE");
  return named.empty() ? Variable("ZEP_ROOT") + kKernelTable : named;
}

int StatusOfOpenError(int error) {
  if (error == ENOENT || error == ENOTDIR) return kSmbiosFileNotFound;
  if (error == EACCES || error == EPERM) return kSmbiosAccessDenied;
  if (error == ENXIO) return kSmbiosFail;  // a socket, or a missing device
  return kSmbiosFileSystemError;
}

// Caches the file that was read last. It is not read again while the file and its change time are the same.
class TLastFile {
public:
  // Null when `status` belongs to another file or the file has changed.
  TSharedTableFile Find(struct stat const& status) const {
    std::lock_guard<std::mutex> const lock(fMutex);
    return fState == StateOf(status) ? fFile : nullptr;
  }

  // Two changes within one clock tick have the same change time, so a file is cached only when its last change is old enough.
  void Keep(struct stat const& status, TSharedTableFile file) {
    constexpr std::time_t kSettledAfterSeconds = 1;
    if (std::time(nullptr) - status.st_ctim.tv_sec <= kSettledAfterSeconds) return;
    std::lock_guard<std::mutex> const lock(fMutex);
    fState = StateOf(status);
    fFile = std::move(file);
  }

private:
  using TState = std::tuple<dev_t, ino_t, off_t, std::time_t, long>;

  static TState StateOf(struct stat const& status) {
    return {status.st_dev, status.st_ino, status.st_size, status.st_ctim.tv_sec, status.st_ctim.tv_nsec};
  }

  mutable std::mutex fMutex;
  TState fState;
  TSharedTableFile fFile;  // null: nothing is cached yet
};

TLastFile& LastFile() {
  static NQRVZEP20::TNeverDestroyed<TLastFile> lastFile;
  return *lastFile;
}

// Reads the complete file, of `size` bytes, up to kMaxFileSize. The buffer has room for one byte more, so that reading stops at
// the end of the file.
bool ReadWhole(int fd, std::size_t size, std::string& contents) {
  contents.resize(std::min(size + 1, kMaxFileSize));
  std::size_t filled = 0;
  while (filled < contents.size()) {
    ssize_t const got = ::read(fd, contents.data() + filled, contents.size() - filled);
    if (got < 0) return false;
    if (got == 0) break;
    filled += static_cast<std::size_t>(got);
  }
  contents.resize(filled);
  return true;
}

int ReadTableFile(char const* path, TSharedTableFile& tableFile) {
  struct stat status;
  if (::stat(path, &status) == 0 && (tableFile = LastFile().Find(status))) return kSmbiosOk;

  // Opening does not block, even for a pipe.
  NQRVZEP20::TUniqueFd const file(::open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) return StatusOfOpenError(errno);
  if (::fstat(file.get(), &status) != 0) return kSmbiosFileSystemError;
  if (!S_ISREG(status.st_mode)) return kSmbiosFail;
  auto const whole = std::make_shared<TTableFile>();
  if (!ReadWhole(file.get(), static_cast<std::size_t>(status.st_size), whole->fContents)) return kSmbiosFileSystemError;
  whole->fTable = smbios::DmiTableIn(whole->fContents);
  tableFile = whole;
  LastFile().Keep(status, tableFile);
  return kSmbiosOk;
}

int Load(void** handle) {
  auto loaded = std::make_unique<THandle>();
  if (int const status = ReadTableFile(TablePath().c_str(), loaded->fFile); status != kSmbiosOk) return status;
  if (loaded->fFile->fTable.empty()) return kSmbiosFail;
  loaded->fPlace = smbios::TStructureReader(loaded->fFile->fTable);
  *handle = loaded.release();
  return kSmbiosOk;
}

int CopyNextOfType(THandle& handle, smbios::TStructureReader place, int type, void* buffer, int* length) {
  if (length == nullptr || *length < 0 || (buffer == nullptr && *length > 0)) return kSmbiosFail;
  smbios::TStructure const structure = place.NextOfType(type);
  if (structure.empty()) return kSmbiosNoMoreItems;

  handle.fPlace = place;
  if (*length > 0) std::memcpy(buffer, structure.data(), std::min(structure.size(), static_cast<std::size_t>(*length)));
  *length = static_cast<int>(structure.size());
  return kSmbiosOk;
}

}  // namespace

#pragma GCC visibility push(default)

int smBiosLoad(void* /*provider*/, void** handle) try {
  if (handle == nullptr) return kSmbiosFail;
  *handle = nullptr;
  return Load(handle);
} catch (std::bad_alloc const&) {
  return kSmbiosOutOfMemory;
}

int smBiosGetFirst(void* handle, int type, void* buffer, int* length) {
  if (handle == nullptr) return kSmbiosFail;
  THandle& opened = *static_cast<THandle*>(handle);
  return CopyNextOfType(opened, smbios::TStructureReader(opened.fFile->fTable), type, buffer, length);
}

int smBiosGetNext(void* handle, int type, void* buffer, int* length) {
  if (handle == nullptr) return kSmbiosFail;
  THandle& opened = *static_cast<THandle*>(handle);
  return CopyNextOfType(opened, opened.fPlace, type, buffer, length);
}

int smBiosClose(void* handle) {
  std::unique_ptr<THandle> const closed(static_cast<THandle*>(handle));
  return kSmbiosOk;
}

#pragma GCC visibility pop
