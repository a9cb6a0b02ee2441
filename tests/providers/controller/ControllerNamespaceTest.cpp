// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/ControllerNamespace.h"

#include "providers/controller/Connections.h"
#include "providers/controller/ControllerRecords.h"
#include "tests/Support.h"
#include "tests/providers/NamespaceText.h"
#include "tests/providers/controller/FakeController.h"

#include <gmock/gmock.h>

#include <map>

namespace NQRVZEP20 {
namespace {

using testing::HasSubstr;
using testing::Not;

class ControllerNamespaceTest : public testing::Test {
protected:
  ControllerNamespaceTest() {
    auto& answers = fController.fAnswers;
    answers[Bytes({6, 1})] = Bytes({0, 0x20, 0x81, 0x01, 0x10, 0x02, 0x9F, 0x91, 0x12, 0, 0x02, 0x0F});
    answers[Bytes({6, 0x37})] = Bytes({0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16});
    answers[Bytes({6, 0x42, 1})] = Bytes({0, 1, 4, 1, 0, 0, 0, 0, 0, 0});
    answers[Bytes({0x0C, 2, 1, 3, 0, 0})] = Bytes({0, 0x11, 192, 0, 2, 7});
    answers[Bytes({0x0C, 2, 1, 4, 0, 0})] = Bytes({0, 0x11, 1});
    answers[Bytes({0x0C, 2, 1, 5, 0, 0})] = Bytes({0, 0x11, 2, 0xA, 0xB, 0xC, 0xD, 0xE});
    answers[Bytes({0x0C, 2, 1, 6, 0, 0})] = Bytes({0, 0x11, 255, 255, 255, 0});
    answers[Bytes({0x0C, 2, 1, 12, 0, 0})] = Bytes({0, 0x11, 0, 0, 0, 0});
    answers[Bytes({6, 0x44, 1, 1})] = Bytes({0, 3, 0x82, 0, 0x04});
    answers[Bytes({6, 0x44, 1, 2})] = Bytes({0, 3, 0x42, 0, 0x14});
    answers[Bytes({6, 0x44, 1, 3})] = Bytes({0, 3, 0x82, 0, 0x0F});
    answers[Bytes({6, 0x46, 1})] = Bytes({0}) + std::string(16, '\0');
    answers[Bytes({6, 0x46, 2})] = Bytes({0}) + "zepadmin" + std::string(8, '\0');
    answers[Bytes({6, 0x46, 3})] = Bytes({0}) + "guest" + std::string(11, '\0');
    fController.fRecords = {FullSensorRecord(0, 0x30, "CPU Temp"), CompactSensorRecord(1, 0x51, 8, "PSU 1"),
                            FullSensorRecord(2, 0x30, "again")};
    answers[Bytes({4, 0x2D, 0x30})] = Bytes({0, 91, 0xC0, 0x18, 0});
    answers[Bytes({4, 0x27, 0x30})] = Bytes({0, 0x38, 0, 0, 0, 81, 90, 100});
    answers[Bytes({4, 0x2D, 0x51})] = Bytes({0, 0, 0xC0, 0x03, 0x80});
    fController.fEvents = {SelEvent(0, 1, 0x30, 1, 0x59, 91, 90), SelEvent(1, 8, 0x51, 0x6F, 1, 0xFF, 0xFF, 1612137000),
                           SelEvent(2, 1, 0x30, 0x81, 0x59, 88, 90), SelEvent(3, 8, 0x99, 0x6F, 1, 0xFF, 0xFF, 3600)};
    fController.fFru = FruDevice() + std::string(1024, '\xFF');
  }

  std::string Fill() {
    auto const controller = ReadController(
        fController.Connection(), [](std::string const&) { return nullptr; }, [](char const*, std::size_t, std::size_t) {});
    FillControllerNamespace(controller, TMachineFiles(fDir.Path()), *fNs);
    return TextOf(*fNs);
  }

