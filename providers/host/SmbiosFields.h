// SPDX-License-Identifier: Apache-2.0
#pragma once

// How fields of SMBIOS structures become values: the firmware's placeholders and numbers for "unknown" are missing values.

#include "Placeholder.h"
#include "TSmbiosStructure.h"

#include <algorithm>
#include <string>
#include <vector>

namespace NQRVZEP20 {

inline TMissing Unknown() { return {kMissingNotGiven, "the firmware reports it as unknown"}; }

inline TMissing NotOfTheForm(std::string const& what) { return {kMissingUnexpected, "not in the expected form: " + what}; }

inline TFinding<std::string> TextOf(TSmbiosStructure const& structure, std::size_t offset) {
  return structure.Text(offset).Then(WithoutPlaceholder);
}

// The number as a T; missing when it is `unknown`, the number that SMBIOS defines for that.
template <class T, class TNumber>
TFinding<T> NumberOf(TFinding<TNumber> const& number, TNumber unknown) {
  return number.Then([unknown](TNumber known) -> TFinding<T> {
    if (known == unknown) return Unknown();
    return static_cast<T>(known);
  });
}

template <class TNumber>
bool IsNumber(TFinding<TNumber> const& found, TNumber number) {
  return found && *found == number;
}

inline bool AreAll(std::vector<unsigned char> const& bytes, unsigned char value) {
  return std::all_of(bytes.begin(), bytes.end(), [value](unsigned char byte) { return byte == value; });
}

// The word for a number from a list that begins with the word for `first`. `subject` names the number in the reason.
template <std::size_t N>
TFinding<std::string> WordFor(unsigned number, char const* const (&words)[N], unsigned first, char const* subject) {
  if (number < first || number - first >= N) return NotOfTheForm(std::string(subject) + " " + std::to_string(number));
  return std::string(words[number - first]);
}

// The words for the bits that are set, from bit `first` on.
template <class TBits, std::size_t N>
std::vector<std::string> WordsFor(TBits bits, char const* const (&words)[N], unsigned first) {
  std::vector<std::string> found;
  for (std::size_t at = 0; at < N; ++at)
    if (bits >> (first + at) & 1) found.emplace_back(words[at]);
  return found;
}

}  // namespace NQRVZEP20
