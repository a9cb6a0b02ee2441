// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <string>

namespace NQRVZEP20::zep {

// Writes the complete text to standard output, verbatim: values that providers, files and tables report, and documents, whose
// messages hide passwords already (AsText). Throws std::system_error when that fails, as on a full disk. When the reader has
// closed the pipe, the program ends by SIGPIPE, unless the caller of zep ignores that signal.
void WriteOutput(std::string const& text);

// The same for a text that repeats arguments, which may contain a password (MessageWithoutSecrets).
void WriteMessage(std::string const& text);

// Whether one of the two was called: with --json, a document was then printed, at least in part.
bool HasWrittenOutput();

// While it exists, everything that is printed to standard output goes to standard error, so that plug-ins do not write into a
// document.
class TOutputGuard {
public:
  TOutputGuard();
  ~TOutputGuard();
  TOutputGuard(TOutputGuard const&) = delete;
  TOutputGuard& operator=(TOutputGuard const&) = delete;

private:
  TUniqueFd fOutput;  // the original standard output; empty when that was closed
};

}  // namespace NQRVZEP20::zep
