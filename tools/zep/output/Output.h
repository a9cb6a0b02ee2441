// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zep/processes/Descriptor.h"

#include <string>

namespace NQRVZEP20::zep {

// Writes the text to standard output, whole and verbatim: values that providers, files and tables report, and documents, whose
// messages hide passwords already (AsText). Throws std::system_error when that fails, as on a full disk; a reader who went away
// ends the program by SIGPIPE, unless the caller of zep has that signal ignored.
void WriteOutput(std::string const& text);

// The same for a text that repeats arguments, which may hold a password (MessageWithoutSecrets).
void WriteMessage(std::string const& text);

// Whether any of the two was called: with --json a document is printed then, in part at least.
bool HasWrittenOutput();

// For as long as it lives, what anyone else in this process prints to standard output goes to standard error: plug-ins
// must not write into a document.
class TOutputGuard {
public:
  TOutputGuard();
  ~TOutputGuard();
  TOutputGuard(TOutputGuard const&) = delete;
  TOutputGuard& operator=(TOutputGuard const&) = delete;

private:
  TDescriptor fOutput;  // the real standard output, when there is one
};

}  // namespace NQRVZEP20::zep
