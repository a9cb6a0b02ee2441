#include "FileTransfer.h"

#include "Curl.h"
#include "Descriptor.h"
#include "ILogger.h"
#include "TRootObject.h"
#include "TZEPException.h"
#include "UrlCoding.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <random>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

[[noreturn]] void Fail(EZEPStatusCode status, std::string const& reason) {
  if (ILogger* const logger = TRootObject::GetCoreLogger()) logger->OutputLogEntry(ILogger::kLogError, reason);
  throw TZEPException(status);
}

// ---- libcurl ----

using TCommands = std::vector<std::string>;

// libcurl, and one connection that goes on from one transfer to the next.
class TConnection {
public:
  TConnection() {
    std::string failure;
    if (!Load(fCurl, failure))
      Fail(kZEPStatusLibCurlFailure,
           (fCurl.fLibrary ? "Error loading curl library: " : "Error opening curl library: ") + failure);
    if (fCurl.fGlobalInit(CURL_GLOBAL_ALL) == CURLE_OK) fHandle = fCurl.fInit();
    if (fHandle == nullptr) Fail(kZEPStatusLibCurlFailure, "Error initalizing curl");
    Set(CURLOPT_ERRORBUFFER, fError.data());
    Set(CURLOPT_FTP_USE_EPSV, 0L);
    Set(CURLOPT_PROXY, "");
  }
  ~TConnection() {
    fCurl.fCleanup(fHandle);
    for (curl_slist* const list : fLists) fCurl.fFreeAll(list);
    fCurl.fGlobalCleanup();
  }
  TConnection(TConnection const&) = delete;
  TConnection& operator=(TConnection const&) = delete;

  template <class TValue>
  void Set(CURLoption option, TValue value) {
    fCurl.fSetOption(fHandle, option, value);
  }

  // What the server is to do after the next transfers.
  void SetCommandsAfter(TCommands const& commands) {
    curl_slist* list = nullptr;
    for (std::string const& command : commands) list = fCurl.fAppend(list, command.c_str());
    fLists.push_back(list);
    Set(CURLOPT_POSTQUOTE, list);
  }

  CURLcode Perform(std::string const& url) {
    fError[0] = '\0';
    Set(CURLOPT_URL, url.c_str());
    return fCurl.fPerform(fHandle);
  }

  // When the remote file of this transfer was changed last; -1 when the server does not tell.
  std::int64_t RemoteTime() const {
    curl_off_t time = -1;
    return fCurl.fGetInfo(fHandle, CURLINFO_FILETIME_T, &time) == CURLE_OK ? time : -1;
  }

  std::string ErrorText() const { return fError.data(); }

  [[noreturn]] static void FailFor(CURLcode code, std::string const& errorText) {
    if (code == CURLE_COULDNT_RESOLVE_HOST || code == CURLE_COULDNT_CONNECT)
      Fail(kZEPStatusConnectionFailed, "Error connecting to Server");
    Fail(kZEPStatusAccessDenied, "Error performing command: " + errorText);
  }

private:
  TCurl fCurl;
  CURL* fHandle = nullptr;
  std::vector<curl_slist*> fLists;
  std::array<char, CURL_ERROR_SIZE> fError{};
};

// ---- Uploads ----

struct TSource {
  TDescriptor fFile;
  TTransferState& fState;
};

