// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>
#include <cstdint>
#include <ctime>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// zstd-compressed tar archives of files, directories and symbolic links, by libarchive.

enum class EMemberKind { kFile, kDirectory, kLink, kOther };  // other: a hard link, a device, a FIFO; only read, never written

struct TMember {
  EMemberKind fKind;
  std::string fName;         // a relative path
  std::string fTarget = {};  // of a link
  mode_t fMode = 0;          // the permissions
  std::timespec fTime = {};
};

// Compresses an archive into memory. Every operation throws std::runtime_error if libarchive fails.
class TArchiveWriter {
public:
  virtual ~TArchiveWriter() = default;

  virtual void Add(TMember const& member, std::string const& content) = 0;

  // The complete archive. Call it once, at the end.
  virtual std::string Finish() = 0;
};

// Why an archive is refused: a clause that names the member.
struct TArchiveError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

// Reads an archive from first to last. It is foreign input: names are not checked, but nothing is written anywhere, and no more
// memory is used than the caller allows. Every operation throws TArchiveError.
class TArchiveReader {
public:
  virtual ~TArchiveReader() = default;

  // The next member; none at the end.
  virtual std::optional<TMember> Next() = 0;

  // The content of the current member, which is an error if it is longer than `limit` bytes, or has a hole at its end, which
  // programs that unpack the archive would fill.
  virtual std::string Content(std::uint64_t limit) = 0;

  // The same, passed to `use` piece by piece.
  virtual void Read(std::uint64_t limit, std::function<void(std::string_view piece)> const& use) = 0;
};

// Never null.
std::unique_ptr<TArchiveWriter> NewArchiveWriter();
std::unique_ptr<TArchiveReader> NewArchiveReader(std::string const& file);

}  // namespace NQRVZEP20::zep
