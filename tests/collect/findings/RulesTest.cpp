// SPDX-License-Identifier: Apache-2.0

// Each rule with instances that have a problem, that are fine, and that cannot be judged. The rules about storage, the kernel's
// log and the management controller have files of their own.

#include "tests/collect/findings/FindingsOf.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

// ---- Network ----

std::string Statistics(int received, int errors) {
  return "instance of ZEP_InterfaceStatistics { InstanceID = \"1\"; ElementName = \"eth0\"; PacketsReceived = " +
         std::to_string(received) + "; ReceiveErrors = " + std::to_string(errors) + "; TransmitErrors = 0; };";
}

TEST(RulesTest, ErrorsOfAPortAreJudgedByTheirShare) {
  EXPECT_THAT(Problems("port-errors", Statistics(1000000, 11)),
              ElementsAre("warning: the network interface eth0 has had 11 errors in 1000011 packets since the start"));
  EXPECT_THAT(FindingsOf(Statistics(1000000, 11)).fProblems.at(0).fRemedy, testing::HasSubstr("counters begin at 0"));
  EXPECT_THAT(Problems("port-errors", Statistics(2000000, 11)), IsEmpty());
  EXPECT_THAT(Problems("port-errors", Statistics(100, 9)), IsEmpty()) << "too few to judge";
}

std::string Port(std::string const& state) { return "instance of CIM_EthernetPort { DeviceID = \"eth0\"; " + state + " };"; }

TEST(RulesTest, APortWithHalfDuplexOrFarBelowItsSpeedIsNamed) {
  std::string const up = "EnabledState = 2; OperationalStatus = {2}; ";
  EXPECT_THAT(Problems("port-half-duplex", Port(up + "FullDuplex = false;")),
              ElementsAre("warning: the network port eth0 uses half duplex"));
  EXPECT_THAT(Problems("port-half-duplex", Port(up + "FullDuplex = true;")), IsEmpty());
  EXPECT_THAT(Problems("port-half-duplex", Port("OperationalStatus = {12}; FullDuplex = false;")), IsEmpty()) << "no link";
  EXPECT_THAT(Problems("port-slow", Port(up + "Speed = 100000000; MaxSpeed = 1000000000;")),
              ElementsAre("warning: the network port eth0 runs at 100 Mbit/s, although it can run at 1000"));
  EXPECT_THAT(Problems("port-slow", Port(up + "Speed = 1000000000; MaxSpeed = 10000000000;")), IsEmpty());
  EXPECT_EQ(Outcome("port-slow", Port(up)), "not-asked");
}

TEST(RulesTest, APortIsComparedWithTheModesOfBothEnds) {
  auto const at = [](char const* mbits, char const* own, char const* partners) {
    return Port(std::string("OperationalStatus = {2}; MaxSpeed = 10000000000; Speed = ") + mbits + "000000;") +
           "instance of ZEP_EthernetPortCapabilities { ElementName = \"eth0\"; AdvertisedLinkModes = " + own +
           "; PartnerLinkModes = " + partners + "; };";
  };
  std::string const rule = "port-slow";
  char const *all = R"({"100baseT/Full", "1000baseT/Full", "10000baseT/Full"})", *upTo100 = R"({"100baseT/Full"})";
  EXPECT_THAT(Problems(rule, at("1000", all, all)),
              ElementsAre("warning: the network port eth0 runs at 1000 Mbit/s, although both ends advertise 10000"));
  EXPECT_THAT(Problems(rule, at("10000", all, all)), IsEmpty());
  EXPECT_THAT(Problems(rule, at("100", all, upTo100)), IsEmpty()) << "the partner has no other speed";
  EXPECT_THAT(Problems(rule, at("100", upTo100, all)), IsEmpty()) << "limited on purpose";
  EXPECT_THAT(Problems(rule, at("100", all, "{}")), testing::SizeIs(1)) << "the modes of the partner are unknown";
  EXPECT_THAT(Problems(rule, at("1000", all, "{}")), IsEmpty());
}

