// SPDX-License-Identifier: Apache-2.0

// Reads any text as the mount table, the list of swap areas, the other texts of the kernel about storage, and the answer of lvm.
// The names of file systems and the UUIDs of volume groups are keys: no two may be the same.

#include "fuzz/Require.h"
#include "providers/storage/Attachment.h"
#include "providers/storage/FileSystemUse.h"
#include "providers/storage/FileSystems.h"
#include "providers/storage/TRaidArray.h"
#include "providers/storage/VolumeGroups.h"

#include <set>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string const text(reinterpret_cast<char const*>(data), size);
  std::set<std::string> names;
  for (NQRVZEP20::TFileSystem const& system : NQRVZEP20::FileSystemsOf(NQRVZEP20::MountsFrom(text), {}))
    Require(names.insert(system.fName).second);
  for (NQRVZEP20::TSwap const& swap : NQRVZEP20::SwapsFrom(text)) Require(!swap.fFile.empty());
  static_cast<void>(NQRVZEP20::UseFrom(text));
  static_cast<void>(NQRVZEP20::SpeedFrom(text, "fuzz"));
  static_cast<void>(NQRVZEP20::MappedNameFrom(text, "LVM-"));
  std::set<std::string> groups;
  for (NQRVZEP20::TVolumeGroup const& group : NQRVZEP20::VolumeGroupsFrom(text)) Require(groups.insert(group.fUuid).second);
  auto const progress = NQRVZEP20::ProgressFrom(text);
  if (progress) Require(*progress <= 100);
  return 0;
}
