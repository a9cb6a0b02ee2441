// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace ipmi {

// The exception that this library throws internally. `status` is one of those in ipmiClient.h; `cause` shows whether another way
// to open the session is worth trying.
struct TFailure {
  enum ECause {
    kFinal,
    kNoVersion2,         // the controller does not speak version 2.0
    kNoSuchCipherSuite,  // it does not accept the cipher suite
    kNoSuchPrivilege,    // it does not grant the privilege when it is requested in this way
    kOutOfStep,          // the controller and this side disagree on the current step of the opening
  };

  int fStatus;
  ECause fCause = kFinal;
};

}  // namespace ipmi
