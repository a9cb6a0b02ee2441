// SPDX-License-Identifier: Apache-2.0
#include "collect/Sections.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "MissingValueClass.h"
#include "TCIMSchemaHelper.h"
#include "collect/FailureOf.h"
#include "collect/TValueWords.h"
#include "collect/UnitText.h"

#include <algorithm>
#include <charconv>
#include <map>
#include <optional>
#include <set>

namespace NQRVZEP20 {

namespace {

using TCell = TReportSection::TCell;
using TInstancePtr = boost::shared_ptr<ICIMInstance>;

constexpr char const* kOther = "other";
constexpr char const* kIdentifiers = "OtherIdentifyingInfo";
constexpr char const* kIdentifierKinds = "IdentifyingDescriptions";

enum class ECell {
  kProperty,
  kIdentifier,  // the element of the array that has the description fOther
  kProduct,     // a size in bytes: the property times the property fOther
  kEither,      // the property fOther where the first has no value
  kDescribed    // the property fOther where the value of the first is named "Other"
};

struct TColumn {
  char const* fTitle;
  char const* fProperty;
  ECell fCell = ECell::kProperty;
  char const* fOther = nullptr;
};

// A section for the instances of a class and its subclasses.
struct TSubject {
  char const* fKey;
  char const* fTitle;
  char const* fClass;
  std::vector<TColumn> fColumns;
};

std::vector<TSubject> const& Subjects() {
  static std::vector<TSubject> const subjects = {
      {"processors",
       "Processors",
       "CIM_Processor",
       {{"Processor", "DeviceID"},
        {"Name", "ElementName"},
        {"Cores", "NumberOfEnabledCores"},
        {"Speed", "MaxClockSpeed"},
        {"Status", "CPUStatus"}}},
      {"memory",
       "Memory modules",
       "CIM_PhysicalMemory",
       {{"Slot", "ElementName"},
        {"Size", "Capacity"},
        {"Type", "MemoryType", ECell::kDescribed, "Description"},
        {"Speed", "ConfiguredMemoryClockSpeed"},
        {"Maker", "Manufacturer"},
        {"Part number", "PartNumber"},
        {"Serial number", "SerialNumber"}}},
      {"disks",
       "Disks",
       "CIM_MediaAccessDevice",
       {{"Disk", "DeviceID"},
        {"Model", "ElementName"},
        {"Serial number", kIdentifiers, ECell::kIdentifier, "Serial number"},
        {"Size", "MaxMediaSize"},
        {"Status", "StatusDescriptions"}}},
      {"volumes",
       "Volumes",
       "CIM_StorageVolume",
       {{"Volume", "DeviceID"},
        {"Name", "ElementName"},
        {"Size", "NumberOfBlocks", ECell::kProduct, "BlockSize"},
        {"Status", "StatusDescriptions"}}},
      {"file-systems",
       "File systems",
       "CIM_LocalFileSystem",
       {{"File system", "Name"},
        {"Type", "FileSystemType"},
        {"Size", "FileSystemSize"},
        {"Free", "AvailableSpace"},
        {"Read-only", "ReadOnly"}}},
      {"ports",
       "Network ports",
       "CIM_NetworkPort",
       {{"Port", "DeviceID"},
        {"Address", "PermanentAddress"},
        {"Speed", "Speed"},
        {"Full duplex", "FullDuplex"},
        {"Status", "StatusDescriptions"}}},
      {"addresses",
       "IP addresses",
       "CIM_IPProtocolEndpoint",
       {{"Address", "ElementName"}, {"Interface", "InterfaceName"}, {"Origin", "AddressOrigin"}, {"Scope", "Scope"}}},
      {"routes",
       "Routes",
       "CIM_NextHopIPRoute",
       {{"Destination", "DestinationAddress"},
        {"Mask or prefix", "DestinationMask", ECell::kEither, "PrefixLength"},
        {"Gateway", "Gateway"},
        {"Interface", "InterfaceName"},
        {"Metric", "Metric"},
        {"Set by", "Protocol"}}},
      {"pci",
       "PCI devices",
       "CIM_PCIDevice",
       {{"Address", "DeviceID"},
        {"Device", "Name"},
        {"Class", "Caption"},
        {"Driver", kIdentifiers, ECell::kIdentifier, "Driver"}}},
      {"usb",
       "USB devices",
       "CIM_USBDevice",
       {{"Device", "DeviceID"}, {"Maker", "Manufacturer"}, {"Product", "Product"}, {"Serial number", "SerialNumber"}}},
  };
  return subjects;
}

// ---- Cells ----

std::string UnitOf(ICIMPropertyDecl const& property) {
  auto const qualifier = property.GetQualifier("PUnit", TCIMContext());
  TCIMValue const unit = qualifier ? qualifier->GetValue(TCIMContext()) : TCIMValue();
  return unit.IsNull() ? "" : unit.ToString();
}

bool IsArray(TCIMValue const& value) { return (value.GetType() & TCIMValue::TCIMType::kCIMTypeArrayFlag) != 0; }

// The name of an enumerated value alone, because a table has little room; otherwise the value with its unit. The elements of an
// array are separated by commas.
std::string TextOf(TCIMValue const& value, TValueWords const& words, std::string const& unit) {
  if (IsArray(value)) {
    std::string text;
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value))
      text += (text.empty() ? "" : ", ") + TextOf(element, words, unit);
    return text;
  }
  std::string const word = words.WordFor(value);
  return word.empty() ? TextWithUnit(value, unit) : word;
}

