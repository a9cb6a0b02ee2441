// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/FileTransfer.h"

#include "TZEPFailure.h"
#include "core/Handles.h"
#include "loaders/CurlLibrary.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/transfer/PartNote.h"
#include "tools/zep/transfer/UrlCoding.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <random>
#include <sstream>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

// ---- libcurl ----

using TCommands = std::vector<std::string>;
using TClock = std::chrono::steady_clock;

// The functions of libcurl that a connection uses.
struct TConnectionFunctions : TCurlFunctions {
  decltype(curl_easy_getinfo)* fGetInfo = nullptr;
  decltype(curl_slist_append)* fAppend = nullptr;
  decltype(curl_slist_free_all)* fFreeAll = nullptr;

  std::vector<TLibraryFunction> Table() {
    std::vector<TLibraryFunction> table = TCurlFunctions::Table();
    table.insert(table.end(),
                 {{"curl_easy_getinfo", fGetInfo}, {"curl_slist_append", fAppend}, {"curl_slist_free_all", fFreeAll}});
    return table;
  }
};

// libcurl, and one connection that successive transfers share.
class TConnection {
public:
  TConnection() {
    TLoadOutcome const& outcome = fCurl.Outcome();
    if (!outcome) {
      bool const isLoaded = outcome.fKind != TLoadOutcome::kNotLoaded;
      throw TZEPFailure(kZEPStatusLibCurlFailure,
                        (isLoaded ? "Error loading curl library: " : "Error opening curl library: ") + outcome.fReason);
    }
    if (fCurl->fGlobalInit(CURL_GLOBAL_ALL) == CURLE_OK) fHandle = fCurl->fInit();
    if (fHandle == nullptr) throw TZEPFailure(kZEPStatusLibCurlFailure, "Error initalizing curl");
    Set(CURLOPT_ERRORBUFFER, fError.data());
    Set(CURLOPT_FTP_USE_EPSV, 0L);
    Set(CURLOPT_PROXY, "");
  }
  ~TConnection() {
    fCurl->fCleanup(fHandle);
    for (curl_slist* const list : fLists) fCurl->fFreeAll(list);
    fCurl->fGlobalCleanup();
  }
  TConnection(TConnection const&) = delete;
  TConnection& operator=(TConnection const&) = delete;

  template <class TValue>
  void Set(CURLoption option, TValue value) {
    fCurl->fSetOption(fHandle, option, value);
  }

  // What the server is to do after the next transfers.
  void SetCommandsAfter(TCommands const& commands) {
    curl_slist* list = nullptr;
    for (std::string const& command : commands) list = fCurl->fAppend(list, command.c_str());
    fLists.push_back(list);
    Set(CURLOPT_POSTQUOTE, list);
  }

  CURLcode Perform(std::string const& url) {
    fError[0] = '\0';
    Set(CURLOPT_URL, url.c_str());
    return fCurl->fPerform(fHandle);
  }

  // When the remote file of this transfer was changed last; -1 when the server does not tell.
  std::int64_t RemoteTime() const {
    curl_off_t time = -1;
    return fCurl->fGetInfo(fHandle, CURLINFO_FILETIME_T, &time) == CURLE_OK ? time : -1;
  }

  // How many bytes this transfer will bring, -1 when the server does not report it. 0 also when it brings none.
  std::int64_t BytesToCome() const {
    curl_off_t bytes = -1;
    return fCurl->fGetInfo(fHandle, CURLINFO_CONTENT_LENGTH_DOWNLOAD_T, &bytes) == CURLE_OK ? bytes : -1;
  }

  std::string ErrorText() const { return fError.data(); }

  [[noreturn]] static void FailFor(CURLcode code, std::string const& errorText) {
    if (code == CURLE_COULDNT_RESOLVE_HOST || code == CURLE_COULDNT_CONNECT)
      throw TZEPFailure(kZEPStatusConnectionFailed, "Error connecting to Server");
    throw TZEPFailure(kZEPStatusAccessDenied, "Error performing command: " + errorText);
  }

private:
  TLoadedLibrary<TConnectionFunctions> const fCurl;
  CURL* fHandle = nullptr;
  std::vector<curl_slist*> fLists;
  std::array<char, CURL_ERROR_SIZE> fError{};
};

// ---- Uploads ----

