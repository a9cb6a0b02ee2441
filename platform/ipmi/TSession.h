// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/ipmi/Opening.h"

namespace ipmi {

// How long is waited for what, in milliseconds. The defaults hold for the library; ipmiClient.h says what callers get of them.
struct TTimes {
  // The first query of all changes nothing: it is sent often, and its answer awaited for long.
  TWaits contact = {kOften, kOften, kOften, kOften, kOften, kOften, kOften, kLong};

  // The later waits also last a second longer than the answer to the first query took.
  std::chrono::milliseconds beyondContact{1000};
  // A step of the opening: the controller may calculate for long, and does so anew for each copy; then the answer was lost.
  TWaits step = {kLong, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore, kOnceMore};
  TWaits command = TWaits(6, kLong);  // a slow controller must not get it twice
  TWaits close = TWaits(3, kOften);

  std::chrono::milliseconds wholeOpening{60000}, wholeCommand{30000};
  std::chrono::milliseconds idle{20000};  // well before a controller closes a session by itself

  static constexpr std::chrono::milliseconds kOften{500}, kOnceMore{1000}, kLong{3500};
};

// A session with a controller, as administrator. Closed when it goes out of scope. Its functions throw TFailure.
class TSession {
public:
  explicit TSession(TTarget target, TTimes const& times = {});
  ~TSession();
  TSession(TSession const&) = delete;
  TSession& operator=(TSession const&) = delete;

  void Open();

  // Sends a command and waits for its answer. A session that was idle is opened anew before; one that was lost too. When no
  // answer comes the session is lost, and whether the controller carried the command out is not known.
  TReply Send(unsigned char netFn, unsigned char command, TByteVector const& request);

private:
  bool IsIdle() const { return TClock::now() - fLastAnswer > fTimes.idle; }
  TWaits Lengthened(TWaits const& waits) const;
  TContact Reach(TClock::time_point deadline);
  TReply AskInSession(unsigned char netFn, unsigned char command, TByteVector const& request, TClock::time_point deadline);
  void Close(TClock::time_point deadline = TClock::time_point::max()) noexcept;

  TTarget const fTarget;
  TTimes const fTimes;
  std::unique_ptr<TLink> fLink;
  std::unique_ptr<IEnvelope> fEnvelope;  // null: there is no session
  std::chrono::milliseconds fContactTime{0};
  TClock::time_point fLastAnswer;
  int fWayThatWorked = 0;  // an index of kWays
};

}  // namespace ipmi
