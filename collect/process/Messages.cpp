// SPDX-License-Identifier: Apache-2.0
#include "collect/process/Messages.h"

#include <cstdint>
#include <cstring>

namespace NQRVZEP20 {

std::string HeadOf(EMessage kind, std::size_t length) {
  auto const size = static_cast<std::uint32_t>(length);
  std::string head(1, static_cast<char>(kind));
  head.append(reinterpret_cast<char const*>(&size), sizeof size);
  return head;
}

std::optional<TMessage> TMessageReader::Next() {
  if (fIsBad || fBytes.size() - fAt < kMessageHead) return std::nullopt;
  auto const kind = static_cast<unsigned char>(fBytes[fAt]);
  std::uint32_t length;
  std::memcpy(&length, fBytes.data() + fAt + 1, sizeof length);
  fIsBad = kind > static_cast<unsigned char>(EMessage::kDone) || length > kLongestMessage;
  if (fIsBad || fBytes.size() - fAt - kMessageHead < length) return std::nullopt;

  TMessage message{static_cast<EMessage>(kind), fBytes.substr(fAt + kMessageHead, length)};
  fAt += kMessageHead + length;
  if (fAt > kLongestMessage || fAt == fBytes.size()) {
    fBytes.erase(0, fAt);
    fAt = 0;
  }
  return message;
}

}  // namespace NQRVZEP20
