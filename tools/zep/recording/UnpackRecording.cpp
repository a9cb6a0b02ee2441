// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/UnpackRecording.h"

#include "collect/SafeText.h"
#include "core/Handles.h"
#include "providers/reasons/RecordedMark.h"
#include "providers/reasons/RootedFiles.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/processes/WriteWhole.h"
#include "tools/zep/transfer/Sha256.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <map>
#include <system_error>
#include <utility>
#include <vector>

namespace NQRVZEP20::zep {

namespace {

constexpr mode_t kFileMode = 0400;

// A hostile archive may have a file before its directory, or below a link.
[[noreturn]] void ThrowUnwritten(std::string const& member) {
  int const error = errno;
  for (int const fault : {ENOENT, ENOTDIR, EEXIST, ENAMETOOLONG})
    if (error == fault) throw TArchiveError("its member " + Printable(member) + " has no place: " + std::strerror(error));
  throw std::system_error(error, std::generic_category(), member + " cannot be written");
}

// Unpacks the members one by one. Every directory is new and private, and links are made last, so that no name leads elsewhere.
class TUnpacking {
public:
  TUnpacking(std::string const& file, std::string directory)
      : fArchive(NewArchiveReader(file)), fDirectory(std::move(directory)) {}

  TRecordingIndex Run() {
    TRecordingIndex index = ReadIndex();
    for (TRecordedMember const& recorded : index.fMembers) fExpected.emplace(recorded.fMember.fName, &recorded);
    while (auto const member = fArchive->Next()) {
      ThrowIfInterrupted();
      Unpack(*member);
    }
    if (!fExpected.empty()) throw TArchiveError("it is cut: its member " + Printable(fExpected.begin()->first) + " is missing");
    for (TMember const& link : fLinks) MakeLink(link);
    for (TMember const& link : fLinks) CheckLink(link);
    return index;
  }

private:
  TRecordingIndex ReadIndex() {
    auto const first = fArchive->Next();
    if (!first || first->fName != kIndexName || first->fKind != EMemberKind::kFile)
      throw TArchiveError(std::string("it is not a recording: its first member is not ") + kIndexName);
    return IndexFrom(fArchive->Content(kMostIndexBytes));
  }

  void Unpack(TMember const& member) {
    auto const at = fExpected.find(member.fName);
    std::string const name = Printable(member.fName);
    if (at == fExpected.end()) throw TArchiveError("its member " + name + " is foreign, or contained twice");
    TRecordedMember const& expected = *at->second;
    fExpected.erase(at);
    if (member.fKind != expected.fMember.fKind || member.fTarget != expected.fMember.fTarget)
      throw TArchiveError("its member " + name + " was altered");
    std::string const path = fDirectory + "/" + member.fName;
    if (member.fKind == EMemberKind::kFile) UnpackFile(expected, path);
    if (member.fKind == EMemberKind::kDirectory && ::mkdir(path.c_str(), 0700) != 0) ThrowUnwritten(member.fName);
    if (member.fKind == EMemberKind::kLink) fLinks.push_back(member);
  }

  void UnpackFile(TRecordedMember const& expected, std::string const& path) {
    std::string const content = fArchive->Content(expected.fBytes);
    {
      TUniqueFd const file(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600));
      mode_t const mode = expected.fMark.empty() ? kFileMode : kMarkMode & 07777;
      if (!file || !WriteWhole(file.get(), content) || ::fchmod(file.get(), mode) != 0) ThrowUnwritten(expected.fMember.fName);
    }
    bool const isSumRight = Sha256Of(path) == expected.fSha256;
    ThrowIfInterrupted();
    if (!isSumRight) ThrowAltered(expected, "SHA-256");
    if (content.size() != expected.fBytes) ThrowAltered(expected, "size");
    if (!expected.fMark.empty() && Printable(content) != expected.fMark) ThrowAltered(expected, "mark");
  }

  // `difference`: the member of the index that is not that of the file.
  [[noreturn]] static void ThrowAltered(TRecordedMember const& expected, std::string const& difference) {
    throw TArchiveError("its member " + Printable(expected.fMember.fName) + " was altered: its " + difference + " differs");
  }

  void MakeLink(TMember const& link) const {
    std::string const path = fDirectory + "/" + link.fName;
    if (::symlink(link.fTarget.c_str(), path.c_str()) != 0) ThrowUnwritten(link.fName);
  }

  // After all links were made, because a link may lead through others.
  void CheckLink(TMember const& link) const {
    std::string const path = link.fName.substr(std::string(kRecordedRoot).size() + 1);
    if (LeadsOut(fDirectory + "/" + kRecordedRoot, path))
      throw TArchiveError("its link " + Printable(link.fName) + " leads out of the recording");
  }

  std::unique_ptr<TArchiveReader> const fArchive;
  std::string const fDirectory;
  std::map<std::string, TRecordedMember const*> fExpected;
  std::vector<TMember> fLinks;
};

}  // namespace

TRecordingIndex UnpackRecording(std::string const& file, std::string const& directory) {
  return TUnpacking(file, directory).Run();
}

}  // namespace NQRVZEP20::zep
