// SPDX-License-Identifier: Apache-2.0
#include "TSmbiosReader.h"

#include "loaders/SmbiosLibrary.h"

#include <cstdlib>
#include <cstring>
#include <optional>
#include <system_error>

namespace NQRVZEP20 {

namespace {

constexpr char const* kTableFileVariable = "ZEP_SMBIOS_TABLE";
constexpr char const* kKernelTable = "/sys/firmware/dmi/tables/DMI";
constexpr char const* kKernelEntryPoint = "/sys/firmware/dmi/tables/smbios_entry_point";

constexpr std::size_t kLargestStructure = 64 * 1024;  // a longer structure is truncated
constexpr std::size_t kMostStructures = 4096;         // of one type: a library may return structures endlessly

std::string NamedFile() {
  char const* file = std::getenv(kTableFileVariable);
  return file != nullptr ? file : "";
}

// ": Too many open files"; empty when the library has left no errno.
std::string Reason(int status, int error) {
  return status == kSmbiosFileSystemError && error != 0 ? ": " + std::generic_category().message(error) : "";
}

std::string const kSystemTables = "the system's SMBIOS tables";

TMissing const kNeedsRoot{kMissingNeedsRoot, "only root can read the SMBIOS tables"};

// The path at which libsmbios.so reads the kernel's tables. The entry point beside them is read there, too.
std::string KernelFile(TMachineFiles const& files) {
  files.Outside(kKernelEntryPoint);
  return files.Outside(kKernelTable);
}

// Why a recording has no tables; none if it has them. libsmbios.so does not know the marks of a recording, and would read one as
// a table. The reason is that of the recorded machine (WhyTablesFailed).
std::optional<TMissing> WhyNotInRecording(TMachineFiles const& files, std::string const& namedFile) {
  if (!namedFile.empty() || (files.IsThisMachine() && !files.IsBeingRecorded()) || !files.Exists(kKernelTable))
    return std::nullopt;
  auto const start = files.Bytes(kKernelTable, 0, 1);
  if (start) return std::nullopt;
  if (start.Why().fCode == kMissingNeedsRoot) return kNeedsRoot;
  std::string const& reason = start.Why().fReason;  // begins with the path: "... cannot be read: Input/output error"
  return TMissing{kMissingUnreadable, kSystemTables + reason.substr(std::strlen(kKernelTable))};
}

TMissing WhyNotLoaded(TLoadOutcome const& outcome) {
  if (outcome.fKind == TLoadOutcome::kNotLoaded)
    return {kMissingUnreadable, "the SMBIOS library cannot be loaded: " + outcome.fReason};
  return {kMissingUnreadable, "libsmbios.so lacks a function that is required"};
}

TMissing WhyTablesFailed(TSmbiosTables const& tables, std::string const& tableFile) {
  int const status = tables.OpenStatus();
  int const error = tables.OpenError();
  if (!tableFile.empty()) {
    std::string const what = "the SMBIOS table file " + tableFile;
    if (status == kSmbiosFileNotFound) return {kMissingUnreadable, what + " does not exist"};
    if (status == kSmbiosAccessDenied) return {kMissingUnreadable, what + " cannot be read: this user lacks the permission"};
    if (status == kSmbiosFileSystemError) return {kMissingUnreadable, what + " cannot be read" + Reason(status, error)};
    return {kMissingUnreadable, what + " does not contain an SMBIOS table"};
  }
  if (status == kSmbiosFileNotFound) return {kMissingNoTables, "the system exports no SMBIOS tables"};
  if (status == kSmbiosAccessDenied) return kNeedsRoot;
  return {kMissingUnreadable, kSystemTables + " cannot be read" + Reason(status, error)};
}

// The structure that `get` copies; empty when it copies none.
std::vector<unsigned char> Read(TSmbiosTables& tables, decltype(&TSmbiosTables::GetFirst) get, int type) {
  std::vector<unsigned char> buffer(kLargestStructure);
  int length = 0;
  if ((tables.*get)(type, buffer.data(), static_cast<int>(buffer.size()), length) != kSmbiosOk) return {};
  buffer.resize(static_cast<std::size_t>(length));
  return buffer;
}

char const* NameOf(int type) {
  switch (type) {
    case kSmbiosBios:
      return "BIOS Information";
    case kSmbiosSystem:
      return "System Information";
    case kSmbiosBoard:
      return "Baseboard";
    case kSmbiosChassis:
      return "Chassis";
    case kSmbiosProcessor:
      return "Processor";
    case kSmbiosSlot:
      return "System Slots";
    case kSmbiosOemStrings:
      return "OEM Strings";
    case kSmbiosOptions:
      return "System Configuration Options";
    case kSmbiosMemoryArray:
      return "Physical Memory Array";
    case kSmbiosMemoryDevice:
      return "Memory Device";
    case kSmbiosBoot:
      return "System Boot Information";
    case kSmbiosIpmi:
      return "IPMI Device Information";
    case kSmbiosOnboardDevice:
      return "Onboard Devices Extended Information";
    case kSmbiosTpm:
      return "TPM Device";
    default:
      return "other";
  }
}

}  // namespace

TSmbiosReader::TSmbiosReader(TMachineFiles const& files) : fNamedFile(NamedFile()), fKernelFile(KernelFile(files)) {
  fTables = std::make_unique<TSmbiosTables>(TSmbiosTables::kClosedWithTables);
  if (!fTables->Library())
    fWhyNot = WhyNotLoaded(fTables->Library());
  else if (auto const why = WhyNotInRecording(files, fNamedFile))
    fWhyNot = *why;
  else if (fTables->HasHandle())
    return;
  else
    fWhyNot = WhyTablesFailed(*fTables, fNamedFile);
  fTables.reset();
}

TSmbiosReader::~TSmbiosReader() = default;

TSmbiosStructure TSmbiosReader::First(int type) const {
  if (!fTables) return TSmbiosStructure(fWhyNot);
  auto bytes = Read(*fTables, &TSmbiosTables::GetFirst, type);
  return bytes.empty() ? TSmbiosStructure(WhyNone(type)) : TSmbiosStructure(std::move(bytes));
}

std::vector<TSmbiosStructure> TSmbiosReader::All(int type) const {
  std::vector<TSmbiosStructure> structures;
  if (!fTables) return structures;
  for (auto get = &TSmbiosTables::GetFirst; structures.size() < kMostStructures; get = &TSmbiosTables::GetNext) {
    auto bytes = Read(*fTables, get, type);
    if (bytes.empty()) break;
    structures.emplace_back(std::move(bytes));
  }
  return structures;
}

TFinding<std::optional<TSmbiosVersion>> TSmbiosReader::Version() const {
  return VersionOfTables(IsOfNamedFile() ? fNamedFile : fKernelFile);
}

std::string TSmbiosReader::SourceOf(int type) const {
  std::string const source = "SMBIOS type " + std::to_string(type);
  return IsOfNamedFile() ? source + " (file)" : source;
}

TMissing TSmbiosReader::WhyNone(int type) const {
  if (!fTables) return fWhyNot;
  return {kMissingNotGiven, "the SMBIOS tables contain no structure of type " + std::to_string(type) + " (" + NameOf(type) + ")"};
}

}  // namespace NQRVZEP20
