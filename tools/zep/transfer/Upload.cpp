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
  EEarlierFile fEarlier;  // of fState.fEarlierFile, once the server has begun to write
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

// What the server shows of the thing at a place.
struct TAtPlace {
  enum EKind { kUnknown, kFile, kDirectory, kOther };
  EKind fKind = kUnknown;
  int fMode = -1;                // of a file; -1 when the server does not report it
  CURLcode fFailure = CURLE_OK;  // of a lost connection or the like; the kind is unknown then
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

  // A file at the place is spared when no byte of this upload has been sent to it: it may be the earlier one. The earlier file
  // gets its name back when it made way and the upload did not take its place.
  void RemoveParts() {
    StartCleanUp();
    bool const isNotComplete = fState.fLeft & (kLeftTemporary | kLeftAtPlace | kLeftPlaceEmpty);
    if ((fState.fLeft & kLeftAtPlace) && fState.fMoved > 0) Remove(fNames.Name(), kLeftAtPlace);
    if ((fState.fLeft & kLeftFormer) && isNotComplete) RestoreFormer();
    if (fState.fLeft & kLeftTemporary) Remove(fOthers.fTemporary, kLeftTemporary | kMayBeRenamed);
  }

private:
  // Whether the server refused the transfer. libcurl gives the same codes for an SFTP connection that was lost: the server may
  // then have done what it did not answer.
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

  // Once the server may have begun to write, `mark` is set in fLeft; once it has, `earlier` in fEarlierFile.
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
    if (code == CURLE_COULDNT_CONNECT) SetLeft(mark, false);  // the server is told of the file after the data connection is made
    return code;
  }

  // ---- Commands ----

  // From now on the commands, taken together, have fCleanUpSeconds.
  void StartCleanUp() {
    fIsCleanUp = true;
    fState.fIsFinishing = true;
    fCleanUpEnd = TClock::now() + std::chrono::seconds(fCleanUpSeconds);
  }

  // The whole seconds that a command of the clean-up may take.
  long SecondsLeft() const { return std::chrono::ceil<std::chrono::seconds>(fCleanUpEnd - TClock::now()).count(); }

  // Sets the connection up for a short transfer that is not an upload. While the upload is cleaned up, a silent server gets half
  // of the time for the command, and the other half for QUIT, which libcurl then sends and waits for.
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

  // ---- The thing at the place ----

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

  // Servers report the size of a regular file only (SIZE).
  TAtPlace LookByFtp() {
    CURLcode const entered = Enter();
    if (entered == CURLE_OK) return {TAtPlace::kDirectory};
    if (entered != CURLE_REMOTE_ACCESS_DENIED) return {TAtPlace::kUnknown, -1, entered};
    std::string headers;  // in which libcurl repeats the size
    Prepare(false, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &AppendText);
    fConnection.Set(CURLOPT_WRITEDATA, &headers);
    CURLcode const sized = fConnection.Perform(fNames.Url());
    if (sized == CURLE_OK && fConnection.BytesToCome() >= 0) return {TAtPlace::kFile};
    bool const isAnswered = sized == CURLE_OK || sized == CURLE_REMOTE_FILE_NOT_FOUND;
    return {TAtPlace::kUnknown, -1, isAnswered ? CURLE_OK : sized};
  }

  // A name with a line feed can forge a line of the listing. Therefore a directory is looked for first.
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

  // Of SFTP: for a link, which is replaced when it leads to a file or nowhere, and for an entry that the server does not list.
  TAtPlace LookByOpening(bool isLink) {
    Prepare(true, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &EndTransfer);
    CURLcode const read = fConnection.Perform(fNames.Url());
    bool const isReadable = read == CURLE_WRITE_ERROR || read == CURLE_OK;  // OK: an empty file
    bool const leadsNowhere = isLink && read == CURLE_REMOTE_FILE_NOT_FOUND;
    if (isReadable || leadsNowhere) return {TAtPlace::kFile};
    return {TAtPlace::kUnknown, -1, IsRefusal(read) ? CURLE_OK : read};
  }

  // The listing of the directory that the place is in, by SFTP.
  CURLcode List(std::string& listing) {
    Prepare(true, {});
    fConnection.Set(CURLOPT_WRITEFUNCTION, &AppendText);
    fConnection.Set(CURLOPT_WRITEDATA, &listing);
    return fConnection.Perform(fNames.DirectoryUrl());
  }

  // ---- An upload that did not get its name ----

  // The file has arrived, but did not get its name. Some servers do not rename onto another file.
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

  // Moves the file at the place out of the way, and the new one to the place. False when the server refuses one of them.
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

  // Whether the server executed the commands; false when it refused one. Fails when the connection was lost.
  bool IsDone(CURLcode code) {
    bool const isRefused = code == CURLE_QUOTE_ERROR && IsRefusal(code);
    if (code != CURLE_OK && !isRefused) GiveUp(code, Reason(code));
    return code == CURLE_OK;
  }

  // Why a transfer failed. libcurl's text for a lost SFTP connection names another cause.
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

  // What becomes of the file at the place when the server writes to it. A file that made way is not at the place.
  EEarlierFile EarlierFileWhenWritten() const {
    if (fState.fLeft & kLeftFormer) return EEarlierFile::kIsThere;
    return fIsFileAtPlace ? EEarlierFile::kIsLost : EEarlierFile::kMayBeLost;
  }

  // ---- Failures ----

  // Removes what may have arrived, and fails.
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
  TClock::time_point fCleanUpEnd;  // no command of the clean-up begins after it
  bool fIsPlaceUnknown = false;    // a thing at the place may be a file or a directory
  bool fIsFileAtPlace = false;     // the server has proved that
  TTransferState& fState;
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

}  // namespace NQRVZEP20::zep
