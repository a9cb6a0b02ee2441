// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TZEPStatusCode.h"
#include "tools/zep/transfer/Remote.h"

#include <sys/mman.h>
#include <sys/types.h>

#include <atomic>
#include <cstdint>
#include <new>
#include <string>

namespace NQRVZEP20::zep {

// A part of a download is for its owner only: the file that it will replace may be private.
constexpr mode_t kModeOfPart = 0600;

// Bits of TTransferState::fLeft.
enum ELeft : unsigned {
  kLeftTemporary = 1,  // the file, or a part of it, under its temporary name
  kLeftFormer = 2,     // the file that was at the place, moved out of the way
  kLeftAtPlace = 4     // a part of the file at the place itself
};

// The names beside the place that an upload uses.
struct TUploadNames {
  std::string fTemporary, fFormer;
};

// What the process of a transfer tells of it while it runs, in memory that it shares with zep.
struct TTransferState {
  std::atomic<std::uint64_t> fMoved{0};       // bytes of the local file, read or written
  std::atomic<std::int64_t> fRemoteTime{-1};  // when the remote file that the part is of was changed last, in seconds since
                                              // 1970; -1: the server does not report it, or nothing was written
  std::atomic<int> fReadError{0};             // errno, when the file that is sent could not be read
  std::atomic<unsigned> fLeft{0};             // ELeft: what of an upload may be left on the server
  std::atomic<bool> fIsTooLarge{false};       // of a download
};

class TSharedTransferState {
public:
  // Throws std::bad_alloc.
  TSharedTransferState() {
    void* const memory = ::mmap(nullptr, sizeof(TTransferState), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED) throw std::bad_alloc();
    fState = new (memory) TTransferState;
  }
  ~TSharedTransferState() { ::munmap(fState, sizeof(TTransferState)); }
  TSharedTransferState(TSharedTransferState const&) = delete;
  TSharedTransferState& operator=(TSharedTransferState const&) = delete;

  TTransferState& operator*() const { return *fState; }
  TTransferState* operator->() const { return fState; }

private:
  TTransferState* fState;
};

// Call these functions in a process of their own (RunWatched). They transfer as the library does, by FTP or SFTP through libcurl
// and without a proxy, and throw TZEPFailure with the library's status codes.

// Names that no other transfer has.
TUploadNames NamesForUpload(TRemote const& place);

// The place of that name in the same directory.
TRemote Beside(TRemote const& place, std::string const& name);

// Sends the file under the temporary name beside the place and renames it there, in the place of one that is there. Where the
// server refuses that name or the renaming, the file is sent to the place itself. What a broken upload left is removed, for which
// the server has `cleanUpSeconds`. When it ends, state.fLeft has what is left: after a success, too.
TZEPStatusCode Upload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds,
                      TTransferState& state);

// Removes the parts that an upload whose process was ended left, on a connection of its own, and clears their bits of fLeft.
void RemoveParts(TRemote const& place, TUploadNames const& names, int cleanUpSeconds, TTransferState& state);

// Fetches into the file. With `isThere` the file may exist. It is taken for the beginning of the remote file when it has the
// time of the remote file (MarkForResuming) and its note (PartNote.h) the URL and the size: the rest is then added, if the server
// can start in the middle. Any other file is replaced once the first bytes arrive, and gets a note. Without `isThere` an existing
// file is kZEPStatusAlreadyExists. Ends with fIsTooLarge when the whole would be larger than `mostBytes` (0: any size).
TZEPStatusCode Download(TRemote const& remote, std::string const& file, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state);

// Gives a part of a download, which is to be resumed some day, the time of the remote file.
void MarkForResuming(std::string const& part, TTransferState const& state);

}  // namespace NQRVZEP20::zep
