// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "providers/mof/MofTree.h"

#include <filesystem>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// Reads the files of one document. Included files must be in the directory of the first file, or below it.
class TMofSources {
public:
  explicit TMofSources(TMofDocument& document) : fDocument(document) {}

  // The first file, or a string instead of a file; a string cannot include files.
  TMofFile const& OpenFirst(std::string const& path);
  TMofFile const& OpenText(std::string const& text, std::string const& name);

  // A file that is included by the file opened last. `directive`: the position of its name, for errors.
  TMofFile const& OpenIncluded(std::string const& name, TMofSpan const& directive);
  void CloseIncluded() { fOpen.pop_back(); }

private:
  struct TOpen {
    std::filesystem::path fPath;  // canonical
    std::filesystem::path fName;  // for errors
  };

  TMofFile const& Add(std::string const& name, std::string text);

  TMofDocument& fDocument;
  std::filesystem::path fFolder;  // of the first file; empty for a string
  std::vector<TOpen> fOpen;       // the file being read is the last; each file includes the next
};

}  // namespace NQRVZEP20