struct TSource {
  TUniqueFd fFile;
  TTransferState& fState;
  unsigned fMark;  // of fState.fLeft
};

// libcurl's callback before a transfer whose connection is there. A libcurl before 7.80 has none; ReadSource has to do.
int MarkBegun(void* context, char*, char*, int, int) {
  TSource& source = *static_cast<TSource*>(context);
  source.fState.fLeft |= source.fMark;
  return CURL_PREREQFUNC_OK;
}

// libcurl's read callback.
std::size_t ReadSource(char* bytes, std::size_t size, std::size_t count, void* context) {
  TSource& source = *static_cast<TSource*>(context);
  source.fState.fLeft |= source.fMark;
  ssize_t got = -1;
  while ((got = ::read(source.fFile.get(), bytes, size * count)) < 0 && errno == EINTR) continue;
  if (got < 0) {
    source.fState.fReadError = errno;
    return CURL_READFUNC_ABORT;
  }
  source.fState.fMoved += static_cast<std::uint64_t>(got);
  return static_cast<std::size_t>(got);
}

std::string DirectoryOf(std::string const& path) { return path.substr(0, path.rfind('/') + 1); }
std::string NameIn(std::string const& path) { return path.substr(path.rfind('/') + 1); }

bool HasControlCharacter(std::string const& text) {
  for (unsigned char const c : text)
    if (c < 0x20 || c == 0x7f) return true;
  return false;
}

// A name that no other transfer has.
std::string TemporaryNameFor(std::string const& name) {
  constexpr std::size_t kLongest = 200;  // names of 255 bytes are common, and the rest needs some
  char number[16];
  std::snprintf(number, sizeof number, ".%08x", static_cast<unsigned>(std::random_device()()));
  return name.substr(0, kLongest) + number + ".part";
}

std::string QuotedForSftp(std::string const& path) {
  std::string quoted = "\"";
  for (char const c : path) {
    if (c == '"' || c == '\\' || c == '\'') quoted += '\\';
    quoted += c;
  }
  return quoted + "\"";
}

// The mode of the file in a listing such as "-rw-r-----    1 u  g  4 Nov 22 04:00 name", which most SFTP servers send; -1 when
// the listing does not have it, or when it is not a regular file.
int ModeInListing(std::string const& listing, std::string const& name) {
  constexpr int kFieldsBeforeName = 8;
  std::istringstream lines(listing);
  for (std::string line; std::getline(lines, line);) {
    std::size_t at = 0;
    for (int n = 0; n < kFieldsBeforeName && at != line.npos; ++n) at = line.find(' ', line.find_first_not_of(' ', at));
    if (at == line.npos || line.substr(at + 1) != name || line.size() < 10 || line[0] != '-') continue;
    int mode = 0;
    for (char const c : line.substr(1, 9)) mode = mode * 2 + (std::strchr("rwxst", c) != nullptr ? 1 : 0);
    return mode;
  }
  return -1;
}

// libcurl's write callback for a text; one of more than 16 MiB is given up.
std::size_t AppendText(char const* bytes, std::size_t size, std::size_t count, void* context) {
  constexpr std::size_t kMostBytes = 16 << 20;
  std::string& text = *static_cast<std::string*>(context);
  std::size_t const length = size * count;
  if (text.size() + length > kMostBytes) return length + 1;
  text.append(bytes, length);
  return length;
}

// libcurl's write callback for a transfer that ends with the first bytes that arrive.
std::size_t EndTransfer(char const*, std::size_t size, std::size_t count, void*) { return size * count + 1; }

// A place on the server, and the names beside it, as the server's commands have them.
class TNames {
public:
  explicit TNames(TRemote const& place) : fPlace(place), fName(Decoded(NameIn(place.fPath))), fDirectory(place) {
    fDirectory.fPath = DirectoryOf(place.fPath);
  }

  std::string const& Name() const { return fName; }
  std::string Url() const { return UrlOf(fPlace); }
  std::string UrlAsDirectory() const { return Url() + "/"; }
  std::string DirectoryUrl() const { return UrlOf(fDirectory); }
  std::string UrlOfOther(std::string const& name) const { return UrlOf(Beside(fPlace, name)); }

