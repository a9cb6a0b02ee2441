// SPDX-License-Identifier: Apache-2.0
#include "Health.h"

#include "ProgramOutput.h"

#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <thread>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;
using TTime = std::chrono::steady_clock::time_point;

constexpr auto kTotalLimit = std::chrono::seconds(20);
constexpr std::size_t kThreads = 8;

TText AskSmartctl(std::string const& node, TTime deadline) {
  if (::geteuid() != 0) return TMissing{kMissingNeedsRoot, "only root may ask a disk for its health"};
  static std::string const program = FindProgram("smartctl");
  if (program.empty())
    return TMissing{kMissingUnreadable, "the program smartctl is not installed; it is part of the package smartmontools"};
  return OutputOf(program, {"--json=c", "-x", "-n", "standby", node}, deadline);
}

// Missing if disks attached in this way have no report.
TText Supported(TDisk const& disk) {
  constexpr char const* kWithout[] = {"virtio", "mmc", "sd", "xen", "ufs"};
  if (disk.fDevice.fKind != TBlockDevice::kDisk) return TMissing{kMissingNotApplicable, "this drive is not a disk"};
  TText const& transport = disk.fAttachment.fTransport;
  auto const isTransport = [&](char const* without) { return transport && *transport == without; };
  if (std::any_of(std::begin(kWithout), std::end(kWithout), isTransport))
    return TMissing{kMissingNotApplicable, "smartctl supports no disks with the transport " + *transport};
  return disk.fDevice.Node();
}

TSmartReport ReportOf(TMachineFiles const& files, TDisk const& disk, TTime deadline) {
  TText const text = Supported(disk).Then([&](std::string const& node) {
    return files.Answer("smartctl/" + disk.fDevice.fName, [&] { return AskSmartctl(node, deadline); });
  });
  return text ? SmartReportFrom(*text) : NoSmartReport(text.Why());
}

}  // namespace

std::map<std::string, TSmartReport> HealthOf(TMachineFiles const& files, std::vector<TDisk> const& disks) {
  TTime const deadline = std::chrono::steady_clock::now() + kTotalLimit;
  std::vector<TSmartReport> reports(disks.size(), NoSmartReport(TMissing()));
  std::atomic<std::size_t> next = 0;
  auto const work = [&] {
    for (std::size_t i = next++; i < disks.size(); i = next++) reports[i] = ReportOf(files, disks[i], deadline);
  };
  auto const asked = static_cast<std::size_t>(
      std::count_if(disks.begin(), disks.end(), [](TDisk const& disk) { return static_cast<bool>(Supported(disk)); }));
  std::vector<std::thread> threads;
  for (std::size_t i = 1; i < std::min(asked, kThreads); ++i) threads.emplace_back(work);
  work();
  for (std::thread& thread : threads) thread.join();

  std::map<std::string, TSmartReport> byName;
  for (std::size_t i = 0; i < disks.size(); ++i) byName.emplace(disks[i].fDevice.fName, reports[i]);
  return byName;
}

TRecord HealthRecord(std::string const& disk, TSmartReport const& report) {
  TRecord record("ZEP_DiskHealth", "smartctl", "CIM_StatisticalData");
  record.AddKey("InstanceID", "ZEP:health:" + disk);
  record.AddOwn("ElementName", "Health of " + disk);
  record.Add("Disk", TText(disk));
  record.Add("Passed", report.fPassed);
  record.Add("Temperature", report.fTemperature).Unit("degree celsius");
  record.Add("PowerOnHours", report.fPowerOnHours).Unit("hour");
  record.Add("PowerCycles", report.fPowerCycles);
  record.Add("ReallocatedSectors", report.fReallocated);
  record.Add("PendingSectors", report.fPending);
  record.Add("UncorrectableErrors", report.fUncorrectable);
  record.Add("TransferErrors", report.fTransferErrors);
  record.Add("ErrorLogEntries", report.fErrorLogEntries);
  record.Add("UnsafeShutdowns", report.fUnsafeShutdowns);
  record.Add("PercentageUsed", report.fPercentageUsed).Unit("percent");
  record.Add("AvailableSpare", report.fAvailableSpare).Unit("percent");
  record.Add("AvailableSpareThreshold", report.fAvailableSpareThreshold).Unit("percent");
  record.Add("CriticalWarning", report.fCriticalWarning);
  record.Add("BytesRead", report.fBytesRead).Unit("byte");
  record.Add("BytesWritten", report.fBytesWritten).Unit("byte");
  record.Add("SelfTest", report.fSelfTest);
  return record;
}

TRecord AttributeRecord(std::string const& disk, TSmartAttribute const& attribute) {
  TRecord record("ZEP_SmartAttribute", "smartctl", "CIM_StatisticalData");
  record.AddKey("InstanceID", "ZEP:smart:" + disk + ":" + std::to_string(attribute.fId));
  record.Add("ElementName", attribute.fName);
  record.Add("ID", TFinding<unsigned short>(attribute.fId));
  record.Add("Value", attribute.fValue);
  record.Add("Worst", attribute.fWorst);
  record.Add("Threshold", attribute.fThreshold);
  record.Add("RawValue", attribute.fRaw);
  record.Add("RawText", attribute.fRawText);
  record.Add("IsPrefailure", attribute.fIsPrefailure);
  record.Add("WhenFailed", attribute.fWhenFailed);
  return record;
}

}  // namespace NQRVZEP20
