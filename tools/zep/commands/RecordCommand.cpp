// SPDX-License-Identifier: Apache-2.0

// zep record: what the plug-ins read of this machine, in one file.

#include "collect/SafeText.h"
#include "providers/reasons/RecordedMark.h"
#include "tools/zep/commands/Commands.h"
#include "tools/zep/commands/Providers.h"
#include "tools/zep/commands/Thresholds.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Output.h"
#include "tools/zep/output/OutputFile.h"
#include "tools/zep/processes/Interrupts.h"
#include "tools/zep/recording/TRecorder.h"
#include "tools/zep/secrets/Secrets.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace NQRVZEP20::zep {

namespace {

struct TRecordArguments {
  std::string fFile;
  bool fAsJson = false;
  TPlugInArguments fPlugIns;
};

// The members of a recording by what they stand for.
struct TMemberCounts {
  std::size_t fFiles = 0, fRefused = 0, fListed = 0;
  std::uint64_t fBytes = 0;
};

TMemberCounts CountsOf(TRecordingIndex const& index) {
  TMemberCounts counts;
  for (TRecordedMember const& recorded : index.fMembers) {
    if (recorded.fMember.fKind != EMemberKind::kFile) continue;
    if (recorded.fMark.empty()) {
      ++counts.fFiles;
      counts.fBytes += recorded.fBytes;
    } else if (recorded.fMark == kListedMark || recorded.fMark == kSpecialMark) {
      ++counts.fListed;
    } else {
      ++counts.fRefused;
    }
  }
  return counts;
}

std::string ReasonOf(TRecordingIndex const& index) {
  std::string names;
  for (TNotRecorded const& row : index.fNotRecorded) names += (names.empty() ? "" : ", ") + row.fFile;
  if (!names.empty()) return "not everything was recorded: " + names;
  return index.fPlugIns.empty() ? "no plug-in was recorded" : "";
}

std::string TextAbout(std::string const& file, TRecordingIndex const& index, std::size_t size) {
  TMemberCounts const counts = CountsOf(index);
  std::string text =
      "The recording " + Printable(file) + " has " + std::to_string(counts.fFiles) + " files and answers with " +
      std::to_string(counts.fBytes) + " bytes, compressed to " + std::to_string(size) + ", and " +
      std::to_string(counts.fRefused) +
      " refusals.\nIt contains the kernel's command line and the mounts as they are, passwords in them included.\n";
  for (TNotRecorded const& row : index.fNotRecorded) text += "Not recorded: " + Printable(row.fFile + ": " + row.fReason) + "\n";
  return text;
}

TJson DocumentAbout(std::string const& file, TRecordingIndex const& index, std::size_t size, EExitStatus status) {
  TMemberCounts const counts = CountsOf(index);
  TJson document = DocumentHead("zep record", status, ReasonOf(index));
  document["file"] = MessageWithoutSecrets(file);
  document["bytes"] = size;
  document["time"] = index.fTime;
  document["files"] = counts.fFiles;
  document["fileBytes"] = counts.fBytes;
  document["refused"] = counts.fRefused;
  document["listed"] = counts.fListed;
  document["plugIns"] = index.fPlugIns;
  document["notRecorded"] = TJson::array();
  for (TNotRecorded const& row : index.fNotRecorded)
    document["notRecorded"].push_back({{"file", row.fFile}, {"reason", row.fReason}});
  return document;
}

EExitStatus StatusOf(TRecordingIndex const& index) {
  if (index.fPlugIns.empty()) return kExitNothing;
  return index.fNotRecorded.empty() ? kExitComplete : kExitPartial;
}

int Record(TRecordArguments const& arguments) {
  TInterruptGuard const guard;
  TRecorder const recorder;
  auto const [index, archive] = recorder.Finish(LoadPlugInsFor(arguments.fPlugIns, std::nullopt), ThresholdSettings());
  ThrowIfInterrupted();
  WritePrivateFile(arguments.fFile, archive);
  EExitStatus const status = StatusOf(index);
  if (arguments.fAsJson)
    WriteOutput(zep::AsText(DocumentAbout(arguments.fFile, index, archive.size(), status)));
  else
    WriteMessage(TextAbout(arguments.fFile, index, archive.size()));
  return status;
}

}  // namespace

TRun AddRecordArguments(CLI::App& command) {
  auto const arguments = std::make_shared<TRecordArguments>();
  command.add_option("file", arguments->fFile, "The recording to write, a zstd-compressed tar archive")->required();
  command.add_flag("--json", arguments->fAsJson, "Print one JSON document about the recording");
  AddPlugInOptions(command, arguments->fPlugIns);
  command.footer(
      "The recording has what the plug-ins read: firmware tables, files of the kernel, the output of programs and the\n"
      "answers of the management controller. It has them unchanged: passwords, too, that are parameters of the kernel or\n"
      "options of a mount. It identifies the machine and its hardware: pass it on only to those who may see that. Only its owner "
      "can read the file.\n\n"
      "Exit status: 0 when all plug-ins were recorded, 2 when some were not, 1 when none was or the recording is too large,\n"
      "64 for wrong usage, 73 when the file cannot be written.");
  return [arguments] { return Record(*arguments); };
}

}  // namespace NQRVZEP20::zep
