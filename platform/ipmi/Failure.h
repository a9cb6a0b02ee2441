// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace ipmi {

// What this library throws within itself. `status` is of the list in ipmiClient.h; `cause` tells whether another way to open
// the session is worth trying.
struct TFailure {
  enum ECause {
    kFinal,
    kNoVersion2,         // the controller does not speak version 2.0
    kNoSuchCipherSuite,  // it does not take the cipher suite
    kNoSuchPrivilege,    // it does not give the privilege, the way it was asked
    kOutOfStep,          // the controller and this side no longer agree on how far the opening is
  };

  int status;
  ECause cause = kFinal;
};

}  // namespace ipmi
