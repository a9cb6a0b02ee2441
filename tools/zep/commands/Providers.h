// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/PlugIns.h"
#include "collect/Sample.h"

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The bundled sample: the SMBIOS table of an invented server, labelled SAMPLE. Throws std::runtime_error when it is not
// installed.
TSample BundledSample();

// The bundled sample for a command that was called with --sample; otherwise none.
std::optional<TSample> SampleIf(bool isWanted);

// LoadPlugIns, with the standard output of plug-ins redirected to standard error.
std::vector<TPlugIn> LoadPlugInsQuietly(std::optional<TSample> const& sample);

}  // namespace NQRVZEP20::zep
