// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/mman.h>
#include <sys/types.h>

#include <atomic>
#include <cstdint>
#include <new>

namespace NQRVZEP20::zep {

// Bits of TTransferState::fLeft. "Place" is where the upload is to arrive, and "earlier file" the one that was there before.
enum ELeft : unsigned {
  kLeftTemporary = 1,   // the file, or a part of it, under its temporary name
  kLeftFormer = 2,      // the earlier file, under the name that it got to make way
  kLeftAtPlace = 4,     // a part of the file at the place itself
  kLeftPlaceEmpty = 8,  // the earlier file made way, and nothing has taken its place; not together with kLeftAtPlace
  kMayBeRenamed = 16,   // the complete file may have lost its temporary name, and be at the place
};

// What became of a file that an upload found at its place.
enum class EEarlierFile {
  kIsThere,    // it was not touched, or a complete file replaced it
  kMayBeLost,  // a part was written over it, if there was one
  kIsLost,     // a part was written over it
};

// The state of a transfer, which its process updates while it runs, in memory that it shares with zep.
struct TTransferState {
  std::atomic<std::uint64_t> fMoved{0};       // bytes of the local file, read or written
  std::atomic<std::int64_t> fRemoteTime{-1};  // when the remote file that the part is of was changed last, in seconds since
                                              // 1970; -1: the server does not report it, or nothing was written
  std::atomic<dev_t> fDevice{0};              // of the part that a download wrote
  std::atomic<ino_t> fInode{0};               // of the same
  std::atomic<int> fReadError{0};             // errno, when the file that is sent could not be read
  std::atomic<unsigned> fLeft{0};             // ELeft: what of an upload may be left on the server
  std::atomic<EEarlierFile> fEarlierFile{EEarlierFile::kIsThere};
  std::atomic<bool> fIsTooLarge{false};   // of a download
  std::atomic<bool> fIsFinishing{false};  // nothing moves: a download is written to the disk, or an upload is cleaned up
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
