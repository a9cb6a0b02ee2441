// SPDX-License-Identifier: Apache-2.0

// zep verify: whether a bundle is as its manifest says, and who signed it.

#include "collect/SafeText.h"
#include "tools/zep/bundle/CheckBundle.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/packing/Archive.h"
#include "tools/zep/secrets/Secrets.h"

#include <CLI/CLI.hpp>

#include <filesystem>
#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TVerifyArguments {
  std::string fFile;
  bool fAsJson = false;
  TTrust fTrust;
};

std::string LineOf(TBundleDifference const& row) { return row.fMember + ": " + row.fReason; }

std::string ReasonOf(TBundleCheck const& check) {
  auto const& rows = check.fDifferences;
  if (rows.size() < 2) return rows.empty() ? "" : LineOf(rows.front());
  return std::to_string(rows.size()) + " differences, of which the first is " + LineOf(rows.front());
}

// The sentence about the signature of a bundle that is right.
std::string TextAboutSigner(TBundleCheck const& check, bool isTrusted) {
  if (check.fSigner.empty()) return "It is not signed: anyone can have made it.";
  if (isTrusted) return "Signed by " + check.fSigner + ", whom you trust.";
  return "Signed with the certificate of " + check.fSigner +
         ", which was not checked: anyone can make such a certificate. --signer or --ca checks it.";
}

std::string TextAbout(TBundleCheck const& check, TVerifyArguments const& arguments) {
  TBundleManifest const& manifest = check.fManifest;
  std::string text = Printable(arguments.fFile) + ": a bundle that zep " + Printable(manifest.fTool) + " made at " +
                     Printable(manifest.fTime) + "\n";
  for (TBundledPiece const& piece : manifest.fPieces)
    text += piece.fName + ": " + std::to_string(piece.fBytes) + " bytes; " + Printable(piece.fObtained) + "\n";
  for (TMissingPiece const& row : manifest.fMissing) text += "Missing: " + Printable(row.fPiece + ": " + row.fReason) + "\n";
  for (TBundleDifference const& row : check.fDifferences) text += "Wrong: " + Printable(LineOf(row)) + "\n";
  if (!check.IsRight()) return text + "The bundle is not right.\n";
  return text + "All pieces are as the manifest says. " + Printable(TextAboutSigner(check, arguments.fTrust.IsWanted())) + "\n";
}

TJson DocumentAbout(TBundleCheck const& check, TVerifyArguments const& arguments, EExitStatus status) {
  TBundleManifest const& manifest = check.fManifest;
  TJson document = DocumentHead("zep verify", status, ReasonOf(check));
  document["file"] = MessageWithoutSecrets(arguments.fFile);
  document["zepVersion"] = manifest.fTool;
  document["time"] = manifest.fTime;
  document["redacted"] = manifest.fRedacted;
  document["pieces"] = TJson::array();
  for (TBundledPiece const& piece : manifest.fPieces)
    document["pieces"].push_back(
        {{"name", piece.fName}, {"bytes", piece.fBytes}, {"sha256", piece.fSha256}, {"obtained", piece.fObtained}});
  document["missing"] = TJson::array();
  for (TMissingPiece const& row : manifest.fMissing)
    document["missing"].push_back({{"piece", row.fPiece}, {"reason", row.fReason}});
  document["differences"] = TJson::array();
  for (TBundleDifference const& row : check.fDifferences)
    document["differences"].push_back({{"member", row.fMember}, {"reason", row.fReason}});
  document["signed"] = manifest.fIsSigned;
  document["signer"] = OrNull(check.fSigner);
  document["isTrusted"] = !check.fSigner.empty() && arguments.fTrust.IsWanted();
  return document;
}

TBundleCheck CheckOrThrow(TVerifyArguments const& arguments) {
  std::error_code ignored;
  std::string const name = Printable(arguments.fFile);
  if (!std::filesystem::is_regular_file(arguments.fFile, ignored))
    throw TFailure(kExitNoInput, name + " cannot be read: it is not a file");
  try {
    return CheckBundle(arguments.fFile, arguments.fTrust);
  } catch (TArchiveError const& failure) {
    throw TFailure(kExitNoInput, name + " is refused: " + failure.what());
  }
}

int Verify(TVerifyArguments const& arguments) {
  TBundleCheck const check = CheckOrThrow(arguments);
  EExitStatus const status = check.IsRight() ? kExitComplete : kExitNothing;
  if (arguments.fAsJson)
    WriteOutput(zep::AsText(DocumentAbout(check, arguments, status)));
  else
    WriteMessage(TextAbout(check, arguments));
  return status;
}

}  // namespace

TRun AddVerifyArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TVerifyArguments>();
  command.add_option("file", arguments->fFile, "The bundle, the output of zep report --bundle")->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document");
  auto* const signer =
      command
          .add_option("--signer", arguments->fTrust.fSignerFile, "The bundle must be signed with this certificate, a file in PEM")
          ->type_name("FILE");
  command
      .add_option("--ca", arguments->fTrust.fAuthoritiesFile,
                  "The bundle must be signed with a certificate that one of these issued, directly or not; a file in PEM")
      ->type_name("FILE")
      ->excludes(signer);
  command.footer(
      "Without --signer and --ca a signature is checked, but not whose it is.\n\n"
      "Exit status: 0 when the bundle is as its manifest and its signature say, 1 when it is not or the signer is not trusted,\n"
      "64 for wrong usage, 66 when a file cannot be read, or is cut or not a bundle.");
  return [arguments] { return Verify(*arguments); };
}

}  // namespace NQRVZEP20::zep
