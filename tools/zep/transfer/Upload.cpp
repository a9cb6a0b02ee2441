// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Upload.h"

#include "TZEPFailure.h"
#include "core/Handles.h"
#include "tools/zep/transfer/Listing.h"
#include "tools/zep/transfer/TConnection.h"
#include "tools/zep/transfer/UrlCoding.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <random>

namespace NQRVZEP20::zep {

namespace {

using TClock = std::chrono::steady_clock;

struct TSource {
  TUniqueFd fFile;
  TTransferState& fState;
  unsigned fMark;         // of fState.fLeft
  EEarlierFile fEarlier;  // the value for fState.fEarlierFile once the server may have begun to write
};

// libcurl's callback before a transfer, after the connection is made. libcurl before 7.80 does not call it; then only ReadSource
// sets the mark.
int MarkBegun(void* context, char*, char*, int, int) {
  TSource& source = *static_cast<TSource*>(context);
  source.fState.fLeft |= source.fMark;
  return CURL_PREREQFUNC_OK;
}

// libcurl's read callback.
std::size_t ReadSource(char* bytes, std::size_t size, std::size_t count, void* context) {
  TSource& source = *static_cast<TSource*>(context);
  source.fState.fLeft |= source.fMark;
  source.fState.fEarlierFile = source.fEarlier;
  ssize_t got = -1;
  while ((got = ::read(source.fFile.get(), bytes, size * count)) < 0 && errno == EINTR) continue;
  if (got < 0) {
    source.fState.fReadError = errno;
    return CURL_READFUNC_ABORT;
  }
  if (got == 0 && source.fMark == kLeftTemporary) source.fState.fLeft |= kMayBeRenamed;
  source.fState.fMoved += static_cast<std::uint64_t>(got);
  return static_cast<std::size_t>(got);
}

std::string DirectoryOf(std::string const& path) { return path.substr(0, path.rfind('/') + 1); }
std::string LastPartOf(std::string const& path) { return path.substr(path.rfind('/') + 1); }

bool HasControlCharacter(std::string const& text) {
  for (unsigned char const c : text)
    if (c < 0x20 || c == 0x7f) return true;
  return false;
}

// A random name, which no other transfer uses.
std::string TemporaryNameFor(std::string const& name) {
  constexpr std::size_t kLongest = 200;  // many file systems allow 255 bytes, including the suffix
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

// libcurl's write callback that collects a text. The transfer fails if it exceeds 16 MiB.
std::size_t AppendText(char const* bytes, std::size_t size, std::size_t count, void* context) {
  constexpr std::size_t kMostBytes = 16 << 20;
  std::string& text = *static_cast<std::string*>(context);
  std::size_t const length = size * count;
  if (text.size() + length > kMostBytes) return length + 1;
  text.append(bytes, length);
  return length;
}

// libcurl's write callback that ends the transfer when the first bytes arrive.
std::size_t EndTransfer(char const*, std::size_t size, std::size_t count, void*) { return size * count + 1; }

// The place of an upload, and other names in its directory, in the form that the commands of the server need.
class TNames {
public:
  explicit TNames(TRemote const& place) : fPlace(place), fName(Decoded(LastPartOf(place.fPath))), fDirectory(place) {
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
  // For SFTP only. A refusal is ignored.
  std::string ChangeOfMode(std::string const& name, int mode) const {
    char octal[16];
    std::snprintf(octal, sizeof octal, "%03o", static_cast<unsigned>(mode));
    return "*chmod " + std::string(octal) + " " + SftpPath(name);
  }
  bool IsSftp() const { return fPlace.fScheme == "sftp"; }

private:
  // FTP commands apply to the directory into which libcurl has changed; SFTP commands need the path.
  std::string SftpPath(std::string const& name) const {
    std::string const path = "/" + Decoded(fDirectory.fPath) + name;
    return QuotedForSftp(path.rfind("/~/", 0) == 0 ? path.substr(3) : path);
  }

  TRemote fPlace;
  std::string fName;
  TRemote fDirectory;
};

// What exists at the place, according to the server.
struct TAtPlace {
  enum EKind { kUnknown, kFile, kDirectory, kOther };
  EKind fKind = kUnknown;
  int fMode = -1;                // of a file; -1 if the server does not report it
  CURLcode fFailure = CURLE_OK;  // not CURLE_OK if there was no answer, as after a lost connection; the kind is then unknown
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
    CURLcode const code =
        Send(fNames.UrlOfOther(temporary), fNames.Renaming(temporary, fNames.Name()), kLeftTemporary, EEarlierFile::kIsThere);
    if (code == CURLE_OK) return SetLeft(kLeftTemporary | kMayBeRenamed, false);
    if (code == CURLE_QUOTE_ERROR && IsRefusal(code)) return ReplaceOrSendAnew();
    if (!IsNothingWritten(code)) GiveUp(code, Reason(code));
    SetLeft(kLeftTemporary, false);
    SendToThePlace();
  }

  // A file at the place is not removed if no byte of this upload has been sent to it, because it may be the earlier file. If the
  // earlier file made way and the new file is not at the place, the earlier file gets its name back.
  void RemoveParts() {
    StartCleanUp();
    bool const isNotComplete = fState.fLeft & (kLeftTemporary | kLeftAtPlace | kLeftPlaceEmpty);
    if ((fState.fLeft & kLeftAtPlace) && fState.fMoved > 0) Remove(fNames.Name(), kLeftAtPlace);
    if ((fState.fLeft & kLeftFormer) && isNotComplete) RestoreFormer();
    if (fState.fLeft & kLeftTemporary) Remove(fOthers.fTemporary, kLeftTemporary | kMayBeRenamed);
  }

private:
  // Whether the server refused the transfer. libcurl returns the same codes for a lost SFTP connection, after which the server
  // may have executed a command without answering it.
  bool IsRefusal(CURLcode code) const {
    bool const isCode = code == CURLE_UPLOAD_FAILED || code == CURLE_REMOTE_ACCESS_DENIED || code == CURLE_REMOTE_FILE_EXISTS ||
                        code == CURLE_REMOTE_FILE_NOT_FOUND || code == CURLE_SSH || code == CURLE_QUOTE_ERROR;
    return isCode && !(fNames.IsSftp() && fConnection.IsLost());
  }

  bool IsNothingWritten(CURLcode code) const { return fState.fMoved == 0 && fState.fReadError == 0 && IsRefusal(code); }

  void SetLeft(unsigned what, bool isLeft) {
    if (isLeft)
      fState.fLeft |= what;
    else
      fState.fLeft &= ~what;
  }

  // Sets `mark` in fLeft as soon as the server may have created the file, and fEarlierFile to `earlier` as soon as it may have
  // written to it.
  CURLcode Send(std::string const& url, TCommands const& commandsAfter, ELeft mark, EEarlierFile earlier) {
    TSource source{TUniqueFd(::open(fFile.c_str(), O_RDONLY | O_CLOEXEC)), fState, mark, earlier};
    if (!source.fFile) {
      fState.fReadError = errno;
      return CURLE_READ_ERROR;
    }
    fConnection.Set(CURLOPT_NOBODY, 0L);
    fConnection.Set(CURLOPT_UPLOAD, 1L);
    fConnection.Set(CURLOPT_READFUNCTION, &ReadSource);
    fConnection.Set(CURLOPT_READDATA, &source);
    fConnection.Set(CURLOPT_PREREQFUNCTION, &MarkBegun);
    fConnection.Set(CURLOPT_PREREQDATA, &source);
    fConnection.SetCommandsAfter(commandsAfter);
    CURLcode const code = fConnection.Perform(url);
    if (code == CURLE_COULDNT_CONNECT) SetLeft(mark, false);  // without a data connection no file is created
    return code;
  }

  // ---- Commands ----

  // From now on all commands together may take fCleanUpSeconds.
  void StartCleanUp() {
    fIsCleanUp = true;
    fState.fIsFinishing = true;
    fCleanUpEnd = TClock::now() + std::chrono::seconds(fCleanUpSeconds);
  }

  // The time left for the clean-up in seconds, rounded up.
  long SecondsLeft() const { return std::chrono::ceil<std::chrono::seconds>(fCleanUpEnd - TClock::now()).count(); }

  // Prepares the connection for a short transfer that is not an upload. During the clean-up, half of the time left is for the
  // answer to the command, and the other half for the answer to QUIT, which libcurl sends afterwards.
  void Prepare(bool hasBody, TCommands const& commandsAfter) {
    fConnection.Set(CURLOPT_UPLOAD, 0L);
    fConnection.Set(CURLOPT_NOBODY, hasBody ? 0L : 1L);
    fConnection.Set(CURLOPT_PREREQFUNCTION, static_cast<curl_prereq_callback>(nullptr));
    fConnection.SetCommandsAfter(commandsAfter);
    if (!fIsCleanUp) return;
    fConnection.Set(CURLOPT_TIMEOUT, SecondsLeft());
    fConnection.Set(CURLOPT_SERVER_RESPONSE_TIMEOUT, std::max(1L, SecondsLeft() / 2));
  }

  CURLcode Command(TCommands const& commands) {
    if (fIsCleanUp && SecondsLeft() < 1) return CURLE_OPERATION_TIMEDOUT;
    Prepare(false, commands);
    return fConnection.Perform(fNames.DirectoryUrl());
  }

  void Remove(std::string const& name, unsigned what) {
    if (Command(fNames.Removal(name)) == CURLE_OK) SetLeft(what, false);
  }

  void RestoreFormer() {
    if (Command(fNames.Renaming(fOthers.fFormer, fNames.Name())) != CURLE_OK) return;
    SetLeft(kLeftFormer, false);
    SetLeft(kLeftPlaceEmpty, false);
  }

  // ---- What exists at the place ----

  TAtPlace LookAtPlace() { return fNames.IsSftp() ? LookBySftp() : LookByFtp(); }

  // Changes into the place (FTP), or opens it as a directory (SFTP).
  CURLcode Enter() {
    Prepare(fNames.IsSftp(), {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &EndTransfer);
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 0L);
    CURLcode const code = fConnection.Perform(fNames.UrlAsDirectory());
    fConnection.Set(CURLOPT_FTP_CREATE_MISSING_DIRS, 1L);
    return code == CURLE_WRITE_ERROR ? CURLE_OK : code;
  }

  // Servers report the size (SIZE) of regular files only.
  TAtPlace LookByFtp() {
    CURLcode const entered = Enter();
    if (entered == CURLE_OK) return {TAtPlace::kDirectory};
    if (entered != CURLE_REMOTE_ACCESS_DENIED) return {TAtPlace::kUnknown, -1, entered};
    std::string headers;  // libcurl writes the size as a header
    Prepare(false, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &AppendText);
    fConnection.Set(CURLOPT_WRITEDATA, &headers);
    CURLcode const sized = fConnection.Perform(fNames.Url());
    if (sized == CURLE_OK && fConnection.BytesToCome() >= 0) return {TAtPlace::kFile};
    bool const isAnswered = sized == CURLE_OK || sized == CURLE_REMOTE_FILE_NOT_FOUND;
    return {TAtPlace::kUnknown, -1, isAnswered ? CURLE_OK : sized};
  }

  // A file name with a line feed can forge a line of the listing. Therefore the place is first opened as a directory.
  TAtPlace LookBySftp() {
    CURLcode const entered = Enter();
    if (entered == CURLE_OK) return {TAtPlace::kDirectory};
    if (!IsRefusal(entered)) return {TAtPlace::kUnknown, -1, entered};
    std::string listing;
    CURLcode const listed = List(listing);
    bool const isTooLong = listed == CURLE_WRITE_ERROR;
    if (listed != CURLE_OK && !isTooLong && !IsRefusal(listed)) return {TAtPlace::kUnknown, -1, listed};
    TListedEntry const entry = EntryIn(listing, fNames.Name());
    if (entry.fType == '-') return {TAtPlace::kFile, entry.fMode};
    if (entry.fType == 'd') return {TAtPlace::kDirectory};
    if (entry.fType != 0 && entry.fType != 'l') return {TAtPlace::kOther};
    return LookByOpening(entry.fType == 'l');
  }

  // For SFTP: checks a link, which is replaced if its target is a file or missing, or an entry that the server does not list.
  TAtPlace LookByOpening(bool isLink) {
    Prepare(true, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &EndTransfer);
    CURLcode const read = fConnection.Perform(fNames.Url());
    bool const isReadable = read == CURLE_WRITE_ERROR || read == CURLE_OK;  // OK: an empty file
    bool const leadsNowhere = isLink && read == CURLE_REMOTE_FILE_NOT_FOUND;
    if (isReadable || leadsNowhere) return {TAtPlace::kFile};
    return {TAtPlace::kUnknown, -1, IsRefusal(read) ? CURLE_OK : read};
  }

  // Fetches the listing of the directory of the place by SFTP.
  CURLcode List(std::string& listing) {
    Prepare(true, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &AppendText);
    fConnection.Set(CURLOPT_WRITEDATA, &listing);
    return fConnection.Perform(fNames.DirectoryUrl());
  }

  // ---- After a renaming that the server refused ----

  // The file has arrived, but the server refused to rename it. Some servers do not rename onto an existing file.
  void ReplaceOrSendAnew() {
    SetLeft(kMayBeRenamed, false);
    TAtPlace const found = LookAtPlace();
    if (found.fFailure != CURLE_OK) GiveUp(found.fFailure, fConnection.ErrorText());
    if (found.fKind == TAtPlace::kDirectory) FailForDirectory();
    if (found.fKind == TAtPlace::kOther) FailFor(" is not a regular file; remove it first, or choose another name");
    if (found.fKind == TAtPlace::kFile && Replace(found.fMode)) return;
    fIsPlaceUnknown = found.fKind == TAtPlace::kUnknown;
    fIsFileAtPlace = found.fKind == TAtPlace::kFile;
    Remove(fOthers.fTemporary, kLeftTemporary);
    fState.fMoved = 0;
    SendToThePlace();
  }

  // Renames the file at the place to make way, and the new file to the place. Returns false if the server refuses one of the two.
  bool Replace(int mode) {
    std::string const &name = fNames.Name(), &temporary = fOthers.fTemporary, &former = fOthers.fFormer;
    SetLeft(kLeftFormer, true);
    if (!IsDone(Command(fNames.Renaming(name, former)))) {
      SetLeft(kLeftFormer, false);
      return false;
    }
    TCommands commands = fNames.Renaming(temporary, name);
    if (mode >= 0) commands.insert(commands.begin(), fNames.ChangeOfMode(temporary, mode));
    SetLeft(kMayBeRenamed, true);
    bool const isRenamed = IsDone(Command(commands));
    SetLeft(kMayBeRenamed, false);
    if (!isRenamed) {
      SetLeft(kLeftPlaceEmpty, true);
      RestoreFormer();
      return false;
    }
    SetLeft(kLeftTemporary, false);
    StartCleanUp();
    Remove(former, kLeftFormer);
    return true;
  }

  // Returns true if the server executed the commands, false if it refused one. Throws if the connection was lost.
  bool IsDone(CURLcode code) {
    bool const isRefused = code == CURLE_QUOTE_ERROR && IsRefusal(code);
    if (code != CURLE_OK && !isRefused) GiveUp(code, Reason(code));
    return code == CURLE_OK;
  }

  // Why a transfer failed. libcurl's text for a lost SFTP connection is misleading.
  std::string Reason(CURLcode code) const {
    bool const isLost = code == CURLE_QUOTE_ERROR && !IsRefusal(code);
    return isLost ? "the connection was lost before the server answered" : fConnection.ErrorText();
  }

  void SendToThePlace() {
    CURLcode const code = Send(fNames.Url(), {}, kLeftAtPlace, EarlierFileWhenWritten());
    bool const isRefused = IsNothingWritten(code);
    if (code == CURLE_OK || isRefused) SetLeft(kLeftAtPlace, false);
    std::string const reason = fConnection.ErrorText();
    if (isRefused && LookAtPlace().fKind == TAtPlace::kDirectory) FailForDirectory();
    std::string const remedy = "; if " + fNames.Name() + " is a directory, end the URL with \"/\"";
    if (code != CURLE_OK) GiveUp(code, reason + (isRefused && fIsPlaceUnknown ? remedy : ""));
    fState.fEarlierFile = EEarlierFile::kIsThere;
    SetLeft(kLeftPlaceEmpty, false);
    StartCleanUp();
    if (fState.fLeft & kLeftFormer) Remove(fOthers.fFormer, kLeftFormer);
  }

  // What happens to the earlier file when the server writes to the place. A file that made way is no longer there.
  EEarlierFile EarlierFileWhenWritten() const {
    if (fState.fLeft & kLeftFormer) return EEarlierFile::kIsThere;
    return fIsFileAtPlace ? EEarlierFile::kIsLost : EEarlierFile::kMayBeLost;
  }

  // ---- Failures ----

  // Removes what may have arrived, and throws.
  [[noreturn]] void GiveUp(CURLcode code, std::string const& reason) {
    RemoveParts();
    TConnection::FailFor(code, reason);
  }

  [[noreturn]] void FailFor(std::string const& reason) {
    RemoveParts();
    throw TZEPFailure(kZEPStatusAccessDenied, fNames.Name() + reason);
  }

  [[noreturn]] void FailForDirectory() { FailFor(" is a directory; end the URL with \"/\""); }

  TConnection fConnection;
  TNames const fNames;
  TUploadNames const fOthers;
  std::string const fFile;
  int const fCleanUpSeconds;
  bool fIsCleanUp = false;
  TClock::time_point fCleanUpEnd;  // no command of the clean-up is sent after this time
  bool fIsPlaceUnknown = false;    // the place may have a file or a directory
  bool fIsFileAtPlace = false;     // the server has proved that a file is at the place
  TTransferState& fState;
};

}  // namespace

TUploadNames NamesForUpload(TRemote const& place) {
  std::string const name = Decoded(LastPartOf(place.fPath));
  return {TemporaryNameFor(name), TemporaryNameFor(name)};
}

TRemote Beside(TRemote const& place, std::string const& name) {
  TRemote other = place;
  other.fPath = DirectoryOf(place.fPath) + EncodedName(name);
  return other;
}

TZEPStatusCode Upload(TRemote const& place, TUploadNames const& names, std::string const& file, int cleanUpSeconds,
                      TTransferState& state) {
  TUpload upload(place, names, file, cleanUpSeconds, state);
  upload.Run();
  state.fHasArrived = true;
  return kZEPStatusOK;
}

void RemoveParts(TRemote const& place, TUploadNames const& names, int cleanUpSeconds, TTransferState& state) {
  TUpload(place, names, "", cleanUpSeconds, state).RemoveParts();
}

}  // namespace NQRVZEP20::zep
