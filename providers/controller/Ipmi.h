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

// Network functions.
constexpr std::uint8_t kSensorEvent = 0x04, kApplication = 0x06, kStorage = 0x0A, kTransport = 0x0C;

// Completion codes.
constexpr std::uint8_t kReservationLost = 0xC5;

// The data of an answer to the request, without the completion code. Missing if there was no answer, if the controller refused
// the command, or if there are fewer than `leastLength` bytes.
TFinding<std::string> DataOf(TFinding<std::string> const& answer, TIpmiRequest const& request, std::size_t leastLength = 0);

// Sends the command and returns the data of its answer.
TFinding<std::string> Ask(TIpmi const& ipmi, TIpmiRequest const& request, std::size_t leastLength = 0);

// Commands that read a part of something return at most this many bytes: a controller that refuses a longer part must accept it.
constexpr std::size_t kShortestPart = 8;

// Whether the controller refused the command because of its length or the length of the answer, so that a shorter part may help.
bool RefusesLength(TFinding<std::string> const& answer);

// Codes of the reasons that Ask and connections give.
constexpr char const* kMissingRefused = "refused";  // the controller refused the command
constexpr char const* kMissingNoAnswer = "no-answer";
constexpr char const* kMissingTimeIsUp = "time-is-up";

}  // namespace NQRVZEP20
