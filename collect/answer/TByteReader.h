// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// Reads what TByteWriter wrote. The bytes need not be trusted: every length is checked against the number of remaining bytes.
// All members throw TBadAnswer if the bytes end too early. The bytes must outlive the reader and the views that it returns.
class TByteReader {
public:
  explicit TByteReader(std::string_view bytes, std::size_t at = 0);  // `at`: the start position, at most the size

  std::size_t At() const { return fAt; }
  std::size_t Left() const { return fBytes.size() - fAt; }

  unsigned char Byte();
  std::uint64_t Number();

  // A number that is at most `most`; for a greater one, throws TBadAnswer with `what` as its name.
  std::uint64_t NumberUpTo(std::uint64_t most, char const* what);

  // The number of elements of a list: at most `most`, and at most the number of remaining bytes, because each element has at
  // least one byte.
  std::size_t Count(std::uint64_t most, char const* what);

  template <class T>
  T Fixed() {
    static_assert(std::is_arithmetic_v<T> && !std::is_same_v<T, bool>);
    Require(sizeof(T));
    T value;
    std::memcpy(&value, fBytes.data() + fAt, sizeof value);
    fAt += sizeof value;
    return value;
  }

  std::string_view Text();
  std::string_view Name();  // a text of at most kLongestName bytes (AnswerLimits.h)
  void Skip(std::size_t bytes);

private:
  void Require(std::size_t bytes) const;

  std::string_view fBytes;
  std::size_t fAt;
};

}  // namespace NQRVZEP20
