// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "FileSystems.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

// File systems, their mounts and swap areas as records of CIM classes. `system`: the record of the computer.

// A CIM_UnixLocalFileSystem. The size and the use of a mounted one are asked of the kernel.
TRecord LocalFileSystemRecord(TMachineFiles const& files, TFileSystem const& fileSystem, TRecord const& system);

// A CIM_RemoteFileSystem: on a server, or served by a program. It is not asked for its size, because that would block as long as
// the server does not answer.
TRecord RemoteFileSystemRecord(TFileSystem const& fileSystem, TRecord const& system);

// A ZEP_Mount (ZEP_Mount.mof).
TRecord MountRecord(TMount const& mount);

// A ZEP_SwapArea (ZEP_SwapArea.mof).
TRecord SwapRecord(TSwap const& swap);

}  // namespace NQRVZEP20
