// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20 {

class TMachineFiles;
class TMemoryNamespace;

// Collects the PCI and USB devices of a machine and writes them into the namespace, which must be empty, together with the
// reasons for missing values (TRecordWriter). Blocks until the data are collected.
void FillDevicesNamespace(TMachineFiles const& files, TMemoryNamespace& ns);

}  // namespace NQRVZEP20