TEST(RulesTest, AnUnpluggedPortIsNamedOnlyIfItIsInUse) {
  std::string const unplugged = Port("EnabledState = 6; OperationalStatus = {12};");
  auto const address = [](int origin) {
    return "instance of CIM_IPProtocolEndpoint { Name = \"1\"; InterfaceName = \"eth0\"; AddressOrigin = " +
           std::to_string(origin) + "; };";
  };
  constexpr int fixed = 3, linkLocal = 10;
  EXPECT_THAT(Problems("port-unplugged", unplugged + address(fixed)),
              ElementsAre("error: the network port eth0 is in use, but has no link"));
  EXPECT_THAT(Problems("port-unplugged", unplugged + R"(instance of ZEP_BridgePort { Name = "1"; ElementName = "eth0"; };)"),
              ElementsAre("error: the network port eth0 is in use, but has no link"));
  EXPECT_THAT(Problems("port-unplugged", unplugged), IsEmpty());
  EXPECT_THAT(Problems("port-unplugged", unplugged + address(linkLocal)), IsEmpty());
  EXPECT_THAT(Problems("port-unplugged", Port("EnabledState = 3; OperationalStatus = {10};") + address(fixed)), IsEmpty())
      << "switched off on purpose";
  EXPECT_THAT(Problems("port-unplugged", Port("EnabledState = 2; OperationalStatus = {2};") + address(fixed)), IsEmpty());
}

TEST(RulesTest, ABondWithoutAMemberIsNamed) {
  EXPECT_THAT(Problems("bond-member", R"(
      instance of ZEP_BondMember { Name = "1"; ElementName = "eth0"; BondName = "bond0"; MIIStatus = "down"; };
      instance of ZEP_BondMember { Name = "2"; ElementName = "eth1"; BondName = "bond0"; MIIStatus = "up"; };
      instance of ZEP_Bond { InstanceID = "bond0"; ElementName = "bond0"; NumberOfMembers = 2; };)"),
              ElementsAre("error: the bond bond0 lacks its member eth0, which has no link"));
  EXPECT_THAT(Problems("bond-member", R"(
      instance of ZEP_Bond { InstanceID = "bond0"; ElementName = "bond0"; NumberOfMembers = 1; };)"),
              ElementsAre("warning: the bond bond0 has only one member"));
}

TEST(RulesTest, ABondOrAMemberThatIsSwitchedOffIsNotSentToItsCable) {
  std::string const members = R"(
      instance of ZEP_BondMember { Name = "1"; ElementName = "eth0"; BondName = "bond0"; MIIStatus = "down"; };
      instance of ZEP_BondMember { Name = "2"; ElementName = "eth1"; BondName = "bond0"; MIIStatus = "up"; };
      instance of ZEP_Bond { InstanceID = "bond0"; ElementName = "bond0"; NumberOfMembers = 2; };)";
  auto const off = [](std::string const& name) {
    return "instance of ZEP_NetworkInterface { Name = \"" + name + "\"; ElementName = \"" + name + "\"; EnabledState = 3; };";
  };
  EXPECT_THAT(Problems("bond-member", members + off("eth0")),
              ElementsAre("error: the bond bond0 lacks its member eth0, which is switched off"));
  EXPECT_EQ(FindingsOf(members + off("eth0")).fProblems.front().fRemedy, "Switch it on (ip link set dev eth0 up).");
  EXPECT_THAT(Problems("bond-member", members + off("bond0")),
              ElementsAre("warning: the bond bond0 is switched off, although it has members"));
  EXPECT_THAT(Problems("bond-member", off("bond0") + R"(
      instance of ZEP_Bond { InstanceID = "bond0"; ElementName = "bond0"; NumberOfMembers = 0; };)"),
              IsEmpty())
      << "as the kernel makes it when it loads the module";
}

// ---- Devices ----

// A bridge with 16 lanes of 16 GT/s and the device below it.
std::string Link(std::string const& device, std::string const& classCode) {
  return R"(instance of CIM_PCIDevice as $bridge { DeviceID = "00:01.0"; ClassCode = 6; };
            instance of CIM_PCIDevice as $device { DeviceID = "01:00.0"; ClassCode = )" +
         classCode + R"(; };
            instance of CIM_ControlledBy { Antecedent = $bridge; Dependent = $device; };
            instance of ZEP_PCIExpressLink { DeviceID = "00:01.0"; Width = 4; MaxWidth = 16; TransferRate = 2.5;
                                             MaxTransferRate = 16.0; };
            instance of ZEP_PCIExpressLink { DeviceID = "01:00.0"; )" +
         device + " };";
}

