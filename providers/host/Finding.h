// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <utility>
#include <variant>

namespace NQRVZEP20 {

// Why a value cannot be had.
struct TMissing {
  std::string fCode;    // one of the kinds below, for programs
  std::string fReason;  // for people: a clause without capital and full stop
};

constexpr char const* kMissingNoTables = "no-smbios";          // the system exports no SMBIOS tables
constexpr char const* kMissingNeedsRoot = "needs-root";        // they may be read by root only
constexpr char const* kMissingUnreadable = "unreadable";       // where the value should come from cannot be read
constexpr char const* kMissingPlaceholder = "placeholder";     // the firmware gives a text that stands for none
constexpr char const* kMissingNotGiven = "not-given";          // the source leaves the value out or calls it unknown
constexpr char const* kMissingUnexpected = "unexpected-form";  // what the source gives cannot be such a value

// A value, or why there is none.
template <class T>
class TFinding {
public:
  TFinding(T value) : fContent(std::move(value)) {}
  TFinding(TMissing why) : fContent(std::move(why)) {}

  explicit operator bool() const { return std::holds_alternative<T>(fContent); }
  T const& operator*() const { return std::get<T>(fContent); }  // only when it is true
  T const* operator->() const { return &std::get<T>(fContent); }
  TMissing const& Why() const { return std::get<TMissing>(fContent); }  // only when it is false

private:
  std::variant<T, TMissing> fContent;
};

}  // namespace NQRVZEP20
