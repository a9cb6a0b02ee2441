// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/stored/BoundedJson.h"
#include "collect/stored/StoredReport.h"
#include "collect/stored/TJsonTree.h"

#include <nlohmann/json.hpp>

#include <string>
#include <string_view>

namespace NQRVZEP20 {

// A document of `zep report --json` as it was written: all members, in their order.
using TStoredDocument = nlohmann::ordered_json;

// The version of the documents that this library reads.
constexpr int kStoredVersion = 2;

// Those of the documents of zep. Values of that number take half a gigabyte at most.
constexpr TJsonBounds kDocumentBounds{16, 2000, 8000000};

// Parses a JSON document. Throws TStoredReportError if it is none, or beyond the bounds.
TStoredDocument ParsedWithinBounds(std::string_view text, TJsonBounds const& bounds = kDocumentBounds);

// Parses a document and checks that it is one of a report, in that version. Throws TStoredReportError.
TJsonTree StoredTreeFrom(std::string const& text, std::string const& name);

// The same as an object that can be changed. All parts of the document are checked, too (StoredReportFrom).
TStoredDocument StoredDocumentFrom(std::string const& text, std::string const& name);

// The text of a regular file of no more than kStoredReportLimit bytes. Throws TStoredReportError.
std::string ReadStoredText(std::string const& file);

// The document in such a file.
TStoredDocument ReadStoredDocument(std::string const& file);

// The report of a document that was changed. Throws TStoredReportError if a part of it is missing or of another kind.
TStoredReport StoredReportOf(TStoredDocument const& document, std::string const& name);

}  // namespace NQRVZEP20