TEST(RulesTest, ALinkIsComparedWithBothEnds) {
  std::string const rule = "pci-link", network = "2", display = "3";
  EXPECT_THAT(Problems(rule, Link("Width = 4; MaxWidth = 8; TransferRate = 8.0; MaxTransferRate = 8.0;", network)),
              ElementsAre("warning: the PCI Express link of 01:00.0 has 4 of the 8 lanes that both ends have"));
  std::string const slow = "Width = 8; MaxWidth = 8; TransferRate = 2.5; MaxTransferRate = 32.0;";
  EXPECT_THAT(Problems(rule, Link(slow, network)),
              ElementsAre("warning: the PCI Express link of 01:00.0 runs at 2.5 GT/s, although both ends can run at 16 GT/s"));
  EXPECT_THAT(Problems(rule, Link(slow, display)), IsEmpty()) << "a display controller saves power";
  EXPECT_THAT(Problems(rule, Link("Width = 16; MaxWidth = 32; TransferRate = 16.0; MaxTransferRate = 32.0;", network)), IsEmpty())
      << "the bridge allows no more";
  EXPECT_THAT(Problems(rule, Link("Width = 4;", network)), IsEmpty());
}

TEST(RulesTest, TheFunctionsOfADeviceShareOneLink) {
  std::string const slow = "Width = 8; MaxWidth = 8; TransferRate = 2.5; MaxTransferRate = 32.0;";
  std::string const second = R"(instance of ZEP_PCIExpressLink { DeviceID = "01:00.1"; )" + slow + R"( };
                                instance of CIM_ControlledBy { Antecedent = $bridge; Dependent = $second; };)";
  std::string const sound = R"(instance of CIM_PCIDevice as $second { DeviceID = "01:00.1"; ClassCode = 4; };)" + second;
  EXPECT_THAT(Problems("pci-link", Link(slow, "3") + sound), IsEmpty()) << "the sound of a display controller";
  EXPECT_THAT(Problems("pci-link", Link(slow, "2") + sound), testing::SizeIs(1)) << "one finding for both functions";
  std::string const noLink = "Width = 0;";
  EXPECT_THAT(Problems("pci-link", Link(noLink, "2") + sound), IsEmpty()) << "the first function decides";
}

TEST(RulesTest, ADeviceWithoutFunction0IsJudgedByItsLowestFunction) {
  auto const functions = [](std::string const& state) {
    std::string text = R"(instance of CIM_PCIDevice as $bridge { DeviceID = "00:01.0"; ClassCode = 6; };
                          instance of ZEP_PCIExpressLink { DeviceID = "00:01.0"; Width = 4; MaxWidth = 16; };)";
    for (std::string const name : {"01:00.2", "01:00.1"})
      text += "instance of CIM_PCIDevice as $f" + name.substr(6) + " { DeviceID = \"" + name + "\"; ClassCode = 2; };" +
              "instance of CIM_ControlledBy { Antecedent = $bridge; Dependent = $f" + name.substr(6) + "; };" +
              "instance of ZEP_PCIExpressLink { DeviceID = \"" + name + "\"; " + state + " };";
    return text;
  };
  EXPECT_THAT(Problems("pci-link", functions("Width = 4; MaxWidth = 8;")),
              ElementsAre("warning: the PCI Express link of 01:00.1 has 4 of the 8 lanes that both ends have"));
  EXPECT_THAT(Problems("pci-link", functions("Width = 8; MaxWidth = 8;")), IsEmpty());
}

TEST(RulesTest, TheSwitchOfAGraphicsCardMayBeSlow) {
  std::string const slow = "Width = 8; MaxWidth = 8; TransferRate = 2.5; MaxTransferRate = 32.0;";
  std::string const card = R"(instance of CIM_PCIDevice as $card { DeviceID = "02:00.0"; ClassCode = 3; };
                              instance of CIM_ControlledBy { Antecedent = $device; Dependent = $card; };)";
  EXPECT_THAT(Problems("pci-link", Link(slow, "6") + card), IsEmpty());
  EXPECT_THAT(Problems("pci-link", Link(slow, "6")), testing::SizeIs(1));
}

// ---- Sensors ----

std::string Sensor(int type, std::string const& state, int reading = 1) {
  return "instance of CIM_NumericSensor { DeviceID = \"1\"; ElementName = \"S1\"; SensorType = " + std::to_string(type) +
         "; CurrentState = \"" + state + "\"; CurrentReading = " + std::to_string(reading) + "; };";
}
constexpr int kTemperature = 2, kVoltage = 3, kFan = 5;

