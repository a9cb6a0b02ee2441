// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <netinet/in.h>
#include <sys/socket.h>

#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace ipmi {

using TClock = std::chrono::steady_clock;
using TPacket = std::vector<unsigned char>;

struct TAddress {
  sockaddr_storage fAddress;
  socklen_t fSize;
};

// The addresses of a host, at least one. Throws TFailure: kIpmiClientHostUnknown, or kIpmiClientBadArgument for a port that is
// not a number from 1 to 65535.
std::vector<TAddress> AddressesOf(std::string const& host, std::string const& port);

// A UDP socket that sends to one address. It accepts packets from any address, because a controller with several addresses may
// answer from another one. The caller checks which packets are genuine.
class TLink {
public:
  // Throws TFailure{kIpmiClientUnreachable} when the system has no such addresses.
  explicit TLink(TAddress const& address);

  // A packet that the network loses is not a failure. Throws TFailure{kIpmiClientUnreachable} when the system cannot
  // send there.
  void Send(TPacket const& packet);

  // Returns the next packet; nothing when none is received by `until`, or as soon as NobodyListens. A packet longer than any
  // that controllers send is returned empty.
  std::optional<TPacket> Receive(TClock::time_point until);

  // Whether the host reported the port as closed before any packet was received.
  bool NobodyListens() const { return fIsRefused && !fHasReceived; }

  // The number of the next request, from 0 to 63 and over again.
  unsigned char NextSequence() { return fSequence = (fSequence + 1) & 0x3F; }

private:
  void TakeErrors();

  TAddress const fAddress;
  NQRVZEP20::TUniqueFd const fSocket;
  bool fIsRefused = false;
  bool fHasReceived = false;
  unsigned char fSequence = 0;
};

// ---- A request and its answer over a network that delays, loses, doubles and reorders ----

enum class EVerdict {
  kAnswer,
  kOther,    // from the controller, but not an answer to this request: a copy, or a late one
  kNonsense  // not a packet that a controller sends
};

// For each sending of the request: how long to wait for its answer before the request is sent again.
using TWaits = std::vector<std::chrono::milliseconds>;

struct TExchange {
  std::function<TPacket()> fRequest;  // called for each sending
  std::function<EVerdict(TPacket const&)> fJudge;
};

// Sends the request repeatedly until `judge` recognises its answer; other packets are skipped. Throws TFailure when no answer
// arrives in time: kIpmiClientNoAnswer, or kIpmiClientFail when invalid packets were received.
void Exchange(TLink& link, TExchange const& exchange, TWaits const& waits, TClock::time_point deadline);

}  // namespace ipmi
