// SPDX-License-Identifier: Apache-2.0
#include "collect/Report.h"

#include "ICIMInstance.h"
#include "TCIMDateTime.h"
#include "TCIMSchemaHelper.h"
#include "TZEPException.h"
#include "collect/FailureOf.h"
#include "collect/ProductName.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <iterator>
#include <map>

namespace NQRVZEP20 {

namespace {

using TNamespacePtr = boost::shared_ptr<ICIMNamespace>;
using TValueAnswer = TAnswer<TCIMValue>;
using TViews = std::vector<TNamespaceView>;

// ---- Identity ----

std::string const& kSystem = TCIMSchemaHelper::kSystemCreationClassName;
std::string const& kOperatingSystem = TCIMSchemaHelper::kOperatingSystemCreationClassName;
std::string const kProduct = "QRVSG_ZEPProduct";
constexpr char const* kUnknownModel = "xxx";  // returned by the schema helper when the product name contains no model

struct TQuestion;
TReportAnswer AnswerTo(TQuestion const& question, TNamespaceView const& view);
TReportAnswer NotOfTheForm(TValueAnswer const& raw);

// One row of the identity: a query of the schema helper, and the property that the answer comes from.
struct TQuestion {
  char const* fKey;
  char const* fLabel;
  std::string const& fClassName;
  char const* fProperty;
  std::string (*fQuery)(TNamespacePtr ns);
  TReportAnswer (*fAnswer)(TQuestion const& question, TNamespaceView const& view) = AnswerTo;
  TReportAnswer (*fWhenRefused)(TValueAnswer const& raw) = NotOfTheForm;  // for a value that the schema helper refuses
};

TReportAnswer Unknown(char const* code, std::string const& reason, std::string const& source) {
  return TReportAnswer::Unknown({code, reason}, source);
}

// The same answer for a report, where the value is missing.
TReportAnswer StillUnknown(TValueAnswer const& answer) { return TReportAnswer::Unknown(answer.fMissing, answer.fSource); }

TReportAnswer AsText(TValueAnswer const& answer) {
  return answer.IsKnown() ? TReportAnswer::Known(answer.fValue->ToString(), answer.fSource) : StillUnknown(answer);
}

// Removes outer blanks and control characters, such as those of a line end.
std::string WithoutOuterBlanks(std::string const& text) {
  auto const isBlank = [](char c) { return (c >= 0 && c <= ' ') || c == '\x7f'; };
  auto const first = std::find_if_not(text.begin(), text.end(), isBlank);
  return {first, std::find_if_not(text.rbegin(), std::make_reverse_iterator(first), isBlank).base()};
}

bool HasOnly(std::string const& text, char c) { return !text.empty() && text.find_first_not_of(c) == std::string::npos; }

TReportAnswer NotOfTheForm(TValueAnswer const& raw) {
  return Unknown(kMissingUnexpected, "not in the expected form: \"" + raw.fValue->ToString() + "\"", raw.fSource);
}

// The answer of the schema helper. When the helper refuses, the property itself has the reason.
TReportAnswer AnswerTo(TQuestion const& question, TNamespaceView const& view) {
  auto const instances = view.InstancesOf(question.fClassName);
  if (instances.empty()) return StillUnknown(view.AnswerWithoutInstance(question.fClassName, question.fProperty));
  if (instances.size() > 1)
    return Unknown(kMissingUnexpected, "the provider describes " + std::to_string(instances.size()) + " instances", "");

  TValueAnswer const raw = view.Answer(*instances.front(), question.fProperty);
  if (!raw.IsKnown()) return StillUnknown(raw);
  try {
    std::string const text = question.fQuery(view.Get());
    if (WithoutOuterBlanks(text).empty()) return Unknown(kMissingNotGiven, "the provider gives a blank value", raw.fSource);
    return TReportAnswer::Known(text, raw.fSource);
  } catch (TZEPException const& failure) {
    EZEPStatusCode const status = failure.GetStatusCode().GetCode();
    if (status != kZEPStatusInvalidFormat && status != kZEPStatusTypeMismatch) throw;
    return question.fWhenRefused(raw);
  }
}

// A machine whose product name has no brackets has neither type nor model.
TReportAnswer NoTypeAndModel(TValueAnswer const& productName) {
  if (HasBrackets(productName.fValue->ToString())) return NotOfTheForm(productName);
  return Unknown(kMissingNotApplicable, "the product name has no machine type and model in \"-[...]-\"", productName.fSource);
}

TReportAnswer AnswerWithModel(TQuestion const& question, TNamespaceView const& view) {
  TReportAnswer const answer = AnswerTo(question, view);
  if (!answer.IsKnown() || std::get<std::string>(*answer.fValue) != kUnknownModel) return answer;
  bool const isLeftOut = HasBrackets(TCIMSchemaHelper::GetSystemProductName(view.Get()));
  return Unknown(isLeftOut ? kMissingNotGiven : kMissingNotApplicable, "the product name contains only the machine type",
                 answer.fSource);
}

// The collector's own serial numbers, which TCIMSchemaHelper::GetSerialNumber accepts. Manufacturers use other forms.
bool IsOfOwnForm(std::string const& serialNumber) {
  auto const isLetterOrDigit = [](unsigned char c) { return std::isalnum(c) != 0; };
  return serialNumber.size() == 7 && std::all_of(serialNumber.begin(), serialNumber.end(), isLetterOrDigit);
}

TReportAnswer AnswerWithSerialNumber(TQuestion const& question, TNamespaceView const& view) {
  TReportAnswer answer = AnswerTo(question, view);
  if (!answer.IsKnown()) return answer;
  std::string const number = WithoutOuterBlanks(std::get<std::string>(*answer.fValue));
  if (HasOnly(number, '\xff')) return Unknown(kMissingNotGiven, "not programmed (0xFF)", answer.fSource);
  if (HasOnly(number, '-'))
    return Unknown(kMissingPlaceholder, "placeholder text of the provider: \"" + number + "\"", answer.fSource);
  if (!IsOfOwnForm(number)) answer.fNote = "not in the collector's own form: 7 letters and digits";
  answer.fValue = number;
  return answer;
}

TQuestion const kIdentity[] = {
    {"hostName", "Host name", kSystem, "Name", TCIMSchemaHelper::GetSystemName},
    {"productName", "Product name", kSystem, "ProductName", TCIMSchemaHelper::GetSystemProductName},
    {"machineType", "Machine type", kSystem, "ProductName", TCIMSchemaHelper::GetMachineType, AnswerTo, NoTypeAndModel},
    {"model", "Model", kSystem, "ProductName", TCIMSchemaHelper::GetModelNumber, AnswerWithModel, NoTypeAndModel},
    {"serialNumber", "Serial number", kSystem, "SerialNumber",
     [](TNamespacePtr ns) { return TCIMSchemaHelper::GetRawSerialNumberString(ns, TCIMContext()); }, AnswerWithSerialNumber},
    {"osName", "OS", kOperatingSystem, "Name", TCIMSchemaHelper::GetOperatingSystemName},
    {"osVersion", "OS version", kOperatingSystem, "Version", TCIMSchemaHelper::GetOperatingSystemVersion},
    {"osType", "OS type", kOperatingSystem, "OSType", TCIMSchemaHelper::GetOperatingSystemType},
    {"collectorVersion", "zepcore version", kProduct, "Version",
     [](TNamespacePtr ns) { return TCIMSchemaHelper::GetDataSourceVersion(ns, TCIMContext()); }},
    {"collectorBuild", "zepcore build", kProduct, "Build",
     [](TNamespacePtr ns) { return TCIMSchemaHelper::GetDataSourceBuild(ns, TCIMContext()); }},
};

// ---- Details ----

TReportAnswer BiosDate(TNamespaceView const& view) {
  TValueAnswer const answer = view.AnswerOfFirst("CIM_BIOSElement", "ReleaseDate");
  if (!answer.IsKnown()) return StillUnknown(answer);
  TCIMDateTime const date = *answer.fValue;
  return TReportAnswer::Known(TDate{date.GetYear(), date.GetMonth(), date.GetDay()}, answer.fSource);
}

// None when the value is missing or not an unsigned number.
std::optional<std::uint64_t> NumberIn(TValueAnswer const& answer) {
  if (!answer.IsKnown()) return std::nullopt;
  std::string const text = answer.fValue->ToString();
  std::uint64_t number = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  return error == std::errc() && end == text.data() + text.size() ? std::optional(number) : std::nullopt;
}

std::optional<std::uint64_t> Sum(std::optional<std::uint64_t> one, std::optional<std::uint64_t> other) {
  return one && other ? std::optional(*one + *other) : std::nullopt;
}

TReportAnswer Processors(TNamespaceView const& view) {
  auto const processors = view.InstancesOf("CIM_Processor");
  if (processors.empty()) return StillUnknown(view.AnswerWithoutInstance("CIM_Processor", "ElementName"));
  std::map<std::string, TProcessorKind> kinds;
  std::string source;
  for (auto const& processor : processors) {
    TValueAnswer const name = view.Answer(*processor, "ElementName");
    std::string const text = name.IsKnown() ? name.fValue->ToString() : "";
    TProcessorKind& kind = kinds.try_emplace(text, TProcessorKind{text, 0, 0}).first->second;
    ++kind.fCount;
    kind.fCores = Sum(kind.fCores, NumberIn(view.Answer(*processor, "NumberOfEnabledCores")));
    source = name.fSource;
  }
  std::vector<TProcessorKind> sorted;
  for (auto const& [text, kind] : kinds) sorted.push_back(kind);
  return TReportAnswer::Known(sorted, source);
}

// The memory that the kernel uses, for a machine whose firmware describes no modules.
TReportAnswer MemoryOfKernel(TNamespaceView const& view) {
  for (auto const& memory : view.InstancesOf("CIM_Memory")) {
    TValueAnswer const id = view.Answer(*memory, "DeviceID");
    if (!id.IsKnown() || id.fValue->ToString() != "Main memory") continue;
    TValueAnswer const number = view.Answer(*memory, "NumberOfBlocks");
    auto const blocks = NumberIn(number), block = NumberIn(view.Answer(*memory, "BlockSize"));
    if (blocks && block) return TReportAnswer::Known(TMemorySize{*blocks * *block, 0, 0}, number.fSource);
  }
  return StillUnknown(view.AnswerWithoutInstance("CIM_PhysicalMemory", "Capacity"));
}

TReportAnswer Memory(TNamespaceView const& view) {
  auto const modules = view.InstancesOf("CIM_PhysicalMemory");
  if (modules.empty()) return MemoryOfKernel(view);
  TMemorySize size{0, modules.size(), 0};
  TValueAnswer capacity;
  for (auto const& module : modules) {
    capacity = view.Answer(*module, "Capacity");
    auto const bytes = NumberIn(capacity);
    size.fBytes += bytes.value_or(0);
    size.fUnknownModules += bytes ? 0 : 1;
  }
  if (size.fUnknownModules < size.fModules) return TReportAnswer::Known(size, capacity.fSource);
  return capacity.IsKnown() ? NotOfTheForm(capacity) : StillUnknown(capacity);
}

struct TDetail {
  char const* fKey;
  char const* fLabel;
  TReportAnswer (*fAnswer)(TNamespaceView const& view);
};

constexpr TDetail kDetails[] = {
    {"manufacturer", "Manufacturer",
     [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst(kSystem, "Manufacturer")); }},
    {"uuid", "UUID", [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst(kSystem, "UUID")); }},
    {"biosVersion", "BIOS version",
     [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst("CIM_BIOSElement", "Version")); }},
    {"biosDate", "BIOS date", BiosDate},
    {"chassis", "Chassis",
     [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst("CIM_Chassis", "ChassisTypeDescription")); }},
    {"processors", "Processors", Processors},
    {"memory", "Memory", Memory},
    {"kernel", "Kernel",
     [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst(kOperatingSystem, "KernelRelease")); }},
    {"architecture", "Architecture",
     [](TNamespaceView const& view) { return AsText(view.AnswerOfFirst(kOperatingSystem, "Architecture")); }},
};