TEST(RulesTest, SensorsAreJudgedByTheirState) {
  std::string const rule = "sensor-threshold";
  EXPECT_THAT(Problems(rule, Sensor(kTemperature, "Upper Critical")),
              ElementsAre("error: the sensor S1 is beyond a threshold (Upper Critical)"));
  EXPECT_THAT(Problems(rule, Sensor(kTemperature, "Upper Non-Critical")),
              ElementsAre("warning: the sensor S1 is beyond a threshold (Upper Non-Critical)"));
  EXPECT_THAT(Problems(rule, Sensor(kVoltage, "Lower Critical")),
              ElementsAre("error: the sensor S1 is beyond a threshold (Lower Critical)"));
  EXPECT_THAT(Problems(rule, Sensor(kVoltage, "Upper Non-Critical")), IsEmpty()) << "such thresholds are often wrong";
  EXPECT_THAT(Problems(rule, Sensor(kTemperature, "Normal")), IsEmpty());
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Lower Critical", 0)), IsEmpty()) << "fans have a rule of their own";
}

TEST(RulesTest, AFanThatDoesNotTurnAlthoughItShouldIsNamed) {
  std::string const rule = "fan-stopped", stopped = "error: the fan S1 has stopped or is broken";
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Lower Critical", 0)), ElementsAre(stopped));
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Fault", 900)), ElementsAre(stopped));
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Normal", 0)), IsEmpty()) << "it has no lowest speed: it may stand still";
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Lower Non-Critical", 200)), IsEmpty());
  EXPECT_THAT(Problems(rule, Sensor(kFan, "Lower Critical", 200)), ElementsAre("error: the fan S1 is too slow (Lower Critical)"));
}

TEST(RulesTest, AHeaderWithoutAFanIsAWarningUnlessTheControllerListsTheFan) {
  std::string const ofBoard = Sensor(kFan, "Lower Non-Critical", 0);
  EXPECT_THAT(Problems("fan-stopped", ofBoard), ElementsAre("warning: the fan S1 does not turn, or is not connected"));
  std::string ofController = ofBoard;
  ofController.replace(ofController.find("\"1\""), 3, "\"ipmi 0x20 0x31\"");
  EXPECT_THAT(Problems("fan-stopped", ofController), ElementsAre("error: the fan S1 has stopped or is broken"));
}

std::string Supply(char const* name, char const* status) {
  return std::string("instance of CIM_PowerSupply { DeviceID = \"") + name + "\"; OperationalStatus = " + status + "; };";
}

TEST(RulesTest, APowerSupplyIsLostIfAnotherOneHasPower) {
  std::string const rule = "power-supply-lost";
  EXPECT_THAT(Problems(rule, Supply("PS1", "{2}") + Supply("PS2", "{10}")),
              ElementsAre("error: the power supply PS2 has no power"));
  EXPECT_THAT(Problems(rule, Supply("PS1", "{6}")), ElementsAre("error: the power supply PS1 has failed"));
  EXPECT_THAT(Problems(rule, Supply("PS1", "{2}") + Supply("PS2", "{2}")), IsEmpty());
  EXPECT_THAT(Problems(rule, Supply("ACAD", "{10}")), IsEmpty()) << "a notebook runs on its battery";
  EXPECT_EQ(Outcome(rule, Supply("PS1", "NULL")), "not-asked");
}

TEST(RulesTest, ErrorsOfMemoryAndPciDevicesAreCounted) {
  EXPECT_THAT(Problems("memory-errors", R"(
      instance of ZEP_MemoryErrors { InstanceID = "1"; ElementName = "A1"; CorrectedErrors = 101; UncorrectedErrors = 2; };
      instance of ZEP_MemoryErrors { InstanceID = "2"; ElementName = "A2"; CorrectedErrors = 100; UncorrectedErrors = 0; };)"),
              ElementsAre("critical: the memory A1 has had uncorrected errors since the start: 2",
                          "warning: the memory A1 has had corrected errors since the start: 101"));
  EXPECT_THAT(Problems("pci-errors", R"(
      instance of ZEP_PCIErrors { InstanceID = "1"; ElementName = "01:00.0"; CorrectableErrors = 1001; NonFatalErrors = 1;
                                  FatalErrors = 3; };
      instance of ZEP_PCIErrors { InstanceID = "2"; ElementName = "02:00.0"; CorrectableErrors = 1000; NonFatalErrors = 0;
                                  FatalErrors = 0; };)"),
              ElementsAre("error: the PCI Express device 01:00.0 has had fatal errors since the start: 3",
                          "warning: the PCI Express device 01:00.0 has had uncorrected errors since the start: 1",
                          "warning: the PCI Express device 01:00.0 has had corrected errors since the start: 1001"));
}

