// SPDX-License-Identifier: Apache-2.0
#include "SmartReport.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <limits>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::json;
using TText = TFinding<std::string>;
using TNumber = TFinding<unsigned long>;

TMissing NotReported() { return {kMissingNotGiven, "smartctl does not report it for this disk"}; }

// The element at a path such as "power_on_time/hours"; null if there is none.
TJson const* At(TJson const& json, std::string const& path) {
  TJson const* element = &json;
  for (std::size_t begin = 0; begin <= path.size();) {
    std::size_t const end = std::min(path.find('/', begin), path.size());
    if (!element->is_object()) return nullptr;
    auto const found = element->find(path.substr(begin, end - begin));
    if (found == element->end()) return nullptr;
    element = &*found;
    begin = end + 1;
  }
  return element;
}

// Names that different versions and kinds of disks use for the same fact: the first that exists.
TJson const* AtAny(TJson const& json, std::vector<char const*> const& paths) {
  for (char const* path : paths)
    if (TJson const* const found = At(json, path)) return found;
  return nullptr;
}

template <class T>
TFinding<T> Number(TJson const* element) {
  if (element == nullptr || !element->is_number_integer()) return NotReported();
  if (element->is_number_unsigned()) {
    auto const number = element->get<std::uint64_t>();
    if (number <= static_cast<std::uint64_t>(std::numeric_limits<T>::max())) return static_cast<T>(number);
  } else {
    auto const number = element->get<std::int64_t>();
    if (std::is_signed_v<T> && number >= static_cast<std::int64_t>(std::numeric_limits<T>::min())) return static_cast<T>(number);
  }
  return TMissing{kMissingUnexpected, "smartctl reports " + element->dump() + ", which is outside the expected range"};
}

TText Text(TJson const* element) {
  if (element == nullptr || !element->is_string() || element->get_ref<std::string const&>().empty()) return NotReported();
  return element->get<std::string>();
}

TFinding<bool> Flag(TJson const* element) {
  if (element == nullptr || !element->is_boolean()) return NotReported();
  return element->get<bool>();
}

template <class T>
TFinding<T> FirstOf(TFinding<T> const& first, TFinding<T> const& second) {
  return first ? first : second;
}

TJson const& ArrayAt(TJson const& json, std::string const& path) {
  static TJson const empty = TJson::array();
  TJson const* const found = At(json, path);
  return found != nullptr && found->is_array() ? *found : empty;
}

// ---- ATA ----

std::vector<TSmartAttribute> AttributesFrom(TJson const& json) {
  std::vector<TSmartAttribute> attributes;
  for (TJson const& row : ArrayAt(json, "ata_smart_attributes/table")) {
    auto const id = Number<unsigned short>(At(row, "id"));
    if (!id) continue;
    TSmartAttribute attribute;
    attribute.fId = *id;
    attribute.fName = Text(At(row, "name"));
    attribute.fValue = Number<unsigned short>(At(row, "value"));
    attribute.fWorst = Number<unsigned short>(At(row, "worst"));
    attribute.fThreshold = Number<unsigned short>(At(row, "thresh"));
    attribute.fRaw = Number<unsigned long>(At(row, "raw/value"));
    attribute.fRawText = Text(At(row, "raw/string"));
    attribute.fIsPrefailure = Flag(At(row, "flags/prefailure"));
    TText const whenFailed = Text(At(row, "when_failed"));
    attribute.fWhenFailed = whenFailed ? whenFailed : TMissing{kMissingNotApplicable, "the attribute has never failed"};
    attributes.push_back(attribute);
  }
  return attributes;
}

TNumber RawValue(std::vector<TSmartAttribute> const& attributes, unsigned short id) {
  for (TSmartAttribute const& attribute : attributes)
    if (attribute.fId == id) return attribute.fRaw;
  return NotReported();
}

// A value of the device statistics, which the ATA standard defines by name.
TNumber Statistic(TJson const& json, char const* name) {
  for (TJson const& page : ArrayAt(json, "ata_device_statistics/pages"))
    for (TJson const& row : ArrayAt(page, "table")) {
      TText const rowName = Text(At(row, "name"));
      if (rowName && *rowName == name) return Number<unsigned long>(At(row, "value"));
    }
  return NotReported();
}

// ---- Values of several kinds of disks ----

TNumber Product(TNumber const& number, TNumber const& unit) {
  return number.Then([&](unsigned long count) {
    return unit.Then([&](unsigned long size) -> TNumber {
      unsigned long product = 0;
      if (__builtin_mul_overflow(count, size, &product))
        return TMissing{kMissingUnexpected, "smartctl reports too large a number"};
      return product;
    });
  });
}

// An NVMe disk counts in units of 1000 blocks of 512 bytes.
TNumber Bytes(TJson const& json, char const* nvmeName, char const* statistic) {
  constexpr unsigned long kNvmeUnit = 512000;
  TNumber const units = Number<unsigned long>(At(json, std::string("nvme_smart_health_information_log/") + nvmeName));
  if (units) return Product(units, TNumber(kNvmeUnit));
  return Product(Statistic(json, statistic), Number<unsigned long>(At(json, "logical_block_size")));
}

