// SPDX-License-Identifier: Apache-2.0
#include "LogRecords.h"

#include "providers/reasons/SensorValueNames.h"

namespace NQRVZEP20 {

namespace {

constexpr TValueName kKindNames[] = {{"1", "Out Of Memory"}, {"2", "Processor"}, {"3", "Memory"},     {"4", "PCI Express"},
                                     {"5", "Hardware"},      {"6", "Disk"},      {"7", "File System"}};

constexpr char const *kLogClass = "ZEP_KernelLog", *kLogName = "kernel", *kSource = "/dev/kmsg";
constexpr std::uint64_t kMicro = 1000000;

TFinding<std::uint64_t> RecordsOf(TKernelLog const& log) {
  if (log.fIsWhole) return log.fRecords;
  return TMissing{kMissingUnreadable,
                  "the time was up when only the oldest " + std::to_string(log.fRecords) + " records had been read"};
}

TCIMDateTime TimeOf(TKernelMessage const& message, TRunningClock const& clock) {
  auto const time = clock.fBootSeconds.Then([&](std::uint64_t boot) {
    return DateTimeFrom(boot + message.fMicroseconds / kMicro, static_cast<unsigned>(message.fMicroseconds % kMicro));
  });
  return time ? *time : UnknownTime();
}

// The clock of the log stands still while the machine sleeps, so that an error may appear older than it is.
TFinding<std::uint64_t> AgeOf(TKernelMessage const& message, TRunningClock const& clock) {
  std::uint64_t const seconds = message.fMicroseconds / kMicro;
  return clock.fUptime.Then([&](std::uint64_t uptime) { return uptime > seconds ? uptime - seconds : 0; });
}

TFinding<std::string> SubjectOf(TKernelEvent const& event) {
  if (!event.fSubject.empty()) return event.fSubject;
  return TMissing{kMissingNotGiven, "the kernel names no device"};
}

}  // namespace

TRecord KernelLogRecord(TKernelLog const& log) {
  TRecord record(kLogClass, kSource, "CIM_RecordLog");
  record.AddKey("InstanceID", "ZEP:log:kernel");
  record.AddOwn("ElementName", "log of the kernel");
  record.Add("CurrentNumberOfRecords", RecordsOf(log));
  record.AddOwn("OverwritePolicy", TCIMValue(std::uint16_t{2})).Names(kOverwritePolicyNames);  // wraps when full
  record.AddOwn("LogState", TCIMValue(std::uint16_t{2})).Names(kLogStateNames);                // normal
  record.Add("GoneRecords", TFinding<std::uint64_t>(log.fGone));
  record.Add("LeftOutRecords", TFinding<std::uint64_t>(log.fLeftOut));
  record.Add("UnreadableRecords", TFinding<std::uint64_t>(log.fUnreadable));
  return record;
}

TRecord KernelEventRecord(TKernelEvent const& event, TRunningClock const& clock) {
  TRecord record("ZEP_KernelLogRecord", kSource, "CIM_LogRecord");
  record.AddKey("LogCreationClassName", kLogClass);
  record.AddKey("LogName", kLogName);
  record.AddKey("CreationClassName", record.GetClassName());
  record.AddKey("RecordID", std::to_string(event.fMessage.fNumber));
  record.SetSource("/dev/kmsg, /proc/stat");
  record.AddKey("MessageTimestamp", TFinding<TCIMDateTime>(TimeOf(event.fMessage, clock)));
  record.SetSource(kSource);
  record.Add("RecordData", TFinding<std::string>(event.fMessage.fText));
  record.Add("PerceivedSeverity", TFinding<std::uint16_t>(event.fSeverity)).Names(kPerceivedSeverityNames);
  record.Add("Kind", TFinding<std::uint16_t>(event.fKind)).Names(kKindNames);
  record.Add("Subject", SubjectOf(event));
  record.SetSource("/dev/kmsg, /proc/uptime");
  record.Add("Age", AgeOf(event.fMessage, clock)).Unit("second");
  return record;
}

}  // namespace NQRVZEP20
