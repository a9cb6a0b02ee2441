// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// Keeps the first and the last bytes of a text of any length.
class TWords {
public:
  explicit TWords(std::size_t most) : fMost(most) {}  // the number of bytes to keep at each end

  void Add(std::string_view text);

  // The text; omitted bytes are replaced by a line that states their number.
  std::string Get() const;

private:
  std::size_t const fMost;
  std::string fFirst, fLast;
  std::uint64_t fLeftOut = 0;
};

}  // namespace NQRVZEP20
