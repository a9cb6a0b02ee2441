// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

class TMemoryNamespace;

// Collects what this machine says of itself and writes it into the namespace, which is empty. Where the machine keeps
// silent, the namespace says why (TRecordWriter).
void FillHostNamespace(TMemoryNamespace& ns);

}  // namespace NQRVZEP20
