// SPDX-License-Identifier: Apache-2.0
#pragma once

// Marks: the files of a recorded machine that stand for a file whose content the recording does not have. A mark is a regular
// file with the sticky bit, whose content says why (docs/formats.md, "Recordings"):
//
//   listed               the file was listed, but not read
//   special              a device, a FIFO or a socket
//   refused 13 user      reading failed with this errno; the reader was root, or another user
//   missing CODE TEXT    of an answer: the reason why it is missing

#include "Missing.h"

#include <sys/stat.h>

#include <cstddef>
#include <string>

namespace NQRVZEP20 {

constexpr mode_t kMarkMode = S_IFREG | S_ISVTX | S_IRUSR;
constexpr std::size_t kLongestMark = 4096;

constexpr char const* kListedMark = "listed";
constexpr char const* kSpecialMark = "special";

// Why opening or reading a file failed.
struct TRefusal {
  int fError;  // an errno
  bool fIsOfRoot;
};

bool IsMark(struct stat const& status);

std::string MarkOf(TRefusal const& refusal);
std::string MarkOf(TMissing const& missing);

TMissing WhyRefused(std::string const& path, TRefusal const& refusal);

// The reason that a mark with this content states for the path.
TMissing WhyMarked(std::string const& path, std::string const& mark);

}  // namespace NQRVZEP20
