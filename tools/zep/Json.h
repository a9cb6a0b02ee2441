#pragma once

#include "Output.h"
#include "TCIMValue.h"
#include "TNamespaceView.h"

#include <nlohmann/json.hpp>

#include <exception>
#include <string>

namespace NQRVZEP20::zep {

using TJson = nlohmann::ordered_json;

// The version of the documents that zep prints. It grows when a program that reads them would notice.
constexpr int kDocumentVersion = 1;

// The head that every document has: what it is, its version, and whether it is about the sample.
TJson DocumentHead(std::string const& what);

// A document as text. Bytes that are no UTF-8 become the replacement character.
std::string AsText(TJson const& document);

// The text; null for an empty one.
TJson OrNull(std::string const& text);

// The document of a command that told nothing, as text: the head, "exitStatus" (kExitNothing) and "reason".
std::string FailureAsJson(std::string const& what, std::string const& reason);

// Runs the work. When that throws, and JSON is wanted, the failure's document is printed and the exception goes on.
template <class TWork>
auto OrFailureDocument(std::string const& what, bool asJson, TWork work) {
  try {
    return work();
  } catch (std::exception const& failure) {
    if (asJson) WriteOutput(FailureAsJson(what, failure.what()));
    throw;
  }
}

// Booleans and numbers become their JSON kinds (a real that is not finite a text), arrays arrays, NULL null, and all
// others their text.
TJson ValueAsJson(TCIMValue const& value);

// The type's name, with "[]" behind it for an array.
std::string NameOf(TCIMValue::TCIMType type);

// An instance with its path and all properties: type, value, source, and why there is no value.
TJson InstanceAsJson(TNamespaceView const& view, ICIMInstance const& instance);

}  // namespace NQRVZEP20::zep
