// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20::zep {

// The path of the schema that new plug-ins take their classes from. ZEP_DMTF_SCHEMA names a MOF file, or a directory with the
// unpacked CIM schema of the DMTF, whose main file is cim_schema_VERSION.mof; otherwise that directory is share/zepcore/schema of
// the installation, where the package of the kit has the reduced cim_schema_VERSION-reduced.mof. Throws std::runtime_error with
// the remedy when there is none.
std::string SchemaFile();

}  // namespace NQRVZEP20::zep
