// SPDX-License-Identifier: Apache-2.0

// Downloads twice, with the library and libcurl that the environment selects, and prints the results.
//
//   TransferProbe [FROM TO]      makes TO a link to the file FROM between the two downloads
//   TransferProbe --proxy        checks a proxy instead

#include "TOSSpecific.h"
#include "TZEPException.h"
#include "tests/Support.h"

#include <unistd.h>

#include <cstdio>

using namespace NQRVZEP20;

static void Download() { TOSSpecific::CurlTransferFile("ftp://127.0.0.1/x", "no/such/file", true); }
static void CheckProxy() { TOSSpecific::CheckProxySetting("127.0.0.1", "1", "u:p", 0); }

static void Try(void (*operation)()) {
  try {
    operation();
    std::puts("done");
  } catch (TZEPException const& failure) {
    std::puts(failure.what());
  }
  for (std::string const& message : LoggedMessages()) std::puts(message.c_str());
  TRootObject::GetCoreLogger()->ClearLog();
}

int main(int argc, char** argv) {
  auto const operation = argc == 2 ? CheckProxy : Download;
  Try(operation);
  if (argc == 3 && ::symlink(argv[1], argv[2]) != 0) return 1;
  Try(operation);
}
