// SPDX-License-Identifier: Apache-2.0
#include "RunningRecords.h"

#include "TOSSpecific.h"
#include "providers/reasons/RunningClock.h"

#include <sys/timex.h>
#include <nlohmann/json.hpp>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

constexpr char const* kTaints[] = {"P: a proprietary module was loaded",
                                   "F: a module was loaded by force",
                                   "S: the kernel runs on a system out of its specification",
                                   "R: a module was unloaded by force",
                                   "M: a processor reported a machine check exception",
                                   "B: a bad page was referenced, or page flags were unexpected",
                                   "U: requested by a user program",
                                   "D: the kernel has died: there was an OOPS or a BUG",
                                   "A: an ACPI table was overridden by the user",
                                   "W: the kernel issued a warning",
                                   "C: a staging driver was loaded",
                                   "I: a workaround for a bug in the platform's firmware was applied",
                                   "O: a module from outside the kernel's tree was loaded",
                                   "E: an unsigned module was loaded",
                                   "L: a soft lockup occurred",
                                   "K: the kernel was patched while it ran",
                                   "X: auxiliary, defined by the distribution",
                                   "T: the kernel was built with the plug-in that randomises structures",
                                   "N: a test was run in the kernel",
                                   "J: a user program changed the state of firmware by a debug operation"};

// The averages of 1, 5 and 15 minutes: "0.20 0.18 0.12 1/80 11206".
TFinding<float> LoadFrom(std::string const& text, int number) {
  float loads[3] = {};
  if (std::sscanf(text.c_str(), "%f %f %f", &loads[0], &loads[1], &loads[2]) == 3) return loads[number];
  return TMissing{kMissingUnexpected, "/proc/loadavg contains \"" + text + "\""};
}

TText AskForClock() {
  timex state = {};
  if (::adjtimex(&state) < 0) return TMissing{kMissingUnreadable, std::string("adjtimex failed: ") + std::strerror(errno)};
  return std::string(reinterpret_cast<char const*>(&state), sizeof state);
}

TText AskForFailedUnits() {
  constexpr int timeoutSeconds = 2;
  std::string output;
  int const status = TOSSpecific::SpawnProcess("systemctl", {"--failed", "--output=json", "--no-pager"}, output, timeoutSeconds);
  if (status != 0) return TMissing{kMissingUnreadable, "systemctl --failed did not succeed within the time limit"};
  return output;
}

TFinding<std::vector<std::string>> FailedUnits(TMachineFiles const& files) {
  auto const ask = [&files]() -> TText {
    if (!files.Exists("/run/systemd/system")) return TMissing{kMissingNotApplicable, "systemd does not run on this machine"};
    return AskForFailedUnits();
  };
  return files.Answer("systemctl/failed", ask).Then(FailedUnitsFrom);
}

}  // namespace

TRecord RunningRecord(TMachineFiles const& files, TMemInfo const& memory) {
  TRecord record("ZEP_RunningState", "/proc/uptime", "CIM_StatisticalData");
  record.AddKey("InstanceID", "Running state");
  record.AddOwn("ElementName", "Running state");
  record.Add("Uptime", RunningClockOf(files).fUptime).Unit("second");
  record.SetSource("/proc/loadavg");
  auto const load = files.Line("/proc/loadavg");
  constexpr char const* names[] = {"LoadOfOneMinute", "LoadOfFiveMinutes", "LoadOfFifteenMinutes"};
  for (int at = 0; at < 3; ++at) record.Add(names[at], load.Then([at](std::string const& text) { return LoadFrom(text, at); }));
  record.SetSource("/proc/meminfo");
  record.Add("AvailableMemory", memory.Bytes("MemAvailable")).Unit("byte");
  record.SetSource("/proc/sys/kernel/tainted");
  auto const taint = files.Number<std::uint64_t>("/proc/sys/kernel/tainted");
  record.Add("Taint", taint);
  record.Add("TaintReasons", taint.Then(TaintWords));
  record.SetSource("adjtimex");
  record.Add("ClockSynchronized", files.Answer("adjtimex", AskForClock).Then(IsSynchronized));
  record.SetSource("systemctl --failed");
  record.Add("FailedUnits", FailedUnits(files));
  return record;
}

std::vector<std::string> TaintWords(std::uint64_t taint) {
  std::vector<std::string> words;
  for (unsigned bit = 0; bit < 64; ++bit)
    if (taint >> bit & 1) words.push_back(bit < std::size(kTaints) ? kTaints[bit] : "bit " + std::to_string(bit));
  return words;
}

TFinding<std::vector<std::string>> FailedUnitsFrom(std::string const& json) {
  TMissing const unexpected{kMissingUnexpected, "the output of systemctl --failed is not a list of units"};
  auto const units = nlohmann::json::parse(json, nullptr, false);
  if (!units.is_array()) return unexpected;
  std::vector<std::string> names;
  for (auto const& unit : units) {
    if (!unit.is_object() || !unit.contains("unit") || !unit["unit"].is_string()) return unexpected;
    names.push_back(unit["unit"].get<std::string>());
  }
  return names;
}

TFinding<bool> IsSynchronized(std::string const& bytes) {
  timex state = {};
  if (bytes.size() != sizeof state) return TMissing{kMissingUnexpected, "adjtimex returned a structure of another size"};
  std::memcpy(&state, bytes.data(), sizeof state);
  return (state.status & STA_UNSYNC) == 0;
}

}  // namespace NQRVZEP20
