// SPDX-License-Identifier: Apache-2.0

// A provider plug-in that states the source of each value, and the reason for each missing one. It also reports a problem: a
// battery that is nearly empty.

#include "TMemoryNamespace.h"
#include "TMemoryProvider.h"
#include "TRecordWriter.h"
#include "TRootObject.h"

#include <boost/make_shared.hpp>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

using namespace NQRVZEP20;

namespace {

// The directory in which the kernel lists the batteries. EXAMPLE_BATTERIES names another one, for tests.
std::filesystem::path Directory() {
  char const* const named = std::getenv("EXAMPLE_BATTERIES");
  return named != nullptr ? named : "/sys/class/power_supply";
}

TFinding<std::string> ReadLine(std::filesystem::path const& file) {
  std::ifstream stream(file);
  std::string line;
  if (!std::getline(stream, line)) return TMissing{kMissingUnreadable, file.string() + " cannot be read"};
  return line;
}

TFinding<unsigned short> PercentFrom(std::string const& text) {
  char* end = nullptr;
  unsigned long const percent = std::strtoul(text.c_str(), &end, 10);
  if (text.empty() || *end != '\0' || percent > 100) return TMissing{kMissingUnexpected, "\"" + text + "\" is not a percentage"};
  return static_cast<unsigned short>(percent);
}

TFinding<unsigned short> ChargeOf(std::filesystem::path const& battery) {
  return ReadLine(battery / "capacity").Then(PercentFrom);
}

TRecord BatteryRecord(std::filesystem::path const& battery) {
  TRecord record("X_Battery", "sysfs");
  record.AddKey("Name", battery.filename().string());
  record.Add("Model", ReadLine(battery / "model_name"));
  record.Add("Charge", ChargeOf(battery));
  return record;
}

// A problem of the battery, which zep report lists among its findings.
TRecord FindingRecord(std::string const& battery, unsigned short charge) {
  TRecord record("ZEP_Finding", "sysfs", "CIM_ManagedElement");
  record.AddKey("InstanceID", "battery-charge " + battery);
  record.AddOwn("Rule", "battery-charge");
  record.AddOwn("Severity", "warning");
  record.Add("Reason", TFinding<std::string>("the battery " + battery + " has only " + std::to_string(charge) + " % left"));
  record.AddOwn("Remedy", "Connect the machine to its power supply, and check that the battery charges.");
  record.AddOwn("Element", "X_Battery.Name=\"" + battery + "\"");
  return record;
}

void FillNamespace(TMemoryNamespace& ns) {
  constexpr unsigned short lowest = 20;  // percent
  std::vector<TRecord> records, findings;
  std::error_code ignored;
  for (auto const& entry : std::filesystem::directory_iterator(Directory(), ignored)) {
    records.push_back(BatteryRecord(entry));
    auto const charge = ChargeOf(entry);
    if (charge && *charge < lowest) findings.push_back(FindingRecord(entry.path().filename().string(), *charge));
  }

  TRecordWriter writer(ns);
  writer.Write(BatteryRecord(""), records, TMissing{kMissingNotGiven, "the kernel shows no battery"});
  writer.Write(FindingRecord("", 0), findings, TMissing{kMissingNotApplicable, "no battery is nearly empty"});
  writer.WriteMissing();
}

struct TRegistration {
  TRegistration() {
    TRootObject::GetNamespaceProviderManager()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Batteries", "root/batteries", FillNamespace));
  }
} const gRegistration;

}  // namespace
