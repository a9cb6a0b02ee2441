// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMValue.h"
#include "collect/TNamespaceView.h"
#include "tools/zep/output/ExitStatus.h"
#include "tools/zep/output/Failure.h"
#include "tools/zep/output/Output.h"

#include <nlohmann/json.hpp>

#include <exception>
#include <string>

namespace NQRVZEP20::zep {

using TJson = nlohmann::ordered_json;

// The version of the documents of zep. It grows when a program that reads them would notice the change.
constexpr int kDocumentVersion = 2;

// The head of every document: what it is, its version, whether it is about the sample, the exit status, and why that is not
// kExitComplete. The reason is empty for kExitComplete, and only then. `sampleLabel` is the label of the sample that the document
// is about; empty for none.
TJson DocumentHead(std::string const& what, EExitStatus status, std::string const& reason, std::string const& sampleLabel = "");

// A document as text, in lines for people or in one line. Bytes that are not UTF-8 become the replacement character. Members that
// hold a message, such as "reason", or repeat an argument, such as "url", hide passwords (Secrets.h); all others are data.
std::string AsText(TJson const& document);
std::string AsLine(TJson const& document);

// The same as AsText, with the messages verbatim too: for a document that is sent or stored.
std::string AsVerbatimText(TJson const& document);

// The text; null for an empty one.
TJson OrNull(std::string const& text);

// The document of a command that failed early: only the head, in one line.
std::string FailureAsJson(std::string const& what, EExitStatus status, std::string const& reason,
                          std::string const& sampleLabel = "");

// Booleans, numbers, arrays and NULL become the same kind of JSON; all other values become texts. 64-bit integers become texts,
// too, because many programs read them as reals of 53 bits; so do reals that are not finite.
TJson ValueAsJson(TCIMValue const& value);

// The name of the type, followed by "[]" for an array.
std::string NameOf(TCIMValue::TCIMType type);

// An instance with its path and all properties: type, value, source, and for a missing value the reason.
TJson InstanceAsJson(TNamespaceView const& view, ICIMInstance const& instance);

}  // namespace NQRVZEP20::zep