TEST(RulesTest, ErrorsOfNoModuleHaveARemedyOfTheirOwn) {
  std::string const errors = "instance of ZEP_MemoryErrors { InstanceID = \"1\"; CorrectedErrors = 0; UncorrectedErrors = 2; };";
  auto const remedyOf = [&](char const* code) {
    auto const problems = FindingsOf(errors + Missing("ZEP_MemoryErrors.InstanceID=\\\"1\\\"", "Location", code)).fProblems;
    return problems.size() == 1 ? problems[0].fRemedy : "";
  };
  EXPECT_THAT(remedyOf("not-given"), StartsWith("Replace the memory module. The counters begin at 0 when"));
  EXPECT_THAT(remedyOf("not-applicable"),
              StartsWith("Replace the faulty memory module (a memory test or the controller's event log may name it). "));
}

// ---- Host ----

TEST(RulesTest, ProcessorsOfDifferentSteppingOrMicrocodeAreNamed) {
  EXPECT_THAT(Problems("processors-differ", R"(
      instance of CIM_Processor { DeviceID = "0"; ElementName = "Xeon"; Stepping = "6"; };
      instance of CIM_Processor { DeviceID = "1"; ElementName = "Xeon"; Stepping = "7"; };
      instance of ZEP_ProcessorSettings { InstanceID = "0"; MicrocodeVersion = "0x1"; };
      instance of ZEP_ProcessorSettings { InstanceID = "1"; MicrocodeVersion = "0x2"; };)"),
              ElementsAre("warning: the processors are of different kinds (Stepping: 6, 7)",
                          "warning: the processors have different microcode (MicrocodeVersion: 0x1, 0x2)"));
  EXPECT_THAT(Problems("processors-differ", R"(
      instance of CIM_Processor { DeviceID = "0"; ElementName = "Xeon"; Stepping = "6"; };
      instance of CIM_Processor { DeviceID = "1"; ElementName = "Xeon"; Stepping = "6"; };)"),
              IsEmpty());
}

std::string Module(std::string const& tag, std::string const& bank, std::string const& capacity) {
  return "instance of CIM_PhysicalMemory { Tag = \"" + tag + "\"; BankLabel = \"" + bank + "\"; Capacity = " + capacity + "; };";
}

TEST(RulesTest, ModulesAreComparedWithinTheirChannel) {
  EXPECT_THAT(Problems("memory-differs", Module("0", "P0 CHANNEL A", "8") + Module("1", "P0 CHANNEL A", "16")),
              ElementsAre("warning: the memory modules of the channel P0 CHANNEL A do not match (Capacity: 16, 8)"));
  EXPECT_THAT(Problems("memory-differs", Module("0", "P0 CHANNEL A", "8") + Module("1", "P0 CHANNEL B", "16")), IsEmpty());
  EXPECT_THAT(Problems("memory-differs", Module("0", "P0 CHANNEL 10", "8") + Module("1", "P0 CHANNEL 1", "16")), IsEmpty());
  EXPECT_EQ(Outcome("memory-differs", Module("0", "BANK 0", "8") + Module("1", "BANK 0", "16")), "not-asked");
}

