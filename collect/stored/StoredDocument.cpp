// SPDX-License-Identifier: Apache-2.0
#include "collect/stored/StoredDocument.h"

#include "collect/SafeText.h"
#include "collect/stored/TStoredNode.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <string_view>

namespace NQRVZEP20 {

namespace {

using TJson = TStoredDocument;

// "line 3, column 9: syntax error while parsing value - unexpected end of input": the message without the number of the exception
// and without the text of the file, which may be a password.
std::string WhyNotJson(TJson::exception const& failure) {
  if (dynamic_cast<TJson::parse_error const*>(&failure) == nullptr) return "a number is too large";
  std::string_view what = failure.what();
  if (std::size_t const at = what.find("line "); at != what.npos) what.remove_prefix(at);
  return Printable(what.substr(0, what.find("; last read")));
}

constexpr char const* kLines = "it has a line for each instance; this command reads the document of zep report --json";

// Whether it is the output of zep report --format jsonl, whose first line is a complete document without instances.
bool IsLines(std::string const& text) {
  TJson const first = TJson::parse(text.substr(0, text.find('\n')), nullptr, false);
  return first.is_object() && first.contains("document") && !first.contains("instances");
}

TJsonTree Parsed(std::string const& text) {
  constexpr std::string_view gzip = "\x1f\x8b";
  if (text.compare(0, gzip.size(), gzip) == 0) throw TStoredReportError("it is compressed; gunzip it first");
  try {
    return BoundedTree(text, kDocumentBounds);
  } catch (TJson::exception const& failure) {
    throw TStoredReportError(IsLines(text) ? kLines : WhyNotJson(failure));
  }
}

void CheckHead(TStoredNode const& document) {
  auto const name = document.Optional("document");
  if (!name || !name->IsString() || name->Text() != "zep report")
    throw TStoredReportError("it is not a document of zep report --json");
  TStoredNode const version = document.Member("version");
  if (version.Kind() != TStoredNode::EKind::kInteger || version.Number() < 0) version.Refuse("is not a number");
  double const number = version.Number();
  if (number != kStoredVersion)
    version.Refuse("is " + version.ScalarText() +
                   (number > kStoredVersion ? ", which a newer zep wrote" : ", which an older zep wrote") +
                   "; this zep reads version " + std::to_string(kStoredVersion));
  if (!document.Optional("status")) throw TStoredReportError("it has no report: " + document.TextOrNullOf("reason"));
}

std::string ReadWithinLimit(std::string const& file) {
  std::error_code error;
  if (!std::filesystem::exists(file, error)) throw TStoredReportError(error ? error.message() : "no such file");
  if (!std::filesystem::is_regular_file(file, error)) throw TStoredReportError("it is not a regular file");
  std::ifstream stream(file, std::ios::binary);
  std::string text(
      static_cast<std::size_t>(std::min<std::uintmax_t>(std::filesystem::file_size(file, error), kStoredReportLimit) + 1), '\0');
  stream.read(text.data(), static_cast<std::streamsize>(text.size()));
  text.resize(static_cast<std::size_t>(stream.gcount()));
  if (text.size() > kStoredReportLimit)
    throw TStoredReportError("it is longer than " + std::to_string(kStoredReportLimit >> 20) +
                             " MiB, the limit for a stored report");
  if (stream.bad() || !stream.eof()) throw TStoredReportError("it cannot be read");
  return text;
}

// Returns the result of `read`. A refusal gets the name of the file before its reason.
template <class TRead>
auto WithName(std::string const& name, TRead read) {
  try {
    return read();
  } catch (TStoredReportError const& failure) {
    throw TStoredReportError(name + ": " + failure.what());
  }
}

}  // namespace

TStoredDocument ParsedWithinBounds(std::string_view text, TJsonBounds const& bounds) {
  try {
    return BoundedJson(text, bounds);
  } catch (TJson::exception const& failure) {
    throw TStoredReportError(WhyNotJson(failure));
  }
}

TJsonTree StoredTreeFrom(std::string const& text, std::string const& name) {
  return WithName(name, [&] {
    TJsonTree document = Parsed(text);
    CheckHead(TStoredNode(document));
    return document;
  });
}

TStoredDocument StoredDocumentFrom(std::string const& text, std::string const& name) {
  StoredReportFrom(text, name);
  return TStoredDocument::parse(text);
}

std::string ReadStoredText(std::string const& file) {
  return WithName(file, [&] { return ReadWithinLimit(file); });
}

TStoredDocument ReadStoredDocument(std::string const& file) { return StoredDocumentFrom(ReadStoredText(file), file); }

TStoredReport StoredReportOf(TStoredDocument const& document, std::string const& name) {
  return StoredReportFrom(document.dump(-1, ' ', false, TJson::error_handler_t::replace), name);
}

}  // namespace NQRVZEP20
