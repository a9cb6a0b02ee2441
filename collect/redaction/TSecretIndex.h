// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/ESecretKind.h"

#include <bitset>
#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

namespace NQRVZEP20 {

struct TSecret {
  ESecretKind fKind;
  std::string fValue;
};

// Finds secrets in texts, in all their spellings (Spellings.h) and in upper and lower case. A secret of letters alone, which may
// be a word of a language, is found in its own case and in upper case only.
//
// A secret is found where no word continues at its ends. A longer word that contains a secret of six characters or more, with a
// digit among them, is a spelling of it: "enx525400112201".
class TSecretIndex {
public:
  // A value that is known already is ignored.
  void Add(ESecretKind kind, std::string const& value);

  std::vector<TSecret> const& Secrets() const { return fSecrets; }
  TSecretCounts Counts() const;

  // Returns the replacement of a spelling. `secret` is null for a text that only looks like a pseudonym (TPseudonyms.h).
  using TReplace = std::function<std::string(TSecret const* secret, std::string const& spelling)>;

  // The text with each spelling of a secret replaced; none if it has none.
  std::optional<std::string> Rewritten(std::string_view text, TReplace const& replace) const;

private:
  static constexpr std::size_t kHashes = 1 << 16;

  struct TSpelling {
    std::string fText;
    std::size_t fPrefix;  // the number of bytes before its first word
    std::size_t fSecret;
    bool fIsExact;  // whether case matters
  };
  struct THit {
    std::size_t fBegin, fEnd;
    TSecret const* fSecret;
  };

  void AddSpelling(TSpelling spelling);
  void AddPart(std::string const& text, std::size_t secret);
  THit HitAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  TSpelling const* LongestAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  TSecret const* SecretIn(std::string_view word) const;
  TSecret const* PartAt(std::string_view word, std::size_t at) const;

  std::vector<TSecret> fSecrets;
  std::unordered_set<std::string> fValues;                             // of the secrets
  std::unordered_map<std::string, std::vector<TSpelling>> fSpellings;  // by the first word, in lower case; the longest first
  std::unordered_map<std::string, std::vector<TSpelling>> fParts;      // of longer words, by their first bytes
  std::bitset<kHashes> fWords, fBegins;                                // hashes of both keys
};

}  // namespace NQRVZEP20
