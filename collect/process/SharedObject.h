// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

// Whether the file is a shared object that can be mapped completely: a regular, readable ELF file of this machine's word size
// whose segments end within the file. The dynamic linker may still refuse it, for example because of a missing symbol; but if a
// process dies while it loads such a file, the fault is in the file's own code.
bool CanBeMapped(std::string const& file);

}  // namespace NQRVZEP20