  TCommands Renaming(std::string const& from, std::string const& to) const {
    if (IsSftp()) return {"rename " + SftpPath(from) + " " + SftpPath(to)};
    return {"RNFR " + from, "RNTO " + to};
  }
  TCommands Removal(std::string const& name) const { return {IsSftp() ? "rm " + SftpPath(name) : "DELE " + name}; }
  // Of SFTP only. A refusal does not count.
  std::string ChangeOfMode(std::string const& name, int mode) const {
    char octal[16];
    std::snprintf(octal, sizeof octal, "%03o", static_cast<unsigned>(mode));
    return "*chmod " + std::string(octal) + " " + SftpPath(name);
  }
  bool IsSftp() const { return fPlace.fScheme == "sftp"; }

private:
  // FTP commands are about the directory that libcurl has changed to; SFTP's need the path.
  std::string SftpPath(std::string const& name) const {
    std::string const path = "/" + Decoded(fDirectory.fPath) + name;
    return QuotedForSftp(path.rfind("/~/", 0) == 0 ? path.substr(3) : path);
  }

  TRemote fPlace;
  std::string fName;
  TRemote fDirectory;
};

class TUpload {
public:
  TUpload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds, TTransferState& state)
      : fNames(place), fOthers(names), fFile(file), fCleanUpSeconds(cleanUpSeconds), fState(state) {
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 1L);
  }

  void Run() {
    if (HasControlCharacter(fNames.Name())) return SendToThePlace();  // which libcurl refuses
    std::string const& temporary = fOthers.fTemporary;
    CURLcode const code = Send(fNames.UrlOfOther(temporary), fNames.Renaming(temporary, fNames.Name()), kLeftTemporary);
    if (code == CURLE_OK) return SetLeft(kLeftTemporary, false);
    if (code == CURLE_QUOTE_ERROR) return RenameOrSendAnew();
    if (!IsNothingWritten(code)) GiveUp(code, fConnection.ErrorText());
    SetLeft(kLeftTemporary, false);
    SendToThePlace();
  }

  // A file at the place is spared when no byte of this upload has been sent to it: it may be the former one. An upload that
  // ended between its two renamings left nothing at the place: the former file gets its name again.
  void RemoveParts() {
    fCleanUpEnd = TClock::now() + std::chrono::seconds(fCleanUpSeconds);
    bool const isNotComplete = fState.fLeft & (kLeftTemporary | kLeftAtPlace);
    if ((fState.fLeft & kLeftAtPlace) && fState.fMoved > 0) Remove(fNames.Name(), kLeftAtPlace);
    if ((fState.fLeft & kLeftFormer) && isNotComplete) RestoreFormer();
    if (fState.fLeft & kLeftTemporary) Remove(fOthers.fTemporary, kLeftTemporary);
  }

