// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/AgeText.h"
#include "collect/findings/Rules.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <string>
#include <tuple>

namespace NQRVZEP20 {

namespace {

// Values of Kind and PerceivedSeverity of ZEP_KernelLogRecord.
enum EKind : std::uint64_t {
  kOutOfMemory = 1,
  kProcessor = 2,
  kMemory = 3,
  kPciExpress = 4,
  kHardware = 5,
  kDisk = 6,
  kFileSystem = 7
};
constexpr std::uint64_t kDegraded = 3, kMinor = 4;

// Records of the log that report the same problem.
struct TRepeated {
  TElement fNewest;
  std::uint64_t fCount;
  std::uint64_t fAge;  // of the newest, in seconds
};

// Kind, severity and subject.
using TProblemKey = std::tuple<std::uint64_t, std::uint64_t, std::string>;
using TRepeatedByKey = std::map<TProblemKey, TRepeated>;

std::string SubjectOf(TElement const& record) {
  auto const subject = record.Text("Subject");
  return subject.IsKnown() ? *subject.fValue : "";
}

void NoteCount(TRuleRun& run, TElement const& log, char const* property, std::string const& reason) {
  auto const count = log.Number(property);
  if (run.Know(log, count) && *count.fValue > 0) run.NoteNotAsked({reason + std::to_string(*count.fValue), log.Path()});
}

// The records that no rule can judge; without the number of records, not all of them were read.
void NoteMissingRecords(TRuleRun& run, TElement const& log) {
  run.Know(log, log.Number("CurrentNumberOfRecords"));
  NoteCount(run, log, "GoneRecords", "older records of the log are gone: ");
  NoteCount(run, log, "LeftOutRecords", "older records about errors were left out: ");
  NoteCount(run, log, "UnreadableRecords", "records of the log have an unknown form: ");
}

// The records of these kinds that are young enough. Without the log, notes why the rule could not be asked.
TRepeatedByKey RecordsOf(TRuleRun& run, std::initializer_list<EKind> kinds) {
  TRepeatedByKey problems;
  for (TElement const& log : run.TryElements("ZEP_KernelLog")) NoteMissingRecords(run, log);
  for (TElement const& record : run.Elements("ZEP_KernelLogRecord")) {
    auto const kind = record.Number("Kind"), severity = record.Number("PerceivedSeverity"), age = record.Number("Age");
    if (!run.Know(record, kind) || !run.Know(record, severity) || !run.Know(record, age)) continue;
    if (std::find(kinds.begin(), kinds.end(), *kind.fValue) == kinds.end()) continue;
    if (*age.fValue > run.Thresholds().fKernelLogDays * kSecondsOfADay) continue;
    TRepeated& problem =
        problems.try_emplace({*kind.fValue, *severity.fValue, SubjectOf(record)}, TRepeated{record, 0, *age.fValue})
            .first->second;
    ++problem.fCount;
    if (*age.fValue <= problem.fAge) problem.fNewest = record, problem.fAge = *age.fValue;
  }
  return problems;
}

// ", 3 times, most recently 5 hours ago"
std::string Often(TRepeated const& problem) {
  if (problem.fCount == 1) return ", " + AgeText(problem.fAge);
  return ", " + std::to_string(problem.fCount) + " times, most recently " + AgeText(problem.fAge);
}

std::string MessageOf(TRepeated const& problem) {
  auto const text = problem.fNewest.Text("RecordData");
  return text.IsKnown() ? " (" + text.fValue->substr(0, text.fValue->find('\n')) + ")" : "";
}

void AddProblem(TRuleRun& run, TRepeated const& problem, ESeverity severity, std::string const& reason,
                std::string const& remedy) {
  run.Add(problem.fNewest, problem.fNewest.Number("Kind").fSource, severity, reason,
          remedy + " dmesg --clear removes the record from this list.");
}

void AskOutOfMemory(TRuleRun& run) {
  for (auto const& [key, problem] : RecordsOf(run, {kOutOfMemory})) {
    auto const& [kind, severity, process] = key;
    if (severity == kMinor)
      AddProblem(
          run, problem, ESeverity::kWarning,
          "the kernel killed the process " + process + " because its control group had reached its memory limit" + Often(problem),
          "Raise the limit of the service or container (MemoryMax), or find out why it needs so much memory.");
    else
      AddProblem(
          run, problem, ESeverity::kError,
          "the kernel killed the process " + process + " because no memory was left" + Often(problem),
          "Add memory or swap space, or limit the memory of the services; journalctl -k lists the memory of each process.");
  }
}

struct TKindWords {
  std::uint64_t fKind;
  char const *fName, *fRemedy;
};
constexpr TKindWords kHardwareKinds[] = {
    {kProcessor, "the processor (machine check)",
     "Update firmware and microcode; if errors go on, replace the processor or the memory."},
    {kMemory, "the memory", "Replace the memory module."},
    {kPciExpress, "a PCI Express device", "Seat the card anew; if errors go on, replace the card or the riser."},
    {kHardware, "the hardware", "Read the event log of the management controller, and replace the part that it names."},
};

TKindWords const& WordsOf(std::uint64_t kind) {
  for (TKindWords const& words : kHardwareKinds)
    if (words.fKind == kind) return words;
  return kHardwareKinds[std::size(kHardwareKinds) - 1];
}

void AskHardware(TRuleRun& run) {
  for (auto const& [key, problem] : RecordsOf(run, {kProcessor, kMemory, kPciExpress, kHardware})) {
    auto const& [kind, severity, subject] = key;
    bool const isCorrected = severity <= kDegraded;
    AddProblem(run, problem, isCorrected ? ESeverity::kInformation : ESeverity::kError,
               std::string("the kernel reports ") + (isCorrected ? "a corrected error of " : "an error of ") +
                   WordsOf(kind).fName + (subject.empty() ? "" : " " + subject) + Often(problem) + MessageOf(problem),
               isCorrected ? "Watch whether such errors become frequent." : WordsOf(kind).fRemedy);
  }
}

// Whether a SCSI, SATA or USB disk, or the one that has this partition, has vanished since the error: someone may have pulled out
// a USB stick.
bool WasRemoved(TRuleRun const& run, std::string const& disk) {
  if (disk.compare(0, 2, "sd") != 0) return false;
  std::string const withoutPartition = disk.substr(0, disk.find_last_not_of("0123456789") + 1);
  auto const drives = run.TryElements("CIM_MediaAccessDevice");
  return !drives.empty() && std::none_of(drives.begin(), drives.end(), [&](TElement const& drive) {
    auto const name = drive.Text("DeviceID");
    return name.IsKnown() && *name.fValue == withoutPartition;
  });
}

constexpr char const* kVanished = ", which has vanished since";

void AddDiskProblem(TRuleRun& run, std::string const& disk, std::uint64_t severity, TRepeated const& problem) {
  bool const wasRemoved = WasRemoved(run, disk);
  AddProblem(run, problem, severity == kMinor || wasRemoved ? ESeverity::kWarning : ESeverity::kError,
             "the kernel reports an input or output error of the disk " + disk + (wasRemoved ? kVanished : "") + Often(problem) +
                 MessageOf(problem),
             wasRemoved ? "Check its cable and power, unless it was removed on purpose."
                        : "Save the data; check cable and power of the disk, and its health (smartctl -x), and replace it.");
}

void AddFileSystemProblem(TRuleRun& run, std::string const& device, TRepeated const& problem) {
  bool const wasRemoved = WasRemoved(run, device);
  AddProblem(run, problem, wasRemoved ? ESeverity::kWarning : ESeverity::kError,
             "the kernel reports an error of the file system on " + device + (wasRemoved ? kVanished : "") + Often(problem) +
                 MessageOf(problem),
             wasRemoved
                 ? "Check the cable and power of the disk, unless it was removed on purpose, and the file system before it is "
                   "mounted again (fsck)."
                 : "Save the data, look for errors of the disk, and check the file system while it is not mounted (fsck).");
}

void AskDisks(TRuleRun& run) {
  for (auto const& [key, problem] : RecordsOf(run, {kDisk, kFileSystem})) {
    auto const& [kind, severity, subject] = key;
    if (kind == kFileSystem)
      AddFileSystemProblem(run, subject, problem);
    else
      AddDiskProblem(run, subject, severity, problem);
  }
}

}  // namespace

std::vector<TRule> LogRules() {
  return {{"out-of-memory", "Has the kernel killed a process for lack of memory?", AskOutOfMemory},
          {"hardware-errors", "Does the kernel's log report errors of the hardware?", AskHardware},
          {"disk-errors", "Does the kernel's log report errors of disks or file systems?", AskDisks}};
}

}  // namespace NQRVZEP20
