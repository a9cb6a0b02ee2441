// SPDX-License-Identifier: Apache-2.0

// The rules about the management controller, with instances that show a problem, that show none, and without a controller.

#include "tests/collect/findings/FindingsOf.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr int kDay = 86400;
constexpr int kWarning = 3, kCritical = 6;

std::string OnController(std::string const& instances) {
  return "instance of ZEP_ManagementController { DeviceID = \"c\"; };" + instances;
}

std::string Entry(int number, std::string const& text, int severity, int age, bool hasEnded = false) {
  return "instance of ZEP_EventLogEntry { RecordID = \"" + std::to_string(number) + "\"; RecordData = \"" + text +
         "\"; PerceivedSeverity = " + std::to_string(severity) + "; Age = " + std::to_string(age) +
         "; HasEnded = " + (hasEnded ? "true" : "false") + "; };";
}

TEST(ControllerRulesTest, ACriticalEntryIsNamedWithItsAge) {
  std::string const rule = "event-log-critical", event = "CPU Temp: Upper Critical - going high, asserted";
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event + "; reading 95", kCritical, 5 * kDay) +
                                          Entry(2, event + "; reading 91", kCritical, 2 * kDay))),
              ElementsAre("error: the controller's event log has a critical entry: " + event + " (2 days ago, the last of 2)"));
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event, kCritical, 10))),
              ElementsAre("error: the controller's event log has a critical entry: " + event + " (less than a minute ago)"));
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event, kWarning, 10))), IsEmpty());
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event, kCritical, 10, true))), IsEmpty()) << "the state has ended";
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event, kCritical, 31 * kDay))), IsEmpty());
  TThresholds thresholds;
  thresholds.fEventLogDays = 40;
  EXPECT_THAT(Problems(rule, OnController(Entry(1, event, kCritical, 31 * kDay)), thresholds), testing::SizeIs(1));
}

TEST(ControllerRulesTest, EntriesAboutTwoModulesStayApart) {
  std::string const event = "ECC: Uncorrectable ECC, asserted; Memory module/device #";
  EXPECT_THAT(
      Problems("event-log-critical", OnController(Entry(1, event + "1", kCritical, 10) + Entry(2, event + "2", kCritical, 10))),
      ElementsAre(testing::HasSubstr(event + "1"), testing::HasSubstr(event + "2")));
}

TEST(ControllerRulesTest, AnEntryThatIsNotAboutAPartHasARemedyOfItsOwn) {
  struct TRow {
    char const *fType, *fText, *fSeverity, *fRemedy;
  };
  TRow const rows[] = {
      {"Memory", "ECC: Uncorrectable ECC, asserted", "error", "replace it"},
      {"Physical Security", "Cover: General Chassis Intrusion, asserted", "warning", "closed"},
      {"Platform Security Violation Attempt", "Panel: Out-of-band Access Password Violation, asserted", "warning", "password"},
      {"Event Logging Disabled", "SEL: All Event Logging Disabled, asserted", "information", "logging"},
      {"Boot Error", "Boot: No bootable media, asserted", "warning", "boot devices"},
      {"OS Critical Stop", "OS: Run-time Critical Stop, asserted", "warning", "operating system"},
      {"Watchdog 2", "Watchdog: Hard Reset, asserted", "warning", "operating system"},
      {"Fan", "Fan 3: Device Removed/Device Absent, asserted", "warning", "Insert"},
  };
  for (TRow const& row : rows) {
    std::string entry = Entry(1, row.fText, kCritical, 10);
    entry.insert(entry.find("RecordData"), std::string("SensorTypeName = \"") + row.fType + "\"; ");
    auto const problems = FindingsOf(OnController(entry)).fProblems;
    ASSERT_EQ(problems.size(), 1U) << row.fType;
    EXPECT_EQ(NameOf(problems[0].fSeverity), row.fSeverity) << row.fType;
    EXPECT_THAT(problems[0].fRemedy, testing::HasSubstr(row.fRemedy)) << row.fType;
    EXPECT_THAT(problems[0].fRemedy, testing::HasSubstr("ipmitool sel clear")) << row.fType;
  }
}

