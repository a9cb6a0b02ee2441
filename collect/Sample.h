// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The bundled sample: the SMBIOS table of an invented server, which providers read in place of this machine's.
//
// Nothing that is printed then goes without a label: the sample's values say SAMPLE, and what the providers still know of
// this machine (its operating system) says that it is not of the sample.

constexpr char const* kSampleLabel = "SAMPLE";

// From now on providers read the sample. To be called before they are loaded. Throws std::runtime_error when the sample
// was not installed.
void SelectSample();

bool IsSampleSelected();

// The table file that the caller of zep has named in ZEP_SMBIOS_TABLE, in place of this machine's tables. Empty for none, and
// for the sample.
std::string TableFile();

// Where a value comes from, as it is to be printed: with its label when the sample is selected, else as it is.
std::string LabelledSource(std::string const& source);

}  // namespace NQRVZEP20::zep
