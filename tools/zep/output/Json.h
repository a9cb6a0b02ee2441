// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "collect/stored/StoredDocument.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"

#include <nlohmann/json.hpp>

#include <string>

namespace NQRVZEP20::zep {

using TJson = nlohmann::ordered_json;

// The version of the documents of zep. It is incremented when a change affects programs that read the documents.
constexpr int kDocumentVersion = kStoredVersion;

// The common members of every document: its name (`what`), its version, whether it is about the sample, the exit status, and
// why that is not kExitComplete. The reason is empty if and only if the status is kExitComplete. `sampleLabel` is the label of
// the sample; empty without a sample.
TJson DocumentHead(std::string const& what, EExitStatus status, std::string const& reason, std::string const& sampleLabel = "");

// A document as text, indented or on one line. Bytes that are not valid UTF-8 become the replacement character. In members that
// contain a message, such as "reason", or repeat an argument, such as "url", passwords are hidden (Secrets.h); the others are
// data and are printed verbatim.
std::string AsText(TJson document);
std::string AsLine(TJson document);

// The same with the messages verbatim, too, for a document that is sent or stored.
std::string AsVerbatimText(TJson const& document);
std::string AsVerbatimLine(TJson const& document);

// Whether passwords are hidden in messages, or not, for a document that is sent or stored.
enum class EMessages { kWithoutSecrets, kVerbatim };

// The text, or null if it is empty.
TJson OrNull(std::string const& text);

// The document of a command that failed early: only the head, in one line.
std::string FailureAsJson(std::string const& what, EExitStatus status, std::string const& reason,
                          std::string const& sampleLabel = "");

// Booleans, numbers, arrays and NULL become the corresponding JSON values; all other values become strings. 64-bit integers
// become strings, too, because many programs parse JSON numbers as doubles with 53 bits of precision, and so do non-finite
// reals.
TJson ValueAsJson(TCIMValue const& value);

// The name of the type, followed by "[]" for an array.
std::string NameOf(TCIMValue::TCIMType type);

}  // namespace NQRVZEP20::zep
