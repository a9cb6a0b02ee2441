// SPDX-License-Identifier: Apache-2.0
#pragma once

// Netlink messages, byte by byte, for tests.

#include <linux/netlink.h>

#include <cstdint>
#include <string>

namespace NQRVZEP20 {

using namespace std::string_literals;

template <class T>
std::string BytesOf(T const& value) {
  return {reinterpret_cast<char const*>(&value), sizeof value};
}

inline std::string Padded(std::string bytes) {
  bytes.resize((bytes.size() + 3) / 4 * 4, '\0');
  return bytes;
}

inline std::string Attribute(unsigned type, std::string const& payload) {
  nlattr const header{static_cast<std::uint16_t>(sizeof header + payload.size()), static_cast<std::uint16_t>(type)};
  return Padded(BytesOf(header) + payload);
}

template <class T>
std::string NumberAttribute(unsigned type, T number) {
  return Attribute(type, BytesOf(number));
}

inline std::string TextAttribute(unsigned type, std::string const& text) { return Attribute(type, text + '\0'); }

inline std::string Message(unsigned type, std::string const& payload, unsigned flags = NLM_F_MULTI) {
  nlmsghdr const header{static_cast<std::uint32_t>(sizeof header + payload.size()), static_cast<std::uint16_t>(type),
                        static_cast<std::uint16_t>(flags), 0, 0};
  return Padded(BytesOf(header) + payload);
}

// The message that ends a dump.
inline std::string End() { return Message(NLMSG_DONE, BytesOf(0)); }

}  // namespace NQRVZEP20
