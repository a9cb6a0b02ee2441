// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/bundle/TBundle.h"

#include "tools/zep/packing/Archive.h"
#include "tools/zep/recording/RecordingIndex.h"
#include "tools/zep/transfer/Sha256.h"

#include <ctime>
#include <utility>

namespace NQRVZEP20::zep {

TBundle::TBundle(std::vector<std::string> redacted) {
  fManifest.fTool = ZEP_VERSION;
  fManifest.fRedacted = std::move(redacted);
}

void TBundle::Add(std::string const& piece, std::string content, std::string const& obtained) {
  if (content.size() > MostBytesOf(piece))
    return AddMissing(
        piece, "it would have " + std::to_string(content.size()) + " bytes; the limit is " + std::to_string(MostBytesOf(piece)));
  fManifest.fPieces.push_back({piece, content.size(), Sha256OfText(content), obtained});
  fContents.push_back(std::move(content));
}

std::string TBundle::Pack(TSigner const* signer) {
  std::time_t const now = std::time(nullptr);
  fManifest.fTime = TimeText(now);
  fManifest.fIsSigned = signer != nullptr;
  std::string const manifest = TextOf(fManifest);
  auto const archive = NewArchiveWriter();
  auto const add = [&](std::string const& name, std::string const& content) {
    archive->Add({EMemberKind::kFile, name, {}, 0600, {now, 0}}, content);
  };
  add(kManifestName, manifest);
  if (signer != nullptr) add(kSignatureName, signer->Sign(manifest));
  for (std::size_t at = 0; at < fContents.size(); ++at) add(fManifest.fPieces[at].fName, fContents[at]);
  return archive->Finish();
}

}  // namespace NQRVZEP20::zep