TCell Unknown(TAnswer<TCIMValue> const& answer) { return TCell::Unknown(answer.fMissing, answer.fSource); }

TCell PropertyCell(TNamespaceView const& view, ICIMInstance const& instance, std::string const& name) {
  TAnswer<TCIMValue> const answer = view.Answer(instance, name);
  if (!answer.IsKnown()) return Unknown(answer);
  auto const declaration = instance.GetProperty(name, TCIMContext())->GetDeclaration(TCIMContext());
  return TCell::Known(TextOf(*answer.fValue, TValueWords(*declaration), UnitOf(*declaration)), answer.fSource);
}

TCell IdentifierCell(TNamespaceView const& view, ICIMInstance const& instance, std::string const& kind) {
  TAnswer<TCIMValue> const identifiers = view.Answer(instance, kIdentifiers), kinds = view.Answer(instance, kIdentifierKinds);
  if (!identifiers.IsKnown()) return Unknown(identifiers);
  if (!kinds.IsKnown()) return Unknown(kinds);
  if (!IsArray(*identifiers.fValue) || !IsArray(*kinds.fValue))
    return TCell::Unknown({kMissingUnexpected, "the identifiers are not arrays"}, identifiers.fSource);
  std::vector<TCIMValue> const& texts = *identifiers.fValue;
  std::vector<TCIMValue> const& names = *kinds.fValue;
  for (std::size_t i = 0; i < names.size() && i < texts.size(); ++i)
    if (names[i].ToString() == kind) return TCell::Known(texts[i].ToString(), identifiers.fSource);
  return TCell::Unknown({kMissingNotGiven, "the provider gives none"}, identifiers.fSource);
}

// A whole number that is not negative; none for any other value.
std::optional<std::uint64_t> NumberIn(TAnswer<TCIMValue> const& answer) {
  std::string const text = answer.fValue->ToString();
  std::uint64_t number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return number;
}

TCell ProductCell(TNamespaceView const& view, ICIMInstance const& instance, std::string const& one, std::string const& other) {
  TAnswer<TCIMValue> const left = view.Answer(instance, one), right = view.Answer(instance, other);
  if (!left.IsKnown()) return Unknown(left);
  if (!right.IsKnown()) return Unknown(right);
  auto const leftNumber = NumberIn(left), rightNumber = NumberIn(right);
  std::uint64_t bytes = 0;
  if (!leftNumber || !rightNumber || __builtin_mul_overflow(*leftNumber, *rightNumber, &bytes))
    return TCell::Unknown({kMissingUnexpected, one + " times " + other + " is not a size"}, left.fSource);
  return TCell::Known(TextWithUnit(TCIMValue(bytes), "byte"), left.fSource);
}

TCell DescribedCell(TNamespaceView const& view, ICIMInstance const& instance, std::string const& one, std::string const& other) {
  TCell const cell = PropertyCell(view, instance, one);
  if (!cell.IsKnown() || *cell.fValue != "Other") return cell;
  TCell const description = PropertyCell(view, instance, other);
  return description.IsKnown() ? description : cell;
}

TCell CellOf(TNamespaceView const& view, ICIMInstance const& instance, TColumn const& column) {
  switch (column.fCell) {
    case ECell::kIdentifier:
      return IdentifierCell(view, instance, column.fOther);
    case ECell::kProduct:
      return ProductCell(view, instance, column.fProperty, column.fOther);
    case ECell::kDescribed:
      return DescribedCell(view, instance, column.fProperty, column.fOther);
    case ECell::kEither:
      if (view.Answer(instance, column.fProperty).IsKnown()) break;
      return PropertyCell(view, instance, column.fOther);
    case ECell::kProperty:
      break;
  }
  return PropertyCell(view, instance, column.fProperty);
}

// ---- Rows ----

// Whether a row would have nothing but its name: some namespaces have an instance only for its associations.
bool IsEmptyRow(std::vector<TCell> const& row) {
  return std::none_of(row.begin() + 1, row.end(), [](TCell const& cell) { return cell.IsKnown(); });
}

