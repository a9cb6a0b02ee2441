// SPDX-License-Identifier: Apache-2.0
#pragma once

// Keeps the documents that zep printed during the tests. After the tests, documents.schema validates them against docs/schema
// (check-documents.py).

#include "tests/Support.h"

#include <nlohmann/json.hpp>

#include <filesystem>
#include <functional>
#include <string>

namespace NQRVZEP20::zep {

// Keeps the document in the build tree; equal ones once. Tests may run in parallel, so a file gets its name when it is complete.
inline void KeepDocument(nlohmann::json const& document) {
  if (!document.is_object() || !document.contains("document")) return;
  std::string const text = document.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
  std::string const file = BuildPath("documents/" + std::to_string(std::hash<std::string>()(text)) + ".json");
  std::string const part = file + "." + std::to_string(::getpid());
  std::error_code ignored;  // another user may run zep, to whom the build tree is closed
  std::filesystem::create_directories(BuildPath("documents"), ignored);
  WriteFile(part, text);
  std::filesystem::rename(part, file, ignored);
}

// The same for the output of zep: a document, or one on each line. Any other output is ignored.
inline void KeepDocuments(std::string const& output) {
  if (output.empty() || output.front() != '{') return;
  auto const document = nlohmann::json::parse(output, nullptr, false);
  if (!document.is_discarded()) return KeepDocument(document);
  std::istringstream lines(output);
  for (std::string line; std::getline(lines, line);) {
    auto const ofLine = nlohmann::json::parse(line, nullptr, false);
    if (!ofLine.is_discarded()) KeepDocument(ofLine);
  }
}

}  // namespace NQRVZEP20::zep
