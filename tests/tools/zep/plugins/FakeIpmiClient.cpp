// SPDX-License-Identifier: Apache-2.0

// A stand-in for libipmiClient.so. Opening a session returns the code in the environment variable FAKE_IPMI_CODE; when the
// variable is "wait", opening fails after 30 seconds.

#include "platform/include/ipmiClient.h"

#include <unistd.h>

#include <cstdlib>
#include <cstring>

extern "C" {

__attribute__((visibility("default"))) int OpenConnection(int, char const*, char const*, char const*, char const*) {
  if (std::strcmp(std::getenv("FAKE_IPMI_CODE"), "wait") == 0) ::sleep(30);
  return std::atoi(std::getenv("FAKE_IPMI_CODE"));
}

__attribute__((visibility("default"))) int CloseConnection() { return 0; }
}
