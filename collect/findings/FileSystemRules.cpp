// SPDX-License-Identifier: Apache-2.0
#include "collect/findings/Rules.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

// Types that are full or read-only by design.
bool IsImage(std::string const& type) {
  constexpr char const* types[] = {"squashfs", "iso9660", "erofs", "cramfs", "udf", "romfs"};
  return std::find(std::begin(types), std::end(types), type) != std::end(types);
}

// Types without space of their own, or whose space is not for files of users.
bool HasNoSpace(std::string const& type) {
  constexpr char const* types[] = {"efivarfs", "devtmpfs", "rootfs", "ramfs", "overlay", "autofs", "fuse.lxcfs"};
  return IsImage(type) || std::find(std::begin(types), std::end(types), type) != std::end(types);
}

std::uint64_t PercentOf(std::uint64_t part, std::uint64_t whole) {
  return static_cast<std::uint64_t>(100.0 * static_cast<double>(part) / static_cast<double>(whole));
}

// The name of a mounted file system that has space of its own; empty for any other.
std::string NameToJudge(TElement const& system) {
  auto const type = system.Text("FileSystemType"), root = system.Text("Root");
  return root.IsKnown() && type.IsKnown() && !HasNoSpace(*type.fValue) ? "the file system on " + *root.fValue : "";
}

bool IsReadOnly(TElement const& system) {
  auto const isReadOnly = system.Flag("ReadOnly");
  return isReadOnly.IsKnown() && *isReadOnly.fValue;
}

std::string FullText(std::uint64_t free, std::uint64_t percent) {
  if (free == 0) return " is full";
  return percent == 0 ? " has less than 1 % free" : " is nearly full: " + std::to_string(percent) + " % free";
}

void AskFullFileSystem(TRuleRun& run) {
  constexpr std::uint64_t gibibyte = 1ull << 30, almostNone = 1;
  for (TElement const& system : run.Elements("CIM_LocalFileSystem")) {
    std::string const name = NameToJudge(system);
    auto const size = system.Number("FileSystemSize"), free = system.Number("AvailableSpace");
    if (name.empty() || !run.Know(system, size) || !run.Know(system, free) || *size.fValue == 0) continue;
    if (IsReadOnly(system)) continue;
    std::uint64_t const percent = PercentOf(*free.fValue, *size.fValue);
    if (percent >= run.Thresholds().fFileSystemFreePercent ||
        *free.fValue >= run.Thresholds().fFileSystemFreeGibibytes * gibibyte)
      continue;
    run.Add(system, free.fSource, percent < almostNone ? ESeverity::kError : ESeverity::kWarning,
            name + FullText(*free.fValue, percent), "Delete what is not needed, or enlarge the file system.");
  }
}

void AskInodes(TRuleRun& run) {
  for (TElement const& system : run.Elements("CIM_UnixLocalFileSystem")) {
    if (IsReadOnly(system)) continue;
    std::string const name = NameToJudge(system);
    auto const all = system.Number("TotalInodes"), free = system.Number("FreeInodes");
    if (name.empty() || !run.Know(system, all) || !run.Know(system, free)) continue;
    if (*all.fValue == 0) continue;  // a file system that makes inodes as it needs them
    std::uint64_t const percent = PercentOf(*free.fValue, *all.fValue);
    if (percent < run.Thresholds().fFreeInodesPercent)
      run.Add(system, free.fSource, *free.fValue == 0 ? ESeverity::kError : ESeverity::kWarning,
              name + " has nearly no room for further files: " + std::to_string(percent) + " % of its inodes free",
              "Delete files: many small ones use up the inodes.");
  }
}

// An overlay without an upper directory, such as the mounted image of a container, cannot be written to.
bool IsReadOnlyOverlay(std::string const& type, std::string const& options) {
  return type == "overlay" && ("," + options).find(",upperdir=") == std::string::npos;
}

bool HasOption(std::string const& options, std::string const& option) {
  return ("," + options + ",").find("," + option + ",") != std::string::npos;
}

// An administrator's read-only mount has the option in both lists. When the kernel stops writing after an error, or the device
// became read-only, only the file system has it.
void AskReadOnlyFileSystem(TRuleRun& run) {
  for (TElement const& mount : run.Elements("ZEP_Mount")) {
    auto const options = mount.Text("Options"), ofSystem = mount.Text("FileSystemOptions");
    if (!run.Know(mount, options) || !run.Know(mount, ofSystem)) continue;
    std::string const type = mount.Text("Type").fValue.value_or("");
    if (IsImage(type) || IsReadOnlyOverlay(type, *ofSystem.fValue)) continue;
    if (HasOption(*options.fValue, "rw") && HasOption(*ofSystem.fValue, "ro"))
      run.Add(mount, ofSystem.fSource, ESeverity::kError, "the file system on " + mount.Label() + " has become read-only",
              "Look in the kernel's log for the error, check the disk, then check the file system (fsck) and mount it again.");
  }
}

}  // namespace

std::vector<TRule> FileSystemRules() {
  return {{"file-system-full", "Is a file system nearly full?", AskFullFileSystem},
          {"file-system-inodes", "Can a file system hold further files?", AskInodes},
          {"file-system-read-only", "Has a file system become read-only?", AskReadOnlyFileSystem}};
}

}  // namespace NQRVZEP20
