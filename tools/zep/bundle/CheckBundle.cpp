// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/CheckBundle.h"

#include "collect/SafeText.h"
#include "tools/zep/packing/Archive.h"
#include "tools/zep/packing/Checksum.h"

#include <map>
#include <set>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

constexpr std::uint64_t kMostForeignBytes = std::uint64_t(16) << 20;  // of a member that no bundle has
constexpr std::size_t kMostMembers = 100;

char const* NameOf(EMemberKind kind) {
  if (kind == EMemberKind::kLink) return "it is a symbolic link";
  return kind == EMemberKind::kDirectory ? "it is a directory" : "it is a hard link or a special file";
}

class TBundleReading {
public:
  TBundleReading(std::string const& file, TTrust const& trust)
      : fVerifier(VerifierFor(trust)), fIsTrustWanted(trust.IsWanted()), fArchive(NewArchiveReader(file)) {}

  TBundleCheck Run() {
    ReadManifest();
    while (auto const member = fArchive->Next()) {
      if (fSeen.size() == kMostMembers) throw TArchiveError("it has more than " + std::to_string(kMostMembers) + " members");
      Read(*member);
    }
    CheckSignature();
    for (auto const& [name, piece] : fExpected) Differ(name, "it is missing");
    return std::move(fCheck);
  }

private:
  void ReadManifest() {
    auto const first = fArchive->Next();
    if (!first || first->fName != kManifestName || first->fKind != EMemberKind::kFile)
      throw TArchiveError(std::string("it is not a bundle: its first member is not ") + kManifestName);
    fManifestText = fArchive->Content(kMostManifestBytes);
    fCheck.fManifest = ManifestFrom(fManifestText);
    for (TBundledPiece const& piece : fCheck.fManifest.fPieces) fExpected.emplace(piece.fName, &piece);
    fSeen.insert(kManifestName);
  }

  void Read(TMember const& member) {
    bool const isFile = member.fKind == EMemberKind::kFile;
    if (!fSeen.insert(member.fName).second) {
      Differ(member.fName, "it is contained twice");
      if (isFile) Skip(member.fName);
    } else if (!isFile) {
      Differ(member.fName, NameOf(member.fKind));
      fExpected.erase(member.fName);
    } else if (member.fName == kSignatureName && fCheck.fManifest.fIsSigned) {
      fSignature = fArchive->Content(kMostManifestBytes);
    } else if (auto const at = fExpected.find(member.fName); at != fExpected.end()) {
      Compare(*at->second);
      fExpected.erase(at);
    } else {
      Differ(member.fName, "the manifest does not name it");
      Skip(member.fName);
    }
  }

  void Compare(TBundledPiece const& piece) {
    auto const sum = NewSha256();
    std::uint64_t bytes = 0;
    fArchive->Read(MostBytesOf(piece.fName), [&](std::string_view part) {
      sum->Add(part);
      bytes += part.size();
    });
    if (bytes != piece.fBytes)
      Differ(piece.fName, "it has " + std::to_string(bytes) + " bytes instead of " + std::to_string(piece.fBytes));
    else if (sum->Digits() != piece.fSha256)
      Differ(piece.fName, "its content was altered: its SHA-256 differs");
  }

  // The content must be unpacked to reach the next member.
  void Skip(std::string const& name) {
    std::uint64_t const most = MostBytesOf(name);
    fArchive->Read(most != 0 ? most : kMostForeignBytes, [](std::string_view) {});
  }

  void CheckSignature() {
    if (!fCheck.fManifest.fIsSigned) {
      if (fIsTrustWanted) Differ(kSignatureName, "the bundle is not signed, so its signer cannot be checked");
      return;
    }
    if (fSeen.count(kSignatureName) == 0) return Differ(kSignatureName, "it is missing, and the manifest says that there is one");
    try {
      fCheck.fSigner = fVerifier->Verify(fManifestText, fSignature);
    } catch (TSignatureError const& failure) {
      Differ(kSignatureName, failure.what());
    }
  }

  void Differ(std::string const& member, std::string const& reason) {
    fCheck.fDifferences.push_back({Shortened(member, 1000), reason});
  }

  std::unique_ptr<TVerifier> const fVerifier;
  bool const fIsTrustWanted;
  std::unique_ptr<TArchiveReader> const fArchive;
  TBundleCheck fCheck;
  std::string fManifestText, fSignature;
  std::map<std::string, TBundledPiece const*> fExpected;
  std::set<std::string> fSeen;
};

}  // namespace

TBundleCheck CheckBundle(std::string const& file, TTrust const& trust) { return TBundleReading(file, trust).Run(); }

}  // namespace NQRVZEP20::zep
