// SPDX-License-Identifier: Apache-2.0

// Loads the plug-ins beside libzepcore.so, in processes of their own ("apart") or in this one, and reads every value of every
// instance. Prints the seconds that this took, the peak of the memory of this process in KiB, and the number of values.

#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "collect/PlugInsApart.h"

#include <sys/resource.h>

#include <chrono>
#include <cstdio>
#include <string>
#include <vector>

using namespace NQRVZEP20;

namespace {

std::size_t ReadValues(TNamespaceView const& view) {
  std::size_t values = 0;
  for (auto const& instance : view.AllInstances())
    instance->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> property) {
          values += property->GetValue(TCIMContext()).IsNull() ? 0 : 1;
          return true;
        },
        TCIMContext());
  return values;
}

}  // namespace

int main(int argc, char** argv) {
  bool const isApart = argc > 1 && std::string(argv[1]) == "apart";
  auto const start = std::chrono::steady_clock::now();
  std::vector<TPlugIn> const plugIns = isApart ? LoadPlugInsApart() : LoadPlugIns();
  std::size_t values = 0;
  for (TNamespaceView const& view : ViewsOf(plugIns)) values += ReadValues(view);
  double const seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
  rusage usage{};
  ::getrusage(RUSAGE_SELF, &usage);
  std::printf("%.9f %ld %zu\n", seconds, usage.ru_maxrss, values);
  return FailuresOf(plugIns).empty() ? 0 : 1;
}
