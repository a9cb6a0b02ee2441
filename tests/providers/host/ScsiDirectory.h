// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/Support.h"

namespace NQRVZEP20 {

// A directory of SCSI devices in the form of sysfs.
class TScsiDirectory {
public:
  explicit TScsiDirectory(std::string path) : fPath(std::move(path)) { std::filesystem::create_directories(fPath); }

  void Add(std::string const& name, std::string const& type, std::string const& vendor, std::string const& model,
           std::string const& revision) const {
    std::string const device = fPath + "/" + name;
    std::filesystem::create_directory(device);
    WriteFile(device + "/type", type + "\n");
    WriteFile(device + "/vendor", vendor + "\n");
    WriteFile(device + "/model", model + "\n");
    WriteFile(device + "/rev", revision + "\n");
  }

private:
  std::string fPath;
};

}  // namespace NQRVZEP20
