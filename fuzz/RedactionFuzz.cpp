// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the map of a redacted report, and redacts them as a text, as a document, and as the secrets of a document.
// Each must then be restored unchanged.

#include "collect/redaction/Redaction.h"
#include "collect/redaction/SecretProperties.h"
#include "collect/stored/StoredDocument.h"
#include "fuzz/Require.h"

#include <cstdint>
#include <sstream>
#include <string>

using namespace NQRVZEP20;
using TJson = TStoredDocument;

namespace {

void ReadAsMap(std::string const& text) {
  auto const document = nlohmann::ordered_json::parse(text, nullptr, false);
  try {
    TPseudonyms const pseudonyms = TPseudonyms::From(document);
    Require(TPseudonyms::From(pseudonyms.AsJson()).AsJson() == pseudonyms.AsJson());
  } catch (TRedactionError const& failure) {
    Require(*failure.what() != '\0');
  }
}

void RedactAndBack(std::string const& text) {
  TSecretIndex index;
  index.Add(ESecretKind::kSerials, "ZX81-77");
  index.Add(ESecretKind::kHosts, "db1.example.net");
  index.Add(ESecretKind::kAddresses, "2001:db8::");
  index.Add(ESecretKind::kUsers, "(bob)");
  TPseudonyms pseudonyms("1");
  std::string const redacted =
      index.Rewritten(text, [&](TSecret const* secret, std::string const& spelling) { return pseudonyms.For(secret, spelling); })
          .value_or(text);
  std::string const back = TSecretIndex()
                               .Rewritten(redacted,
                                          [&](TSecret const*, std::string const& pseudonym) {
                                            Require(pseudonyms.SpellingOf(pseudonym) != nullptr);
                                            return *pseudonyms.SpellingOf(pseudonym);
                                          })
                               .value_or(redacted);
  Require(back == text);
}

// Redacts a document and gives the original back. Returns the redacted document, or null if it was refused.
TJson RedactedAndBack(TJson const& original) {
  TPseudonyms pseudonyms("1");
  TJson document = original;
  try {
    Redact(document, {kSecretKinds.begin(), kSecretKinds.end()}, pseudonyms);
  } catch (TRedactionError const& failure) {
    Require(*failure.what() != '\0');
    return nullptr;
  }
  TJson const redacted = document;
  Unredact(document, pseudonyms);
  Require(document == original);
  return redacted;
}

void ReadAsDocument(std::string const& text) {
  TJson document;
  try {
    document = StoredDocumentFrom(text, "x");
    StoredReportOf(document, "x");
  } catch (TStoredReportError const&) {
    return;
  }
  if (!IsRedacted(document)) RedactedAndBack(document);
}

TJson PropertyOf(std::string const& value) { return {{"type", "string"}, {"value", value}}; }

// The first lines are a serial number, a host, an address and an account; the others are texts in which they may occur.
void RedactAsSecrets(std::string const& text) {
  std::istringstream lines(text);
  std::string serial, host, address, user;
  for (std::string* line : {&serial, &host, &address, &user}) std::getline(lines, *line);
  TJson head = {serial, text};
  for (std::string line; std::getline(lines, line);) head.push_back(line);
  TJson const instance = {{"path", "root/x:X.Tag=\"" + serial + "\""},
                          {"namespace", "root/x"},
                          {"class", "X"},
                          {"properties",
                           {{"SerialNumber", PropertyOf(serial)},
                            {"HostName", PropertyOf(host)},
                            {"AccessInfo", PropertyOf(address)},
                            {"IPAddress", PropertyOf(address)},
                            {"UserID", PropertyOf(user)},
                            {"Source", PropertyOf(host)},
                            {"FileSystemOptions", PropertyOf(text)},
                            {"KernelCommandLine", PropertyOf(text)},
                            {"Message", PropertyOf(text)}}}};
  TJson const redacted =
      RedactedAndBack({{"head", head},
                       {"identity", TJson::object()},
                       {"details", TJson::object()},
                       {"classes", {{{"class", "X"}, {"superclasses", {"CIM_RemoteServiceAccessPoint", "ZEP_Mount"}}}}},
                       {"instances", {instance}}});
  bool const isPath = serial.find(':') != serial.npos;
  Require(isPath || IsPlaceholder(ESecretKind::kSerials, serial) || redacted.at("head").at(0) != serial);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  ReadAsMap(text);
  RedactAndBack(text);
  ReadAsDocument(text);
  RedactAsSecrets(text);
  return 0;
}
