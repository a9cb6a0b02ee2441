// SPDX-License-Identifier: Apache-2.0
#pragma once

// Keeps the documents that zep printed during the tests. After the tests, documents.schema validates them against docs/schema
// (check-documents.py).

#include "tests/Support.h"

#include <nlohmann/json.hpp>

#include <filesystem>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// Keeps the text in the build tree; equal ones once. Tests may run in parallel, so a file gets its name when it is complete.
inline void KeepText(std::string const& text, std::string const& suffix) {
  std::string const file = BuildPath("documents/" + std::to_string(std::hash<std::string>()(text)) + suffix);
  std::string const part = file + "." + std::to_string(::getpid());
  std::error_code ignored;  // another user may run zep, to whom the build tree is closed
  std::filesystem::create_directories(BuildPath("documents"), ignored);
  WriteFile(part, text);
  std::filesystem::rename(part, file, ignored);
}

// Anything but a document is ignored.
inline void KeepDocument(nlohmann::json const& document) {
  if (document.is_object() && document.contains("document"))
    KeepText(document.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace), ".json");
}

// The same for the output of zep: a document, one on each line, or a report in lines, of which only the first is a document.
inline void KeepDocuments(std::string const& output) {
  if (output.empty() || output.front() != '{') return;
  std::vector<nlohmann::json> documents = {nlohmann::json::parse(output, nullptr, false)};
  if (documents.front().is_discarded()) {
    documents.clear();
    std::istringstream lines(output);
    for (std::string line; std::getline(lines, line);) documents.push_back(nlohmann::json::parse(line, nullptr, false));
    if (documents.size() > 1 && documents.back().is_object() && !documents.back().contains("document"))
      return KeepText(output, ".jsonl");
  }
  for (nlohmann::json const& document : documents) KeepDocument(document);
}

}  // namespace NQRVZEP20::zep
