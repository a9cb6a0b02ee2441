// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/StoredReport.h"

#include "collect/UnitText.h"
#include "collect/redaction/ESecretKind.h"
#include "collect/stored/StoredDocument.h"
#include "collect/stored/TStoredNode.h"

#include <algorithm>
#include <charconv>
#include <initializer_list>
#include <string_view>

namespace NQRVZEP20 {

namespace {

using TText = TAnswer<std::string>;

// ---- The parts of the document ----

TMissing MissingOf(TStoredNode const& node) { return {node.TextOf("code"), node.TextOf("reason")}; }

TStoredRow RowOf(TStoredNode const& node) {
  TStoredNode const value = node.Member("value");
  std::string const source = node.TextOrNullOf("source");
  TText answer = value.IsNull() ? TText::Unknown(MissingOf(node), source) : TText::Known(value.Text(), source);
  if (auto const note = node.Optional("note")) answer.fNote = note->Text();
  return {node.Name(), node.TextOf("label"), std::move(answer)};
}

std::vector<TStoredRow> RowsOf(TStoredNode const& node) {
  std::vector<TStoredRow> rows;
  node.ForEachMember([&](TStoredNode const& row) { rows.push_back(RowOf(row)); });
  return rows;
}

TText CellOf(TStoredNode const& node) {
  return node.IsString() ? TText::Known(node.Text(), "") : TText::Unknown(MissingOf(node), "");
}

TReportSection SectionOf(TStoredNode const& node) {
  TReportSection section{node.TextOf("key"), node.TextOf("title"), {}, {}, node.TextOrNullOf("whyEmpty")};
  section.fColumns = node.Member("columns").Elements([](TStoredNode const& title) { return title.Text(); });
  section.fRows = node.Member("rows").Elements([&](TStoredNode const& row) {
    auto cells = row.Elements(CellOf);
    if (cells.size() != section.fColumns.size()) row.Refuse("has not as many cells as the table has columns");
    return cells;
  });
  return section;
}

constexpr char const* kUnknownWord = "is a word that no report has";

// The text of the member, which must be one of the words.
std::string WordOf(TStoredNode const& node, char const* name, std::initializer_list<std::string_view> words) {
  std::string const text = node.TextOf(name);
  if (std::find(words.begin(), words.end(), text) == words.end()) node.Member(name).Refuse(kUnknownWord);
  return text;
}

std::string RedactionOf(TStoredNode const& node) {
  std::string const map = node.TextOf("map");
  TStoredNode const kinds = node.Member("kinds");
  kinds.ForEachElement([](TStoredNode const& kind) {
    if (!SecretKindFrom(kind.Text())) kind.Refuse(kUnknownWord);
  });
  return map + " " + kinds.AsJson();
}

TStoredProblem ProblemOf(TStoredNode const& node) {
  return {node.TextOf("rule"), WordOf(node, "severity", {"critical", "error", "warning", "information"}), node.TextOf("reason"),
          node.TextOrNullOf("remedy"), node.TextOrNullOf("instance")};
}

TStoredRule RuleOf(TStoredNode const& node) {
  std::string const outcome = WordOf(node, "outcome", {"fine", "wrong", "not-asked"});
  return {node.TextOf("id"), node.TextOf("question"), outcome, outcome == "fine" && node.Member("examined").Number() == 0,
          node.Member("notExamined").Elements([](TStoredNode const& element) {
            return TStoredNotExamined{element.TextOrNullOf("instance"), element.TextOf("reason")};
          })};
}

void AddProviders(TStoredNode const& plugIn, std::vector<TStoredProvider>& providers) {
  std::string const name = plugIn.TextOf("name"), error = plugIn.TextOrNullOf("error");
  double const milliseconds = plugIn.Member("milliseconds").Number();
  if (!error.empty()) providers.push_back({name, "", "", milliseconds, error});
  plugIn.Member("providers").ForEachElement([&](TStoredNode const& run) {
    providers.push_back({name, run.TextOf("name"), run.TextOrNullOf("namespace"),
                         milliseconds + run.Member("milliseconds").Number(), run.TextOrNullOf("error")});
  });
}

// ---- Instances ----

// The shortest text that is read back as the same number.
std::string ShortestOf(float number) {
  char text[32];
  return {text, std::to_chars(std::begin(text), std::end(text), number).ptr};
}

// A value that is not an array, as text. A real32 is written in the document with the digits of a real64.
std::string TextOf(TStoredNode const& node, std::string const& type) {
  if (node.IsArray() || node.IsObject()) node.Refuse("is not a value");
  bool const isReal32 = node.Kind() == TStoredNode::EKind::kFloat && type.rfind("real32", 0) == 0;
  return isReal32 ? ShortestOf(static_cast<float>(node.Number())) : node.ScalarText();
}

// The word for the value, or the value with its unit.
std::string InWords(TStoredNode const& value, TStoredNode const* word, TStoredProperty const& property) {
  std::string text = TextOf(value, property.fType);
  if (word != nullptr && word->IsString()) return word->Text();
  return property.fUnit.empty() ? text : TextWithUnit(TCIMValue(text), property.fUnit);
}

// The same for an array and its words, of which there may be fewer.
std::string InWords(TStoredNode const& values, std::vector<TStoredNode> const& words, TStoredProperty const& property) {
  std::string text;
  std::size_t at = 0;
  values.ForEachElement([&](TStoredNode const& value) {
    text += (at == 0 ? "" : ", ") + InWords(value, at < words.size() ? &words[at] : nullptr, property);
    ++at;
  });
  return text;
}

std::string InWords(TStoredNode const& value, std::optional<TStoredNode> const& words, TStoredProperty const& property) {
  if (!value.IsArray()) return InWords(value, words ? &*words : nullptr, property);
  bool const hasWords = words && words->IsArray();
  return InWords(value, hasWords ? words->Elements([](TStoredNode const& word) { return word; }) : std::vector<TStoredNode>(),
                 property);
}

TStoredProperty PropertyOf(TStoredNode const& node) {
  TStoredProperty property{node.Name(), node.TextOf("type"), node.Optional("key").has_value(), "", "", "", node.TextOf("source"),
                           {}};
  if (auto const unit = node.Optional("unit")) property.fUnit = unit->Text();
  TStoredNode const value = node.Member("value");
  if (value.IsNull()) {
    property.fMissing = MissingOf(node);
    return property;
  }
  property.fText = InWords(value, node.Optional("words"), property);
  property.fRaw = value.IsArray() ? value.AsJson() : TextOf(value, property.fType);
  return property;
}

TStoredInstance InstanceOf(TStoredNode const& node) {
  TStoredInstance instance{node.TextOf("path"), node.TextOf("provider"), node.TextOf("namespace"), node.TextOf("class"), {}};
  node.Member("properties").ForEachMember([&](TStoredNode const& property) {
    instance.fProperties.push_back(PropertyOf(property));
  });
  return instance;
}

// A provider that filled its namespace may still have failed when its instances were read: the document has only some of them.
void AddFailureOfInstances(TStoredNode const& failure, std::vector<TStoredProvider>& providers) {
  std::string const name = failure.TextOf("provider"), error = failure.TextOf("error");
  for (TStoredProvider& provider : providers)
    if (provider.fName == name) provider.fError = error;
}

TStoredReport ReportOf(TStoredNode const& document) {
  TStoredReport report;
  report.fZep = document.TextOf("zep");
  if (auto const label = document.Optional("label")) report.fLabel = label->Text();
  if (auto const time = document.Optional("time")) report.fTime = time->Text();
  report.fStatus = WordOf(document, "status", {"complete", "partial", "nothing"});
  report.fReason = document.TextOrNullOf("reason");
  if (auto const redaction = document.Optional("redaction")) report.fRedaction = RedactionOf(*redaction);
  report.fHead = document.Member("head").Elements([](TStoredNode const& line) { return line.Text(); });
  TStoredNode const findings = document.Member("findings");
  report.fProblems = findings.Member("problems").Elements(ProblemOf);
  report.fRules = findings.Member("rules").Elements(RuleOf);
  report.fIdentity = RowsOf(document.Member("identity"));
  report.fDetails = RowsOf(document.Member("details"));
  if (auto const sections = document.Optional("sections")) report.fSections = sections->Elements(SectionOf);
  document.Member("plugIns").ForEachElement([&](TStoredNode const& plugIn) { AddProviders(plugIn, report.fProviders); });
  report.fInstances = document.Member("instances").Elements(InstanceOf);
  if (auto const failures = document.Optional("instanceFailures"))
    failures->ForEachElement([&](TStoredNode const& failure) { AddFailureOfInstances(failure, report.fProviders); });
  return report;
}

}  // namespace

TStoredProperty const* TStoredInstance::Find(std::string const& name) const {
  auto const found = std::find_if(fProperties.begin(), fProperties.end(),
                                  [&](TStoredProperty const& property) { return property.fName == name; });
  return found == fProperties.end() ? nullptr : &*found;
}

bool TStoredInstance::IsAssociation() const {
  bool hasKey = false;
  for (TStoredProperty const& property : fProperties) {
    if (property.fIsKey && property.fType != "reference") return false;
    hasKey = hasKey || property.fIsKey;
  }
  return hasKey;
}

TStoredReport StoredReportFrom(std::string const& text, std::string const& name) {
  TJsonTree const document = StoredTreeFrom(text, name);
  try {
    TStoredReport report = ReportOf(TStoredNode(document));
    report.fFile = name;
    return report;
  } catch (TStoredReportError const& failure) {
    throw TStoredReportError(name + ": " + failure.what());
  }
}

TStoredReport ReadStoredReport(std::string const& file) { return StoredReportFrom(ReadStoredText(file), file); }

}  // namespace NQRVZEP20
