// SPDX-License-Identifier: Apache-2.0

// Stands in for libipmiClient.so: opening fails with the code that the environment variable FAKE_IPMI_CODE names; after half
// a minute for "wait".

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
