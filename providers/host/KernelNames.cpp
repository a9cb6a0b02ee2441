// SPDX-License-Identifier: Apache-2.0
#include "KernelNames.h"

#include "Placeholder.h"

#include <sys/utsname.h>

#include <cstdlib>

namespace NQRVZEP20 {

namespace {

std::string const kDirectory = "/proc/sys/kernel/";

std::string Text(char const* text) { return text; }

TKernelNames NamesOfThisMachine() {
  utsname kernel = {};
  ::uname(&kernel);
  return {"uname", Text(kernel.sysname), Text(kernel.nodename), Text(kernel.release), Text(kernel.version), Text(kernel.machine)};
}

}  // namespace

TKernelNames KernelNamesOf(TMachineFiles const& files) {
  if (files.IsThisMachine()) return NamesOfThisMachine();
  return {kDirectory,
          files.Line(kDirectory + "ostype"),
          files.Line(kDirectory + "hostname"),
          files.Line(kDirectory + "osrelease"),
          files.Line(kDirectory + "version"),
          files.Line(kDirectory + "arch")};
}

TSystemName SystemNameOf(TKernelNames const& kernel) {
  char const* const named = std::getenv("ZEP_HOST_NAME");
  if (named != nullptr && *named != '\0') return {named, "ZEP_HOST_NAME"};
  return {kernel.fHost.Then(HostNameOf), kernel.fSource};
}

}  // namespace NQRVZEP20
