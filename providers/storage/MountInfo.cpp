// SPDX-License-Identifier: Apache-2.0
#include "MountInfo.h"

#include <algorithm>
#include <sstream>

namespace NQRVZEP20 {

namespace {

bool IsOctal(char c) { return c >= '0' && c <= '7'; }

// Replaces each "\ooo" by the byte with that octal code.
std::string Decoded(std::string const& text) {
  std::string decoded;
  for (std::size_t i = 0; i < text.size(); ++i) {
    bool const isEscape =
        text[i] == '\\' && i + 3 < text.size() && IsOctal(text[i + 1]) && IsOctal(text[i + 2]) && IsOctal(text[i + 3]);
    decoded += isEscape ? static_cast<char>((text[i + 1] - '0') << 6 | (text[i + 2] - '0') << 3 | (text[i + 3] - '0')) : text[i];
    if (isEscape) i += 3;
  }
  return decoded;
}

std::vector<std::string> WordsOf(std::string const& line) {
  std::istringstream words(line);
  std::vector<std::string> list;
  for (std::string word; words >> word;) list.push_back(word);
  return list;
}

}  // namespace

// "28 1 9:0 / /data rw,noatime shared:1 - ext4 /dev/md0 rw": six fields, tags up to a dash, three fields. The source may be
// empty.
std::vector<TMount> MountsFrom(std::string const& text) {
  constexpr std::size_t kFirstTag = 6;
  std::vector<TMount> mounts;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::vector<std::string> const words = WordsOf(line);
    if (words.size() < kFirstTag) continue;
    auto const dash = std::find(words.begin() + kFirstTag, words.end(), "-");
    if (std::distance(dash, words.end()) < 3) continue;
    std::string tags;
    for (auto tag = words.begin() + kFirstTag; tag != dash; ++tag) tags += (tags.empty() ? "" : " ") + *tag;
    bool const hasSource = std::distance(dash, words.end()) > 3;
    mounts.push_back({words[0], words[2], Decoded(words[3]), Decoded(words[4]), words[5], tags, dash[1],
                      hasSource ? Decoded(dash[2]) : "", words.back()});
  }
  return mounts;
}

std::vector<TSwap> SwapsFrom(std::string const& text) {
  std::vector<TSwap> swaps;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream words(line);
    TSwap swap{};
    if (!(words >> swap.fFile >> swap.fType >> swap.fSize >> swap.fUsed >> swap.fPriority)) continue;
    swap.fFile = Decoded(swap.fFile);
    swaps.push_back(swap);
  }
  return swaps;
}

}  // namespace NQRVZEP20