private:
  static bool IsRefusal(CURLcode code) {
    return code == CURLE_UPLOAD_FAILED || code == CURLE_REMOTE_ACCESS_DENIED || code == CURLE_REMOTE_FILE_EXISTS ||
           code == CURLE_REMOTE_FILE_NOT_FOUND || code == CURLE_SSH;
  }

  bool IsNothingWritten(CURLcode code) const { return fState.fMoved == 0 && fState.fReadError == 0 && IsRefusal(code); }

  void SetLeft(ELeft what, bool isLeft) {
    if (isLeft)
      fState.fLeft |= what;
    else
      fState.fLeft &= ~static_cast<unsigned>(what);
  }

  // Once the server may have begun to write, `mark` is left there.
  CURLcode Send(std::string const& url, TCommands const& commandsAfter, ELeft mark) {
    TSource source{TUniqueFd(::open(fFile.c_str(), O_RDONLY | O_CLOEXEC)), fState, mark};
    if (!source.fFile) {
      fState.fReadError = errno;
      return CURLE_READ_ERROR;
    }
    fConnection.Set(CURLOPT_NOBODY, 0L);
    fConnection.Set(CURLOPT_UPLOAD, 1L);
    fConnection.Set(CURLOPT_TIMEOUT, 0L);
    fConnection.Set(CURLOPT_SERVER_RESPONSE_TIMEOUT, 0L);
    fConnection.Set(CURLOPT_READFUNCTION, &ReadSource);
    fConnection.Set(CURLOPT_READDATA, &source);
    fConnection.Set(CURLOPT_PREREQFUNCTION, &MarkBegun);
    fConnection.Set(CURLOPT_PREREQDATA, &source);
    fConnection.SetCommandsAfter(commandsAfter);
    return fConnection.Perform(url);
  }

  // The whole seconds that a command may take.
  long SecondsLeft() const {
    std::chrono::seconds const most(fCleanUpSeconds);
    return std::chrono::ceil<std::chrono::seconds>(std::min<TClock::duration>(most, fCleanUpEnd - TClock::now())).count();
  }

  // Sets the connection up for a short transfer that is no upload. A server that is silent gets half of the time for the command,
  // and the other half for QUIT, which libcurl then sends and waits for.
  void Prepare(bool hasBody, TCommands const& commandsAfter) {
    fConnection.Set(CURLOPT_UPLOAD, 0L);
    fConnection.Set(CURLOPT_NOBODY, hasBody ? 0L : 1L);
    fConnection.Set(CURLOPT_TIMEOUT, SecondsLeft());
    fConnection.Set(CURLOPT_SERVER_RESPONSE_TIMEOUT, std::max(1L, SecondsLeft() / 2));
    fConnection.Set(CURLOPT_PREREQFUNCTION, static_cast<curl_prereq_callback>(nullptr));
    fConnection.SetCommandsAfter(commandsAfter);
  }

  CURLcode Command(TCommands const& commands) {
    if (SecondsLeft() < 1) return CURLE_OPERATION_TIMEDOUT;
    Prepare(false, commands);
    return fConnection.Perform(fNames.DirectoryUrl());
  }

  // Whether the server can change into the place (FTP), or open it as a directory (SFTP).
  bool IsDirectory() {
    Prepare(fNames.IsSftp(), {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &EndTransfer);
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 0L);
    CURLcode const code = fConnection.Perform(fNames.UrlAsDirectory());
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 1L);
    return code == CURLE_OK || code == CURLE_WRITE_ERROR;
  }

  [[noreturn]] void FailForDirectory() {
    RemoveParts();
    throw TZEPFailure(kZEPStatusAccessDenied, fNames.Name() + " is a directory; end the URL with \"/\"");
  }

  // The mode of the regular file at the place; -1 when the server does not report it. FTP servers do not.
  int ModeOfPlace() {
    if (!fNames.IsSftp()) return -1;
    std::string listing;
    Prepare(true, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &AppendText);
    fConnection.Set(CURLOPT_WRITEDATA, &listing);
    return fConnection.Perform(fNames.DirectoryUrl()) == CURLE_OK ? ModeInListing(listing, fNames.Name()) : -1;
  }

  void Remove(std::string const& name, ELeft what) {
    if (Command(fNames.Removal(name)) == CURLE_OK) SetLeft(what, false);
  }

  void RestoreFormer() {
    if (Command(fNames.Renaming(fOthers.fFormer, fNames.Name())) == CURLE_OK) SetLeft(kLeftFormer, false);
  }

  // The file has arrived, but did not get its name. Some servers do not rename onto another file: that is moved out of the way.
  void RenameOrSendAnew() {
    if (IsDirectory()) FailForDirectory();
    std::string const &name = fNames.Name(), &temporary = fOthers.fTemporary, &former = fOthers.fFormer;
    int const mode = ModeOfPlace();
    SetLeft(kLeftFormer, true);
    CURLcode const moved = Command(fNames.Renaming(name, former));
    if (moved == CURLE_QUOTE_ERROR) SetLeft(kLeftFormer, false);  // refused
    if (moved == CURLE_OK) {
      TCommands commands = fNames.Renaming(temporary, name);
      if (mode >= 0) commands.insert(commands.begin(), fNames.ChangeOfMode(temporary, mode));
      if (Command(commands) == CURLE_OK) {
        SetLeft(kLeftTemporary, false);
        return Remove(former, kLeftFormer);
      }
      RestoreFormer();
    }
    Remove(temporary, kLeftTemporary);
    fState.fMoved = 0;
    SendToThePlace();
  }

  void SendToThePlace() {
    CURLcode const code = Send(fNames.Url(), {}, kLeftAtPlace);
    bool const isRefused = IsNothingWritten(code);
    if (code == CURLE_OK || isRefused) SetLeft(kLeftAtPlace, false);
    std::string const reason = fConnection.ErrorText();
    if (isRefused && IsDirectory()) FailForDirectory();
    if (code != CURLE_OK) GiveUp(code, reason);
    if (fState.fLeft & kLeftFormer) Remove(fOthers.fFormer, kLeftFormer);
  }

  // Removes what may have arrived, and fails.
  [[noreturn]] void GiveUp(CURLcode code, std::string const& reason) {
    RemoveParts();
    TConnection::FailFor(code, reason);
  }

  TConnection fConnection;
  TNames const fNames;
  TUploadNames const fOthers;
  std::string const fFile;
  int const fCleanUpSeconds;
  TClock::time_point fCleanUpEnd = TClock::time_point::max();  // no command begins after it
  TTransferState& fState;
};

