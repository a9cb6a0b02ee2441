// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ProcessorFacts.h"
#include "TSmbiosStructure.h"
#include "TSystemName.h"
#include "providers/reasons/TRecord.h"

#include <string>

namespace NQRVZEP20 {

// Processors as records of CIM classes: a record for each socket that has a processor. `number` counts them, from 0.

// Combines the firmware's structure of type 4, whose source is `source`, with the facts that the kernel knows. The kernel's value
// is used for the name, the number of cores and the clock speeds, because firmware in virtual machines contains other texts and
// numbers there; the firmware's is used where the kernel has none, and for all other properties.
TRecord ProcessorRecord(TSmbiosStructure const& processor, std::string const& source, unsigned number, TSystemName const& name,
                        TFinding<TProcessorFacts> const& kernel);

// False for a socket that the firmware reports as empty. A structure without that field is treated as filled.
bool IsSocketFilled(TSmbiosStructure const& processor);

// How many cores and hardware threads the processor has.
TRecord CapabilitiesRecord(unsigned number, TFinding<TProcessorFacts> const& kernel);

// The settings under which the kernel runs the processor (ZEP_ProcessorSettings.mof). `socket`: null for a record that only
// declares the class.
TRecord ProcessorSettingsRecord(unsigned number, TKernelProcessors::TSocket const* socket, TMachineFiles const& files);

// A core of a processor.
TRecord CoreRecord(unsigned processor, unsigned core, TKernelProcessors::TCore const& cpus);

}  // namespace NQRVZEP20