// libcurl's read callback.
std::size_t ReadSource(char* bytes, std::size_t size, std::size_t count, void* context) {
  TSource& source = *static_cast<TSource*>(context);
  ssize_t got = -1;
  while ((got = ::read(source.fFile.Get(), bytes, size * count)) < 0 && errno == EINTR) continue;
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

// A place on the server, and the names beside it, as the server's commands have them.
class TNames {
public:
  explicit TNames(TRemote const& place) : fPlace(place), fName(Decoded(NameIn(place.fPath))), fDirectory(place) {
    fDirectory.fPath = DirectoryOf(place.fPath);
  }

  std::string const& Name() const { return fName; }
  std::string Url() const { return UrlOf(fPlace); }
  std::string DirectoryUrl() const { return UrlOf(fDirectory); }
  std::string UrlOfOther(std::string const& name) const {
    TRemote other = fPlace;
    other.fPath = fDirectory.fPath + EncodedName(name);
    return UrlOf(other);
  }

  TCommands Renaming(std::string const& from, std::string const& to) const {
    if (IsSftp()) return {"rename " + SftpPath(from) + " " + SftpPath(to)};
    return {"RNFR " + from, "RNTO " + to};
  }
  TCommands Removal(std::string const& name) const { return {IsSftp() ? "rm " + SftpPath(name) : "DELE " + name}; }

private:
  bool IsSftp() const { return fPlace.fScheme == "sftp"; }
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
  TUpload(TRemote const& place, std::string const& file, int cleanUpSeconds, TTransferState& state)
      : fNames(place), fFile(file), fCleanUpSeconds(cleanUpSeconds), fState(state) {
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 1L);
  }

  void Run() {
    if (HasControlCharacter(fNames.Name())) return SendToThePlace();  // which libcurl refuses
    std::string const temporary = TemporaryNameFor(fNames.Name());
    CURLcode const code = Send(fNames.UrlOfOther(temporary), fNames.Renaming(temporary, fNames.Name()));
    if (code == CURLE_OK) return;
    if (code == CURLE_QUOTE_ERROR) return RenameOrSendAnew(temporary);
    bool const isNameRefused = fState.fMoved == 0 && fState.fReadError == 0 && IsRefusal(code);
    if (isNameRefused) return SendToThePlace();
    GiveUp(code, temporary);
  }

private:
  static bool IsRefusal(CURLcode code) {
    return code == CURLE_UPLOAD_FAILED || code == CURLE_REMOTE_ACCESS_DENIED || code == CURLE_REMOTE_FILE_EXISTS ||
           code == CURLE_REMOTE_FILE_NOT_FOUND || code == CURLE_SSH;
  }

  CURLcode Send(std::string const& url, TCommands const& commandsAfter) {
    TSource source{TDescriptor(::open(fFile.c_str(), O_RDONLY | O_CLOEXEC)), fState};
    if (!source.fFile) {
      fState.fReadError = errno;
      return CURLE_READ_ERROR;
    }
    fConnection.Set(CURLOPT_NOBODY, 0L);
    fConnection.Set(CURLOPT_UPLOAD, 1L);
    fConnection.Set(CURLOPT_TIMEOUT, 0L);
    fConnection.Set(CURLOPT_READFUNCTION, &ReadSource);
    fConnection.Set(CURLOPT_READDATA, &source);
    fConnection.SetCommandsAfter(commandsAfter);
    return fConnection.Perform(url);
  }

  bool Command(TCommands const& commands) {
    fConnection.Set(CURLOPT_UPLOAD, 0L);
    fConnection.Set(CURLOPT_NOBODY, 1L);
    fConnection.Set(CURLOPT_TIMEOUT, static_cast<long>(fCleanUpSeconds));
    fConnection.SetCommandsAfter(commands);
    return fConnection.Perform(fNames.DirectoryUrl()) == CURLE_OK;
  }

  // The file has arrived, but did not get its name. Some servers do not rename onto another file: that is moved out of the way.
  void RenameOrSendAnew(std::string const& temporary) {
    std::string const& name = fNames.Name();
    std::string const old = TemporaryNameFor(name);
    if (Command(fNames.Renaming(name, old))) {
      if (Command(fNames.Renaming(temporary, name))) {
        Command(fNames.Removal(old));
        return;
      }
      Command(fNames.Renaming(old, name));
    }
    Command(fNames.Removal(temporary));
    fState.fMoved = 0;
    SendToThePlace();
  }

  void SendToThePlace() {
    CURLcode const code = Send(fNames.Url(), {});
    if (code != CURLE_OK) GiveUp(code, fState.fMoved > 0 ? fNames.Name() : "");
  }

  // Removes what may have arrived under that name, if any, and fails.
  [[noreturn]] void GiveUp(CURLcode code, std::string const& name) {
    std::string const reason = fConnection.ErrorText();
    bool const wasReached = code != CURLE_COULDNT_RESOLVE_HOST && code != CURLE_COULDNT_CONNECT && code != CURLE_LOGIN_DENIED;
    if (wasReached) fState.fIsRemoved = name.empty() || Command(fNames.Removal(name));
    TConnection::FailFor(code, reason);
  }

  TConnection fConnection;
  TNames const fNames;
  std::string const fFile;
  int const fCleanUpSeconds;
  TTransferState& fState;
};

// ---- Downloads ----

