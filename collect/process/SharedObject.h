// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Whether the file is a shared object that can be mapped completely: a regular, readable ELF file of this machine's word size
// whose segments end within the file. The dynamic linker may still refuse it, for example because of a missing symbol; but if a
// process dies while it loads such a file, the fault is in the file's own code.
bool CanBeMapped(std::string const& fileName);

// Why this process cannot load the ELF file, if that is built for another type of processor: "it is built for aarch64, and this
// process for x86-64". Empty for any other file, and without /proc. The dynamic linker reports such a file as missing.
std::string WhyOfOtherProcessor(std::string const& fileName);

// The names of the symbols that the shared object defines for other libraries, as in its dynamic symbol table, without those that
// the linker adds to every library. None if the file cannot be mapped or has no such table. No code of the file runs.
std::optional<std::vector<std::string>> ExportedSymbols(std::string const& fileName);

// The names of all symbols that the shared object uses and that neither this process nor the libraries that the object needs
// define. `message` is that of the dynamic linker, which names only the first one; if it is about anything else, the result is
// empty. The program ldd finds the others; without it, the result is the first one. Blocks until ldd ends.
std::vector<std::string> UndefinedSymbols(std::string const& message, std::string const& fileName);

// The text with each mangled name of C++ in it, as the dynamic linker writes it, replaced by the name in the source.
std::string Demangled(std::string const& text);

}  // namespace NQRVZEP20
