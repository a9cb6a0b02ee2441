// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/ipmi/Messages.h"

namespace ipmi {

// Which controller, and as whom. The password is wiped at the end.
struct TTarget {
  std::string host, port, user, password;

  ~TTarget();
};

// The first thing to ask a controller, outside of a session: what it speaks.
struct TContact {
  TFields capabilities;                  // tmpl_cmd_get_channel_authentication_capabilities_rs
  std::chrono::milliseconds answerTime;  // from the query to its answer
};
TContact MakeContact(TLink& link, TWaits const& waits, TClock::time_point deadline);

// What the opening of a session is done with.
struct TOpening {
  TLink& link;
  TTarget const& target;
  TContact const& contact;
  TWaits waits;  // of each step
  TClock::time_point deadline;
};

// How a session is opened.
struct TWay {
  enum EVersion { kVersion2, kVersion15 } version;
  unsigned char cipherSuite;
  bool namesPrivilege;  // when the controller is asked for a session
};

// Opens a session. What it is packed in refers to the target's password. Throws TFailure; the controller may have opened a
// session then, about which this side knows nothing.
std::unique_ptr<IEnvelope> OpenSession(TOpening const& opening, TWay const& way);

// Makes the account of an open session administrator. Throws TFailure.
void RaisePrivilege(TLink& link, IEnvelope& envelope, TWaits const& waits, TClock::time_point deadline);

// One of the two does it.
std::unique_ptr<IEnvelope> OpenVersion2(TOpening const& opening, TWay const& way);
std::unique_ptr<IEnvelope> OpenVersion15(TOpening const& opening);

// An unpredictable number other than 0.
std::uint32_t RandomNumber();

}  // namespace ipmi