// ---- Downloads ----

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
    if (code == CURLE_OK && !fFile) Open();  // of an empty remote file no byte comes
    if (code != CURLE_OK || fError != 0) FailFor(code);
  }

private:
  // A part is continued when its time is in whole seconds (MarkForResuming) and it has a note.
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

  // Whether the part is the beginning of the remote file, which has that size now.
  bool IsPartOf(std::int64_t remoteSize) const {
    return fConnection.RemoteTime() == fTimeOfPart && fNote == NoteFor(fShownUrl, remoteSize);
  }

  // Whether the part must be replaced: it is of another file, or the server cannot start in the middle.
  bool IsStartedAnew(CURLcode code) {
    if (code == CURLE_OK) return !IsPartOf(static_cast<std::int64_t>(fStart));  // nothing was missing, if it is the same file
    return fIsOther || code == CURLE_BAD_DOWNLOAD_RESUME || code == CURLE_FTP_COULDNT_USE_REST || code == CURLE_RANGE_ERROR;
  }

  // Opens the part when the first bytes have arrived. False, with fError or fIsOther, when nothing may be written.
  bool Open() {
    std::int64_t const toCome = fConnection.BytesToCome();
    std::int64_t const size = toCome < 0 ? -1 : toCome + static_cast<std::int64_t>(fStart);
    fIsOther = fStart > 0 && !IsPartOf(size);
    if (fIsOther) return false;
    int const how = fStart > 0 ? O_APPEND : fIsThere ? O_CREAT | O_TRUNC : O_CREAT | O_EXCL;
    fFile = TUniqueFd(::open(fPath.c_str(), O_WRONLY | O_NOFOLLOW | O_CLOEXEC | how, kModeOfPart));
    if (!fFile) fError = errno;
    if (!fFile) return false;
    ::fchmod(fFile.get(), kModeOfPart);  // of an earlier part; a file system without modes refuses it
    if (fStart == 0) WriteNote(fPath, NoteFor(fShownUrl, size));
    fState.fRemoteTime = fConnection.RemoteTime();  // only now is it the time of what the part holds
    return true;
  }

  // libcurl's write callback. Another result than the number of bytes ends the transfer.
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
  bool const fIsThere;            // whether a file of that name was there before
  std::uint64_t fStart = 0;       // what is there of it
  std::int64_t fTimeOfPart = -1;  // the time of that
  std::string fNote;              // the note of that
  bool fIsOther = false;          // the remote file is not the one that it came from
  int fError = 0;                 // errno of writing
};

}  // namespace

TUploadNames NamesForUpload(TRemote const& place) {
  std::string const name = Decoded(NameIn(place.fPath));
  return {TemporaryNameFor(name), TemporaryNameFor(name)};
}

TRemote Beside(TRemote const& place, std::string const& name) {
  TRemote other = place;
  other.fPath = DirectoryOf(place.fPath) + EncodedName(name);
  return other;
}

TZEPStatusCode Upload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds,
                      TTransferState& state) {
  TUpload(place, names, file, cleanUpSeconds, state).Run();
  return kZEPStatusOK;
}

void RemoveParts(TRemote const& place, TUploadNames const& names, int cleanUpSeconds, TTransferState& state) {
  TUpload(place, names, "", cleanUpSeconds, state).RemoveParts();
}

TZEPStatusCode Download(TRemote const& remote, std::string const& file, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state) {
  TDownload(remote, file, isThere, mostBytes, state).Run();
  return kZEPStatusOK;
}

void MarkForResuming(std::string const& part, TTransferState const& state) {
  if (state.fRemoteTime < 0) return;
  timespec const times[] = {{0, UTIME_OMIT}, {static_cast<time_t>(state.fRemoteTime), 0}};
  ::utimensat(AT_FDCWD, part.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

}  // namespace NQRVZEP20::zep
