// SPDX-License-Identifier: Apache-2.0
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMPropertyDecl.h"
#include "collect/Sections.h"
#include "collect/TValueWords.h"
#include "collect/findings/Findings.h"
#include "tools/zep/controller/Inventory.h"
#include "tools/zep/output/FindingsJson.h"
#include "tools/zep/output/FindingsText.h"
#include "tools/zep/output/InstanceJson.h"
#include "tools/zep/output/SectionText.h"

#include <cmath>
#include <cstdio>
#include <string_view>

namespace NQRVZEP20::zep {

namespace {

using TCell = TReportSection::TCell;

struct TColumn {
  char const* fTitle;
  char const* fProperty;
};

constexpr char const* kReading = "CurrentReading";

struct TSubject {
  char const* fTitle;
  char const* fClass;
  std::vector<TColumn> fColumns;
};

std::vector<TSubject> const& Subjects() {
  static std::vector<TSubject> const subjects = {
      {"Controller",
       "ZEP_ManagementController",
       {{"Maker", "Manufacturer"}, {"Product", "ProductID"}, {"Firmware", "FirmwareVersion"}, {"IPMI", "IPMIVersion"}}},
      {"LAN channels",
       "ZEP_ControllerNetwork",
       {{"Channel", "Channel"}, {"Address", "IPv4Address"}, {"Source", "AddressSource"}, {"MAC address", "MACAddress"}}},
      {"Accounts",
       "ZEP_ControllerAccount",
       {{"Number", "Name"}, {"Name", "UserID"}, {"State", "EnabledState"}, {"Privilege", "Privilege"}}},
      {"Parts",
       "CIM_PhysicalPackage",
       {{"Part", "ElementName"},
        {"Maker", "Manufacturer"},
        {"Model", "Model"},
        {"Part number", "PartNumber"},
        {"Serial number", "SerialNumber"}}},
      {"Sensors", "CIM_Sensor", {{"Sensor", "ElementName"}, {"Reading", kReading}, {"State", "CurrentState"}}},
      {"Event log",
       "ZEP_EventLogEntry",
       {{"Time", "MessageTimestamp"}, {"Severity", "PerceivedSeverity"}, {"Event", "RecordData"}}},
  };
  return subjects;
}

// The time of an entry without one, as the DMTF schema prescribes it.
bool IsUnknownTime(std::string const& text) { return text.rfind("9999", 0) == 0; }

// "20210201T..." as "2021-02-01 00:00:00"; an interval, which counts from the start of the controller, as it is.
std::string TimeText(std::string const& text) {
  if (text.size() < 14 || text.find('+') == std::string::npos) return text;
  return text.substr(0, 4) + "-" + text.substr(4, 2) + "-" + text.substr(6, 2) + " " + text.substr(8, 2) + ":" +
         text.substr(10, 2) + ":" + text.substr(12, 2);
}

// The name of an enumerated value, or the value.
std::string WordOf(ICIMInstance const& instance, std::string const& property, TCIMValue const& value) {
  auto const declaration = instance.GetClass(TCIMContext())->GetPropertyDecl(property, TCIMContext());
  std::string const word = declaration ? TValueWords(*declaration).WordFor(value) : "";
  return word.empty() ? value.ToString() : word;
}

// " Volts", " Bytes Per Second", " (unit: packets per s)".
std::string UnitOf(TNamespaceView const& view, ICIMInstance const& sensor, TCIMValue const& unit) {
  constexpr char const *other = "1", *none = "0";
  auto const description = view.Answer(sensor, "Description"), rate = view.Answer(sensor, "RateUnits");
  if (unit.ToString() == other && description.IsKnown()) return " (" + description.fValue->ToString() + ")";
  bool const isRate = rate.IsKnown() && rate.fValue->ToString() != none;
  return " " + WordOf(sensor, "BaseUnits", unit) + (isRate ? " " + WordOf(sensor, "RateUnits", *rate.fValue) : "");
}

// The reading in the unit of the sensor: "11.98 Volts".
std::string ReadingText(TNamespaceView const& view, ICIMInstance const& sensor, TCIMValue const& reading) {
  auto const modifier = view.Answer(sensor, "UnitModifier"), unit = view.Answer(sensor, "BaseUnits");
  if (!modifier.IsKnown() || !unit.IsKnown()) return reading.ToString();
  char number[64];
  std::snprintf(number, sizeof number, "%.10g",
                std::stod(reading.ToString()) * std::pow(10, std::stoi(modifier.fValue->ToString())));
  return number + UnitOf(view, sensor, *unit.fValue);
}

TCell CellOf(TNamespaceView const& view, ICIMInstance const& instance, char const* property) {
  bool const isReading = property == std::string_view(kReading);
  if (isReading && instance.GetClass(TCIMContext())->GetName(TCIMContext()) == "CIM_Sensor")
    return TCell::Unknown({kMissingNotApplicable, "the sensor has states, and no number"}, "");
  auto const answer = view.Answer(instance, property);
  if (!answer.IsKnown()) return TCell::Unknown(answer.fMissing, answer.fSource);
  if (isReading) return TCell::Known(ReadingText(view, instance, *answer.fValue), answer.fSource);
  std::string const word = WordOf(instance, property, *answer.fValue);
  bool const isTime = answer.fValue->GetType() == TCIMValue::TCIMType::kCIMTypeDateTime;
  if (isTime && IsUnknownTime(word)) return TCell::Unknown({kMissingNotGiven, "the entry has no time"}, answer.fSource);
  return TCell::Known(isTime ? TimeText(word) : word, answer.fSource);
}

TReportSection SectionOf(TNamespaceView const& view, TSubject const& subject) {
  TReportSection section;
  section.fTitle = subject.fTitle;
  for (TColumn const& column : subject.fColumns) section.fColumns.emplace_back(column.fTitle);
  for (auto const& instance : view.InstancesOf(subject.fClass)) {
    section.fRows.emplace_back();
    for (TColumn const& column : subject.fColumns) section.fRows.back().push_back(CellOf(view, *instance, column.fProperty));
  }
  if (section.fRows.empty()) section.fWhyEmpty = view.WhyNoInstance(subject.fClass).fReason;
  return section;
}

TFindings FindingsOf(TNamespaceView const& view, TThresholds const& thresholds) {
  return MakeFindings({view}, thresholds, ControllerRules());
}

}  // namespace

void AddInventory(TJson& document, TInventory const& inventory, TThresholds const& thresholds) {
  document["findings"] = inventory.fView ? FindingsAsJson(FindingsOf(*inventory.fView, thresholds)) : TJson();
  TJson& instances = document["instances"] = TJson::array();
  if (!inventory.fView) return;
  TInstanceJson json(*inventory.fView);
  for (auto const& instance : inventory.fView->AllInstances()) instances.push_back(json.Of(*instance));
}

std::string InventoryAsText(TInventory const& inventory, TThresholds const& thresholds) {
  if (!inventory.fView) return "";
  std::string text = "\n" + FindingsAsText(FindingsOf(*inventory.fView, thresholds), "");
  for (TSubject const& subject : Subjects()) text += "\n" + SectionAsText(SectionOf(*inventory.fView, subject), "", 0);
  return text;
}

}  // namespace NQRVZEP20::zep