std::string Log(std::string const& state) {
  return OnController("instance of ZEP_EventLog { InstanceID = \"l\"; " + state + " };");
}

TEST(ControllerRulesTest, AFullLogIsNamed) {
  std::string const problem = "warning: the controller's event log is full, so that new events are lost";
  EXPECT_THAT(Problems("event-log-full", Log("FreeRecords = 0; HasLostRecords = false;")), ElementsAre(problem));
  EXPECT_THAT(Problems("event-log-full", Log("FreeRecords = 9; HasLostRecords = true;")),
              ElementsAre("warning: the controller's event log was full, and has lost events"));
  EXPECT_THAT(Problems("event-log-full", Log("FreeRecords = 9; HasLostRecords = false;")), IsEmpty());
}

TEST(ControllerRulesTest, AFullLogIsNamedWithTheSourceThatShowsIt) {
  auto const sourceOf = [](std::string const& state) {
    auto const problems = FindingsOf(Log("ClockTime = \"20210201000000.000000+000\"; " + state)).fProblems;
    return problems.size() == 1 ? problems[0].fSource : std::to_string(problems.size()) + " problems";
  };
  EXPECT_EQ(sourceOf("FreeRecords = 0; HasLostRecords = true;"), "free");
  EXPECT_EQ(sourceOf("FreeRecords = 9; HasLostRecords = true;"), "lost");
  EXPECT_EQ(sourceOf("HasLostRecords = true;"), "lost");
}

TEST(ControllerRulesTest, AClockThatIsNotSetIsNamed) {
  auto const missing = [](char const* code) { return Missing("ZEP_EventLog.InstanceID=\\\"l\\\"", "ClockTime", code); };
  EXPECT_THAT(Problems("controller-clock", Log("") + missing("placeholder")),
              ElementsAre("warning: the clock of the management controller is not set"));
  EXPECT_THAT(Problems("controller-clock", Log("") + missing("no-answer")), IsEmpty());
  EXPECT_THAT(Problems("controller-clock", Log("ClockTime = \"20210201000000.000000+000\";")), IsEmpty());
}

TEST(ControllerRulesTest, AClockThatLostItsTimeIsNamed) {
  auto const at = [](char const* time) { return Log(std::string("ClockTime = \"") + time + ".000000+000\";"); };
  EXPECT_THAT(Problems("controller-clock", at("20000101001530")),
              ElementsAre("warning: the clock of the management controller is in the year 2000"));
  EXPECT_THAT(Problems("controller-clock", at("20100101000000")), IsEmpty());

  std::string const log = at("20210201000000"), problem = "earlier than the newest entry of its event log";
  std::string const entries =
      "instance of ZEP_EventLogEntry { RecordID = \"1\"; };"
      "instance of ZEP_EventLogEntry { RecordID = \"2\"; Age = 10; };";
  std::string const later = log + entries + "instance of ZEP_EventLogEntry { RecordID = \"3\"; };";
  auto const ageIs = [](char const* code) { return Missing("ZEP_EventLogEntry.RecordID=\\\"3\\\"", "Age", code); };
  EXPECT_THAT(Problems("controller-clock", later + ageIs("unexpected-form")), ElementsAre(testing::HasSubstr(problem)));
  EXPECT_THAT(Problems("controller-clock", later + ageIs("not-given")), IsEmpty()) << "the entry has no date";
  EXPECT_THAT(Problems("controller-clock",
                       log + "instance of ZEP_EventLogEntry { RecordID = \"3\"; };" + entries + ageIs("unexpected-form")),
              IsEmpty())
      << "the clock was corrected after the first entry";
}

