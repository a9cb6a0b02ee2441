// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The member manifest.json of a bundle, which names all others (docs/formats.md, "Bundles").

constexpr char const* kManifestName = "manifest.json";
constexpr char const* kSignatureName = "manifest.p7s";

// The pieces, in their order in a bundle.
constexpr char const* kReportPiece = "report.json";
constexpr char const* kPagePiece = "report.html";
constexpr char const* kRecordingPiece = "recording.tar.zst";
constexpr char const* kLogPiece = "log/zep.log";

constexpr int kBundleVersion = 1;
constexpr std::uint64_t kMostManifestBytes = std::uint64_t(1) << 20;  // and of the signature

// The most bytes of the piece of that name; 0 if a bundle has no such piece.
std::uint64_t MostBytesOf(std::string const& piece);

struct TBundledPiece {
  std::string fName;
  std::uint64_t fBytes;
  std::string fSha256;    // 64 hexadecimal digits
  std::string fObtained;  // how zep got it, for people
};

// A piece, or a part of one, that the bundle does not have.
struct TMissingPiece {
  std::string fPiece;
  std::string fReason;
};

struct TBundleManifest {
  std::string fTime;  // when the bundle was made: "2026-11-23T04:05:06Z"
  std::string fTool;  // the version of zep
  bool fIsSigned = false;
  std::vector<std::string> fRedacted;  // the kinds of secrets that were replaced in all pieces: "serials"
  std::vector<TBundledPiece> fPieces;
  std::vector<TMissingPiece> fMissing;
};

std::string TextOf(TBundleManifest const& manifest);

// Throws TArchiveError if the text is not a manifest, is that of a newer version, or names a piece twice or one that no bundle
// has.
TBundleManifest ManifestFrom(std::string const& text);

}  // namespace NQRVZEP20::zep
