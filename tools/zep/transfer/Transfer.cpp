// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/transfer/Transfer.h"

#include "core/Handles.h"
#include "os/RemotePath.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/Terminal.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/TChildProcess.h"
#include "tools/zep/secrets/Secrets.h"
#include "tools/zep/transfer/Download.h"
#include "tools/zep/transfer/LocalFile.h"
#include "tools/zep/transfer/PartFile.h"
#include "tools/zep/transfer/PartNote.h"
#include "tools/zep/transfer/Sha256.h"
#include "tools/zep/transfer/TLockFile.h"
#include "tools/zep/transfer/Unreachable.h"
#include "tools/zep/transfer/Upload.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <charconv>
#include <chrono>
#include <filesystem>
#include <iostream>
#include <limits>
#include <string_view>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

// ---- Progress ----

// A progress line on the terminal of standard error, which is redrawn repeatedly and erased at the end.
class TProgress {
public:
  TProgress(std::uint64_t total, bool isWanted) : fTotal(total), fIsShown(isWanted && CanRedrawErrors()) {}
  ~TProgress() {
    if (fIsShown && CanWrite()) std::cerr << "\r\x1b[K" << std::flush;
  }
  TProgress(TProgress const&) = delete;
  TProgress& operator=(TProgress const&) = delete;

  void Show(std::uint64_t bytes) {
    if (!fIsShown || !CanWrite()) return;
    double const seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - fStart).count();
    std::string line = "\r\x1b[K";
    if (fTotal > 0) line += Bar(bytes) + " of " + SizeText(fTotal) + ", ";
    line += SizeText(bytes) + ", " + SizeText(static_cast<std::uint64_t>(static_cast<double>(bytes) / seconds)) + "/s";
    std::cerr << line << std::flush;
  }

private:
  // Whether a write to the terminal does not block. After Ctrl-S it would, and zep would not notice the end of the transfer.
  static bool CanWrite() {
    pollfd errors{STDERR_FILENO, POLLOUT, 0};
    return ::poll(&errors, 1, 0) > 0;
  }

  std::string Bar(std::uint64_t bytes) const {
    constexpr std::uint64_t kWidth = 30;
    std::uint64_t const share = std::min(bytes, fTotal);
    std::string bar(share * kWidth / fTotal, '#');
    bar.resize(kWidth, '.');
    return "[" + bar + "] " + std::to_string(share * 100 / fTotal) + " %";
  }

  std::uint64_t fTotal;  // 0: unknown
  bool fIsShown;
  std::chrono::steady_clock::time_point fStart = std::chrono::steady_clock::now();
};

TOutcome Transfer(std::function<TZEPStatusCode()> const& transfer, TTransferState const& state, std::uint64_t total,
                  TTransferOptions const& options) {
  TProgress progress(total, !options.fQuiet);
  TWatch watch;
  watch.fMoved = &state.fMoved;
  watch.fStallSeconds = options.fStallSeconds;
  watch.fIsFinishing = &state.fIsFinishing;
  watch.fShowProgress = [&progress](std::uint64_t bytes) { progress.Show(bytes); };
  return RunWatched(transfer, watch);
}

// Adds the reason for a failed connection, which the library does not report. If the host does not answer at all, the transfer
// stalls before any byte is moved.
void ExplainNoConnection(TOutcome& outcome, TRemote const& remote, bool isNothingMoved) {
  constexpr int kProbeSeconds = 3;
  bool const isStall = outcome.fExit == kExitStalled && isNothingMoved;
  if (outcome.fExit != kExitNoConnection && !isStall) return;
  std::string const usualPort = remote.fScheme == "sftp" ? "22" : "21";
  std::string const why = WhyUnreachable(remote.fHost, remote.fPort.empty() ? usualPort : remote.fPort, kProbeSeconds);
  if (PendingInterrupt() != 0)
    outcome = Interrupted();
  else if (!why.empty())
    outcome = {kZEPStatusConnectionFailed, kExitNoConnection, outcome.fReason + ": " + Printable(why)};
}

TTransferred TransferOf(TRemote const& remote, std::string const& file) {
  TTransferred transferred;
  transferred.fUrl = ShownUrlOf(remote);
  transferred.fFile = file;
  return transferred;
}

TTransferred Failed(TTransferred transferred, EExitStatus exit, std::string const& reason) {
  transferred.fOutcome = {kZEPStatusFail, exit, reason};
  return transferred;
}

