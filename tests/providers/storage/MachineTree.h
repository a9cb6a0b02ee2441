// SPDX-License-Identifier: Apache-2.0
#pragma once

// Files of a machine that a test makes up, and records as text.

#include "providers/reasons/TMachineFiles.h"
#include "providers/reasons/TRecord.h"
#include "tests/Support.h"

#include <gmock/gmock.h>

#include <filesystem>
#include <string>
#include <vector>

namespace NQRVZEP20 {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

class TMachineTree {
public:
  // Adds a file with a line, and the directories above it.
  void Add(std::string const& path, std::string const& text) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path() + path).parent_path());
    WriteFile(fDir.Path() + path, text);
  }

  void Remove(std::string const& path) { std::filesystem::remove(fDir.Path() + path); }

  void Link(std::string const& path, std::string const& target) {
    std::filesystem::create_directories(std::filesystem::path(fDir.Path() + path).parent_path());
    std::filesystem::create_symlink(target, fDir.Path() + path);
  }

  // Adds a block device of that size in sectors of 512 bytes; `path` is its directory in sysfs.
  void AddBlockDevice(std::string const& path, std::string const& number, std::string const& sectors) {
    std::string const name = path.substr(path.rfind('/') + 1);
    Add(path + "/size", sectors + "\n");
    Add(path + "/dev", number + "\n");
    Add(path + "/ro", "0\n");
    Add(path + "/removable", "0\n");
    Link("/sys/class/block/" + name, path);
  }

  // Adds a disk below a device of the kernel: "/sys/devices/pci0000:00/0000:00:01.1/ata1/host0/target0:0:0/0:0:0:0".
  void AddDisk(std::string const& device, std::string const& name, std::string const& number, std::string const& sectors) {
    std::string const path = device + "/block/" + name;
    AddBlockDevice(path, number, sectors);
    Add(path + "/queue/logical_block_size", "512\n");
    Add(path + "/queue/rotational", "1\n");
    Link(path + "/device", device);
  }

  void AddPartition(std::string const& disk, std::string const& name, std::string const& number, std::string const& start,
                    std::string const& sectors) {
    AddBlockDevice(disk + "/" + name, number, sectors);
    Add(disk + "/" + name + "/partition", name.substr(name.find_last_not_of("0123456789") + 1) + "\n");
    Add(disk + "/" + name + "/start", start + "\n");
  }

private:
  TTempDir fDir;

public:
  TMachineFiles const fFiles{fDir.Path()};
};

// The value or the reason.
template <class T>
std::string TextOf(TFinding<T> const& finding) {
  if (!finding) return "<" + finding.Why().fReason + ">";
  if constexpr (std::is_arithmetic_v<T>)
    return std::to_string(*finding);
  else
    return *finding;
}

// "Name=value" of each property, or "Name=<reason>".
inline std::vector<std::string> LinesOf(TRecord const& record) {
  std::vector<std::string> lines;
  for (TRecordProperty const& property : record.GetProperties())
    lines.push_back(property.fName + "=" +
                    (property.fValue.IsNull() ? "<" + property.fMissing.fReason + ">" : property.fValue.ToString()));
  return lines;
}

inline std::string LineOf(TRecord const& record, std::string const& property) {
  for (std::string const& line : LinesOf(record))
    if (line.rfind(property + "=", 0) == 0) return line.substr(property.size() + 1);
  return "no property " + property;
}

}  // namespace NQRVZEP20
