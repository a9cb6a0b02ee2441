// The functions of libsmbios.so.

#include "platform/include/smbios.h"

#include "platform/smbios/SmbiosTable.h"

#include <errno.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <string>

namespace {

constexpr char const* kKernelTable = "/sys/firmware/dmi/tables/DMI";
constexpr std::size_t kMaxFileSize = 16u << 20;

// An open handle: the file as it was read, and the place behind the structure handed out last.
struct THandle {
  std::string file;
  std::string_view table;  // into `file`
  smbios::TStructureReader place;
};

class TOpenFile {
public:
  // Opening does not wait, whatever the path names.
  explicit TOpenFile(char const* path) : fFd(::open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK)) {}
  ~TOpenFile() {
    if (fFd >= 0) ::close(fFd);
  }
  TOpenFile(TOpenFile const&) = delete;
  TOpenFile& operator=(TOpenFile const&) = delete;

  int Fd() const { return fFd; }

private:
  int fFd;  // -1: not opened
};

char const* TablePath() {
  char const* named = std::getenv("ZEP_SMBIOS_TABLE");
  return named != nullptr && *named != '\0' ? named : kKernelTable;
}

int StatusOfOpenError(int error) {
  if (error == ENOENT || error == ENOTDIR) return kSmbiosFileNotFound;
  if (error == EACCES || error == EPERM) return kSmbiosAccessDenied;
  return kSmbiosFail;
}

// Reads a regular file whole, up to the limit. One byte of room more than the file has shows its end with the first read.
int ReadRegularFile(char const* path, std::string& contents) {
  const TOpenFile file(path);
  if (file.Fd() < 0) return StatusOfOpenError(errno);
  struct stat status;
  if (::fstat(file.Fd(), &status) != 0 || !S_ISREG(status.st_mode)) return kSmbiosFail;

  contents.resize(std::min(static_cast<std::size_t>(status.st_size) + 1, kMaxFileSize));
  std::size_t filled = 0;
  while (filled < contents.size()) {
    const ssize_t got = ::read(file.Fd(), contents.data() + filled, contents.size() - filled);
    if (got < 0) return kSmbiosFail;
    if (got == 0) break;
    filled += static_cast<std::size_t>(got);
  }
  contents.resize(filled);
  return kSmbiosOk;
}

int Load(void** handle) {
  auto loaded = std::make_unique<THandle>();
  if (const int status = ReadRegularFile(TablePath(), loaded->file); status != kSmbiosOk) return status;
  loaded->table = smbios::DmiTableIn(loaded->file);
  if (loaded->table.empty()) return kSmbiosFail;
  loaded->place = smbios::TStructureReader(loaded->table);
  *handle = loaded.release();
  return kSmbiosOk;
}

int CopyNextOfType(THandle& handle, smbios::TStructureReader place, int type, void* buffer, int* length) {
  if (length == nullptr || *length < 0 || (buffer == nullptr && *length > 0)) return kSmbiosFail;
  const smbios::TStructure structure = place.NextOfType(type);
  if (structure.empty()) return kSmbiosNoMoreItems;

  handle.place = place;
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
  return CopyNextOfType(opened, smbios::TStructureReader(opened.table), type, buffer, length);
}

int smBiosGetNext(void* handle, int type, void* buffer, int* length) {
  if (handle == nullptr) return kSmbiosFail;
  THandle& opened = *static_cast<THandle*>(handle);
  return CopyNextOfType(opened, opened.place, type, buffer, length);
}

int smBiosClose(void* handle) {
  const std::unique_ptr<THandle> closed(static_cast<THandle*>(handle));
  return kSmbiosOk;
}

#pragma GCC visibility pop