// The transfer with its final outcome, which is the interrupt if one is pending.
TTransferred Decided(TTransferred transferred) {
  TOutcome const outcome = transferred.fOutcome;
  if (!IsInterruptedAtLast() || outcome.fExit >= kExitHangUp) return transferred;
  transferred.fHasArrived = outcome.fExit == kExitComplete;
  std::string const reason = transferred.fHasArrived
                                 ? "the complete file is on the server; zep was interrupted before it could report the checksum"
                                 : outcome.fReason + "; interrupted";
  return Failed(transferred, StatusOfInterrupt(), reason);
}

// Fills in user and password. After an interrupt, sets the outcome and returns false.
bool FindPasswordOf(TRemote& remote, TTransferred& transferred, TTransferOptions const& options) {
  try {
    FindPassword(remote, options.fNetrc);
    return true;
  } catch (std::exception const&) {
    if (PendingInterrupt() == 0) throw;
    transferred.fOutcome = Interrupted();
    return false;
  }
}

// Parses a size such as "500K". Returns an empty text, or the reason why it is not a size.
std::string WhyNoSize(std::string const& text, std::uint64_t& bytes) {
  constexpr std::string_view kUnits = "KMGT";
  std::uint64_t number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  std::string_view const unit(end, static_cast<std::size_t>(text.data() + text.size() - end));
  std::size_t const power = unit.size() == 1 ? kUnits.find(static_cast<char>(std::toupper(unit[0]))) : kUnits.npos;
  bool const isRead = error == std::errc() && (unit.empty() || power != kUnits.npos);
  unsigned const shift = unit.empty() ? 0 : 10 * (static_cast<unsigned>(power) + 1);
  if (!isRead || number > (std::numeric_limits<std::uint64_t>::max() >> 1 >> shift)) return "it is not a size";
  bytes = number << shift;
  return "";
}

// ---- Sending ----

// Why the file cannot be uploaded; empty if it can.
std::string WhyNotReadable(std::string const& file, struct stat& status) {
  if (::stat(file.c_str(), &status) != 0) return ReasonOf(errno);
  if (!S_ISREG(status.st_mode)) return "it is not a regular file";
  TUniqueFd const opened(::open(file.c_str(), O_RDONLY | O_CLOEXEC));
  char first;
  return opened && ::pread(opened.get(), &first, 1, 0) >= 0 ? "" : ReasonOf(errno);
}

// Computes the checksum, which stays empty after an interrupt. Returns an empty text, or the reason for a failure.
std::string WhyNoChecksum(std::string const& file, std::string& checksum) {
  try {
    checksum = Sha256Of(file);
    return "";
  } catch (std::exception const& failure) {
    return Printable(failure.what());
  }
}

bool IsAsBefore(std::string const& file, struct stat const& before) {
  struct stat now;
  return ::stat(file.c_str(), &now) == 0 && IsSameFile(now, before) && now.st_size == before.st_size &&
         now.st_mtim.tv_sec == before.st_mtim.tv_sec && now.st_mtim.tv_nsec == before.st_mtim.tv_nsec;
}

void AddName(TRemote& remote, std::string const& name) {
  if (remote.fPath.empty() || remote.fPath.back() == '/') remote.fPath += EncodedName(name);
}

// The final path of an upload. On bootable media the library chooses the directory for a host alone.
TRemote PlaceOf(TTarget const& target) {
  TRemote place = target.fRemote;
  if (target.fIsHost) place.fPath = RemotePathOf(place.fPath);
  return place;
}

// The time limit for removing an incomplete upload. By default it is shorter than the longest stall allowed.
int CleanUpSecondsOf(TTransferOptions const& options) {
  constexpr int kMost = 10;
  if (options.fCleanUpSeconds > 0) return options.fCleanUpSeconds;
  return options.fStallSeconds > 0 ? std::clamp(options.fStallSeconds / 2, 1, kMost) : kMost;
}

// The time limit after zep has killed the process of the upload. It is short by default, because the user is waiting.
int CleanUpSecondsAfterEnd(TTransferOptions const& options) {
  constexpr int kMost = 5;
  return options.fCleanUpSeconds > 0 ? options.fCleanUpSeconds : std::min(CleanUpSecondsOf(options), kMost);
}

