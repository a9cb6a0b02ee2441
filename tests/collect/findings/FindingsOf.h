// SPDX-License-Identifier: Apache-2.0
#pragma once

// The findings of instances that a test writes as MOF.

#include "collect/findings/Findings.h"

#include "TMemoryNamespace.h"
#include "providers/mof/Mof.h"
#include "tests/Support.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

// The classes that the rules read, with the properties that they use.
inline constexpr char const* kRuleClasses = R"(
  Qualifier Description : string, Scope(any);
  Qualifier ValueMap : string[], Scope(property);
  Qualifier ValueSource : string, Scope(property);
  class CIM_ManagedElement {};
  Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride);
  Qualifier Association : boolean = false, Scope(association), Flavor(DisableOverride);
  class CIM_MediaAccessDevice { [key] string DeviceID; uint16 OperationalStatus[]; string StatusDescriptions[]; };
  class CIM_DiskDrive : CIM_MediaAccessDevice { uint16 HealthState; };
  class ZEP_DiskHealth { [key] string InstanceID; string ElementName; string Disk; uint8 PercentageUsed; uint8 AvailableSpare;
    uint8 AvailableSpareThreshold; uint64 PendingSectors; uint64 UncorrectableErrors; uint64 ReallocatedSectors; };
  class ZEP_RaidArray { [key] string DeviceID; string Level; string MetadataVersion; string State; uint16 Members; uint16 MissingMembers; string Action;
    uint16 PackageRedundancy; };
  class CIM_LocalFileSystem { [key] string Name; string Root; string FileSystemType; boolean ReadOnly; uint64 FileSystemSize;
    uint64 AvailableSpace; };
  class CIM_UnixLocalFileSystem : CIM_LocalFileSystem { uint64 TotalInodes; uint64 FreeInodes; };
  class ZEP_Mount { [key] string InstanceID; string ElementName; string Type; string Options; string FileSystemOptions; };
  class ZEP_InterfaceStatistics { [key] string InstanceID; string ElementName; uint64 ReceiveErrors; uint64 TransmitErrors;
    uint64 PacketsReceived; uint64 PacketsTransmitted; };
  class ZEP_EthernetPortCapabilities { [key] string ElementName; string AdvertisedLinkModes[]; string PartnerLinkModes[]; };
  class CIM_EthernetPort { [key] string DeviceID; uint16 EnabledState; uint16 OperationalStatus[]; boolean FullDuplex;
    uint64 Speed; uint64 MaxSpeed; };
  class CIM_IPProtocolEndpoint { [key] string Name; string InterfaceName; uint16 AddressOrigin; };
  class ZEP_NetworkInterface { [key] string Name; string ElementName; uint16 EnabledState; };
  class ZEP_BridgePort { [key] string Name; string ElementName; };
  class ZEP_BondMember { [key] string Name; string ElementName; string BondName; string MIIStatus; };
  class ZEP_Bond { [key] string InstanceID; string ElementName; uint32 NumberOfMembers; };
  class CIM_PCIDevice { [key] string DeviceID; uint8 ClassCode; };
  class ZEP_PCIExpressLink { [key] string DeviceID; uint16 Width; uint16 MaxWidth; real32 TransferRate; real32 MaxTransferRate; };
  [association] class CIM_ControlledBy { [key] CIM_PCIDevice ref Antecedent; [key] CIM_PCIDevice ref Dependent; };
  class CIM_Sensor { [key] string DeviceID; string ElementName; uint16 SensorType; string OtherSensorTypeDescription;
    string CurrentState; uint16 OperationalStatus[]; };
  class CIM_NumericSensor : CIM_Sensor { sint32 CurrentReading; sint32 UnitModifier; };
  class ZEP_ManagementController { [key] string DeviceID; string UnreadParts[]; };
  class ZEP_ControllerAccount { [key] string Name; string UserID; uint16 EnabledState; string Privilege; boolean HasLANAccess; };
  class ZEP_EventLog { [key] string InstanceID; uint64 CurrentNumberOfRecords; [ValueSource("free")] uint64 FreeRecords;
    [ValueSource("lost")] boolean HasLostRecords; datetime ClockTime; };
  class ZEP_EventLogEntry { [key] string RecordID; string RecordData; string SensorTypeName; string SensorDeviceID;
    uint16 PerceivedSeverity; uint64 Age; boolean HasEnded; };
  class ZEP_MemoryErrors { [key] string InstanceID; string ElementName; string Location; uint64 CorrectedErrors; uint64 UncorrectedErrors; };
  class ZEP_PCIErrors { [key] string InstanceID; string ElementName; uint64 CorrectableErrors; uint64 NonFatalErrors;
    uint64 FatalErrors; };
  class CIM_PowerSupply { [key] string DeviceID; string ElementName; uint16 OperationalStatus[]; };
  class ZEP_KernelLog { [key] string InstanceID; uint64 CurrentNumberOfRecords; uint64 GoneRecords; uint64 LeftOutRecords;
    uint64 UnreadableRecords; };
  class ZEP_KernelLogRecord { [key] string RecordID; string RecordData; uint16 PerceivedSeverity; uint16 Kind; string Subject;
    uint64 Age; };
  class CIM_Processor { [key] string DeviceID; string ElementName; string Stepping; };
  class ZEP_ProcessorSettings { [key] string InstanceID; string MicrocodeVersion; };
  class CIM_PhysicalMemory { [key] string Tag; string ElementName; string BankLabel; uint64 Capacity; uint16 MemoryType;
    uint32 MaxMemorySpeed; };
  class ZEP_Virtualization { [key] string InstanceID; boolean IsVirtual; };
  class ZEP_ProcessorWeakness { [key] string Name; uint16 State; };
  class ZEP_RunningState { [key] string InstanceID; uint64 Uptime; boolean ClockSynchronized; uint64 Taint; string FailedUnits[]; };
)";

