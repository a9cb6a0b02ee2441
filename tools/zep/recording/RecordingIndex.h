// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/findings/TThresholds.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/packing/Archive.h"

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The member recording.json of a recording, which names all others (docs/formats.md, "Recordings").

constexpr char const* kIndexName = "recording.json";
constexpr char const* kRecordedRoot = "root";
constexpr int kRecordingVersion = 1;

constexpr std::uint64_t kMostRecordedBytes = std::uint64_t(256) << 20;  // of all files together
constexpr std::uint64_t kMostIndexBytes = std::uint64_t(64) << 20;
constexpr std::size_t kMostRecordedMembers = 200000;

struct TRecordedMember {
  TMember fMember;
  std::string fTime = {};    // of a file: when it was read
  std::uint64_t fBytes = 0;  // of a file
  std::string fSha256 = {};  // of a file, 64 hexadecimal digits
  std::string fMark = {};    // of a mark: its content (RecordedMark.h)
};

// A plug-in of which the recording has nothing, or a file of the machine that it cannot contain.
struct TNotRecorded {
  std::string fFile;  // "libHost.nsp.so", or the path in the recording that the file would have
  std::string fReason;
};

struct TRecordingIndex {
  std::string fTime;                  // when all was read: "2026-11-23T04:05:06Z"
  std::string fTool;                  // the version of zep
  std::string fPlugInDirectory = {};  // of that zep; empty in recordings of earlier versions
  TThresholds fThresholds = {};       // of that machine
  std::vector<std::string> fPlugIns;  // the files of the plug-ins that were recorded: "libHost.nsp.so"
  std::vector<TNotRecorded> fNotRecorded;
  std::vector<TRecordedMember> fMembers;
};

// The names of members must be valid UTF-8 (WithBytesEscaped); bytes of other texts that are not become escapes.
std::string TextOf(TRecordingIndex const& index);

// Throws TArchiveError if the text is not an index, is that of a newer version, or names a member that no recording has.
TRecordingIndex IndexFrom(std::string const& text);

// "2026-11-23T04:05:06Z"
std::string TimeText(std::time_t time);
bool IsTimeText(std::string const& text);  // a valid time in that form

}  // namespace NQRVZEP20::zep
