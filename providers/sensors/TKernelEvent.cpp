// SPDX-License-Identifier: Apache-2.0
#include "TKernelEvent.h"

#include <algorithm>
#include <charconv>
#include <utility>

namespace NQRVZEP20 {

namespace {

using TView = std::string_view;

bool Contains(TView text, TView part) { return text.find(part) != TView::npos; }
bool BeginsWith(TView text, TView beginning) { return text.substr(0, beginning.size()) == beginning; }

// Removes the number at the start of the text, and the character after it.
template <class T>
bool TakeNumber(TView& text, char after, T& number) {
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  auto const length = static_cast<std::size_t>(end - text.data());
  if (error != std::errc() || length == text.size() || *end != after) return false;
  text.remove_prefix(length + 1);
  return true;
}

// The text without the escapes "\xNN", which stand for unprintable bytes and for the backslash.
std::string Unescaped(TView text) {
  std::string result;
  for (; !text.empty(); text.remove_prefix(1)) {
    unsigned char byte = 0;
    if (BeginsWith(text, "\\x") && text.size() >= 4 &&
        std::from_chars(text.data() + 2, text.data() + 4, byte, 16).ptr == text.data() + 4) {
      result += static_cast<char>(byte);
      text.remove_prefix(3);
    } else {
      result += text.front();
    }
  }
  return result;
}

// The part between two texts; the rest if the second is missing, and nothing without the first.
std::string Between(TView text, TView before, TView after) {
  std::size_t const at = text.find(before);
  if (at == TView::npos) return "";
  TView const rest = text.substr(at + before.size());
  return std::string(rest.substr(0, rest.find(after)));
}

using TSubject = std::string (*)(TView text);

std::string None(TView) { return ""; }
std::string Process(TView text) { return Between(text.substr(std::min(text.find(" process "), text.size())), "(", ") "); }
std::string FirstWord(TView text) { return std::string(text.substr(0, text.find_first_of(": "))); }
std::string SecondWord(TView text) { return Between(text, " ", ": "); }
std::string Cpu(TView text) { return "CPU " + Between(text, "CPU ", ":"); }
std::string Device(TView text) { return Between(text, ", dev ", ","); }
std::string BufferDevice(TView text) { return Between(text, " on dev ", ","); }
std::string InParentheses(TView text) { return Between(text, "(", ")"); }
std::string MdDevice(TView text) { return Between(text, ": Disk failure on ", ","); }
std::string FileSystemDevice(TView text) {
  std::string const device = Between(text, "(device ", ")");
  return device.substr(0, device.find(':'));  // BTRFS: "(device sda1: state EA)"
}
std::string Module(TView text) { return Between(text, " on ", " ("); }

// A message: the text at its start and a text that it contains; either may be empty.
struct TPattern {
  char const *fBeginning, *fPart;
  TKernelEvent::EKind fKind;
  TKernelEvent::ESeverity fSeverity;
  TSubject fSubject;
};
using TEvent = TKernelEvent;
constexpr TPattern kPatterns[] = {
    {"Out of memory: Kill", "", TEvent::kOutOfMemory, TEvent::kMajor, Process},
    {"Out of memory (oom_kill_allocating_task): Kill", "", TEvent::kOutOfMemory, TEvent::kMajor, Process},
    {"Memory cgroup out of memory: Kill", "", TEvent::kOutOfMemory, TEvent::kMinor, Process},
    {"mce: [Hardware Error]: CPU ", ": Machine Check Exception: ", TEvent::kProcessor, TEvent::kCritical, Cpu},
    {"mce: [Hardware Error]: CPU ", ": Machine Check: ", TEvent::kProcessor, TEvent::kDegraded, Cpu},
    {"[Hardware Error]: Corrected error, no action required", "", TEvent::kProcessor, TEvent::kDegraded, None},
    {"[Hardware Error]: Deferred error", "", TEvent::kProcessor, TEvent::kMajor, None},
    {"[Hardware Error]: Uncorrected, ", "", TEvent::kProcessor, TEvent::kCritical, None},
    {"[Hardware Error]: System Fatal error", "", TEvent::kProcessor, TEvent::kCritical, None},
    {"EDAC MC", " UE ", TEvent::kMemory, TEvent::kCritical, Module},
    {"EDAC MC", " CE ", TEvent::kMemory, TEvent::kDegraded, Module},
    {"Memory failure: ", ": recovery action for ", TEvent::kMemory, TEvent::kMajor, None},
    {"", "PCIe Bus Error: severity=Correct", TEvent::kPciExpress, TEvent::kDegraded, SecondWord},
    {"", "PCIe Bus Error: severity=Uncorrect", TEvent::kPciExpress, TEvent::kMajor, SecondWord},
    {"", "DPC: containment event", TEvent::kPciExpress, TEvent::kCritical, SecondWord},
    {"{", "[Hardware Error]: event severity: corrected", TEvent::kHardware, TEvent::kDegraded, None},
    {"{", "[Hardware Error]: event severity: recoverable", TEvent::kHardware, TEvent::kMajor, None},
    {"{", "[Hardware Error]: event severity: fatal", TEvent::kHardware, TEvent::kCritical, None},
    {"BERT: Error records from previous boot", "", TEvent::kHardware, TEvent::kCritical, None},
    {"NMI: PCI system error (SERR)", "", TEvent::kHardware, TEvent::kCritical, None},
    {"NMI: IOCK error", "", TEvent::kHardware, TEvent::kCritical, None},
    {"", "I/O error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "critical medium error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "critical target error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "timeout error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "protection error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "device offline error, dev ", TEvent::kDisk, TEvent::kMajor, Device},
    {"", "recoverable transport error, dev ", TEvent::kDisk, TEvent::kMinor, Device},
    {"md/", ": Disk failure on ", TEvent::kDisk, TEvent::kMinor, MdDevice},
    {"Buffer I/O error on dev dm-", "", TEvent::kDisk, TEvent::kMajor, BufferDevice},
    {"Buffer I/O error on dev md", "", TEvent::kDisk, TEvent::kMajor, BufferDevice},
    {"nvme nvme", " timeout, ", TEvent::kDisk, TEvent::kMinor, SecondWord},
    {"nvme nvme", ": controller is down; will reset", TEvent::kDisk, TEvent::kMajor, SecondWord},
    {"ata", ": failed command: ", TEvent::kDisk, TEvent::kMinor, FirstWord},
    {"EXT4-fs error (device ", "", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"XFS (", "orruption", TEvent::kFileSystem, TEvent::kMajor, InParentheses},
    {"BTRFS critical (device ", "", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", " errs: ", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", "corrupt", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", "bad tree block", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", "transid verify failed", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", "unable to fixup", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS error (device ", "ransaction aborted", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
    {"BTRFS warning (device ", "csum failed", TEvent::kFileSystem, TEvent::kMajor, FileSystemDevice},
};

// Drives whose medium may be missing or removed report errors, although they work.
bool IsRemovableMedium(TEvent const& event) {
  return event.fKind == TEvent::kDisk && (BeginsWith(event.fSubject, "sr") || BeginsWith(event.fSubject, "fd") ||
                                          Contains(event.fMessage.fText, ": failed command: PACKET"));
}

// Many disks refuse requests to forget blocks, and work well.
bool IsRefusedDiscard(TEvent const& event) {
  return event.fKind == TEvent::kDisk &&
         (Contains(event.fMessage.fText, "(DISCARD)") || Contains(event.fMessage.fText, "(WRITE_ZEROES)"));
}

// A machine check that was found at the start may have ended the previous run. Bit 61 of the state of the bank is set for an
// error that was not corrected.
TEvent::ESeverity SeverityOf(TPattern const& pattern, TView text) {
  if (pattern.fKind != TEvent::kProcessor || pattern.fSubject != Cpu) return pattern.fSeverity;
  std::string const afterBank = Between(text, " Bank ", "\n");
  std::string const state = Between(afterBank, ": ", " ");
  std::uint64_t bits = 0;
  std::from_chars(state.data(), state.data() + state.size(), bits, 16);
  return (bits >> 61 & 1) != 0 ? TEvent::kCritical : pattern.fSeverity;
}

}  // namespace

std::optional<TKernelMessage> KernelMessageFrom(std::string_view line) {
  constexpr unsigned facilityShift = 3;  // below it is the priority
  TKernelMessage message;
  unsigned priority = 0;
  if (!TakeNumber(line, ',', priority) || !TakeNumber(line, ',', message.fNumber) ||
      !TakeNumber(line, ',', message.fMicroseconds))
    return std::nullopt;
  std::size_t const text = line.find(';');  // further fields may come before it
  if (text == TView::npos) return std::nullopt;
  message.fFacility = priority >> facilityShift;
  message.fText = Unescaped(line.substr(text + 1));
  return message;
}

std::optional<TKernelEvent> KernelEventFrom(TKernelMessage message) {
  if (message.fFacility != 0) return std::nullopt;
  TView const text = message.fText;
  for (TPattern const& pattern : kPatterns) {
    if (!BeginsWith(text, pattern.fBeginning) || !Contains(text, pattern.fPart)) continue;
    TEvent event{pattern.fKind, SeverityOf(pattern, text), pattern.fSubject(text), {}};
    event.fMessage = std::move(message);
    return IsRemovableMedium(event) || IsRefusedDiscard(event) ? std::nullopt : std::optional(std::move(event));
  }
  return std::nullopt;
}

}  // namespace NQRVZEP20
