// SPDX-License-Identifier: Apache-2.0

// A provider plug-in: the clocks of this machine. docs/writing-a-provider.md walks through it.

#include "TMemoryNamespace.h"
#include "TMemoryProvider.h"
#include "TRootObject.h"

#include <time.h>
#include <boost/make_shared.hpp>

using namespace NQRVZEP20;

namespace {

enum EClockKind { kTimeOfDay = 1, kSinceStart = 2 };

void DescribeClasses(TMemoryNamespace& ns) {
  ns.DefineClass("X_TimeSource").Abstract().Description("A source of time.").Key("Name", "string");

  ns.DefineClass("X_Clock", "X_TimeSource")
      .Description("A clock of the operating system.")
      .Property("Kind", "uint16")
      .ValueMap({"1", "2"}, {"Time of day", "Time since the start of the machine"})
      .Property("Seconds", "uint64")
      .Description("The time that the clock showed when the namespace was filled.")
      .Property("ResolutionNanoseconds", "uint64");

  ns.DefineClass("X_RunsAtTheRateOf")
      .Association()
      .KeyReference("Leader", "X_TimeSource")
      .KeyReference("Follower", "X_TimeSource");
}

boost::shared_ptr<TMemoryInstance> AddClock(TMemoryNamespace& ns, char const* name, clockid_t id, EClockKind kind) {
  TMemoryValues values{{"Name", name}, {"Kind", kind}};
  timespec time = {};
  if (::clock_gettime(id, &time) == 0) values.Set("Seconds", time.tv_sec);
  if (::clock_getres(id, &time) == 0) values.Set("ResolutionNanoseconds", time.tv_nsec);
  return ns.AddInstance("X_Clock", values);
}

void FillNamespace(TMemoryNamespace& ns) {
  DescribeClasses(ns);
  auto const realtime = AddClock(ns, "realtime", CLOCK_REALTIME, kTimeOfDay);
  auto const monotonic = AddClock(ns, "monotonic", CLOCK_MONOTONIC, kSinceStart);
  AddClock(ns, "boottime", CLOCK_BOOTTIME, kSinceStart);
  ns.AddInstance("X_RunsAtTheRateOf", {{"Leader", realtime->GetReference()}, {"Follower", monotonic->GetReference()}});
}

// Runs when the plug-in is loaded.
struct TRegistration {
  TRegistration() {
    TRootObject::GetNamespaceProviderManager()->RegisterNamespaceProvider(
        boost::make_shared<TMemoryProvider>("Clock", "root/clock", FillNamespace));
  }
} const gRegistration;

}  // namespace
