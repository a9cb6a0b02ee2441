// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// Writes numbers and texts one after the other. Numbers of a fixed width have the byte order of this machine, on which the reader
// runs, too.
class TByteWriter {
public:
  void Byte(unsigned int value) { fBytes.push_back(static_cast<char>(value)); }  // its lowest eight bits

  // 7 bits a byte, the lowest first; the highest bit of a byte states whether another one follows.
  void Number(std::uint64_t value);

  template <class T>
  void Fixed(T value) {
    static_assert(std::is_arithmetic_v<T>);
    fBytes.append(reinterpret_cast<char const*>(&value), sizeof value);
  }

  void Text(std::string_view text);  // its length and its bytes
  void Raw(std::string_view bytes) { fBytes.append(bytes); }

  std::string const& Bytes() const { return fBytes; }
  void Clear() { fBytes.clear(); }
  void CutTo(std::size_t size) { fBytes.resize(size); }  // drops what was written after that size

private:
  std::string fBytes;
};

}  // namespace NQRVZEP20
