// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the map of a redacted report, and redacts them as a text, which must then be restored unchanged.

#include "collect/redaction/TPseudonyms.h"
#include "fuzz/Require.h"

#include <cstdint>
#include <string>

using namespace NQRVZEP20;

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
      index.Rewritten(text, [&](TSecret const* secret, std::string const& spelling) { return pseudonyms.For(secret, spelling); });
  std::string const back = TSecretIndex().Rewritten(redacted, [&](TSecret const*, std::string const& pseudonym) {
    Require(pseudonyms.SpellingOf(pseudonym) != nullptr);
    return *pseudonyms.SpellingOf(pseudonym);
  });
  Require(back == text);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  ReadAsMap(text);
  RedactAndBack(text);
  return 0;
}