std::vector<TCell> RowOf(TNamespaceView const& view, ICIMInstance const& instance, TSubject const& subject) {
  std::vector<TCell> row;
  for (TColumn const& column : subject.fColumns) row.push_back(CellOf(view, instance, column));
  return row;
}

TReportSection SectionOf(TSubject const& subject, std::vector<TNamespaceView> const& views) {
  TReportSection section{subject.fKey, subject.fTitle, {}, {}, ""};
  for (TColumn const& column : subject.fColumns) section.fColumns.emplace_back(column.fTitle);
  std::string whyEmpty = "no provider describes them";
  for (TNamespaceView const& view : views) {
    std::string const failure = FailureOf([&] {
      if (!view.FindClass(subject.fClass)) return;
      for (TInstancePtr const& instance : view.InstancesOf(subject.fClass)) {
        auto const row = RowOf(view, *instance, subject);
        if (!IsEmptyRow(row) && view.IsOfReport(*instance)) section.fRows.push_back(row);
      }
      bool const isOfSample = view.GetSampleLabel().empty() || view.InstancesOf(subject.fClass).empty();
      whyEmpty = isOfSample ? view.WhyNoInstance(subject.fClass).fReason : "the sample does not describe them";
    });
    if (!failure.empty()) whyEmpty = "provider " + view.GetProviderName() + " failed: " + failure;
  }
  if (section.fRows.empty()) section.fWhyEmpty = whyEmpty;
  return section;
}

// ---- Other classes ----

bool IsBelow(boost::shared_ptr<ICIMClass const> cls, std::string const& name) {
  for (; cls; cls = cls->GetSuperClass(TCIMContext()))
    if (cls->GetName(TCIMContext()) == name) return true;
  return false;
}

// Classes that the identity, the details or a section shows, and associations.
bool IsShownElsewhere(boost::shared_ptr<ICIMClass const> const& cls) {
  std::set<std::string> const shown = {TCIMSchemaHelper::kSystemCreationClassName,
                                       TCIMSchemaHelper::kOperatingSystemCreationClassName, "QRVSG_ZEPProduct",
                                       kMissingValueClass, "CIM_ComputerSystem"};
  if (shown.count(cls->GetName(TCIMContext())) > 0 || cls->GetClassFlag(TCIMContext())) return true;
  auto const& subjects = Subjects();
  return std::any_of(subjects.begin(), subjects.end(), [&](TSubject const& subject) { return IsBelow(cls, subject.fClass); });
}

void AddOtherClasses(TReportSection& section, TNamespaceView const& view) {
  std::map<boost::shared_ptr<ICIMClass>, std::size_t> counts;
  for (TInstancePtr const& instance : view.AllInstances())
    if (view.IsOfReport(*instance)) ++counts[instance->GetClass(TCIMContext())];
  std::map<std::string, std::size_t> others;
  for (auto const& [cls, count] : counts)
    if (!IsShownElsewhere(cls)) others[cls->GetName(TCIMContext())] += count;
  for (auto const& [name, count] : others)
    section.fRows.push_back({TCell::Known(name, ""), TCell::Known(std::to_string(count), ""), TCell::Known(view.GetName(), "")});
}

TReportSection OtherClasses(std::vector<TNamespaceView> const& views) {
  TReportSection section{kOther, "Other classes", {"Class", "Instances", "Namespace"}, {}, ""};
  std::string whyEmpty = "no provider has instances of other classes";
  for (TNamespaceView const& view : views) {
    std::string const failure = FailureOf([&] { AddOtherClasses(section, view); });
    if (!failure.empty()) whyEmpty = "provider " + view.GetProviderName() + " failed: " + failure;
  }
  if (section.fRows.empty()) section.fWhyEmpty = whyEmpty;
  return section;
}

}  // namespace

std::vector<std::string> SectionKeys() {
  std::vector<std::string> keys;
  for (TSubject const& subject : Subjects()) keys.emplace_back(subject.fKey);
  keys.emplace_back(kOther);
  return keys;
}

std::vector<TReportSection> MakeSections(std::vector<TPlugIn> const& plugIns, std::vector<std::string> const& keys) {
  auto const views = ViewsOf(plugIns);
  auto const isWanted = [&](std::string const& key) { return std::find(keys.begin(), keys.end(), key) != keys.end(); };
  std::vector<TReportSection> sections;
  for (TSubject const& subject : Subjects())
    if (isWanted(subject.fKey)) sections.push_back(SectionOf(subject, views));
  if (isWanted(kOther)) sections.push_back(OtherClasses(views));
  return sections;
}

}  // namespace NQRVZEP20