std::string Account(std::string const& name, int state, std::string const& privilege, bool hasAccess = true) {
  return OnController("instance of ZEP_ControllerAccount { Name = \"2\"; UserID = " + name +
                      "; EnabledState = " + std::to_string(state) + "; Privilege = \"" + privilege +
                      "\"; HasLANAccess = " + (hasAccess ? "true" : "false") + "; };");
}

TEST(ControllerRulesTest, AccountsThatAnyoneKnowsAreNamed) {
  constexpr int enabled = 2, disabled = 3;
  std::string const rule = "controller-account";
  EXPECT_THAT(Problems(rule, Account("\"ADMIN\"", enabled, "Administrator")),
              ElementsAre("information: the management controller has an account with a maker's usual name: ADMIN"));
  EXPECT_THAT(Problems(rule, Account("NULL", enabled, "User")),
              ElementsAre("warning: the management controller has an enabled account without a name (User)"));
  EXPECT_THAT(Problems(rule, Account("\"ADMIN\"", disabled, "Administrator")), IsEmpty());
  EXPECT_THAT(Problems(rule, Account("\"ADMIN\"", enabled, "User")), IsEmpty());
  EXPECT_THAT(Problems(rule, Account("NULL", enabled, "User", false)), IsEmpty()) << "without access over the LAN";
  EXPECT_THAT(Problems(rule, Account("\"alice\"", enabled, "Administrator")), IsEmpty());
}

TEST(ControllerRulesTest, AnAccountWhoseNameWasNotReadIsNotNameless) {
  constexpr int enabled = 2;
  auto const missing = [](char const* code) { return Missing("ZEP_ControllerAccount.Name=\\\"2\\\"", "UserID", code); };
  std::string const rule = "controller-account", account = Account("NULL", enabled, "User");
  EXPECT_THAT(Problems(rule, account + missing("not-given")), testing::SizeIs(1));
  for (char const* const code : {"no-answer", "refused", "time-is-up"}) {
    EXPECT_THAT(Problems(rule, account + missing(code)), IsEmpty()) << code;
    auto const notAsked = ResultOf(rule, FindingsOf(account + missing(code))).fNotAsked;
    ASSERT_EQ(notAsked.size(), 1U) << code;
    EXPECT_EQ(notAsked[0].fReason, "a reason") << code;
  }
}

std::string Sensor(std::string const& type, int status) {
  return OnController("instance of CIM_Sensor { DeviceID = \"s\"; ElementName = \"PSU 1\"; OtherSensorTypeDescription = \"" +
                      type + "\"; CurrentState = \"Power Supply Failure detected\"; OperationalStatus = {" +
                      std::to_string(status) + "}; };");
}

TEST(ControllerRulesTest, AFailedPartIsNamed) {
  constexpr int ok = 2, error = 6;
  std::string const rule = "controller-part-failed";
  EXPECT_THAT(Problems(rule, Sensor("Power Supply", error)),
              ElementsAre("error: the controller reports a failure of PSU 1 (Power Supply): Power Supply Failure detected"));
  EXPECT_THAT(Problems(rule, Sensor("Power Supply", ok)), IsEmpty());
  EXPECT_THAT(Problems(rule, Sensor("System ACPI Power State", error)), IsEmpty());
}

std::string PartIn(std::string const& type, std::string const& state, int status = 0) {
  return OnController("instance of CIM_Sensor { DeviceID = \"s\"; ElementName = \"PSU 1\"; CurrentState = \"" + state +
                      "\"; OtherSensorTypeDescription = \"" + type + "\"; OperationalStatus = {" + std::to_string(status) +
                      "}; };");
}

std::string Logged(std::string const& text, std::string const& sensor = "s", int age = 10) {
  return "instance of ZEP_EventLogEntry { RecordID = \"1\"; RecordData = \"" + text + "\"; SensorDeviceID = \"" + sensor +
         "\"; Age = " + std::to_string(age) + "; };";
}

