// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/recording/RecordingIndex.h"

#include "collect/SafeText.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/processes/Interrupts.h"

#include <algorithm>
#include <array>
#include <ctime>
#include <set>
#include <stdexcept>
#include <string_view>

namespace NQRVZEP20::zep {

namespace {

constexpr std::array<char const*, 3> kKinds = {"file", "directory", "link"};  // by EMemberKind

TJson AsJson(TRecordedMember const& recorded) {
  TMember const& member = recorded.fMember;
  TJson json{{"path", member.fName}, {"kind", kKinds.at(static_cast<std::size_t>(member.fKind))}};
  if (member.fKind == EMemberKind::kLink) json["target"] = member.fTarget;
  if (member.fKind != EMemberKind::kFile) return json;
  json["time"] = recorded.fTime;
  json["bytes"] = recorded.fBytes;
  json["sha256"] = recorded.fSha256;
  if (!recorded.fMark.empty()) json["mark"] = Printable(recorded.fMark);
  return json;
}

[[noreturn]] void ThrowUnsound(std::string const& why) { throw TArchiveError(std::string(kIndexName) + " is not sound: " + why); }

// "root", or a path below it that names no directory above.
bool IsWithinRoot(std::string const& path) {
  if (path == kRecordedRoot) return true;
  std::string_view rest = path;
  if (path.size() > 4096 || path.find('\0') != path.npos || rest.substr(0, 5) != "root/") return false;
  while (!rest.empty()) {
    std::string_view const name = rest.substr(0, rest.find('/'));
    if (name.empty() || name == "." || name == "..") return false;
    rest.remove_prefix(std::min(name.size() + 1, rest.size()));
  }
  return path.back() != '/';
}

std::string TimeIn(TJson const& json) {
  std::string const text = json.at("time").get<std::string>();
  if (!IsTimeText(text)) ThrowUnsound("the time " + Printable(text) + " is invalid");
  return text;
}

TThresholds ThresholdsFrom(TJson const& json) {
  if (!json.is_object()) ThrowUnsound("the thresholds are not an object");
  try {
    return TThresholds::From([&](std::string const& key) {
      auto const value = json.find(key);
      return value == json.end() ? "" : std::to_string(value->get<std::uint64_t>());
    });
  } catch (std::invalid_argument const& failure) {
    ThrowUnsound(failure.what());
  }
}

TRecordedMember MemberFrom(TJson const& json) {
  std::string const path = json.at("path").get<std::string>();
  if (!IsWithinRoot(path)) ThrowUnsound("the path " + Printable(path) + " leads out of the recording");
  auto const kind = std::find(kKinds.begin(), kKinds.end(), json.at("kind").get<std::string>());
  if (kind == kKinds.end()) ThrowUnsound(Printable(path) + " is of an unknown kind");
  TRecordedMember recorded{{static_cast<EMemberKind>(kind - kKinds.begin()), path}};
  if (recorded.fMember.fKind == EMemberKind::kLink) recorded.fMember.fTarget = json.at("target").get<std::string>();
  if (recorded.fMember.fKind != EMemberKind::kFile) return recorded;
  recorded.fTime = TimeIn(json);
  recorded.fBytes = json.at("bytes").get<std::uint64_t>();
  recorded.fSha256 = json.at("sha256").get<std::string>();
  recorded.fMark = json.value("mark", "");
  return recorded;
}

void CheckVersion(TJson const& json) {
  TJson const& version = json.at("recordingVersion");
  if (version.is_number_unsigned() && version.get<std::uint64_t>() == kRecordingVersion) return;
  throw TArchiveError("it is a recording of the version " + Printable(version.dump()) + ", written by zep " +
                      Printable(json.value("zepVersion", "?")) + "; this zep reads only the version " +
                      std::to_string(kRecordingVersion));
}

// Each member is below a directory, not below a file or link.
void CheckDirectories(std::vector<TRecordedMember> const& members) {
  std::set<std::string_view> directories;
  for (TRecordedMember const& recorded : members)
    if (recorded.fMember.fKind == EMemberKind::kDirectory) directories.insert(recorded.fMember.fName);
  for (TRecordedMember const& recorded : members) {
    std::string_view const name = recorded.fMember.fName;
    if (directories.count(name == kRecordedRoot ? name : name.substr(0, name.rfind('/'))) == 0)
      ThrowUnsound(Printable(name) + " is not in a directory");
  }
}

void CheckLimits(TRecordingIndex const& index) {
  if (index.fMembers.size() > kMostRecordedMembers)
    ThrowUnsound("it names more than " + std::to_string(kMostRecordedMembers) + " members");
  std::uint64_t bytes = 0;
  std::set<std::string_view> names;
  for (TRecordedMember const& recorded : index.fMembers) {
    if (recorded.fBytes > kMostRecordedBytes - bytes)
      ThrowUnsound("the files have more than " + std::to_string(kMostRecordedBytes) + " bytes");
    bytes += recorded.fBytes;
    if (!names.insert(recorded.fMember.fName).second) ThrowUnsound(Printable(recorded.fMember.fName) + " is named twice");
  }
}

// A member of the recording has seven values at most.
constexpr TJsonBounds kIndexBounds{8, 100, 10 * kMostRecordedMembers};

TRecordingIndex Read(TJson const& json) {
  CheckVersion(json);
  TRecordingIndex index;
  index.fTime = TimeIn(json);
  index.fTool = json.at("zepVersion").get<std::string>();
  index.fPlugInDirectory = json.value("plugInDirectory", "");
  index.fThresholds = ThresholdsFrom(json.value("thresholds", TJson::object()));
  index.fPlugIns = json.at("plugIns").get<std::vector<std::string>>();
  for (TJson const& row : json.at("notRecorded"))
    index.fNotRecorded.push_back({row.at("file").get<std::string>(), row.at("reason").get<std::string>()});
  for (TJson const& member : json.at("members")) {
    ThrowIfInterrupted();
    index.fMembers.push_back(MemberFrom(member));
  }
  CheckLimits(index);
  CheckDirectories(index.fMembers);
  return index;
}

}  // namespace

std::string TextOf(TRecordingIndex const& index) {
  TJson json{{"recordingVersion", kRecordingVersion}, {"zepVersion", index.fTool}, {"time", index.fTime}};
  json["plugInDirectory"] = WithBytesEscaped(index.fPlugInDirectory);
  for (auto const& [key, value] : index.fThresholds.Settings()) json["thresholds"][key] = value;
  for (char const* const list : {"plugIns", "notRecorded", "members"}) json[list] = TJson::array();
  for (std::string const& plugIn : index.fPlugIns) json["plugIns"].push_back(WithBytesEscaped(plugIn));
  for (TNotRecorded const& row : index.fNotRecorded)
    json["notRecorded"].push_back({{"file", WithBytesEscaped(row.fFile)}, {"reason", WithBytesEscaped(row.fReason)}});
  for (TRecordedMember const& member : index.fMembers) json["members"].push_back(AsJson(member));
  return json.dump(1) + "\n";
}

TRecordingIndex IndexFrom(std::string const& text) {
  try {
    return Read(ParsedWithinBounds(text, kIndexBounds));
  } catch (TStoredReportError const& failure) {
    ThrowUnsound(failure.what());
  } catch (TJson::exception const& failure) {
    ThrowUnsound(Printable(failure.what()));
  }
}

std::string TimeText(std::time_t time) {
  std::tm utc{};
  ::gmtime_r(&time, &utc);
  char text[sizeof "2026-11-23T04:05:06Z"];
  std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &utc);
  return text;
}

bool IsTimeText(std::string const& text) {
  std::tm utc{};
  char const* const end = ::strptime(text.c_str(), "%Y-%m-%dT%H:%M:%SZ", &utc);
  return end != nullptr && TimeText(::timegm(&utc)) == text;
}

}  // namespace NQRVZEP20::zep
