// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

class TMemoryNamespace;

// Collects the data of this machine and writes them into the namespace, which must be empty, together with the reasons for
// missing values (TRecordWriter). Blocks until the data are collected.
void FillHostNamespace(TMemoryNamespace& ns);

}  // namespace NQRVZEP20
