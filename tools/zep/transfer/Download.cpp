// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Download.h"

#include "TZEPFailure.h"
#include "core/Handles.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/transfer/PartNote.h"
#include "tools/zep/transfer/TConnection.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace NQRVZEP20::zep {

namespace {

class TDownload {
public:
  TDownload(TRemote const& remote, std::string const& file, bool isThere, std::uint64_t mostBytes, TTransferState& state)
      : fUrl(UrlOf(remote)), fShownUrl(ShownUrlOf(remote)), fPath(file), fMostBytes(mostBytes), fState(state), fIsThere(isThere) {
    fConnection.Set(CURLOPT_WRITEFUNCTION, &Write);
    fConnection.Set(CURLOPT_WRITEDATA, this);
    fConnection.Set(CURLOPT_FILETIME, 1L);
    fConnection.Set(CURLOPT_MAXFILESIZE_LARGE, static_cast<curl_off_t>(mostBytes));  // where the server reports the size
  }

  void Run() {
    FindStart();
    CURLcode code = Fetch();
    if (fStart > 0 && !fFile && IsStartedAnew(code)) {
      fStart = 0;
      fIsOther = false;
      code = Fetch();
    }
    bool const isWholeTooLarge = code == CURLE_OK && fMostBytes > 0 && fStart > fMostBytes;
    if (code == CURLE_FILESIZE_EXCEEDED || isWholeTooLarge) fState.fIsTooLarge = true;
    if (fState.fIsTooLarge) FailFor(code);
    if (code == CURLE_OK && !fFile)
      OpenPart(static_cast<std::int64_t>(fStart));  // the file is empty, or the part was already complete
    if (code == CURLE_OK && fError == 0) Flush();
    if (code != CURLE_OK || fError != 0) FailFor(code);
  }

private:
  // A part can be resumed if its time is in whole seconds (MarkForResuming) and it has a note.
  void FindStart() {
    struct stat status {};
    bool const isPart = fIsThere && ::lstat(fPath.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_size > 0;
    if (!isPart || status.st_mtim.tv_nsec != 0) return;
    fNote = ReadNote(fPath);
    if (fNote.empty()) return;
    fStart = static_cast<std::uint64_t>(status.st_size);
    fTimeOfPart = status.st_mtim.tv_sec;
  }

  CURLcode Fetch() {
    fState.fMoved = fStart;
    fConnection.Set(CURLOPT_RESUME_FROM_LARGE, static_cast<curl_off_t>(fStart));
    return fConnection.Perform(fUrl);
  }

  // Whether the part is the beginning of the remote file, whose current size is given.
  bool IsPartOf(std::int64_t remoteSize) const {
    return fConnection.RemoteTime() == fTimeOfPart && fNote == NoteFor(fShownUrl, remoteSize);
  }

  // Whether the part must be replaced: it belongs to another file, or the server cannot start in the middle.
  bool IsStartedAnew(CURLcode code) {
    if (code == CURLE_OK)
      return !IsPartOf(static_cast<std::int64_t>(fStart));  // no bytes arrived: complete, if it is the same file
    return fIsOther || code == CURLE_BAD_DOWNLOAD_RESUME || code == CURLE_FTP_COULDNT_USE_REST || code == CURLE_RANGE_ERROR;
  }

  // Opens the part when the first bytes have arrived. Returns false, with fError or fIsOther set, if nothing may be written.
  bool Open() {
    std::int64_t const toCome = fConnection.BytesToCome();
    std::int64_t const size = toCome < 0 ? -1 : toCome + static_cast<std::int64_t>(fStart);
    fIsOther = fStart > 0 && !IsPartOf(size);
    return !fIsOther && OpenPart(size);
  }

  // Opens the part of a remote file of that size (-1: unknown). Returns false with fError set after a failure.
  bool OpenPart(std::int64_t size) {
    int const how = fStart > 0 ? O_APPEND : fIsThere ? O_CREAT | O_TRUNC : O_CREAT | O_EXCL;
    fFile = TUniqueFd(::open(fPath.c_str(), O_WRONLY | O_NOFOLLOW | O_CLOEXEC | how, kModeOfPart));
    if (!fFile) fError = errno;
    if (!fFile) return false;
    struct stat opened {};
    ::fstat(fFile.get(), &opened);
    fState.fDevice = opened.st_dev;
    fState.fInode = opened.st_ino;
    ::fchmod(fFile.get(), kModeOfPart);  // an earlier part may have another mode; fails on a file system without modes
    if (fStart == 0) WriteNote(fPath, NoteFor(fShownUrl, size));
    fState.fRemoteTime = fConnection.RemoteTime();  // only now is it the time of what the part holds
    return true;
  }

  // Some file systems report a failed write only now. Those without fsync return EINVAL.
  void Flush() {
    fState.fIsFinishing = true;
    if (::fsync(fFile.get()) != 0 && errno != EINVAL) fError = errno;
    fState.fIsFinishing = false;
  }

  // libcurl's write callback. Any result other than the number of bytes ends the transfer.
  static std::size_t Write(char const* bytes, std::size_t size, std::size_t count, void* context) {
    TDownload& self = *static_cast<TDownload*>(context);
    std::size_t const length = size * count;
    if (!self.fFile && !self.Open()) return length + 1;
    if (self.fMostBytes > 0 && self.fState.fMoved + length > self.fMostBytes) {
      self.fState.fIsTooLarge = true;
      return length + 1;
    }
    if (!WriteWhole(self.fFile.get(), {bytes, length})) {
      self.fError = errno;
      return length + 1;
    }
    self.fState.fMoved += length;
    return length;
  }

  [[noreturn]] void FailFor(CURLcode code) {
    if (fError == EEXIST) throw TZEPException(kZEPStatusAlreadyExists);
    if (fError != 0) throw TZEPFailure(kZEPStatusFileSystemError, std::strerror(fError));
    TConnection::FailFor(code, fConnection.ErrorText());
  }

  TConnection fConnection;
  std::string const fUrl, fShownUrl;
  std::string const fPath;
  std::uint64_t const fMostBytes;
  TTransferState& fState;
  TUniqueFd fFile;
  bool const fIsThere;            // whether the part may exist
  std::uint64_t fStart = 0;       // the size of the part that is resumed
  std::int64_t fTimeOfPart = -1;  // its modification time
  std::string fNote;              // its note
  bool fIsOther = false;          // the part does not belong to the remote file
  int fError = 0;                 // errno of opening or writing the part
};

}  // namespace

TZEPStatusCode Download(TRemote const& remote, std::string const& part, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state) {
  TDownload(remote, part, isThere, mostBytes, state).Run();
  return kZEPStatusOK;
}

void MarkForResuming(std::string const& part, TTransferState const& state) {
  if (state.fRemoteTime < 0) return;
  timespec const times[] = {{0, UTIME_OMIT}, {static_cast<time_t>(state.fRemoteTime), 0}};
  ::utimensat(AT_FDCWD, part.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

}  // namespace NQRVZEP20::zep
