// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A record of the kernel's log.
struct TKernelMessage {
  unsigned fFacility = 0;           // 0: the kernel itself; others: programs that write to the log
  std::uint64_t fNumber = 0;        // of the record, ascending
  std::uint64_t fMicroseconds = 0;  // since the start of the kernel
  std::string fText;                // with escapes such as "\x0a" replaced by their bytes
};

// The first line of a record of /dev/kmsg; none if it has another form.
std::optional<TKernelMessage> KernelMessageFrom(std::string_view line);

// An error that the kernel reports in its log.
struct TKernelEvent {
  // The values of the property Kind.
  enum EKind : std::uint16_t {
    kOutOfMemory = 1,
    kProcessor = 2,
    kMemory = 3,
    kPciExpress = 4,
    kHardware = 5,
    kDisk = 6,
    kFileSystem = 7
  };
  static constexpr int kKinds = 7;

  // Values of the property PerceivedSeverity of the DMTF schema.
  enum ESeverity : std::uint16_t { kDegraded = 3, kMinor = 4, kMajor = 5, kCritical = 6 };

  EKind fKind;
  ESeverity fSeverity;
  std::string fSubject;  // the device, file system or process that the text names: "sda"; empty if it names none
  TKernelMessage fMessage;
};

// The error that the message reports; none for any other message. Messages of programs report none.
std::optional<TKernelEvent> KernelEventFrom(TKernelMessage message);

}  // namespace NQRVZEP20