TEST(ControllerRulesTest, APowerSupplyThatWasRemovedIsMissing) {
  std::string const rule = "controller-part-failed", text = "PSU 1: Presence detected, deasserted", removal = Logged(text);
  std::string const bay = PartIn("Power Supply", "none");
  EXPECT_THAT(Problems(rule, bay + removal),
              ElementsAre("error: PSU 1 (Power Supply) is missing: the controller's event log records its removal"));
  EXPECT_THAT(Problems(rule, PartIn("Power Supply", "Presence detected") + removal), IsEmpty()) << "inserted again";
  EXPECT_THAT(Problems(rule, bay), IsEmpty()) << "the bay was never used";
  EXPECT_THAT(Problems(rule, bay + Logged("PSU 1: Presence detected, asserted")), IsEmpty());
  EXPECT_THAT(Problems(rule, bay + Logged(text, "another sensor of this name")), IsEmpty());
  EXPECT_THAT(Problems(rule, bay + Logged(text, "s", 31 * kDay)), IsEmpty()) << "long ago";
  EXPECT_THAT(Problems(rule, PartIn("Drive Slot", "none") + removal), IsEmpty());
}

TEST(ControllerRulesTest, AnEmptyBayIsNotAFailure) {
  constexpr int error = 6;
  std::string const rule = "controller-part-failed", absent = "Device Removed/Device Absent";
  for (char const* const type : {"Fan", "Memory", "Drive Slot", "Battery", "Power Supply"}) {
    std::string const bay = PartIn(type, absent, error);
    EXPECT_THAT(Problems(rule, bay), IsEmpty()) << type;
    for (char const* const removal : {"Device Removed/Device Absent, asserted", "Device Inserted/Device Present, deasserted"})
      EXPECT_THAT(
          Problems(rule, bay + Logged(std::string("PSU 1: ") + removal)),
          ElementsAre(std::string("error: PSU 1 (") + type + ") is missing: the controller's event log records its removal"))
          << removal;
    EXPECT_THAT(Problems(rule, PartIn(type, "Device Inserted/Device Present", 2) + Logged("PSU 1: " + absent + ", asserted")),
                IsEmpty())
        << type << " was inserted again";
  }
}

TEST(ControllerRulesTest, AListThatWasCutShortIsNoted) {
  auto const reasonsOf = [](std::string const& rule, std::string const& parts) {
    std::string const controller = "instance of ZEP_ManagementController { DeviceID = \"c\"; UnreadParts = {" + parts + "}; };";
    std::vector<std::string> reasons;
    for (TNotAsked const& notAsked : ResultOf(rule, FindingsOf(controller)).fNotAsked) reasons.push_back(notAsked.fReason);
    return reasons;
  };
  std::string const sensors = "not read to the end: sensors: time", log = "not read to the end: event log: time";
  std::string const all = "\"sensors: time\", \"event log: time\", \"FRU data: time\"";
  EXPECT_THAT(reasonsOf("sensor-threshold", all), ElementsAre(sensors));
  EXPECT_THAT(reasonsOf("fan-stopped", all), ElementsAre(sensors));
  EXPECT_THAT(reasonsOf("controller-part-failed", all), ElementsAre(sensors, log));
  EXPECT_THAT(reasonsOf("event-log-critical", all), ElementsAre(log));
  for (char const* const rule : {"sensor-threshold", "controller-part-failed", "event-log-critical"})
    EXPECT_THAT(reasonsOf(rule, "\"FRU data: time\""), IsEmpty()) << rule;
}

TEST(ControllerRulesTest, AMachineWithoutAControllerIsFine) {
  for (TRule const& rule : ControllerRules()) {
    EXPECT_THAT(Problems(rule.fId, ""), IsEmpty()) << rule.fId;
    EXPECT_EQ(Outcome(rule.fId, ""), "fine") << rule.fId;
  }
}

}  // namespace
}  // namespace NQRVZEP20
