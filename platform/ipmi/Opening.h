// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/ipmi/Messages.h"

namespace ipmi {

// The controller and the account. The password is wiped by the destructor.
struct TTarget {
  std::string fHost, fPort, fUser, fPassword;

  ~TTarget();
};

// The answer to the first query, outside of a session: the versions that the controller supports.
struct TContact {
  TFields fCapabilities;                  // tmpl_cmd_get_channel_authentication_capabilities_rs
  std::chrono::milliseconds fAnswerTime;  // from the query to its answer
};
TContact MakeContact(TLink& link, TWaits const& waits, TClock::time_point deadline);

// The parameters of opening a session.
struct TOpening {
  TLink& fLink;
  TTarget const& fTarget;
  TContact const& fContact;
  TWaits fWaits;  // of each step
  TClock::time_point fDeadline;
};

// How a session is opened.
struct TWay {
  enum EVersion { kVersion2, kVersion15 } fVersion;
  unsigned char fCipherSuite;
  bool fNamesPrivilege;  // in the request for a session
};

// Opens a session. The envelope refers to the target's password. Throws TFailure; the controller may nevertheless have opened a
// session, which this side does not know.
std::unique_ptr<IEnvelope> OpenSession(TOpening const& opening, TWay const& way);

// Makes the account of an open session administrator. Throws TFailure.
void RaisePrivilege(TLink& link, IEnvelope& envelope, TWaits const& waits, TClock::time_point deadline);

// OpenSession calls one of these two.
std::unique_ptr<IEnvelope> OpenVersion2(TOpening const& opening, TWay const& way);
std::unique_ptr<IEnvelope> OpenVersion15(TOpening const& opening);

// An unpredictable number other than 0.
std::uint32_t RandomNumber();

}  // namespace ipmi