// The forms in which the firmware of many makers labels modules: the locator, the bank, and the channel in one of them.
TEST(RulesTest, ModulesAreNotComparedIfTheirLabelsNameNoChannel) {
  struct {
    char const *fLocator, *fBank, *fChannel;
  } const rows[] = {{"P1-DIMMA1", "P0_Node0_Channel0_Dimm0", "P0_Node0_Channel0"},
                    {"CPU1_DIMM_A1", "NODE 1 CHANNEL 0 DIMM 0", "NODE 1 CHANNEL 0"},
                    {"DIMM 0", "P0 CHANNEL A", "P0 CHANNEL A"},
                    {"ChannelA-DIMM0", "BANK 0", "ChannelA"},
                    {"Controller1-ChannelB-DIMM1", "BANK 3", "Controller1-ChannelB"},
                    {"CPU1_CHANNEL_B_DIMM0", "", "CPU1_CHANNEL_B"},
                    {"P0_Node0_Channel10_Dimm0", "", "P0_Node0_Channel10"},
                    {"DIMM 0", "P0 CHANNEL 11", "P0 CHANNEL 11"},
                    {"A1", "", nullptr},
                    {"PROC 2 DIMM 12", "Not Specified", nullptr},
                    {"DIMM_A1", "BANK 0", nullptr},
                    {"Node0_Dimm1", "Node0_Bank0", nullptr},
                    {"System Board Slot Channels", "", nullptr}};
  for (auto const& row : rows) {
    auto const modules = [&](char const* second) {
      std::string text;
      for (std::string const module : {"\"1\"; Capacity = 8", second})
        text += "instance of CIM_PhysicalMemory { Tag = " + module + "; ElementName = \"" + row.fLocator + "\"; BankLabel = \"" +
                row.fBank + "\"; };";
      return text;
    };
    std::string const rule = "memory-differs", different = modules("\"2\"; Capacity = 16");
    EXPECT_THAT(Problems(rule, modules("\"2\"; Capacity = 8")), IsEmpty()) << row.fLocator;
    if (row.fChannel == nullptr) {
      EXPECT_EQ(Outcome(rule, different), "not-asked") << row.fLocator;
    } else {
      EXPECT_THAT(Problems(rule, different), ElementsAre(testing::HasSubstr("the channel " + std::string(row.fChannel) + " do")));
    }
  }
}

TEST(RulesTest, AModuleOfAChannelWithoutACapacityIsNotExamined) {
  std::string const modules = Module("0", "P0 CHANNEL A", "8") + Module("1", "P0 CHANNEL A", "NULL");
  auto const missing = Missing("CIM_PhysicalMemory.Tag=\\\"1\\\"", "Capacity", "not-given");
  auto const notAsked = ResultOf("memory-differs", FindingsOf(modules + missing)).fNotAsked;
  ASSERT_EQ(notAsked.size(), 1U);
  EXPECT_EQ(notAsked[0].fReason, "a reason");
  auto const alone =
      ResultOf("memory-differs", FindingsOf(Module("1", "P0 CHANNEL A", "NULL") + missing + Module("2", "P0 CHANNEL A", "NULL")))
          .fNotAsked;
  for (TNotAsked const& reason : alone) EXPECT_NE(reason.fReason, "the firmware does not name the channels of the modules");
}

TEST(RulesTest, WeaknessesWithoutMitigationAreListed) {
  std::string const weaknesses = R"(instance of ZEP_ProcessorWeakness { Name = "mds"; State = 4; };
                                    instance of ZEP_ProcessorWeakness { Name = "retbleed"; State = 4; };
                                    instance of ZEP_ProcessorWeakness { Name = "meltdown"; State = 3; };)";
  std::string const reason = ": the kernel mitigates some weaknesses of the processor incompletely or not at all: mds, retbleed";
  EXPECT_THAT(Problems("processor-weakness", weaknesses), ElementsAre("warning" + reason));
  EXPECT_THAT(
      Problems("processor-weakness", weaknesses + R"(instance of ZEP_Virtualization { InstanceID = "1"; IsVirtual = true; };)"),
      ElementsAre("information" + reason));
  EXPECT_THAT(Problems("processor-weakness", R"(instance of ZEP_ProcessorWeakness { Name = "mds"; State = 2; };)"), IsEmpty());
}

// ---- The running system ----

std::string State(std::string const& state) { return "instance of ZEP_RunningState { InstanceID = \"1\"; " + state + " };"; }

TEST(RulesTest, AClockIsJudgedSomeTimeAfterTheStart) {
  EXPECT_THAT(Problems("clock-synchronized", State("Uptime = 900; ClockSynchronized = false;")),
              ElementsAre("warning: the clock is not synchronised"));
  EXPECT_THAT(Problems("clock-synchronized", State("Uptime = 900; ClockSynchronized = true;")), IsEmpty());
  EXPECT_EQ(Outcome("clock-synchronized", State("Uptime = 899; ClockSynchronized = false;")), "not-asked");
}

