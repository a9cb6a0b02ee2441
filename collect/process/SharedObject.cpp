// SPDX-License-Identifier: Apache-2.0
#include "collect/process/SharedObject.h"

#include "core/Handles.h"

#include <fcntl.h>
#include <link.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <cstring>
#include <vector>

namespace NQRVZEP20 {

namespace {

bool ReadAt(int fd, std::uint64_t at, void* place, std::size_t size) {
  return ::pread(fd, place, size, static_cast<off_t>(at)) == static_cast<ssize_t>(size);
}

bool IsWithin(std::uint64_t begin, std::uint64_t length, std::uint64_t end) { return begin <= end && length <= end - begin; }

}  // namespace

bool CanBeMapped(std::string const& file) {
  TUniqueFd const fd(::open(file.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  struct stat status {};
  if (!fd || ::fstat(fd.get(), &status) != 0 || !S_ISREG(status.st_mode)) return false;
  auto const size = static_cast<std::uint64_t>(status.st_size);

  ElfW(Ehdr) header{};
  if (!ReadAt(fd.get(), 0, &header, sizeof header) || std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0) return false;
  unsigned char const wordSize = sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32;
  if (header.e_ident[EI_CLASS] != wordSize || header.e_type != ET_DYN || header.e_phentsize != sizeof(ElfW(Phdr))) return false;

  std::vector<ElfW(Phdr)> segments(header.e_phnum);
  std::size_t const bytes = segments.size() * sizeof(ElfW(Phdr));
  if (!IsWithin(header.e_phoff, bytes, size) || !ReadAt(fd.get(), header.e_phoff, segments.data(), bytes)) return false;
  for (ElfW(Phdr) const& segment : segments)
    if (segment.p_type == PT_LOAD && !IsWithin(segment.p_offset, segment.p_filesz, size)) return false;
  return true;
}

}  // namespace NQRVZEP20
