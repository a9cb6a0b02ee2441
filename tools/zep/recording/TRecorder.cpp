// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/TRecorder.h"

#include "collect/SafeText.h"
#include "providers/reasons/RecordedMark.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/transfer/Sha256.h"

#include <sys/stat.h>

#include <algorithm>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string ValueOf(char const* variable) {
  char const* const value = std::getenv(variable);
  return value != nullptr ? value : "";
}

// The root of the machine, before another root is set.
std::string MachineRoot() {
  std::string const root = ValueOf("ZEP_ROOT");
  return root.empty() ? "/" : fs::absolute(root).string();
}

std::string MadeDirectory(std::string const& path) {
  fs::create_directory(path);
  return path;
}

std::string ContentOf(std::string const& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

TRecordedMember MemberOf(fs::path const& path, std::string const& name) {
  struct stat status {};
  if (::lstat(path.c_str(), &status) != 0)
    throw fs::filesystem_error("a recorded file", path, std::error_code(errno, std::generic_category()));
  TMember member{EMemberKind::kFile, name, {}, status.st_mode & 07777, status.st_mtim};
  if (S_ISDIR(status.st_mode)) member.fKind = EMemberKind::kDirectory;
  if (S_ISLNK(status.st_mode)) {
    member.fKind = EMemberKind::kLink;
    member.fTarget = fs::read_symlink(path).string();
  }
  TRecordedMember recorded{std::move(member)};
  if (recorded.fMember.fKind != EMemberKind::kFile) return recorded;
  recorded.fTime = TimeText(status.st_mtim.tv_sec);
  recorded.fBytes = static_cast<std::uint64_t>(status.st_size);
  recorded.fSha256 = Sha256Of(path);
  if (IsMark(status)) recorded.fMark = ContentOf(path);
  return recorded;
}

bool IsUtf8(std::string const& text) { return WithBytesEscaped(text) == text; }

// Adds all members in the order of their names, so that a directory comes before its files.
void AddMembers(TRecordingIndex& index, fs::path const& root) {
  std::vector<TRecordedMember>& members = index.fMembers;
  members.push_back(MemberOf(root, kRecordedRoot));
  for (fs::directory_entry const& entry : fs::recursive_directory_iterator(root)) {
    ThrowIfInterrupted();
    TRecordedMember member = MemberOf(entry.path(), kRecordedRoot + ("/" + entry.path().lexically_relative(root).string()));
    if (IsUtf8(member.fMember.fName) && IsUtf8(member.fMember.fTarget))
      members.push_back(std::move(member));
    else
      index.fNotRecorded.push_back({member.fMember.fName, "the name of this file, or the target of this link, is not UTF-8"});
  }
  std::sort(members.begin(), members.end(),
            [](auto const& one, auto const& other) { return one.fMember.fName < other.fMember.fName; });
}

// A plug-in that reads through TMachineFiles leaves a note in this directory: an empty file of its name, which is writable if
// something that it read is missing (TMachineCopy.h).
constexpr char const* kNotes = "zep-plug-ins";

constexpr char const* kNotAllWritten =
    "what it reads could not be written to the temporary directory; free space in it, or name another directory in TMPDIR";

bool HasLoss(struct stat const& note) { return (note.st_mode & S_IWUSR) != 0; }

// Returns why the plug-in was not recorded, or an empty text.
std::string WhyNotRecorded(TPlugIn const& plugIn, fs::path const& note) {
  struct stat status {};
  if (::stat(note.c_str(), &status) == 0) return HasLoss(status) ? kNotAllWritten : "";
  if (!plugIn.fError.empty()) return plugIn.fError;
  return "it does not read through TMachineFiles of zepcore, so its reading cannot be recorded";
}

void NamePlugIns(TRecordingIndex& index, fs::path const& root, std::vector<TPlugIn> const& plugIns) {
  for (TPlugIn const& plugIn : plugIns) {
    std::string const name = fs::path(plugIn.fFile).filename().string();
    std::string const why = WhyNotRecorded(plugIn, root / kNotes / name);
    if (why.empty())
      index.fPlugIns.push_back(name);
    else
      index.fNotRecorded.push_back({name, why});
  }
}

void CheckSize(TRecordingIndex const& index) {
  std::uint64_t bytes = 0;
  for (TRecordedMember const& member : index.fMembers) bytes += member.fBytes;
  if (bytes > kMostRecordedBytes || index.fMembers.size() > kMostRecordedMembers)
    throw TFailure(kExitNothing, "the plug-ins read more than a recording may contain: " + std::to_string(bytes) + " bytes in " +
                                     std::to_string(index.fMembers.size()) + " files; the limits are " +
                                     std::to_string(kMostRecordedBytes) + " and " + std::to_string(kMostRecordedMembers));
}

}  // namespace

TRecorder::TRecorder()
    : fDirectory("zep-recording"),
      fVariables({{"ZEP_RECORD_FROM", MachineRoot()},
                  {"ZEP_ROOT", MadeDirectory(fDirectory.Path(kRecordedRoot))},
                  {"ZEP_SMBIOS_TABLE", ""},
                  {"ZEP_HOST_NAME", ""},
                  {"ZEP_SCSI_DEVICES", ""}}) {}

void TRecorder::CheckNothingIsLost() const {
  std::error_code none;
  for (fs::directory_entry const& note : fs::directory_iterator(fs::path(fDirectory.Path(kRecordedRoot)) / kNotes, none)) {
    struct stat status {};
    if (::stat(note.path().c_str(), &status) == 0 && HasLoss(status))
      throw TFailure(kExitNotWritten,
                     "the report would not be complete: " + Printable(note.path().filename().string()) + ": " + kNotAllWritten);
  }
}

TRecorder::TResult TRecorder::Finish(std::vector<TPlugIn> const& plugIns, TThresholds const& thresholds) const {
  fs::path const root = fDirectory.Path(kRecordedRoot);
  TResult result;
  TRecordingIndex& index = result.fIndex;
  index.fTime = TimeText(std::time(nullptr));
  index.fTool = ZEP_VERSION;
  index.fPlugInDirectory = PlugInDirectory();
  index.fThresholds = thresholds;
  NamePlugIns(index, root, plugIns);
  AddMembers(index, root);
  CheckSize(index);
  auto const archive = NewArchiveWriter();
  archive->Add({EMemberKind::kFile, kIndexName, {}, 0600, {std::time(nullptr), 0}}, TextOf(index));
  for (TRecordedMember const& recorded : index.fMembers) {
    TMember const& member = recorded.fMember;
    archive->Add(member, member.fKind == EMemberKind::kFile ? ContentOf(fDirectory.Path(member.fName)) : "");
  }
  result.fArchive = archive->Finish();
  return result;
}

}  // namespace NQRVZEP20::zep
