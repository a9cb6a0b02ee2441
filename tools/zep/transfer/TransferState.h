// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/mman.h>
#include <sys/types.h>

#include <atomic>
#include <cstdint>
#include <new>

namespace NQRVZEP20::zep {

// Bits of TTransferState::fLeft. The "place" is the final path of the upload, and the "earlier file" is the file that was there
// before.
enum ELeft : unsigned {
  kLeftTemporary = 1,   // the complete or incomplete file under its temporary name
  kLeftFormer = 2,      // the earlier file, which was renamed to make way
  kLeftAtPlace = 4,     // an incomplete file at the place
  kLeftPlaceEmpty = 8,  // the earlier file made way, and no file is at the place; not together with kLeftAtPlace
  kMayBeRenamed = 16,   // the complete file may have been renamed, and may be at the place
};

// The fate of the earlier file.
enum class EEarlierFile {
  kIsThere,    // it was not changed, or a complete file replaced it
  kMayBeLost,  // if there was one, it was overwritten by an incomplete file
  kIsLost,     // it was overwritten by an incomplete file
};

// The state of a transfer, in memory that zep shares with the process of the transfer, which updates it.
struct TTransferState {
  std::atomic<std::uint64_t> fMoved{0};       // bytes of the local file that were read or written
  std::atomic<std::int64_t> fRemoteTime{-1};  // when the remote file that the part is of was changed last, in seconds since
                                              // 1970; -1: the server does not report it, or nothing was written
  std::atomic<dev_t> fDevice{0};              // of the part that a download wrote
  std::atomic<ino_t> fInode{0};               // of the same
  std::atomic<int> fReadError{0};             // errno, if the file to upload could not be read
  std::atomic<unsigned> fLeft{0};             // ELeft: what an upload may have left on the server
  std::atomic<bool> fHasArrived{false};       // the complete upload is at its place; only the connection is still open
  std::atomic<EEarlierFile> fEarlierFile{EEarlierFile::kIsThere};
  std::atomic<bool> fIsTooLarge{false};   // the file to download exceeds the size limit
  std::atomic<bool> fIsFinishing{false};  // no bytes move: a download is flushed to disk, or an upload is cleaned up
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

}  // namespace NQRVZEP20::zep
