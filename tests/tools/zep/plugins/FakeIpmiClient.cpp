// Stands in for libipmiClient.so: opening fails with the code that the environment variable FAKE_IPMI_CODE names.

#include "platform/include/ipmiClient.h"

#include <cstdlib>

extern "C" {

__attribute__((visibility("default"))) int OpenConnection(int, char const*, char const*, char const*, char const*) {
  return std::atoi(std::getenv("FAKE_IPMI_CODE"));
}

__attribute__((visibility("default"))) int CloseConnection() { return 0; }
}