// ---- All providers ----

TReportAnswer WithoutProvider(std::vector<TPlugIn> const& plugIns) {
  return Unknown(kMissingNotDescribed, plugIns.empty() ? "no provider plug-in found" : "no provider plug-in could be used", "");
}

template <class TQuery>
TReportAnswer AnswerOf(TNamespaceView const& view, TQuery query) {
  TReportAnswer answer;
  std::string const failure = FailureOf([&] { answer = query(view); });
  if (failure.empty()) return answer;
  return Unknown(kMissingProviderFailed, "provider " + view.GetProviderName() + " failed: " + failure, "");
}

// Whether the reason of `answer` says more than that of `best`; both are unknown.
bool IsMoreSpecific(TReportAnswer const& answer, TReportAnswer const& best) {
  return best.fMissing.fCode == kMissingNotDescribed || (answer.IsNotApplicable() && !best.IsNotApplicable());
}

// The answer of the first provider that knows the value; otherwise the most specific reason.
template <class TQuery>
TReportAnswer BestAnswer(TViews const& views, std::vector<TPlugIn> const& plugIns, TQuery query) {
  TReportAnswer best = WithoutProvider(plugIns);
  for (TNamespaceView const& view : views) {
    TReportAnswer const answer = AnswerOf(view, query);
    if (answer.IsKnown()) return answer;
    if (IsMoreSpecific(answer, best)) best = answer;
  }
  return best;
}

