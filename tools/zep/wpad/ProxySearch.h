// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// How long an answer to one message is waited for.
constexpr int kReplySeconds = 6;

// What came back.
struct TReply {
  std::size_t fSize;
  std::string fSender;
  long fMilliseconds;  // since the message that was sent last
};

// One interface, or the round with an IPv6 address: what was sent about it, and what came of that.
struct TAsking {
  std::string fInterface;  // empty: the IPv6 round
  bool fIsUp = true, fIsPromiscuous = false;
  std::string fAddress, fHardwareAddress;
  int fSent = 0;  // messages
  std::optional<TReply> fReply;
  std::string fUrl;      // of the reply; empty when it names none
  std::string fFailure;  // why nothing was sent or could come back; empty for a mere silence
};

struct TSearch {
  std::vector<TAsking> fAskings;
  std::string fUrl;      // empty: nobody named one
  std::string fFailure;  // what ended the search early
};

// Told once a second while an answer is waited for: about what, and how many seconds are left of the asking.
using TOnWait = std::function<void(TAsking const& asking, int secondsLeft)>;

// Why this process can never listen where DHCP servers answer; empty when it can, if only later.
std::string WhyNoListening();

// Whether another program holds the port at this moment.
bool IsPortTaken();

// The discovery of AutoProxyDiscovery::StartWpad, step by step, but for the ending of DHCP clients. And a person does not
// wait where nothing can come: a message that cannot be sent is not waited for, and a port that stays taken ends it all.
TSearch SearchProxy(TOnWait const& onWait);

}  // namespace NQRVZEP20::zep
