// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

class TMachineFiles;
class TMemoryNamespace;

// Describes the disks, volumes and file systems below the root of `files`, and writes them into the namespace, which must be
// empty, together with the reasons for missing values (TRecordWriter). Blocks until the data are collected.
void FillStorageNamespace(TMemoryNamespace& ns, TMachineFiles const& files);

}  // namespace NQRVZEP20