TEST(RulesTest, OnlyTaintsThatShowAFaultAreNamed) {
  EXPECT_THAT(Problems("kernel-taint", State("Taint = 16;")),
              ElementsAre("error: a processor has reported a machine check exception since the start"));
  EXPECT_THAT(Problems("kernel-taint", State("Taint = 640;")),
              ElementsAre("error: the kernel has had an internal error (OOPS or BUG) since the start",
                          "information: the kernel has issued a warning about its own state since the start"));
  EXPECT_THAT(Problems("kernel-taint", State("Taint = 12289;")), IsEmpty()) << "proprietary, foreign and unsigned modules";
}

TEST(RulesTest, FailedUnitsAreNamedUpToFive) {
  EXPECT_THAT(Problems("failed-units", State(R"(FailedUnits = {"a", "b", "c", "d", "e", "f", "g"};)")),
              ElementsAre("warning: units of systemd have failed: a, b, c, d, e and 2 more"));
  EXPECT_THAT(Problems("failed-units", State("FailedUnits = {};")), IsEmpty());
}

// ---- Plug-ins ----

TEST(RulesTest, AProblemOfAPlugInHasItsOwnRule) {
  auto const findings = FindingsOf(R"(instance of ZEP_Finding { InstanceID = "1"; Rule = "pump-pressure"; Severity = "error";
      Reason = "the pressure of pump 1 is 0.2 bar"; Remedy = "Check the pump."; Element = "X_Pump.Id=1"; };
      instance of ZEP_Finding { InstanceID = "2"; Severity = "dreadful"; Reason = "r"; };)");
  ASSERT_EQ(findings.fProblems.size(), 1u);
  EXPECT_EQ(findings.fProblems[0].fRule, "pump-pressure");
  EXPECT_EQ(findings.fProblems[0].fReason, "the pressure of pump 1 is 0.2 bar");
  EXPECT_EQ(findings.fProblems[0].fInstance, "X_Pump.Id=1");
  auto const& notAsked = ResultOf("plug-in", findings).fNotAsked;
  ASSERT_EQ(notAsked.size(), 1u);
  EXPECT_EQ(notAsked[0].fReason, "\"dreadful\" is not a severity");
}

// ---- All rules ----

TEST(RulesTest, NothingIsWrongWithoutInstances) {
  auto const findings = FindingsOf("");
  EXPECT_THAT(findings.fProblems, IsEmpty());
  EXPECT_EQ(findings.CountOf(TRuleResult::EOutcome::kFine), findings.fRules.size());
}

TEST(RulesTest, ARuleWithNothingToExamineIsCountedApart) {
  auto const findings = FindingsOf(State("Taint = 0;"));
  auto const counts = findings.CountRules();
  EXPECT_EQ(counts.fAsked + counts.fWithNothingToExamine + counts.fNotAsked, findings.fRules.size());
  EXPECT_FALSE(ResultOf("kernel-taint", findings).HasNothingToExamine());
  EXPECT_TRUE(ResultOf("array-degraded", findings).HasNothingToExamine());
  EXPECT_FALSE(ResultOf("failed-units", findings).HasNothingToExamine()) << "it could not be asked";
}

TEST(RulesTest, ARuleWhoseSourceIsMissingIsNotAsked) {
  auto const findings = FindingsOf(Missing("CIM_NumericSensor", "", "no-source"));
  for (char const* rule : {"sensor-threshold", "fan-stopped"}) {
    auto const& result = ResultOf(rule, findings);
    EXPECT_EQ(NameOf(result.fOutcome), "not-asked") << rule;
    EXPECT_EQ(result.fNotAsked.at(0).fReason, "a reason") << rule;
  }
}

// A provider that has read instances, or found none, beside one that could not read its own.
TEST(RulesTest, AProviderThatCouldNotReadItsInstancesIsNotedBesideAnother) {
  auto const reasonsBeside = [](std::string const& first, char const* code) {
    std::vector<TNamespaceView> views;
    for (std::string const& instances : {first, Missing("CIM_NumericSensor", "", code)}) {
      auto const ns = boost::make_shared<TMemoryNamespace>("root/test");
      ReadMofText(kRuleClasses, "classes", ns);
      ReadMofText(instances, "instances", ns);
      views.emplace_back("Test", ns);
    }
    std::vector<std::string> reasons;
    for (TNotAsked const& notAsked : ResultOf("fan-stopped", MakeFindings(views)).fNotAsked) reasons.push_back(notAsked.fReason);
    return reasons;
  };
  EXPECT_THAT(reasonsBeside(Sensor(kTemperature, "Normal"), "needs-root"), ElementsAre("a reason"));
  EXPECT_THAT(reasonsBeside(Sensor(kFan, "Normal"), "needs-root"), ElementsAre("a reason"));
  EXPECT_THAT(reasonsBeside("", "needs-root"), ElementsAre("a reason"));
  EXPECT_THAT(reasonsBeside(Sensor(kFan, "Normal"), "no-source"), IsEmpty()) << "the machine has no controller";
  EXPECT_THAT(reasonsBeside(Sensor(kTemperature, "Normal"), "no-source"), ElementsAre("no sensor measures the speed of a fan"));
}

