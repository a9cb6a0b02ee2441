// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"

#include <filesystem>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// The files of one document: reads them, and keeps includes within the folder of the first one.
class TMofSources {
public:
  explicit TMofSources(TMofDocument& document) : fDocument(document) {}

  // The file that everything begins with, or a text in its place, which includes nothing.
  TMofFile const& OpenFirst(std::string const& path);
  TMofFile const& OpenText(std::string const& text, std::string const& name);

  // A file that the last one opened includes. `directive` is its name where it stands.
  TMofFile const& OpenIncluded(std::string const& name, TMofPlace const& directive);
  void CloseIncluded() { fOpen.pop_back(); }

private:
  struct TOpen {
    std::filesystem::path fPath;  // without links and dots
    std::filesystem::path fName;  // as errors call it
  };

  TMofFile const& Add(std::string const& name, std::string text);

  TMofDocument& fDocument;
  std::filesystem::path fFolder;  // empty for a text
  std::vector<TOpen> fOpen;       // the file that is read, and before it those that include it
};

}  // namespace NQRVZEP20
