// SPDX-License-Identifier: Apache-2.0

// Runs one form of spawning a thousand times and prints the resources that are left: descriptors, children, allocated bytes.

#include "TOSSpecific.h"
#include "tests/os/HostTools.h"

#include <malloc.h>

#include <functional>
#include <iostream>
#include <map>

namespace {

using namespace NQRVZEP20;
using TArguments = std::vector<std::string>;

std::string const kChild = Child("PrintsToBoth");

void SpawnTimedOut() {
  std::string output;
  TOSSpecific::SpawnProcess(Child("StaysSilent"), {}, output, 0);
  // The child is left by rule. It is ended here, so that what else is left can be counted.
  siginfo_t child{};
  std::string const children = ReadFile("/proc/self/task/" + std::to_string(::getpid()) + "/children");
  ::kill(std::stoi(children), SIGKILL);
  ::waitid(P_ALL, 0, &child, WEXITED);
}

std::map<std::string, std::function<void()>> const kForms = {
    {"PathAndEnvironment",
     [] {
       std::string output;
       TOSSpecific::SpawnProcess(kChild, {"a"}, "zero", {"A=1"}, output, 60);
     }},
    {"SearchedProgram",
     [] {
       std::string output;
       TOSSpecific::SpawnProcess(kChild, {"a"}, output, 60);
     }},
    {"StringOfAProgram", [] { TOSSpecific::SpawnProcess(kChild, TArguments{"a"}, 60); }},
    {"CommandLine", [] { TOSSpecific::SpawnProcess(kChild + " a", 60); }},
    {"NoSuchProgram", [] { TOSSpecific::SpawnProcess("/nonexistent", 60); }},
    {"ProgramThatFails", [] { TOSSpecific::SpawnProcess(Child("ExitsWith3"), 60); }},
    {"ProgramThatDies", [] { TOSSpecific::SpawnProcess(Child("DiesBySignal") + " 9", 60); }},
    {"TimedOut", SpawnTimedOut},
    {"CapFileViaProc",
     [] {
       std::string contents;
       TOSSpecific::CapFileViaProc(kChild, {"a"}, "/proc/version", contents);
     }},
    {"FindFile", [] { TOSSpecific::FindFile("/proc/version"); }},
};

std::size_t AllocatedBytes() { return ::mallinfo2().uordblks; }

}  // namespace

int main(int, char** arguments) {
  auto const& spawn = kForms.at(arguments[1]);
  for (int i = 0; i < 10; ++i) spawn();  // makes all allocations that are kept
  OpenDescriptors();
  int const descriptors = OpenDescriptors();
  std::size_t const bytes = AllocatedBytes();
  for (int i = 0; i < 1000; ++i) spawn();
  std::size_t const bytesAfterwards = AllocatedBytes();
  std::cout << OpenDescriptors() - descriptors << " descriptors, " << (HasChildren() ? "children" : "no children") << ", "
            << static_cast<long>(bytesAfterwards - bytes) << " bytes" << std::endl;
}
