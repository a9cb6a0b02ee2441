// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/bundle/TBundle.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/recording/TRecorder.h"

#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace NQRVZEP20::zep {

struct TBundleArguments {
  std::string fFile;         // empty: no bundle
  std::string fKey;          // empty: it is not signed
  std::string fCertificate;  // empty: it is in the file of the key

  bool IsWanted() const { return !fFile.empty(); }
};

// Adds --bundle, --sign and --certificate.
void AddBundleOptions(CLI::App& command, TBundleArguments& arguments);

// Throws TFailure with kExitNoInput if a bundle is to be signed and cannot be with these files. Call it before the report is
// made.
void CheckSigning(TBundleArguments const& arguments);

// What a bundle has besides the report itself.
struct TEvidence {
  std::string fMaking;                    // how the report was made: "made by zep 1.2 from ..."
  std::optional<std::string> fRecording;  // the file
  std::string fRecordingMaking;           // how it was obtained
  std::optional<std::string> fLog;        // redacted if the report is
  std::vector<TMissingPiece> fMissing;
  std::string fFailure;  // why a part of the recording is missing that should be in the bundle; otherwise empty
};

// Collects the evidence of a report on a machine while it is made. While an object exists, plug-ins that are loaded record what
// they read.
class TEvidenceReading {
public:
  // `replayed`: the recording that the plug-ins read; empty for this machine. `whyNoRecording`: not empty if there shall be none.
  TEvidenceReading(std::string const& replayed, std::string const& whyNoRecording);

  // Throws TFailure after an interrupt, and with kExitNotWritten if the temporary directory is full, because the report then
  // lacks what could not be recorded. A recording that fails otherwise is missing.
  TEvidence Finish(std::vector<TPlugIn> const& plugIns);

private:
  void AddRecording(TEvidence& evidence, std::vector<TPlugIn> const& plugIns) const;

  std::string fReplayed, fWhyNot, fFailure;
  std::optional<TRecorder> fRecorder;
};

// The evidence of a stored report.
TEvidence EvidenceOfStored();

// The kinds of secrets that are redacted in the document of a report. Throws TRedactionError if it does not have them.
std::vector<std::string> RedactedKinds(TJson const& document);

// Packs, signs and writes the bundle of the report whose document has this text, and returns its manifest. Throws like
// WritePrivateFile, and TFailure after an interrupt. A page that cannot be made is missing.
TBundleManifest WriteBundle(TBundleArguments const& arguments, std::string const& text, std::vector<std::string> const& redacted,
                            TEvidence const& evidence);

// For people: "The bundle db1.tar.zst has 4 pieces, and is not signed.", and what is missing.
std::string TextAbout(TBundleManifest const& manifest, TBundleArguments const& arguments);

}  // namespace NQRVZEP20::zep
