// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TByteWriter.h"

namespace NQRVZEP20 {

void TByteWriter::Number(std::uint64_t value) {
  for (; value >= 0x80; value >>= 7) Byte(static_cast<unsigned int>(value & 0x7f) | 0x80u);
  Byte(static_cast<unsigned int>(value));
}

void TByteWriter::Text(std::string_view text) {
  Number(text.size());
  fBytes.append(text);
}

}  // namespace NQRVZEP20
