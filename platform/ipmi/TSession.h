// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/ipmi/Opening.h"

namespace ipmi {

// How long each step waits, in milliseconds. The library uses the defaults; ipmiClient.h documents the resulting limits.
struct TTimes {
  // The first query changes nothing: it is sent often, and its answer is awaited for a long time.
  TWaits fContact = {kOften, kOften, kOften, kOften, kOften, kOften, kOften, kLong};

  // The later waits also last a second longer than the answer to the first query took.
  std::chrono::milliseconds fBeyondContact{1000};
  // A step of the opening: the controller may calculate for a long time, and starts again for each copy of the request.
  TWaits fStep = {kLong, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore};
  TWaits fCommand = TWaits(6, kLong);  // a slow controller must not receive a command twice
  TWaits fClose = TWaits(3, kOften);

  std::chrono::milliseconds fWholeOpening{60000}, fWholeCommand{30000};
  std::chrono::milliseconds fIdle{20000};  // well before controllers close an idle session

  static constexpr std::chrono::milliseconds kOften{500}, kOnceMore{1000}, kLong{3500};
};

// A session with a controller, as administrator. Closed when it goes out of scope. Its functions throw TFailure.
class TSession {
public:
  explicit TSession(TTarget const& target, TTimes const& times = {});
  ~TSession();
  TSession(TSession const&) = delete;
  TSession& operator=(TSession const&) = delete;

  void Open();

  // Sends a command and waits for its answer. A session that was idle or lost is reopened first. Without an answer the session is
  // lost, and it is unknown whether the controller carried out the command.
  TReply Send(unsigned char netFn, unsigned char command, TByteVector const& request);

private:
  bool IsIdle() const { return TClock::now() - fLastAnswer > fTimes.fIdle; }
  TWaits Lengthened(TWaits const& waits) const;
  TContact Reach(TClock::time_point deadline);
  TReply AskInSession(unsigned char netFn, unsigned char command, TByteVector const& request, TClock::time_point deadline);
  void Close(TClock::time_point deadline = TClock::time_point::max()) noexcept;

  TTarget const fTarget;
  TTimes const fTimes;
  std::unique_ptr<TLink> fLink;
  std::unique_ptr<IEnvelope> fEnvelope;  // null: no session is open
  std::chrono::milliseconds fContactTime{0};
  TClock::time_point fLastAnswer;
  int fWayThatWorked = 0;  // an index of kWays
};

}  // namespace ipmi