// Removes what an upload left whose process was killed. Another interrupt ends the wait.
void CleanUp(TRemote const& place, TUploadNames const& names, int limit, TTransferState& state) {
  TChildProcess const child(
      [&] {
        RemoveParts(place, names, limit, state);
        return std::string("done");
      },
      SIGKILL);
  pollfd waiting{child.Output(), POLLIN, 0};
  ::poll(&waiting, 1, limit * 1000);
}

std::string JoinedByAnd(std::vector<std::string> const& texts) {
  std::string joined;
  for (std::string const& text : texts) joined += (joined.empty() ? "" : " and ") + text;
  return joined;
}

// States what a failed upload has done to the earlier file.
std::string LossText(EEarlierFile earlier) {
  switch (earlier) {
    case EEarlierFile::kIsLost:
      return "; the earlier file of that name is lost";
    case EEarlierFile::kMayBeLost:
      return "; if there was an earlier file of that name, it is lost";
    default:
      return "";
  }
}

// Adds details of an upload to its outcome: why the local file could not be read, and what may be left on the server.
void ExplainUpload(TTransferred& transferred, TRemote const& place, TUploadNames const& names, TTransferState const& state) {
  TOutcome& outcome = transferred.fOutcome;
  bool const isComplete = outcome.fExit == kExitComplete;
  if (state.fReadError != 0) outcome = {outcome.fStatus, kExitNoInput, ReasonOf(state.fReadError)};
  std::vector<std::string>& left = transferred.fLeftOnServer;
  if (state.fLeft & kLeftTemporary) left.push_back(ShownUrlOf(Beside(place, names.fTemporary)));
  if (state.fLeft & kLeftAtPlace) left.push_back(ShownUrlOf(place));
  if (!isComplete && !left.empty()) outcome.fReason += "; the server may have a part of it: " + JoinedByAnd(left);
  if (!isComplete && (state.fLeft & kMayBeRenamed)) outcome.fReason += ", or the complete file: " + ShownUrlOf(place);
  if (!isComplete) outcome.fReason += LossText(state.fEarlierFile);
  if ((state.fLeft & kLeftFormer) == 0) return;
  transferred.fFormerUrl = ShownUrlOf(Beside(place, names.fFormer));
  left.push_back(transferred.fFormerUrl);
  bool const isPlaceEmpty = (state.fLeft & kLeftPlaceEmpty) && !(state.fLeft & kLeftAtPlace);
  if (isComplete) return;
  if (isPlaceEmpty) outcome.fReason += "; no file has the name " + ShownUrlOf(place) + " now: the earlier file is ";
  if (!isPlaceEmpty) outcome.fReason += "; the earlier file may now be ";
  outcome.fReason += transferred.fFormerUrl;
}

// Adds the checksum to a complete upload, which fails if the local file is no longer as it was `before`.
TTransferred WithChecksum(TTransferred transferred, struct stat const& before) {
  std::string const file = transferred.fFile;
  bool const isAsBefore = IsAsBefore(file, before);
  std::string const whyNoChecksum = isAsBefore ? WhyNoChecksum(file, transferred.fSha256) : "";
  if (!isAsBefore || !IsAsBefore(file, before)) return Failed(transferred, kExitPartial, "the file changed while it was sent");
  if (whyNoChecksum.empty()) return transferred;
  return Failed(transferred, kExitPartial, "it was sent, but its checksum is not known: " + whyNoChecksum);
}

// ---- Fetching ----

TTransferred BrokenOff(TTransferred transferred, bool wasThere, TTransferState const& state, TTransferOptions const& options) {
  std::string const& part = transferred.fFile;
  if (transferred.fOutcome.fStatus == kZEPStatusAlreadyExists)
    return Failed(transferred, kExitNotWritten, "another program has created this file in the meantime");
  if (state.fIsTooLarge) {
    transferred.fOutcome.fReason = "the file is larger than " + ExactSizeText(options.fMostBytes) + "; --max-size allows more";
    bool const isKept = wasThere || (::unlink(part.c_str()) != 0 && errno != ENOENT);
    if (!isKept) RemoveNote(part);
    if (!isKept) return transferred;
  }
  if (transferred.fOutcome.fStatus == kZEPStatusFileSystemError) transferred.fOutcome.fExit = kExitNotWritten;
  MarkForResuming(part, state);
  transferred.fOutcome.fReason += PartText(part);
  return transferred;
}

