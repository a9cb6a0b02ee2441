// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "tests/SmbiosTables.h"

namespace NQRVZEP20 {

inline TSample const& TheSample() {
  static TSample const sample = {SamplePath(), "sample-server", "SAMPLE"};
  return sample;
}

// The plug-ins in the directory of libzepcore.so, loaded once per process with the sample.
inline std::vector<TPlugIn> const& SamplePlugIns() {
  static std::vector<TPlugIn> const plugIns = LoadPlugIns(TheSample());
  return plugIns;
}

}  // namespace NQRVZEP20
