// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/commands/Bundling.h"

#include "collect/FailureOf.h"
#include "collect/redaction/Redaction.h"
#include "collect/stored/StoredReport.h"
#include "tools/zep/bundle/CollectorLog.h"
#include "tools/zep/commands/Thresholds.h"
#include "tools/zep/html/ReportHtml.h"
#include "tools/zep/output/OutputFile.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/processes/Interrupts.h"

#include <CLI/CLI.hpp>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <utility>

namespace NQRVZEP20::zep {

namespace {

namespace fs = std::filesystem;

std::string NamesOf(std::vector<TPlugIn> const& plugIns) {
  std::vector<std::string> names;
  for (TPlugIn const& plugIn : plugIns) names.push_back(fs::path(plugIn.fFile).filename().string());
  return names.empty() ? "no plug-in" : "the plug-ins " + Joined(names, ", ");
}

std::string ReadRecording(std::string const& file) {
  if (fs::file_size(file) > MostBytesOf(kRecordingPiece))
    throw std::runtime_error("it is longer than " + ExactSizeText(MostBytesOf(kRecordingPiece)));
  std::ifstream stream(file, std::ios::binary);
  std::string content{std::istreambuf_iterator<char>(stream), {}};
  if (!stream) throw std::runtime_error("it cannot be read");
  return content;
}

void AddPage(TBundle& bundle, std::string const& document) {
  try {
    bundle.Add(kPagePiece, ReportAsHtml(StoredReportFrom(document, kReportPiece)), "made from " + std::string(kReportPiece));
  } catch (TStoredReportError const& failure) {
    bundle.AddMissing(kPagePiece, failure.what());
  }
}

}  // namespace

void AddBundleOptions(CLI::App& command, TBundleArguments& arguments) {
  auto* const bundle =
      command
          .add_option("--bundle", arguments.fFile,
                      "Write document, page, recording and log of the report to this file instead of printing it, with a\n"
                      "manifest of their checksums; zep verify checks it. Only its owner can read the file")
          ->type_name("FILE");
  auto* const sign =
      command.add_option("--sign", arguments.fKey, "Sign the manifest of the bundle with this private key, a file in PEM")
          ->type_name("KEY")
          ->needs(bundle);
  command
      .add_option("--certificate", arguments.fCertificate,
                  "The certificate of the key, and those of its issuers, if they are not in the same file")
      ->type_name("FILE")
      ->needs(sign);
  for (char const* other : {"--to-media", "--send", "--since", "--section", "--full", "--format"})
    bundle->excludes(command.get_option(other));
}

void CheckSigning(TBundleArguments const& arguments) {
  if (!arguments.fKey.empty()) SignerFrom(arguments.fKey, arguments.fCertificate);
}

// ---- The evidence ----

TEvidenceReading::TEvidenceReading(std::string const& replayed, std::string const& whyNoRecording)
    : fReplayed(replayed), fWhyNot(whyNoRecording) {
  if (fWhyNot.empty() && fReplayed.empty()) fFailure = FailureOf([&] { fRecorder.emplace(); });
}

TEvidence TEvidenceReading::Finish(std::vector<TPlugIn> const& plugIns) {
  if (fRecorder) fRecorder->CheckNothingIsLost();
  TEvidence evidence;
  evidence.fMaking = "made by zep " ZEP_VERSION " from the answers of " + NamesOf(plugIns) +
                     (fReplayed.empty() ? "" : ", which read a recording");
  std::string const failure = fFailure.empty() ? FailureOf([&] { AddRecording(evidence, plugIns); }) : fFailure;
  ThrowIfInterrupted();
  if (!failure.empty()) {
    evidence.fMissing.push_back({kRecordingPiece, failure});
    evidence.fFailure = "the bundle has no recording: " + failure;
  }
  evidence.fLog = CollectorLog(plugIns);
  return evidence;
}

void TEvidenceReading::AddRecording(TEvidence& evidence, std::vector<TPlugIn> const& plugIns) const {
  if (!fWhyNot.empty()) {
    evidence.fMissing.push_back({kRecordingPiece, fWhyNot});
  } else if (fRecorder) {
    TRecorder::TResult result = fRecorder->Finish(plugIns, ThresholdSettings());
    if (result.fIndex.fPlugIns.empty()) throw std::runtime_error("no plug-in was recorded");
    for (TNotRecorded const& row : result.fIndex.fNotRecorded) {
      evidence.fMissing.push_back({std::string(kRecordingPiece) + " of " + row.fFile, row.fReason});
      evidence.fFailure = "the recording in the bundle is not complete";
    }
    evidence.fRecording = std::move(result.fArchive);
    evidence.fRecordingMaking = "the bytes that the plug-ins read while " + std::string(kReportPiece) +
                                " was made: " + Joined(result.fIndex.fPlugIns, ", ");
  } else {
    evidence.fRecording = ReadRecording(fReplayed);
    evidence.fRecordingMaking = "the recording that the plug-ins read, unchanged";
  }
}

TEvidence EvidenceOfStored() {
  constexpr char const* why = "the report is a stored one, from which only its page is made";
  return {"a stored report, read again by zep " ZEP_VERSION, {}, "", {}, {{kRecordingPiece, why}, {kLogPiece, why}}, ""};
}

// ---- The bundle ----

std::vector<std::string> RedactedKinds(TJson const& document) {
  std::vector<std::string> names;
  if (!IsRedacted(document)) return names;
  for (ESecretKind const kind : RedactedWith(document).fKinds) names.push_back(NameOf(kind));
  return names;
}

TBundleManifest WriteBundle(TBundleArguments const& arguments, std::string const& text, std::vector<std::string> const& redacted,
                            TEvidence const& evidence) {
  TBundle bundle(redacted);
  bundle.Add(kReportPiece, text, evidence.fMaking);
  AddPage(bundle, text);
  if (evidence.fRecording) bundle.Add(kRecordingPiece, *evidence.fRecording, evidence.fRecordingMaking);
  if (evidence.fLog) bundle.Add(kLogPiece, *evidence.fLog, "the log of zep and its plug-ins, without passwords");
  for (TMissingPiece const& row : evidence.fMissing) bundle.AddMissing(row.fPiece, row.fReason);
  std::unique_ptr<TSigner> signer;
  if (!arguments.fKey.empty()) signer = SignerFrom(arguments.fKey, arguments.fCertificate);
  std::string const archive = bundle.Pack(signer.get());
  ThrowIfInterrupted();
  WritePrivateFile(arguments.fFile, archive);
  return bundle.Manifest();
}

std::string TextAbout(TBundleManifest const& manifest, TBundleArguments const& arguments) {
  std::string text = "The bundle " + Printable(arguments.fFile) + " has " + std::to_string(manifest.fPieces.size()) +
                     " pieces, and is " + (manifest.fIsSigned ? "" : "not ") + "signed.\n";
  for (TMissingPiece const& row : manifest.fMissing) text += "Missing: " + Printable(row.fPiece + ": " + row.fReason) + "\n";
  return text;
}

}  // namespace NQRVZEP20::zep
