// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

// The completeness of a report.
enum class ECompleteness {
  kComplete,  // every row of the identity is known, or does not apply to this machine, and no plug-in failed
  kPartial,   // a row of the identity is missing, or a plug-in failed
  kNothing    // no row of the identity is known
};

}  // namespace NQRVZEP20
