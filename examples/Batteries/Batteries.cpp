// SPDX-License-Identifier: Apache-2.0

// A provider plug-in that states the source of each value, and the reason for each missing one.

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

TRecord BatteryRecord(std::filesystem::path const& battery) {
  TRecord record("X_Battery", "sysfs");
  record.AddKey("Name", battery.filename().string());
  record.Add("Model", ReadLine(battery / "model_name"));
  record.Add("Charge", ReadLine(battery / "capacity").Then(PercentFrom));
  return record;
}

void FillNamespace(TMemoryNamespace& ns) {
  std::vector<TRecord> records;
  std::error_code ignored;
  for (auto const& entry : std::filesystem::directory_iterator(Directory(), ignored)) records.push_back(BatteryRecord(entry));

  TRecordWriter writer(ns);
  writer.Write(BatteryRecord(""), records, TMissing{kMissingNotGiven, "the kernel shows no battery"});
  writer.WriteMissing();
}

struct TRegistration {
  TRegistration() {
    TRootObject::GetNamespaceProviderManager()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Batteries", "root/batteries", FillNamespace));
  }
} const gRegistration;

}  // namespace
