// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/BundleManifest.h"

#include "collect/SafeText.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/packing/Archive.h"
#include "tools/zep/recording/RecordingIndex.h"

#include <set>

namespace NQRVZEP20::zep {

namespace {

constexpr std::uint64_t kMebibyte = std::uint64_t(1) << 20;

struct TLimit {
  char const* fPiece;
  std::uint64_t fBytes;
};
constexpr TLimit kLimits[] = {
    {kReportPiece, 256 * kMebibyte},
    {kPagePiece, 256 * kMebibyte},
    {kRecordingPiece, 512 * kMebibyte},
    {kLogPiece, 64 * kMebibyte},
};

[[noreturn]] void ThrowUnsound(std::string const& why) {
  throw TArchiveError(std::string(kManifestName) + " is not sound: " + why);
}

bool IsSha256(std::string const& text) { return text.size() == 64 && text.find_first_not_of("0123456789abcdef") == text.npos; }

TBundledPiece PieceFrom(TJson const& json) {
  TBundledPiece piece{json.at("name").get<std::string>(), json.at("bytes").get<std::uint64_t>(),
                      json.at("sha256").get<std::string>(), json.at("obtained").get<std::string>()};
  std::string const name = Printable(piece.fName);
  std::uint64_t const most = MostBytesOf(piece.fName);
  if (most == 0) ThrowUnsound("no bundle has a piece " + name);
  if (piece.fBytes > most) ThrowUnsound(name + " has more than " + std::to_string(most) + " bytes");
  if (!IsSha256(piece.fSha256)) ThrowUnsound("the SHA-256 of " + name + " has not 64 hexadecimal digits");
  return piece;
}

void CheckVersion(TJson const& json) {
  TJson const& version = json.at("bundleVersion");
  if (version.is_number_unsigned() && version.get<std::uint64_t>() == kBundleVersion) return;
  throw TArchiveError("it is a bundle of the version " + Printable(version.dump()) + ", written by zep " +
                      Printable(json.value("zepVersion", "?")) + "; this zep reads only the version " +
                      std::to_string(kBundleVersion));
}

TBundleManifest Read(TJson const& json) {
  CheckVersion(json);
  TBundleManifest manifest;
  manifest.fTime = json.at("time").get<std::string>();
  if (!IsTimeText(manifest.fTime)) ThrowUnsound("its time is invalid");
  manifest.fTool = json.at("zepVersion").get<std::string>();
  manifest.fIsSigned = json.at("signed").get<bool>();
  manifest.fRedacted = json.at("redacted").get<std::vector<std::string>>();
  std::set<std::string> names;
  for (TJson const& row : json.at("pieces")) {
    manifest.fPieces.push_back(PieceFrom(row));
    if (!names.insert(manifest.fPieces.back().fName).second) ThrowUnsound(manifest.fPieces.back().fName + " is named twice");
  }
  for (TJson const& row : json.at("missing"))
    manifest.fMissing.push_back({row.at("piece").get<std::string>(), row.at("reason").get<std::string>()});
  return manifest;
}

}  // namespace

std::uint64_t MostBytesOf(std::string const& piece) {
  for (TLimit const& limit : kLimits)
    if (piece == limit.fPiece) return limit.fBytes;
  return 0;
}

std::string TextOf(TBundleManifest const& manifest) {
  TJson json{{"bundleVersion", kBundleVersion}, {"zepVersion", manifest.fTool},   {"time", manifest.fTime},
             {"signed", manifest.fIsSigned},    {"redacted", manifest.fRedacted}, {"pieces", TJson::array()},
             {"missing", TJson::array()}};
  for (TBundledPiece const& piece : manifest.fPieces)
    json["pieces"].push_back(
        {{"name", piece.fName}, {"bytes", piece.fBytes}, {"sha256", piece.fSha256}, {"obtained", piece.fObtained}});
  for (TMissingPiece const& row : manifest.fMissing) json["missing"].push_back({{"piece", row.fPiece}, {"reason", row.fReason}});
  return json.dump(1, ' ', false, TJson::error_handler_t::replace) + "\n";
}

TBundleManifest ManifestFrom(std::string const& text) {
  try {
    return Read(ParsedWithinBounds(text));
  } catch (TStoredReportError const& failure) {
    ThrowUnsound(failure.what());
  } catch (TJson::exception const& failure) {
    ThrowUnsound(Printable(failure.what()));
  }
}

}  // namespace NQRVZEP20::zep
