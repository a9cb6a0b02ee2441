// SPDX-License-Identifier: Apache-2.0
#include "collect/Sections.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "MissingValueClass.h"
#include "TCIMSchemaHelper.h"
#include "collect/FailureOf.h"
#include "collect/SectionSubjects.h"
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
constexpr char const* kIdentifierKinds = "IdentifyingDescriptions";

// ---- Cells ----

bool IsArray(TCIMValue const& value) { return (value.GetType() & TCIMValue::TCIMType::kCIMTypeArrayFlag) != 0; }

// The name of an enumerated value alone, because a table has little room; otherwise the value with its unit. The elements of an
// array are separated by commas; without any, it is "none".
std::string TextOf(TCIMValue const& value, TValueWords const& words, std::string const& unit) {
  if (IsArray(value)) {
    std::string text;
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value))
      text += (text.empty() ? "" : ", ") + TextOf(element, words, unit);
    return text.empty() ? "none" : text;
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

// "525400112201" as "52:54:00:11:22:01". An address that has separators stays as it is.
std::string InPairs(std::string const& address) {
  if (address.find_first_not_of("0123456789abcdefABCDEF") != std::string::npos) return address;
  std::string digits = address;
  for (std::size_t at = 2; at < digits.size(); at += 3) digits.insert(at, ":");
  return digits;
}

// "tmpfs on /run" as "tmpfs".
std::string WithoutPlace(std::string const& name) { return name.substr(0, name.find(" on /")); }

// "93784 s" as "1 d 2 h 3 min".
std::string InDays(std::string const& seconds) {
  constexpr unsigned long long minute = 60, hour = 60 * minute, day = 24 * hour;
  unsigned long long number = 0;
  if (std::from_chars(seconds.data(), seconds.data() + seconds.size(), number).ec != std::errc()) return seconds;
  std::string text = number < day ? "" : std::to_string(number / day) + " d ";
  if (number >= hour) text += std::to_string(number % day / hour) + " h ";
  return text + std::to_string(number % hour / minute) + " min";
}

// The text of the property, changed.
TCell ChangedCell(TNamespaceView const& view, ICIMInstance const& instance, TColumn const& column,
                  std::string (*change)(std::string const&)) {
  TCell cell = PropertyCell(view, instance, column.fProperty);
  if (cell.IsKnown()) cell.fValue = change(*cell.fValue);
  return cell;
}

TCell NumberCell(TNamespaceView const& view, ICIMInstance const& instance, std::string const& name) {
  TAnswer<TCIMValue> const answer = view.Answer(instance, name);
  return answer.IsKnown() ? TCell::Known(answer.fValue->ToString(), answer.fSource) : Unknown(answer);
}

TCell CellOf(TNamespaceView const& view, ICIMInstance const& instance, TColumn const& column) {
  switch (column.fCell) {
    case ECell::kNumber:
      return NumberCell(view, instance, column.fProperty);
    case ECell::kDuration:
      return ChangedCell(view, instance, column, InDays);
    case ECell::kSource:
      return ChangedCell(view, instance, column, WithoutPlace);
    case ECell::kMacAddress:
      return ChangedCell(view, instance, column, InPairs);
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

void SortByName(std::vector<std::vector<TCell>>& rows) {
  auto const nameOf = [](std::vector<TCell> const& row) { return row.front().fValue.value_or(""); };
  std::stable_sort(rows.begin(), rows.end(), [&](auto const& a, auto const& b) { return nameOf(a) < nameOf(b); });
}

// The reason for the class or, if only those below have one, for the first of them that does; empty if the namespace has none.
std::string RecordedReason(TNamespaceView const& view, ICIMClass const& cls) {
  TMissing const why = view.WhyNoInstance(cls.GetName(TCIMContext()));
  if (why.fCode != kMissingNotDescribed) return why.fReason;
  std::string reason;
  cls.EnumerateSubClasses(
      [&](boost::shared_ptr<ICIMClass> const& below) {
        reason = RecordedReason(view, *below);
        return reason.empty();
      },
      TCIMContext());
  return reason;
}

TReportSection SectionOf(TSubject const& subject, std::vector<TNamespaceView> const& views) {
  TReportSection section{subject.fKey, subject.fTitle, {}, {}, ""};
  for (TColumn const& column : subject.fColumns) section.fColumns.emplace_back(column.fTitle);
  bool const isSample = !views.empty() && !views.front().GetSampleLabel().empty();
  // The reason of the first provider that has one. For a sample none counts, since they are about this machine.
  std::string whyEmpty = isSample ? "the sample does not describe them" : "";
  for (TNamespaceView const& view : views) {
    std::string const failure = FailureOf([&] {
      auto const cls = view.FindClass(subject.fClass);
      if (!cls) return;
      for (TInstancePtr const& instance : view.InstancesOf(subject.fClass)) {
        auto const row = RowOf(view, *instance, subject);
        if (!IsEmptyRow(row) && view.IsOfReport(*instance)) section.fRows.push_back(row);
      }
      if (whyEmpty.empty()) whyEmpty = RecordedReason(view, *cls);
    });
    if (!failure.empty()) whyEmpty = "provider " + view.GetProviderName() + " failed: " + failure;
  }
  if (subject.fIsSorted) SortByName(section.fRows);
  if (section.fRows.empty()) section.fWhyEmpty = whyEmpty.empty() ? "no provider describes them" : whyEmpty;
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
  auto const& subjects = SectionSubjects();
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
  for (TSubject const& subject : SectionSubjects()) keys.emplace_back(subject.fKey);
  keys.emplace_back(kOther);
  return keys;
}

std::vector<TReportSection> MakeSections(std::vector<TPlugIn> const& plugIns, std::vector<std::string> const& keys) {
  auto const views = ViewsOf(plugIns);
  auto const isWanted = [&](std::string const& key) { return std::find(keys.begin(), keys.end(), key) != keys.end(); };
  std::vector<TReportSection> sections;
  for (TSubject const& subject : SectionSubjects())
    if (isWanted(subject.fKey)) sections.push_back(SectionOf(subject, views));
  if (isWanted(kOther)) sections.push_back(OtherClasses(views));
  return sections;
}

}  // namespace NQRVZEP20
