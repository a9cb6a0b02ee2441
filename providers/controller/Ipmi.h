// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/reasons/TFinding.h"

#include <cstdint>
#include <functional>
#include <string>

namespace NQRVZEP20 {

// A command to a management controller.
struct TIpmiRequest {
  std::uint8_t fNetFn, fCommand;
  std::string fData = {};
};

// Sends a command and returns its answer: the completion code, and the data after it. Missing if there was no answer. Blocks as
// long as the connection does.
using TIpmi = std::function<TFinding<std::string>(TIpmiRequest const& request)>;

// Completion codes.
constexpr std::uint8_t kReservationLost = 0xC5, kTooLong = 0xCA, kLengthRefused = 0xC8, kUnspecified = 0xFF;

// The data of the answer, without the completion code. Missing if there was no answer, if the controller refused the command, or
// if there are fewer than `leastLength` bytes.
TFinding<std::string> Ask(TIpmi const& ipmi, TIpmiRequest const& request, std::size_t leastLength = 0);

// Codes of the reasons that Ask and connections give.
constexpr char const* kMissingRefused = "refused";  // the controller refused the command
constexpr char const* kMissingNoAnswer = "no-answer";
constexpr char const* kMissingTimeIsUp = "time-is-up";

}  // namespace NQRVZEP20
