// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

class TMemoryNamespace;

// Collects the data of this machine and writes them into the namespace, which must be empty. The namespace states why a value is
// missing (TRecordWriter). Blocks while the machine is read.
void FillHostNamespace(TMemoryNamespace& ns);

}  // namespace NQRVZEP20