// Renames the complete part to the final name. An interrupt before that leaves the part.
TTransferred Completed(TTransferred transferred, std::string const& file, bool overwrites, TTransferState const& state) {
  std::string const& part = transferred.fFile;
  transferred.fBytes = state.fMoved;
  std::string const whyNoChecksum = IsAsWritten(part, state) ? WhyNoChecksum(part, transferred.fSha256) : "";
  if (!IsAsWritten(part, state))
    return Decided(Failed(transferred, kExitNotWritten, "another program changed or removed this file during the download"));
  if (!whyNoChecksum.empty()) return Decided(Failed(transferred, kExitNotWritten, whyNoChecksum + PartText(part)));
  if (IsInterruptedAtLast()) {
    MarkForResuming(part, state);
    return Failed(transferred, StatusOfInterrupt(), "interrupted" + PartText(part));
  }
  int const error = RenamePart(part, file, overwrites);
  if (error != 0)
    return Failed(transferred, kExitNotWritten, "it arrived, but is still " + Printable(part) + ": " + ReasonOf(error));
  RemoveNote(part);
  transferred.fFile = file;
  return transferred;
}

}  // namespace

void AddTransferOptions(CLI::App& command, TTransferOptions& options) {
  command.add_flag("--quiet", options.fQuiet, "Do not print the progress, or a message after a success");
  command
      .add_option("--stall", options.fStallSeconds,
                  "The number of seconds without progress after which the transfer is ended (default 60); 0: never. In an\n"
                  "upload, bytes count when they are read, so the last few MiB must reach the server within this time")
      ->check(CLI::Range(0, 86400));
  command.add_option("--netrc", options.fNetrc, "The netrc file with users and passwords (default: $NETRC, or ~/.netrc)");
}

void AddUploadOptions(CLI::App& command, TTransferOptions& options) {
  AddTransferOptions(command, options);
  command
      .add_option("--clean-up", options.fCleanUpSeconds,
                  "The time limit, in seconds, for removing an incomplete file from the server after a failure (default 10,\n"
                  "after a stall or an interrupt 5, but not more than half of --stall)")
      ->check(CLI::Range(1, 3600));
}

void AddSizeOption(CLI::App& command, std::string const& name, std::uint64_t& bytes, std::string const& description) {
  CLI::Validator const check([&bytes](std::string& text) { return WhyNoSize(text, bytes); }, "SIZE, such as 500K, 2M or 1G");
  command
      .add_option_function<std::string>(
          name, [](std::string const&) {}, description)
      ->check(check)
      ->type_name("");
}

std::string TransferHelp() {
  return "Passwords come from the URL (which other users may see in the list of processes), from netrc, or from a prompt.\n"
         "The host key of an SFTP server is not verified, so another server in its place would receive the password.\n"
         "The path of a URL may contain spaces and other special characters; percent-escapes such as \"%20\" are decoded.\n"
         "Exit status: 0 after a success, 1 when the server refused the transfer or it failed, 64 for wrong usage, 66 when the\n"
         "file to send cannot be read, 68 when the host is unknown or cannot be reached, 69 when libcurl is missing, 73 when\n"
         "the local file exists or cannot be written, 75 when the transfer made no progress for the seconds of --stall.";
}

bool IsUrl(std::string const& text) { return text.find("://") != text.npos; }

TTarget TargetOf(std::string const& text, bool bySftp) {
  TTarget target{RemoteOf(text, bySftp ? "sftp" : "ftp"), !IsUrl(text)};
  if (target.fRemote.fScheme != "ftp" && target.fRemote.fScheme != "sftp")
    throw TWrongUsage("only ftp:// and sftp:// are supported");
  if (target.fIsHost && !target.fRemote.fPath.empty())
    throw TWrongUsage("a host alone has no path; write a URL that begins with ftp:// or sftp://");
  return target;
}

