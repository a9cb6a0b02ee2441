// SPDX-License-Identifier: Apache-2.0
#include "KernelNames.h"

#include "Placeholder.h"

#include <sys/utsname.h>

#include <cstdlib>
#include <sstream>

namespace NQRVZEP20 {

namespace {

std::string const kDirectory = "/proc/sys/kernel/";

constexpr char const* kAnswer = "uname";

// A line for each name.
TFinding<std::string> AskKernel() {
  utsname kernel = {};
  ::uname(&kernel);
  std::string lines;
  for (char const* const name : {kernel.sysname, kernel.nodename, kernel.release, kernel.version, kernel.machine})
    lines += std::string(name) + "\n";
  return lines;
}

TKernelNames NamesFrom(TFinding<std::string> const& answer) {
  std::istringstream lines(answer ? *answer : "");
  auto const next = [&]() -> TFinding<std::string> {
    std::string line;
    if (!answer) return answer.Why();
    if (!std::getline(lines, line)) return TMissing{kMissingUnexpected, "the answer of uname has fewer than five lines"};
    return line;
  };
  return {kAnswer, next(), next(), next(), next(), next()};  // in this order: the list is braced
}

}  // namespace

TKernelNames KernelNamesOf(TMachineFiles const& files) {
  if (files.IsThisMachine() || files.HasAnswer(kAnswer)) return NamesFrom(files.Answer(kAnswer, AskKernel));
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
