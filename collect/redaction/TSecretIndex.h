// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/redaction/ESecretKind.h"

#include <bitset>
#include <cstddef>
#include <functional>
#include <map>
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

// Finds secrets in texts, in all their spellings (Spellings.h), with any marks (TNormalText.h) and in upper and lower case. A
// secret of letters alone, which may be a word of a language, is found in its own case and in upper and lower case only; one
// without digits with a space only where it has one itself.
//
// A secret is found where no word continues at its ends. A longer word that contains a secret of six characters or more, with a
// digit among them, or one in base64, is a spelling of it: "enx525400112201". The begin of a long secret is a spelling of it,
// too: 200 characters in whole words, or 64 in a longer word. The time for a text is thus in proportion to its length.
class TSecretIndex {
public:
  // Another spelling of a value that is known already (CanonicalForm) belongs to that secret.
  void Add(ESecretKind kind, std::string const& value);

  std::vector<TSecret> const& Secrets() const { return fSecrets; }
  // The secret to which a value belongs that was added.
  TSecret const& SecretOf(std::string const& value) const;

  TSecretCounts Counts() const;

  // Returns the replacement of a spelling. `secret` is null for a text that only looks like a pseudonym (TPseudonyms.h).
  using TReplace = std::function<std::string(TSecret const* secret, std::string const& spelling)>;

  // The text with each spelling of a secret replaced; none if it has none.
  std::optional<std::string> Rewritten(std::string_view text, TReplace const& replace) const;

private:
  static constexpr std::size_t kHashes = 1 << 16;

  struct TSpelling {
    std::size_t fSecret;
    bool fIsValue;  // of the secret itself
    bool fIsExact;  // whether case matters
  };
  struct TPart {
    std::size_t fSecret;
    bool fIsBase64;
  };
  using TParts = std::map<std::string, TPart>;
  using TLongSpellings = std::map<std::string, std::size_t, std::less<>>;  // the secrets by their normal forms
  struct THit {
    std::size_t fBegin = 0, fEnd = 0;
    TSecret const* fSecret = nullptr;
  };

  void AddCase(std::string const& value);
  void AddSpelling(std::string const& text, TSpelling const& spelling);
  void AddBase64(std::string const& text, std::size_t secret);
  void AddPart(std::string_view text, TPart const& part);
  THit HitAtWord(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  THit HitAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  THit LongestAt(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  THit LongHitAt(std::string_view text, std::size_t begin, std::string const& head) const;
  bool IsAsWritten(TSpelling const& spelling, std::string_view text) const;
  THit WithSigns(THit const& hit, std::string_view text, std::size_t from) const;
  THit WordWith(std::string_view text, std::size_t from, std::size_t begin, std::size_t end) const;
  TPart const* PartIn(std::string_view word) const;
  TPart const* PartAt(std::string_view word, std::size_t at) const;

  std::vector<TSecret> fSecrets;
  std::unordered_set<std::string> fValues;
  std::unordered_map<std::string, std::size_t> fKnown;    // the secrets by their canonical forms
  std::unordered_map<std::string, TSpelling> fSpellings;  // by their normal forms
  std::unordered_map<std::string, TLongSpellings> fLong;  // longer ones, by the first words of their normal forms
  std::unordered_map<std::string, std::vector<std::size_t>>
      fSizes;                            // of the normal forms, or of their first words, by the first word; the longest first
  TParts fParts;                         // of longer words, in lower case
  std::bitset<kHashes> fWords, fBegins;  // hashes of the first words, and of the first bytes of parts
};

}  // namespace NQRVZEP20
