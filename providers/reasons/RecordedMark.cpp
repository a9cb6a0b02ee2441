// SPDX-License-Identifier: Apache-2.0
#include "RecordedMark.h"

#include <cerrno>
#include <cstring>
#include <sstream>

namespace NQRVZEP20 {

namespace {

constexpr char const* kRefused = "refused";
constexpr char const* kMissing = "missing";
constexpr char const* kRoot = "root";

}  // namespace

bool IsMark(struct stat const& status) { return S_ISREG(status.st_mode) && (status.st_mode & S_ISVTX) != 0; }

std::string MarkOf(TRefusal const& refusal) {
  return std::string(kRefused) + " " + std::to_string(refusal.fError) + " " + (refusal.fIsOfRoot ? kRoot : "user");
}

std::string MarkOf(TMissing const& missing) {
  return (std::string(kMissing) + " " + missing.fCode + " " + missing.fReason).substr(0, kLongestMark);
}

TMissing WhyRefused(std::string const& path, TRefusal const& refusal) {
  int const error = refusal.fError;
  if (error == ENOENT || error == ENOTDIR) return {kMissingNotGiven, path + " does not exist"};
  if ((error == EACCES || error == EPERM) && !refusal.fIsOfRoot) return {kMissingNeedsRoot, "only root may read " + path};
  return {kMissingUnreadable, path + " cannot be read: " + std::strerror(error)};
}

TMissing WhyMarked(std::string const& path, std::string const& mark) {
  std::istringstream text(mark);
  std::string kind, who;
  int error = 0;
  text >> kind;
  if (kind == kSpecialMark) return {kMissingUnreadable, path + " is not a regular file"};
  if (kind == kRefused && text >> error >> who) return WhyRefused(path, {error, who == kRoot});
  TMissing missing;
  if (kind == kMissing && text >> missing.fCode && text.get() == ' ') {
    missing.fReason = mark.substr(static_cast<std::size_t>(text.tellg()));
    return missing;
  }
  return {kMissingUnreadable, path + " was listed when this machine was recorded, but not read"};
}

}  // namespace NQRVZEP20