TEST(RulesTest, WithoutProvidersNoRuleCanBeAskedButThatOfPlugIns) {
  auto const findings = MakeFindings({});
  EXPECT_THAT(findings.fProblems, IsEmpty());
  for (TRuleResult const& rule : findings.fRules)
    EXPECT_EQ(NameOf(rule.fOutcome), rule.fId == "plug-in" ? "fine" : "not-asked") << rule.fId;
}

TEST(RulesTest, TheWorstProblemComesFirst) {
  auto const findings = FindingsOf(State("Taint = 16; FailedUnits = {\"a\"};") +
                                   "instance of CIM_DiskDrive { DeviceID = \"sda\"; HealthState = 20; };");
  std::vector<std::string> rules;
  for (TProblem const& problem : findings.fProblems) rules.push_back(problem.fRule);
  EXPECT_THAT(rules, ElementsAre("disk-failing", "kernel-taint", "failed-units"));
  EXPECT_EQ(findings.Worst(), ESeverity::kCritical);
}

TEST(RulesTest, AProblemNamesItsInstanceAndSource) {
  auto const findings = FindingsOf("instance of CIM_DiskDrive { DeviceID = \"sda\"; HealthState = 20; };");
  ASSERT_EQ(findings.fProblems.size(), 1u);
  EXPECT_EQ(findings.fProblems[0].fInstance, "root/test:CIM_DiskDrive.DeviceID=\"sda\"");
  EXPECT_EQ(findings.fProblems[0].fSource, "provider Test");
}

TEST(RulesTest, ARuleThatThrowsCountsAsNotAskedAndKeepsItsProblems) {
  auto const add = [](TRuleRun& run) { run.Add({"", ESeverity::kWarning, "before", "Do it.", "", ""}); };
  auto const findings =
      MakeFindings({}, {}, {{"a", "A?", [](TRuleRun&) { throw 5; }}, {"b", "B?", [&](TRuleRun& run) {
                                                                        add(run);
                                                                        throw std::runtime_error("out of order");
                                                                      }}});
  EXPECT_EQ(NameOf(findings.fRules[0].fOutcome), "not-asked");
  EXPECT_EQ(NameOf(findings.fRules[1].fOutcome), "wrong");
  EXPECT_EQ(findings.fRules[1].fNotAsked.at(0).fReason, "the rule failed: out of order");
  ASSERT_EQ(findings.fProblems.size(), 1u);
  EXPECT_EQ(findings.fProblems[0].fRule, "b");
}

// ---- Thresholds and severities ----

TEST(ThresholdsTest, SettingsReplaceDefaults) {
  auto const thresholds =
      TThresholds::From([](std::string const& key) { return key == "finding-file-system-free-percent" ? "7" : std::string(); });
  EXPECT_EQ(thresholds.fFileSystemFreePercent, 7u);
  EXPECT_EQ(thresholds.fFreeInodesPercent, 5u);
}

TEST(ThresholdsTest, AValueOutOfRangeIsRefusedWithItsKeyAndRange) {
  for (std::string const value : {"101", "-1", "many", "5 "}) {
    try {
      TThresholds::From([&](std::string const& key) { return key == "finding-free-inodes-percent" ? value : std::string(); });
      ADD_FAILURE() << value << " was accepted";
    } catch (std::invalid_argument const& failure) {
      EXPECT_EQ(failure.what(), "setting finding-free-inodes-percent: \"" + value + "\" is not a whole number from 0 to 100");
    }
  }
}

TEST(SeverityTest, NamesAndSeveritiesCorrespond) {
  for (std::string const name : {"information", "warning", "error", "critical"}) EXPECT_EQ(NameOf(*SeverityFrom(name)), name);
  EXPECT_FALSE(SeverityFrom("Warning"));
  EXPECT_LT(ESeverity::kWarning, ESeverity::kError);
}

}  // namespace
}  // namespace NQRVZEP20