ECompleteness CompletenessOf(TReport const& report) {
  auto const isKnown = [](TReportRow const& row) { return row.fAnswer.IsKnown(); };
  auto const isSettled = [](TReportRow const& row) { return row.fAnswer.IsKnown() || row.fAnswer.IsNotApplicable(); };
  bool const areAllSettled = std::all_of(report.fIdentity.begin(), report.fIdentity.end(), isSettled);
  bool const isAnyKnown = std::any_of(report.fIdentity.begin(), report.fIdentity.end(), isKnown);
  bool const hasAnyFailed =
      std::any_of(report.fPlugIns.begin(), report.fPlugIns.end(), [](TPlugIn const& plugIn) { return plugIn.HasFailed(); });
  if (!isAnyKnown) return ECompleteness::kNothing;
  return areAllSettled && !hasAnyFailed ? ECompleteness::kComplete : ECompleteness::kPartial;
}

TReportRow const* FindIn(std::vector<TReportRow> const& rows, std::string const& key) {
  auto const found = std::find_if(rows.begin(), rows.end(), [&](TReportRow const& row) { return row.fKey == key; });
  return found != rows.end() ? &*found : nullptr;
}

}  // namespace

TReportRow const* TReport::FindRow(std::string const& key) const {
  TReportRow const* const row = FindIn(fIdentity, key);
  return row != nullptr ? row : FindIn(fDetails, key);
}

TReport MakeReport(std::vector<TPlugIn> plugIns, std::optional<TSample> sample, TReportRules const& rules) {
  TReport report{};
  report.fPlugIns = std::move(plugIns);
  report.fSample = std::move(sample);
  report.fTableFile = report.fSample ? "" : NamedTableFile();
  TViews const views = ViewsOf(report.fPlugIns);
  report.fFindings = MakeFindings(views, rules.fThresholds, rules.fRules);
  for (TQuestion const& question : kIdentity) {
    auto const query = [&](TNamespaceView const& view) { return question.fAnswer(question, view); };
    report.fIdentity.push_back({question.fKey, question.fLabel, BestAnswer(views, report.fPlugIns, query)});
  }
  for (TDetail const& row : kDetails)
    report.fDetails.push_back({row.fKey, row.fLabel, BestAnswer(views, report.fPlugIns, row.fAnswer)});
  report.fCompleteness = CompletenessOf(report);
  return report;
}

}  // namespace NQRVZEP20
