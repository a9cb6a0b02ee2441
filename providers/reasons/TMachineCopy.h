// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "RootedFiles.h"
#include "TFinding.h"

#include <sys/stat.h>

#include <cstddef>
#include <string>
#include <vector>

namespace NQRVZEP20 {

// A copy of those files of a machine that its plug-ins read, made while they read them (zep record). The copy has the links and
// directories on the way to each file, and marks (RecordedMark.h) in place of files that cannot be read or were only listed.
//
// Paths are those on the machine. Several processes may fill the same copy: the first one that reads a file to its end decides
// its content. A failure to write makes the note of the library writable: what is not in the copy cannot be read from it either,
// so the library has not read all that it could. Operations block as long as the file systems do, and while another process
// copies.
class TMachineCopy {
public:
  // `from`: the root of the machine, empty for "/". `to`: the root of the copy, an existing directory. Notes the library that
  // this code is part of as an empty file in /zep-plug-ins/, so that a recording names the plug-ins that read through it.
  TMachineCopy(std::string from, std::string to);

  // Copies the `length` bytes from `offset`, or the refusal.
  void KeepBytes(std::string const& path, std::size_t offset, std::size_t length) const;

  // Copies the names in a directory.
  void KeepNames(std::string const& directory) const;

  // Copies the way to the path, and that it exists.
  void KeepPlace(std::string const& path) const;

  // Writes the answer, or why it is missing, to the file `path` of the copy.
  void KeepAnswer(std::string const& path, TFinding<std::string> const& answer) const;

private:
  // Where a path leads, without links.
  struct TPlace {
    std::string fPath;
    struct stat fStatus = {};  // all zero if the file does not exist or cannot be reached
    int fError = 0;            // why, an errno
  };

  TPlace Walk(std::string const& path) const;
  TPlace Look(std::string const& path) const;
  void Keep(TPlace const& place) const;
  void KeepDirectory(std::string const& path) const;
  void KeepLink(std::string const& path, std::string const& target) const;
  void Write(std::string const& path, std::string const& content, mode_t mode) const;
  void WritePart(std::string const& path, std::size_t offset, std::string const& content) const;
  bool HasWhole(std::string const& path) const;
  void Mark(std::string const& path, std::string const& mark) const;
  void NoteLoss() const;

  std::string fFrom;
  std::string fTo;
  std::string fNote;  // the file in /zep-plug-ins/
};

}  // namespace NQRVZEP20