TTransferred SendFile(std::string const& file, TTarget target, std::string const& name, TTransferOptions const& options) {
  AddName(target.fRemote, name.empty() ? fs::path(file).filename().string() : name);
  TTransferred transferred = TransferOf(PlaceOf(target), file);
  struct stat before;
  std::string const why = WhyNotReadable(file, before);
  if (!why.empty()) return Failed(transferred, kExitNoInput, why);
  transferred.fBytes = static_cast<std::uint64_t>(before.st_size);

  bool const isReady = FindPasswordOf(target.fRemote, transferred, options);
  TRemote const place = PlaceOf(target);
  transferred.fUrl = ShownUrlOf(place);
  if (!isReady) return transferred;
  TSharedTransferState const state;
  int const cleanUpSeconds = CleanUpSecondsOf(options);
  TUploadNames const names = NamesForUpload(place);
  transferred.fOutcome =
      Transfer([&] { return Upload(place, names, file, cleanUpSeconds, *state); }, *state, transferred.fBytes, options);
  if (state->fHasArrived) transferred.fOutcome = {kZEPStatusOK, kExitComplete, ""};  // even if closing the connection failed
  EExitStatus const exit = transferred.fOutcome.fExit;
  bool const wasEnded = exit == kExitStalled || exit >= kExitHangUp;
  if (wasEnded && (state->fLeft & (kLeftTemporary | kLeftAtPlace | kLeftPlaceEmpty)))
    CleanUp(place, names, CleanUpSecondsAfterEnd(options), *state);
  ExplainNoConnection(transferred.fOutcome, place, state->fMoved == 0 && state->fLeft == 0);
  ExplainUpload(transferred, place, names, *state);
  return Decided(exit == kExitComplete ? WithChecksum(transferred, before) : transferred);
}

TTransferred GetFile(TRemote remote, std::string const& file, bool overwrites, TTransferOptions const& options) {
  std::string const part = file + ".part";
  TTransferred transferred = TransferOf(remote, part);
  bool const isReady = FindPasswordOf(remote, transferred, options);
  transferred.fUrl = ShownUrlOf(remote);
  if (!isReady) return transferred;
  TLockFile const lock(part + ".lock");
  if (!lock.WhyNotHeld().empty()) return Failed(transferred, kExitNotWritten, lock.WhyNotHeld());
  std::string const why = WhyNoPart(part);
  if (!why.empty()) return Failed(transferred, kExitNotWritten, why);
  bool const isThere = IsRegularFile(part);
  if (!isThere) RemoveNote(part);
  TSharedTransferState const state;
  std::uint64_t const most = options.fMostBytes;
  transferred.fOutcome = Transfer([&] { return Download(remote, part, isThere, most, *state); }, *state, 0, options);
  ExplainNoConnection(transferred.fOutcome, remote, state->fInode == 0);
  if (transferred.fOutcome.fExit != kExitComplete) return Decided(BrokenOff(transferred, isThere, *state, options));
  return Completed(transferred, file, overwrites, *state);
}

void WarnOfLeft(TTransferred const& transferred) {
  if (transferred.fOutcome.fExit != kExitComplete) return;  // the reason already names them
  for (std::string const& url : transferred.fLeftOnServer) {
    bool const isFormer = url == transferred.fFormerUrl;
    std::cerr << "zep: warning: the server did not remove " << url
              << (isFormer ? ", the file that was replaced\n" : ", a temporary file of this upload\n");
  }
}

TJson DocumentOf(TTransferred const& transferred, std::string const& command) {
  bool const isComplete = transferred.fOutcome.fExit == kExitComplete;
  TJson document = DocumentHead(command, transferred.fOutcome.fExit, transferred.fOutcome.fReason);
  document["url"] = transferred.fUrl;
  document["file"] = MessageWithoutSecrets(transferred.fFile);
  document["bytes"] = isComplete ? TJson(transferred.fBytes) : TJson(nullptr);
  document["sha256"] = isComplete ? TJson(transferred.fSha256) : TJson(nullptr);
  if (command == "zep send") document["leftOnServer"] = transferred.fLeftOnServer;
  return document;
}

int TellOf(TTransferred const& transferred, std::string const& command, bool asJson, TTransferOptions const& options) {
  TOutcome const& outcome = transferred.fOutcome;
  bool const isComplete = outcome.fExit == kExitComplete;
  if (asJson) {
    WriteOutput(AsText(DocumentOf(transferred, command)));
  } else if (isComplete && !options.fQuiet) {
    WriteMessage(transferred.fUrl + ", " + Printable(transferred.fFile) + ": " + std::to_string(transferred.fBytes) +
                 " bytes, SHA-256 " + transferred.fSha256 + "\n");
  }
  WarnOfLeft(transferred);
  if (!isComplete)
    std::cerr << "zep: " << transferred.fUrl << ", " << Printable(transferred.fFile) << ": " << outcome.fReason << "\n";
  return outcome.fExit;
}

}  // namespace NQRVZEP20::zep
