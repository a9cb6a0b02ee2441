// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <functional>
#include <string>
#include <string_view>
#include <type_traits>

namespace NQRVZEP20 {

// The attributes of a netlink message, or those that are nested in one of its attributes. It keeps views of the bytes of the
// message. An attribute whose length exceeds the rest of the bytes ends the list; of several attributes with the same type, the
// last one counts. Copies share the bytes.
class TNetlinkAttributes {
public:
  // No attributes.
  TNetlinkAttributes() = default;
  explicit TNetlinkAttributes(std::string_view bytes);

  bool Has(unsigned type) const;

  // The payload; empty if there is no such attribute.
  std::string_view Bytes(unsigned type) const;

  // A number in the machine's byte order. Missing without the attribute, or if it is shorter than T.
  template <class T>
  TFinding<T> Number(unsigned type) const {
    static_assert(std::is_trivially_copyable_v<T>);
    std::string_view const bytes = Bytes(type);
    if (!Has(type)) return WhyAbsent();
    if (bytes.size() < sizeof(T)) return TMissing{kMissingUnexpected, "the kernel reports it with too few bytes"};
    T number;
    std::memcpy(&number, bytes.data(), sizeof number);
    return number;
  }

  // A text, up to the first zero byte. Missing without the attribute, or if the text is empty.
  TFinding<std::string> Text(unsigned type) const;

  // The attributes that are nested in this one; none if there is no such attribute.
  TNetlinkAttributes Nested(unsigned type) const { return TNetlinkAttributes(Bytes(type)); }

  // Visits each attribute of a list, including those with the same type.
  static void VisitEach(std::string_view list, std::function<void(unsigned type, std::string_view payload)> const& visit);

private:
  static TMissing WhyAbsent() { return {kMissingNotGiven, "the kernel does not report it"}; }

  std::array<std::string_view, 128> fPayloads;  // by type; without a pointer: absent. Attributes of higher types are ignored.
};

// The text before the first zero byte.
std::string_view TextIn(std::string_view bytes);

// Calls `visit` for each message of the given type in the bytes of a netlink dump: with the header of its family, of type T, and
// its attributes. A message whose length exceeds the rest of the bytes ends the dump. The views are valid as long as `bytes`.
template <class T>
void VisitMessages(std::string const& bytes, unsigned type,
                   std::function<void(T const&, TNetlinkAttributes const&)> const& visit);

// The error that the kernel reports in the dump; missing (kMissingNotGiven) if it reports none. `errno` values: EPERM, ….
TFinding<int> ErrorIn(std::string const& dump);

// Whether the kernel states that the dump is incomplete, because the objects changed while it was made.
bool IsInterrupted(std::string const& dump);

// Calls `visit` with the type and the payload of each message, including those that end a dump.
void VisitPayloads(std::string const& dump, std::function<void(unsigned type, std::string_view payload)> const& visit);

template <class T>
void VisitMessages(std::string const& bytes, unsigned type,
                   std::function<void(T const&, TNetlinkAttributes const&)> const& visit) {
  static_assert(std::is_trivially_copyable_v<T> && sizeof(T) % 4 == 0);
  VisitPayloads(bytes, [&](unsigned found, std::string_view payload) {
    if (found != type || payload.size() < sizeof(T)) return;
    T header;
    std::memcpy(&header, payload.data(), sizeof header);
    visit(header, TNetlinkAttributes(payload.substr(sizeof header)));
  });
}

}  // namespace NQRVZEP20