// A SCSI disk counts its uncorrected errors by kind of access.
TNumber ScsiUncorrected(TJson const& json) {
  TNumber sum = NotReported();
  for (char const* kind : {"read", "write", "verify"}) {
    TNumber const count =
        Number<unsigned long>(At(json, "scsi_error_counter_log/" + std::string(kind) + "/total_uncorrected_errors"));
    if (count) sum = (sum ? *sum : 0UL) + *count;
  }
  return sum;
}

TText SelfTestFrom(TJson const& json) {
  TJson const& nvmeTests = ArrayAt(json, "nvme_self_test_log/table");
  if (!nvmeTests.empty()) return Text(At(nvmeTests[0], "self_test_result/string"));
  return Text(AtAny(json, {"ata_smart_data/self_test/status/string", "scsi_self_test_0/result/string"}));
}

TFinding<long> TemperatureFrom(TJson const& json) {
  return Number<long>(At(json, "temperature/current")).Then([](long degrees) -> TFinding<long> {
    if (degrees == 0) return TMissing{kMissingPlaceholder, "the disk reports 0 degrees, as disks without a sensor do"};
    return degrees;
  });
}

// The message of a run that found no values.
TMissing WhyNoValues(TJson const& json) {
  for (TJson const& message : ArrayAt(json, "smartctl/messages"))
    if (TText const text = Text(At(message, "string"))) return {kMissingUnreadable, "smartctl reports: " + *text};
  if (TText const mode = Text(At(json, "power_mode/name"))) return {kMissingUnreadable, "the disk is in the mode " + *mode};
  return {kMissingNotGiven, "smartctl reports nothing about the health of this disk"};
}

}  // namespace

TSmartReport NoSmartReport(TMissing const& why) {
  return {why, why, why, why, why, why, why, why, why, why, why, why, why, why, why, why, why, why, why, {}};
}

bool HasHealth(TSmartReport const& report) {
  return report.fPassed || report.fTemperature || report.fPowerOnHours || report.fPowerCycles || report.fReallocated ||
         report.fUncorrectable || report.fPercentageUsed || !report.fAttributes.empty();
}

bool IsOnlyTemperature(TSmartReport const& report) {
  constexpr unsigned char temperature = 1U << 1;
  return report.fPassed && !*report.fPassed && report.fCriticalWarning && *report.fCriticalWarning == temperature;
}

TSmartReport SmartReportFrom(std::string const& text) {
  TJson const json = TJson::parse(text, nullptr, false);
  if (!json.is_object()) return NoSmartReport({kMissingUnexpected, "the output of smartctl is not an object in JSON"});
  if (At(json, "smart_support") == nullptr && At(json, "smart_status") == nullptr && At(json, "user_capacity") == nullptr)
    return NoSmartReport(WhyNoValues(json));

  auto const nvme = [&](char const* name) { return At(json, std::string("nvme_smart_health_information_log/") + name); };
  constexpr unsigned short kReallocatedId = 5, kPendingId = 197, kUncorrectableId = 198, kTransferErrorsId = 199;
  std::vector<TSmartAttribute> const attributes = AttributesFrom(json);
  TSmartReport report = NoSmartReport(NotReported());
  report.fPassed = Flag(At(json, "smart_status/passed"));
  report.fTemperature = TemperatureFrom(json);
  report.fPowerOnHours = Number<unsigned long>(At(json, "power_on_time/hours"));
  report.fPowerCycles = Number<unsigned long>(At(json, "power_cycle_count"));
  report.fReallocated = FirstOf(RawValue(attributes, kReallocatedId), Number<unsigned long>(At(json, "scsi_grown_defect_list")));
  report.fPending = RawValue(attributes, kPendingId);
  report.fUncorrectable = FirstOf(FirstOf(RawValue(attributes, kUncorrectableId), Number<unsigned long>(nvme("media_errors"))),
                                  ScsiUncorrected(json));
  report.fTransferErrors = RawValue(attributes, kTransferErrorsId);
  report.fErrorLogEntries =
      Number<unsigned long>(AtAny(json, {"ata_smart_error_log/extended/count", "ata_smart_error_log/summary/count",
                                         "nvme_smart_health_information_log/num_err_log_entries"}));
  report.fUnsafeShutdowns = Number<unsigned long>(nvme("unsafe_shutdowns"));
  report.fPercentageUsed =
      FirstOf(Number<unsigned char>(AtAny(json, {"nvme_smart_health_information_log/percentage_used",
                                                 "scsi_percentage_used_endurance_indicator", "endurance_used/current_percent"})),
              Statistic(json, "Percentage Used Endurance Indicator").Then([](unsigned long percent) {
                return static_cast<unsigned char>(std::min(percent, 255UL));
              }));
  report.fAvailableSpare = Number<unsigned char>(nvme("available_spare"));
  report.fAvailableSpareThreshold = Number<unsigned char>(nvme("available_spare_threshold"));
  report.fCriticalWarning = Number<unsigned char>(nvme("critical_warning"));
  report.fBytesRead = Bytes(json, "data_units_read", "Logical Sectors Read");
  report.fBytesWritten = Bytes(json, "data_units_written", "Logical Sectors Written");
  report.fSelfTest = SelfTestFrom(json);
  report.fRotationsPerMinute = Number<unsigned>(At(json, "rotation_rate"));
  report.fFormFactor = Number<unsigned>(AtAny(json, {"form_factor/ata_value", "form_factor/scsi_value"}));
  report.fAttributes = attributes;
  return report;
}

}  // namespace NQRVZEP20