inline TFindings FindingsOf(std::string const& instances, TThresholds const& thresholds = {}) {
  auto const ns = boost::make_shared<TMemoryNamespace>("root/test");
  ReadMofText(kRuleClasses, "classes", ns);
  ReadMofFile(SourcePath("collect/findings/ZEP_Finding.mof"), ns);
  ReadMofText(instances, "instances", ns);
  return MakeFindings({TNamespaceView("Test", ns)}, thresholds);
}

// The reason why a value is missing. `path`: of its instance, with escaped quotation marks.
inline std::string Missing(std::string const& path, std::string const& property, std::string const& code) {
  return "class ZEP_MissingValue { string ElementPath; string ElementProperty; string Code; string Reason; };"
         "instance of ZEP_MissingValue { ElementPath = \"" +
         path + "\"; ElementProperty = \"" + property + "\"; Code = \"" + code + "\"; Reason = \"a reason\"; };";
}

// The problems that the rule finds, as "severity: reason".
inline std::vector<std::string> Problems(std::string const& rule, std::string const& instances,
                                         TThresholds const& thresholds = {}) {
  std::vector<std::string> texts;
  for (TProblem const& problem : FindingsOf(instances, thresholds).fProblems) {
    EXPECT_FALSE(problem.fRemedy.empty()) << problem.fReason;
    if (problem.fRule == rule) texts.push_back(NameOf(problem.fSeverity) + ": " + problem.fReason);
  }
  return texts;
}

inline TRuleResult ResultOf(std::string const& rule, TFindings const& findings) {
  for (TRuleResult const& result : findings.fRules)
    if (result.fId == rule) return result;
  ADD_FAILURE() << "no rule " << rule;
  return {};
}

inline std::string Outcome(std::string const& rule, std::string const& instances) {
  return NameOf(ResultOf(rule, FindingsOf(instances)).fOutcome);
}

}  // namespace NQRVZEP20
