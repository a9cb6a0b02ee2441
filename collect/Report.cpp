// SPDX-License-Identifier: Apache-2.0
#include "collect/Report.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "TCIMSchemaHelper.h"
#include "TZEPException.h"
#include "collect/Sample.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Text.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <map>

namespace NQRVZEP20::zep {

namespace {

using TNamespacePtr = boost::shared_ptr<ICIMNamespace>;
using TViews = std::vector<TNamespaceView>;

// ---- Asking ----

std::string const& kSystem = TCIMSchemaHelper::kSystemCreationClassName;
std::string const& kOperatingSystem = TCIMSchemaHelper::kOperatingSystemCreationClassName;
std::string const kProduct = "QRVSG_ZEPProduct";
constexpr char const* kMissingPlaceholder = "placeholder";  // a text that stands for none
constexpr char const* kUnknownModel = "xxx";                // what the helper answers when the product name has no model

struct TQuestion;
TAnswer AnswerTo(TQuestion const& question, TNamespaceView const& view);
TAnswer NotOfTheForm(TAnswer const& raw);

// What one row of the identity asks, and the property that the answer comes from.
struct TQuestion {
  char const* fKey;
  char const* fLabel;
  std::string const& fClassName;
  char const* fProperty;
  std::string (*fAsk)(TNamespacePtr ns);
  TAnswer (*fAnswer)(TQuestion const& question, TNamespaceView const& view) = AnswerTo;
  TAnswer (*fWhenRefused)(TAnswer const& raw) = NotOfTheForm;  // of a value that the helper does not take
};

// Blanks and control characters, such as those of a line's end.
std::string WithoutOuterBlanks(std::string const& text) {
  auto const isBlank = [](char c) { return (c >= 0 && c <= ' ') || c == '\x7f'; };
  auto const first = std::find_if_not(text.begin(), text.end(), isBlank);
  return {first, std::find_if_not(text.rbegin(), std::make_reverse_iterator(first), isBlank).base()};
}

bool HasOnly(std::string const& text, char c) { return !text.empty() && text.find_first_not_of(c) == std::string::npos; }

TAnswer NotOfTheForm(TAnswer const& raw) {
  return TAnswer::Unknown({kMissingUnexpected, "not in the expected form: \"" + raw.fValue + "\""}, raw.fSource);
}

// What the helper answers; where it refuses, the reason is looked for in the property itself.
TAnswer AnswerTo(TQuestion const& question, TNamespaceView const& view) {
  auto const instances = view.InstancesOf(question.fClassName);
  if (instances.empty()) return view.AnswerWithoutInstance(question.fClassName, question.fProperty);
  if (instances.size() > 1)
    return TAnswer::Unknown({kMissingUnexpected, "the provider describes " + std::to_string(instances.size()) + " of them"}, "");

  TAnswer const raw = view.Answer(*instances.front(), question.fProperty);
  if (!raw.fIsKnown) return raw;
  try {
    std::string const text = question.fAsk(view.Get());
    if (WithoutOuterBlanks(text).empty())
      return TAnswer::Unknown({kMissingNotGiven, "the provider gives a blank text"}, raw.fSource);
    return TAnswer::Known(text, raw.fSource);
  } catch (TZEPException const& failure) {
    EZEPStatusCode const status = failure.GetStatusCode().GetCode();
    if (status != kZEPStatusInvalidFormat && status != kZEPStatusTypeMismatch) throw;
    return question.fWhenRefused(raw);
  }
}

// Where the brackets begin in "Server Q100 -[1234AB7]-"; npos when there are none.
std::size_t StartOfBrackets(std::string const& productName) {
  std::size_t const opening = productName.find("-[");
  return productName.find(']', opening) == std::string::npos ? std::string::npos : opening;
}

bool HasBrackets(std::string const& productName) { return StartOfBrackets(productName) != std::string::npos; }

// A machine whose product name has no brackets has neither type nor model.
TAnswer NoTypeAndModel(TAnswer const& productName) {
  if (HasBrackets(productName.fValue)) return NotOfTheForm(productName);
  return TAnswer::Unknown({kMissingNotApplicable, "the product name has no machine type and model in \"-[...]-\""},
                          productName.fSource);
}

TAnswer AnswerWithModel(TQuestion const& question, TNamespaceView const& view) {
  TAnswer const answer = AnswerTo(question, view);
  if (!answer.fIsKnown || answer.fValue != kUnknownModel) return answer;
  bool const isLeftOut = HasBrackets(TCIMSchemaHelper::GetSystemProductName(view.Get()));
  return TAnswer::Unknown({isLeftOut ? kMissingNotGiven : kMissingNotApplicable, "the product name tells the machine type only"},
                          answer.fSource);
}

// The collector's own serial numbers, which TCIMSchemaHelper::GetSerialNumber takes. Makers have others.
bool IsOfOwnForm(std::string const& serialNumber) {
  auto const isLetterOrDigit = [](unsigned char c) { return std::isalnum(c) != 0; };
  return serialNumber.size() == 7 && std::all_of(serialNumber.begin(), serialNumber.end(), isLetterOrDigit);
}

TAnswer AnswerWithSerialNumber(TQuestion const& question, TNamespaceView const& view) {
  TAnswer answer = AnswerTo(question, view);
  if (!answer.fIsKnown) return answer;
  answer.fValue = WithoutOuterBlanks(answer.fValue);
  if (HasOnly(answer.fValue, '\xff')) return TAnswer::Unknown({kMissingNotGiven, "not programmed (0xFF)"}, answer.fSource);
  if (HasOnly(answer.fValue, '-'))
    return TAnswer::Unknown({kMissingPlaceholder, "placeholder text of the provider: \"" + answer.fValue + "\""}, answer.fSource);
  if (!IsOfOwnForm(answer.fValue)) answer.fNote = "not in the collector's own form: 7 letters and digits";
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

TMissing WhyNobodyAnswers(std::vector<TPlugIn> const& plugIns) {
  if (plugIns.empty()) return {kMissingNotDescribed, "no provider plug-in found"};
  return {kMissingNotDescribed, "no provider plug-in works"};
}

// The first answer of a provider that knows, else the most telling of the others: that there is no such value, or the first
// reason.
template <class TAsk>
TAnswer AskEveryone(TViews const& views, std::vector<TPlugIn> const& plugIns, TAsk ask) {
  TAnswer best = TAnswer::Unknown(WhyNobodyAnswers(plugIns), "");
  for (TNamespaceView const& view : views) {
    TAnswer answer = TAnswer::Unknown({}, "");
    std::string const failure = FailureOf([&] { answer = ask(view); });
    if (!failure.empty())
      answer = TAnswer::Unknown({kMissingProviderFailed, "provider " + view.GetProviderName() + " failed: " + failure}, "");
    if (answer.fIsKnown) return answer;
    bool const tellsMore = best.fMissing.fCode == kMissingNotDescribed || (answer.IsNotApplicable() && !best.IsNotApplicable());
    if (tellsMore) best = answer;
  }
  return best;
}

// ---- Details ----

TAnswer PropertyOfFirst(TNamespaceView const& view, std::string const& className, char const* property) {
  auto const instances = view.InstancesOf(className);
  if (instances.empty()) return view.AnswerWithoutInstance(className, property);
  return view.Answer(*instances.front(), property);
}

TAnswer BiosDate(TNamespaceView const& view) {
  auto const instances = view.InstancesOf("CIM_BIOSElement");
  if (instances.empty()) return view.AnswerWithoutInstance("CIM_BIOSElement", "ReleaseDate");
  TAnswer answer = view.Answer(*instances.front(), "ReleaseDate");
  if (!answer.fIsKnown) return answer;
  TCIMDateTime const date = instances.front()->GetProperty("ReleaseDate", TCIMContext())->GetValue(TCIMContext());
  char text[32];
  std::snprintf(text, sizeof text, "%04u-%02u-%02u", date.GetYear(), date.GetMonth(), date.GetDay());
  return TAnswer::Known(text, answer.fSource);
}

// "2 x Example Processor, 24 cores"
TAnswer Processors(TNamespaceView const& view) {
  auto const processors = view.InstancesOf("CIM_Processor");
  if (processors.empty()) return view.AnswerWithoutInstance("CIM_Processor", "ElementName");
  std::map<std::string, unsigned> countOfKind;
  unsigned long cores = 0;
  bool areCoresKnown = true;
  std::string source;
  for (auto const& processor : processors) {
    TAnswer const kind = view.Answer(*processor, "ElementName");
    TAnswer const number = view.Answer(*processor, "NumberOfEnabledCores");
    ++countOfKind[kind.fIsKnown ? kind.fValue : "processor of unknown kind"];
    if (number.fIsKnown) cores += std::strtoul(number.fValue.c_str(), nullptr, 10);
    areCoresKnown = areCoresKnown && number.fIsKnown;
    source = kind.fSource;
  }
  std::string text;
  for (auto const& [kind, count] : countOfKind) text += (text.empty() ? "" : ", ") + std::to_string(count) + " x " + kind;
  if (areCoresKnown) text += ", " + std::to_string(cores) + (cores == 1 ? " core" : " cores");
  return TAnswer::Known(text, source);
}

// "128 GiB in 8 modules"
TAnswer Memory(TNamespaceView const& view) {
  auto const modules = view.InstancesOf("CIM_PhysicalMemory");
  if (modules.empty()) return view.AnswerWithoutInstance("CIM_PhysicalMemory", "Capacity");
  unsigned long bytes = 0, unknown = 0;
  TAnswer capacity = TAnswer::Unknown({}, "");
  for (auto const& module : modules) {
    capacity = view.Answer(*module, "Capacity");
    if (capacity.fIsKnown)
      bytes += std::strtoul(capacity.fValue.c_str(), nullptr, 10);
    else
      ++unknown;
  }
  if (unknown == modules.size()) return capacity;
  std::string text =
      ExactSizeText(bytes) + " in " + std::to_string(modules.size()) + (modules.size() == 1 ? " module" : " modules");
  if (unknown > 0) text += ", " + std::to_string(unknown) + " of them of unknown size";
  return TAnswer::Known(text, capacity.fSource);
}

struct TDetail {
  char const* fKey;
  char const* fLabel;
  TAnswer (*fAnswer)(TNamespaceView const& view);
};

constexpr TDetail kDetails[] = {
    {"manufacturer", "Manufacturer", [](TNamespaceView const& view) { return PropertyOfFirst(view, kSystem, "Manufacturer"); }},
    {"uuid", "UUID", [](TNamespaceView const& view) { return PropertyOfFirst(view, kSystem, "UUID"); }},
    {"biosVersion", "BIOS version",
     [](TNamespaceView const& view) { return PropertyOfFirst(view, "CIM_BIOSElement", "Version"); }},
    {"biosDate", "BIOS date", BiosDate},
    {"chassis", "Chassis",
     [](TNamespaceView const& view) { return PropertyOfFirst(view, "CIM_Chassis", "ChassisTypeDescription"); }},
    {"processors", "Processors", Processors},
    {"memory", "Memory", Memory},
    {"kernel", "Kernel", [](TNamespaceView const& view) { return PropertyOfFirst(view, kOperatingSystem, "KernelRelease"); }},
    {"architecture", "Architecture",
     [](TNamespaceView const& view) { return PropertyOfFirst(view, kOperatingSystem, "Architecture"); }},
};

// ---- Head lines ----

TAnswer const& Row(std::vector<TReportRow> const& rows, std::string const& key) {
  return std::find_if(rows.begin(), rows.end(), [&](TReportRow const& row) { return row.fKey == key; })->fAnswer;
}

std::string ValueOr(TAnswer const& answer, std::string const& otherwise) { return answer.fIsKnown ? answer.fValue : otherwise; }

// Without the brackets with type and model, which the line tells by themselves.
std::string WithoutTypeAndModel(std::string const& productName) {
  std::string const name = productName.substr(0, StartOfBrackets(productName));
  std::size_t const last = name.find_last_not_of(' ');
  return last == std::string::npos ? productName : name.substr(0, last + 1);
}

std::string TypeAndModel(std::vector<TReportRow> const& identity) {
  TAnswer const& type = Row(identity, "machineType");
  TAnswer const& model = Row(identity, "model");
  if (type.IsNotApplicable()) return "no machine type and model";
  return "type " + ValueOr(type, "unknown") + (model.IsNotApplicable() ? ", no model" : ", model " + ValueOr(model, "unknown"));
}

std::string MachineLine(std::vector<TReportRow> const& identity) {
  TAnswer const& product = Row(identity, "productName");
  TAnswer const& type = Row(identity, "machineType");
  TAnswer const& serial = Row(identity, "serialNumber");
  std::string const host = ValueOr(Row(identity, "hostName"), "Unnamed machine");
  if (!product.fIsKnown && !type.fIsKnown && !serial.fIsKnown && product.fMissing.fReason == serial.fMissing.fReason)
    return host + ": not identified: " + product.fMissing.fReason;
  return host + ": " + (product.fIsKnown ? WithoutTypeAndModel(product.fValue) : "unknown product") + ", " +
         TypeAndModel(identity) + ", serial number " + ValueOr(serial, "unknown");
}

std::string OperatingSystemLine(TReport const& report) {
  TAnswer const& name = Row(report.fIdentity, "osName");
  TAnswer const& version = Row(report.fIdentity, "osVersion");
  TAnswer const& type = Row(report.fIdentity, "osType");
  TAnswer const& kernel = Row(report.fDetails, "kernel");
  std::string line = IsSampleSelected() ? "operating system of this machine, not of the sample: " : "Operating system: ";
  line += name.fIsKnown ? name.fValue + (version.fIsKnown ? " " + version.fValue : "") : "unknown: " + name.fMissing.fReason;
  if (type.fIsKnown && kernel.fIsKnown) line += ", " + type.fValue + " " + kernel.fValue;
  return line;
}

std::vector<std::string> HeadLines(TReport const& report) {
  std::string const label = IsSampleSelected() ? std::string(kSampleLabel) + " " : "";
  return {label + MachineLine(report.fIdentity), label + OperatingSystemLine(report)};
}

EExitStatus StatusOf(TReport const& report) {
  auto const isKnown = [](TReportRow const& row) { return row.fAnswer.fIsKnown; };
  auto const isSettled = [](TReportRow const& row) { return row.fAnswer.fIsKnown || row.fAnswer.IsNotApplicable(); };
  bool const areAllSettled = std::all_of(report.fIdentity.begin(), report.fIdentity.end(), isSettled);
  bool const isAnyKnown = std::any_of(report.fIdentity.begin(), report.fIdentity.end(), isKnown);
  bool const hasAnyFailed =
      std::any_of(report.fPlugIns.begin(), report.fPlugIns.end(), [](TPlugIn const& plugIn) { return plugIn.HasFailed(); });
  if (!isAnyKnown) return kExitNothing;
  return areAllSettled && !hasAnyFailed ? kExitComplete : kExitPartial;
}

}  // namespace

TReport MakeReport(std::vector<TPlugIn> plugIns) {
  TReport report;
  report.fPlugIns = std::move(plugIns);
  TViews const views = ViewsOf(report.fPlugIns);
  for (TQuestion const& question : kIdentity) {
    auto const answer = [&](TNamespaceView const& view) { return question.fAnswer(question, view); };
    report.fIdentity.push_back({question.fKey, question.fLabel, AskEveryone(views, report.fPlugIns, answer)});
  }
  for (TDetail const& row : kDetails)
    report.fDetails.push_back({row.fKey, row.fLabel, AskEveryone(views, report.fPlugIns, row.fAnswer)});
  report.fHead = HeadLines(report);
  report.fStatus = StatusOf(report);
  return report;
}

std::string WhyNotComplete(TReport const& report) {
  if (report.fStatus == kExitComplete) return "";
  std::vector<std::string> reasons;
  std::string last;  // of the row before: rows with the same reason share it
  for (TReportRow const& row : report.fIdentity) {
    TAnswer const& answer = row.fAnswer;
    if (answer.fIsKnown || answer.IsNotApplicable()) continue;
    if (!reasons.empty() && answer.fMissing.fReason == last)
      reasons.back().insert(reasons.back().size() - last.size() - 2, ", " + row.fLabel);
    else
      reasons.push_back(row.fLabel + ": " + answer.fMissing.fReason);
    last = answer.fMissing.fReason;
  }
  for (std::string const& failure : FailuresOf(report.fPlugIns)) reasons.push_back(failure);
  return Joined(reasons, "; ");
}

}  // namespace NQRVZEP20::zep