class TDownload {
public:
  TDownload(std::string const& file, bool isThere, std::uint64_t mostBytes, TTransferState& state)
      : fPath(file), fMostBytes(mostBytes), fState(state), fIsThere(isThere) {
    fConnection.Set(CURLOPT_WRITEFUNCTION, &Write);
    fConnection.Set(CURLOPT_WRITEDATA, this);
    fConnection.Set(CURLOPT_FILETIME, 1L);
  }

  void Run(std::string const& url) {
    struct stat status {};
    bool const isMarked = fIsThere && ::lstat(fPath.c_str(), &status) == 0 && S_ISREG(status.st_mode) && status.st_size > 0 &&
                          status.st_mtim.tv_nsec == 0;
    if (isMarked) {
      fStart = static_cast<std::uint64_t>(status.st_size);
      fTimeOfPart = status.st_mtim.tv_sec;
    }
    CURLcode code = Fetch(url);
    if (fStart > 0 && IsStartedAnew(code)) {
      fStart = 0;
      fIsOther = false;
      code = Fetch(url);
    }
    if (code == CURLE_OK && !fFile) Open();  // of an empty remote file no byte comes
    if (code != CURLE_OK || fError != 0) FailFor(code);
  }

private:
  CURLcode Fetch(std::string const& url) {
    fState.fMoved = fStart;
    fConnection.Set(CURLOPT_RESUME_FROM_LARGE, static_cast<curl_off_t>(fStart));
    return fConnection.Perform(url);
  }

  // Whether what is there cannot be a beginning: the remote file is another one by now, or the server cannot start in the middle.
  bool IsStartedAnew(CURLcode code) {
    bool const isWhole = code == CURLE_OK && !fFile;  // nothing was missing, if it is the same file
    if (isWhole) return fConnection.RemoteTime() != fTimeOfPart;
    return fIsOther || code == CURLE_BAD_DOWNLOAD_RESUME || code == CURLE_FTP_COULDNT_USE_REST || code == CURLE_RANGE_ERROR;
  }

  // False, with fError or fIsOther, when nothing may be written.
  bool Open() {
    fState.fRemoteTime = fConnection.RemoteTime();
    fIsOther = fStart > 0 && fState.fRemoteTime != fTimeOfPart;
    if (fIsOther) return false;
    int const how = fStart > 0 ? O_APPEND : fIsThere ? O_CREAT | O_TRUNC : O_CREAT | O_EXCL;
    fFile = TDescriptor(::open(fPath.c_str(), O_WRONLY | O_NOFOLLOW | O_CLOEXEC | how, 0666));
    if (!fFile) fError = errno;
    return static_cast<bool>(fFile);
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
    if (!WriteWhole(self.fFile.Get(), {bytes, length})) {
      self.fError = errno;
      return length + 1;
    }
    self.fState.fMoved += length;
    return length;
  }

  [[noreturn]] void FailFor(CURLcode code) {
    if (fError == EEXIST) throw TZEPException(kZEPStatusAlreadyExists);
    if (fError != 0) Fail(kZEPStatusFileSystemError, std::strerror(fError));
    TConnection::FailFor(code, fConnection.ErrorText());
  }

  TConnection fConnection;
  std::string const fPath;
  std::uint64_t const fMostBytes;
  TTransferState& fState;
  TDescriptor fFile;
  bool const fIsThere;            // whether a file of that name was there before
  std::uint64_t fStart = 0;       // what is there of it
  std::int64_t fTimeOfPart = -1;  // the time of that
  bool fIsOther = false;          // the remote file is not the one that it came from
  int fError = 0;                 // errno of writing
};

}  // namespace

TZEPStatusCode Upload(TRemote const& place, std::string const& file, int cleanUpSeconds, TTransferState& state) {
  TUpload(place, file, cleanUpSeconds, state).Run();
  return kZEPStatusOK;
}

TZEPStatusCode Download(TRemote const& remote, std::string const& file, bool isThere, std::uint64_t mostBytes,
                        TTransferState& state) {
  TDownload(file, isThere, mostBytes, state).Run(UrlOf(remote));
  return kZEPStatusOK;
}

void MarkForResuming(std::string const& part, TTransferState const& state) {
  if (state.fRemoteTime < 0) return;
  timespec const times[] = {{0, UTIME_OMIT}, {static_cast<time_t>(state.fRemoteTime), 0}};
  ::utimensat(AT_FDCWD, part.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

}  // namespace NQRVZEP20::zep