  TEnvironmentGuard fNamed{"ZEP_HOST_NAME", "s1"};
  TTempDir const fDir;
  TFakeController fController;
  boost::shared_ptr<TMemoryNamespace> fNs = NewNamespace();
};

TEST_F(ControllerNamespaceTest, EveryPartHasItsInstances) {
  std::string const text = Fill();
  for (char const* const line :
       {"FirmwareVersion: 1.10",
        "IPMIVersion: 2.0",
        "ManufacturerID: 4753",
        "ProductID: 3842",
        "GUID: 100f0e0d-0c0b-0a09-0807-060504030201",
        "IPv4Address: 192.0.2.7",
        "AddressSource: static",
        "SubnetMask: 255.255.255.0",
        "MACAddress: 02:0a:0b:0c:0d:0e",
        "DefaultGateway: <the controller reports 0.0.0.0: none is set>",
        "UserID: zepadmin",
        "UserID: guest",
        "Privilege: Administrator",
        "Privilege: No Access",
        "ElementName: CPU Temp",
        "CurrentReading: 91",
        "CurrentState: Upper Critical",
        "UpperThresholdNonCritical: 81",
        "LowerThresholdCritical: <the sensor has no such threshold>",
        "ElementName: PSU 1",
        "CurrentState: Presence detected, Power Supply Failure detected",
        "SerialNumber: KQ12345",
        "Model: Server Q100",
        "UserTracking: asset 5",
        "ManufactureDate: 20220101000000.000000+000",
        "OtherIdentifyingInfo: rail kit",
        "CurrentNumberOfRecords: 4",
        "MaxNumberOfRecords: 104",
        "ClockTime: 20210201000000.000000+000",
        "RecordData: CPU Temp: Upper Critical - going high, asserted; reading 91, threshold 90 degrees C",
        "RecordData: PSU 1: Power Supply Failure detected, asserted",
        "Age: 600",
        "HasEnded: true",
        "HasEnded: false"})
    EXPECT_THAT(text, HasSubstr(std::string("  ") + line + "\n"));
  EXPECT_THAT(text, HasSubstr("00000000010000.000000:000")) << "before the clock was set, times are intervals";
  EXPECT_THAT(text, Not(HasSubstr("ElementName: again"))) << "the second record of one sensor";
}

TEST_F(ControllerNamespaceTest, AnEntryNamesAllItsSources) {
  std::map<std::string, std::string> sources;
  TRecord const record = EntryRecord({});
  for (TRecordProperty const& property : record.GetProperties()) sources[property.fName] = property.fSource;
  EXPECT_EQ(sources["Age"], "IPMI Get SEL Entry, Get SEL Time");
  EXPECT_EQ(sources["HasEnded"], "IPMI Get SEL Entry, Get Sensor Reading");
  EXPECT_EQ(sources["RecordData"], "IPMI Get SEL Entry, sensor data records");
}

TEST_F(ControllerNamespaceTest, TheGuidIsThatOfTheSystem) {  // command 0x37; that of the device is command 0x08
  std::string source;
  TRecord const record = ControllerRecord({}, TComputerSystem(TMachineFiles(fDir.Path())));
  for (TRecordProperty const& property : record.GetProperties())
    if (property.fName == "GUID") source = property.fSource;
  EXPECT_EQ(source, "IPMI Get System GUID");
}

TEST_F(ControllerNamespaceTest, AnEntryInAFormOfTheMakerDoesNotEndAState) {
  std::string const event = SelEvent(0, 1, 0x30, 1, 0x59, 91, 90);
  std::string makers = SelEvent(1, 1, 0x30, 0x81, 0x59, 91, 90);  // at the same places as in the end of the event
  makers[2] = '\xC0';
  fController.fEvents = {event, makers};
  std::string const text = Fill();
  EXPECT_THAT(text, Not(HasSubstr("HasEnded: true")));
  std::size_t const record = text.find("  ElementName: maker's entry\n");
  ASSERT_NE(record, std::string::npos);
  EXPECT_EQ(text.substr(record, text.find("CIM_SystemDevice", record) - record),
            "  ElementName: maker's entry\n"
            "  PerceivedSeverity: 0\n"
            "  RecordData: maker's entry: entry in a form of the maker: 01 00 c0 80 44 17 60 20 00 04 01 30 81 59 5b 5a\n"
            "  SensorTypeName: <the entry is in a form of the maker>\n"
            "  SensorDeviceID: <the entry is in a form of the maker>\n"
            "  Age: 0\n"
            "  HasEnded: false\n");
}

TEST_F(ControllerNamespaceTest, AnEventHasTheNameOfASensorThatOnlyReportsEvents) {
  fController.fRecords.push_back(EventOnlyRecord(3, 0x77, 0x12, "System Event"));
  fController.fEvents = {SelEvent(0, 0x12, 0x77, 0x6F, 1)};
  std::string const text = Fill();
  EXPECT_THAT(text, HasSubstr("  RecordData: System Event: OEM System Boot Event, asserted\n"));
  EXPECT_THAT(text, Not(HasSubstr("  CurrentState: <")));
}

TEST_F(ControllerNamespaceTest, AnEventWhoseStateIsOverHasEnded) {
  constexpr int redundancy = 0x0B, severity = 0x07, specific = 0x6F, critical = 2;
  constexpr std::size_t typeOfRecord = 13;
  struct TRow {
    int fSensorType, fEventType, fState, fStates;  // of the event, and the bits that the sensor has now
    bool fHasEnded;
  };
  TRow const rows[] = {
      {8, redundancy, 1, 0x01, true},       // "Redundancy Lost"; now "Fully Redundant"
      {8, redundancy, 1, 0x02, false},      // still lost
      {9, severity, critical, 0x01, true},  // "Transition to Critical"; now "OK"
      {9, severity, critical, 0x04, false},
      {8, specific, 1, 0x01, true},  // power supply failure; now only present
      {8, specific, 1, 0x03, false},
      {0x0C, specific, 1, 0x00, false},  // an uncorrectable memory error, whose bit does not last
      {0x0C, severity, critical, 0x01, false},
      {0x13, specific, 4, 0x00, false},  // a critical interrupt
  };
  for (TRow const& row : rows) {
    std::string record = CompactSensorRecord(1, 0x60, row.fSensorType, "part");
    record[typeOfRecord] = static_cast<char>(row.fEventType);
    fController.fRecords = {record};
    fController.fEvents = {SelEvent(0, row.fSensorType, 0x60, row.fEventType, row.fState)};
    fController.fAnswers[Bytes({4, 0x2D, 0x60})] = Bytes({0, 0, 0xC0, row.fStates, 0x80});
    fNs = NewNamespace();
    EXPECT_THAT(Fill(), HasSubstr(row.fHasEnded ? "HasEnded: true" : "HasEnded: false"))
        << row.fSensorType << " " << row.fEventType << " " << row.fStates;
  }
}

TEST_F(ControllerNamespaceTest, AnEventWhoseStateCannotBeReadHasNotEnded) {
  constexpr std::size_t readableStates = 18;
  auto const readTo = [&](int flags, int readable) {
    std::string record = CompactSensorRecord(1, 0x60, 8, "PSU 2");
    record[readableStates] = static_cast<char>(readable);
    fController.fRecords = {record};
    fController.fEvents = {SelEvent(0, 8, 0x60, 0x6F, 1)};
    fController.fAnswers[Bytes({4, 0x2D, 0x60})] = Bytes({0, 0, flags, 1, 0x80});
    fNs = NewNamespace();
    return Fill();
  };
  EXPECT_THAT(readTo(0xC0, 0x03), HasSubstr("HasEnded: true"));
  EXPECT_THAT(readTo(0xE0, 0x03), HasSubstr("HasEnded: false")) << "the states are unavailable";
  EXPECT_THAT(readTo(0xC0, 0x01), HasSubstr("HasEnded: false")) << "the sensor only reports the event";
}

TEST_F(ControllerNamespaceTest, SensorsOfTwoLunsStayApart) {
  constexpr std::size_t lunOfRecord = 6, lunOfEvent = 8;
  std::string other = CompactSensorRecord(3, 0x51, 8, "PSU 9"), end = SelEvent(1, 8, 0x51, 0x6F | 0x80, 1);
  other[lunOfRecord] = end[lunOfEvent] = 1;
  fController.fRecords.push_back(other);
  fController.fEvents = {SelEvent(0, 8, 0x51, 0x6F, 1), end};
  std::string const text = Fill();
  EXPECT_THAT(text, HasSubstr("DeviceID=\"ipmi 0x20 0x51\""));
  EXPECT_THAT(text, HasSubstr("DeviceID=\"ipmi 0x20 LUN 1 0x51\""));
  EXPECT_THAT(text, HasSubstr("  SensorDeviceID: ipmi 0x20 0x51\n"));
  EXPECT_THAT(text, HasSubstr("  SensorDeviceID: ipmi 0x20 LUN 1 0x51\n"));
  EXPECT_THAT(text, HasSubstr("  RecordData: PSU 1: Power Supply Failure detected, asserted\n"));
  EXPECT_THAT(text, HasSubstr("  RecordData: PSU 9: Power Supply Failure detected, deasserted\n"));
  EXPECT_THAT(text, HasSubstr("HasEnded: false")) << "the end is that of the other sensor";
}

TEST_F(ControllerNamespaceTest, AThresholdEventOfASensorThatIsWithinItHasEnded) {
  fController.fEvents = {SelEvent(0, 1, 0x30, 1, 0x59, 91, 90)};  // upper critical, going high; its end is not in the log
  EXPECT_THAT(Fill(), Not(HasSubstr("HasEnded: true"))) << "the sensor is beyond it";
  fController.fAnswers[Bytes({4, 0x2D, 0x30})] = Bytes({0, 85, 0xC0, 0x08, 0});  // only beyond the non-critical threshold
  fNs = NewNamespace();
  EXPECT_THAT(Fill(), HasSubstr("HasEnded: true"));
  fController.fAnswers[Bytes({4, 0x2D, 0x30})] = Bytes({0, 85, 0xE0, 0x08, 0});  // the reading is unavailable
  fNs = NewNamespace();
  EXPECT_THAT(Fill(), Not(HasSubstr("HasEnded: true")));
}

TEST_F(ControllerNamespaceTest, AnEntryThatIsAddedWhileTheLogIsReadIsNew) {
  constexpr std::uint32_t clock = 1612137600;
  fController.fEvents = {SelEvent(0, 8, 0x51, 0x6F, 1, 0xFF, 0xFF, clock + 600)};
  EXPECT_THAT(Fill(), HasSubstr("  Age: 0\n"));
  fController.fEvents = {SelEvent(0, 8, 0x51, 0x6F, 1, 0xFF, 0xFF, clock + 601)};
  fNs = NewNamespace();
  EXPECT_THAT(Fill(), HasSubstr("  Age: <the entry is later than the clock of the controller>\n"));
}

TEST_F(ControllerNamespaceTest, AFruDeviceThatIsNotReadHasTheReason) {
  std::string other = FruLocatorRecord(3, 5, "Node 2"), onBus = FruLocatorRecord(4, 6, "DIMM A1");
  other[5] = 0x22;  // the address of another controller
  onBus[7] = 0;
  fController.fRecords.insert(fController.fRecords.end(), {other, onBus});
  std::string const text = Fill();
  EXPECT_THAT(text, HasSubstr("Tag=\"ipmi 0x22 FRU 5 unread\""));
  EXPECT_THAT(text,
              HasSubstr("Manufacturer: <the FRU device belongs to another controller or another LUN, which is not queried>"));
  EXPECT_THAT(text, HasSubstr("ElementName: DIMM A1 unread\n"));
  EXPECT_THAT(text, HasSubstr("SerialNumber: <the FRU device is on a bus of the controller, which is not read>"));
}

TEST_F(ControllerNamespaceTest, AnEntryWithoutATimeHasTheUnknownTimeAsItsKey) {
  std::string makers = SelEvent(0, 1, 0x30, 1, 0x59);
  makers[2] = '\xE0';  // a form without a time
  fController.fEvents = {makers};
  std::string const text = Fill();
  EXPECT_THAT(text, HasSubstr("MessageTimestamp=\"99990101000000.000000+000\""));
  EXPECT_THAT(text, HasSubstr("  Age: <the entry has no time>\n"));
}

TEST_F(ControllerNamespaceTest, AControllerThatFallsSilentLeavesReasons) {
  fController.fMostRequests = 38;  // up to the event log
  std::string const text = Fill();
  EXPECT_THAT(text, HasSubstr("FirmwareVersion: 1.10"));
  EXPECT_THAT(text, HasSubstr("event log: the controller does not answer"));
  EXPECT_EQ(TReasonReader(*fNs).WhyNoInstance("ZEP_EventLog")->fReason, "the controller does not answer");
}

TEST_F(ControllerNamespaceTest, EveryListThatWasNotReadToItsEndIsNamed) {
  Fill();
  std::size_t const all = fController.fRequests;
  auto const unreadAfter = [&](std::size_t requests) {
    fController.fMostRequests = requests;
    fController.fRequests = 0;
    fNs = NewNamespace();
    std::string const text = Fill();
    std::size_t const begin = text.find("UnreadParts: ");
    return text.substr(begin, text.find('\n', begin) - begin);
  };
  EXPECT_THAT(unreadAfter(all), Not(HasSubstr("the controller does not answer")));
  EXPECT_THAT(unreadAfter(all - 1), HasSubstr("FRU data: the controller does not answer"));
  EXPECT_THAT(unreadAfter(all - 1), Not(HasSubstr("event log")));
  EXPECT_THAT(unreadAfter(all - 10), HasSubstr("event log: the controller does not answer"));
  EXPECT_THAT(unreadAfter(30), HasSubstr("sensors: the controller does not answer"));
}

TEST_F(ControllerNamespaceTest, NoControllerLeavesTheReasonInEachClass) {
  fController.fMostRequests = 0;
  Fill();
  TReasonReader const reasons(*fNs);
  for (char const* const name : {"ZEP_ManagementController", "ZEP_ControllerNetwork", "ZEP_ControllerAccount", "CIM_Sensor",
                                 "CIM_NumericSensor", "CIM_PhysicalPackage", "ZEP_EventLog", "ZEP_EventLogEntry"})
    EXPECT_EQ(reasons.WhyNoInstance(name)->fReason, "the controller does not answer") << name;
}

TEST_F(ControllerNamespaceTest, AnswersOfAnyLengthAreHarmless) {
  auto const whole = fController.Connection();
  for (std::size_t length = 0; length < 24; ++length) {
    TIpmi const cut = [&](TIpmiRequest const& request) {
      return whole(request).Then([&](std::string const& answer) { return answer.substr(0, length); });
    };
    auto const ns = NewNamespace();
    auto const controller = ReadController(
        cut, [](std::string const&) { return nullptr; }, [](char const*, std::size_t, std::size_t) {});
    EXPECT_NO_THROW(FillControllerNamespace(controller, TMachineFiles(fDir.Path()), *ns)) << length;
  }
}

// The answers of the controller of a virtual machine (QEMU's ipmi-bmc-sim with the records of three sensors and two events),
// recorded through /dev/ipmi0.
TEST_F(ControllerNamespaceTest, ARecordedControllerIsDescribed) {
  TMachineFiles const files(SourcePath("tests/data/controller"));
  auto const controller = ReadController(
      Recorded(TIpmi(), files), [](std::string const&) { return nullptr; }, [](char const*, std::size_t, std::size_t) {});
  FillControllerNamespace(controller, files, *fNs);
  std::string const text = TextOf(*fNs);
  for (char const* const line :
       {"IPMIVersion: 2.0", "ElementName: PSU 1", "ElementName: Fan 1", "UpperThresholdCritical: 90",
        "CurrentReading: <the controller refused the command 0x2d of network function 0x04 (completion code 0xcb)>",
        "CurrentNumberOfRecords: 2", "FreeRecords: 126", "ClockTime: 20261122225220.000000+000",
        "RecordData: PSU 1: Power Supply Failure detected, asserted", "Age: 1"})
    EXPECT_THAT(text, HasSubstr(std::string("  ") + line + "\n"));
}

}  // namespace
}  // namespace NQRVZEP20
