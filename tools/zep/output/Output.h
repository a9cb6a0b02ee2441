// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <string>

namespace NQRVZEP20::zep {

// Writes the complete text to standard output, verbatim. Use it for values from providers, files and tables, and for documents,
// in whose messages passwords are already hidden (AsText). Throws std::system_error on failure, such as a full disk. If the
// reader has closed the pipe, SIGPIPE kills zep, unless the caller of zep ignores that signal.
void WriteOutput(std::string const& text);

// The same for text that repeats arguments, in which passwords are hidden (MessageWithoutSecrets).
void WriteMessage(std::string const& text);

// Whether one of the two has been called: with --json, a document has then been printed, at least in part.
bool HasWrittenOutput();

// While an object exists, standard output is redirected to standard error, so that plug-ins do not print into a document.
class TOutputGuard {
public:
  TOutputGuard();
  ~TOutputGuard();
  TOutputGuard(TOutputGuard const&) = delete;
  TOutputGuard& operator=(TOutputGuard const&) = delete;

private:
  TUniqueFd fOutput;  // the original standard output; empty if it was closed
};

}  // namespace NQRVZEP20::zep
