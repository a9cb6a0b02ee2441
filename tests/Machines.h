// SPDX-License-Identifier: Apache-2.0
#pragma once

// Machines that were recorded with zep record, or with tests/system/vm/record-machine.sh.

#include "tests/Support.h"

namespace NQRVZEP20 {

// A recorded machine of tests/data/machines, unpacked into a temporary directory.
class TRecordedMachine {
public:
  explicit TRecordedMachine(std::string const& name) {
    std::string const recording = TestDataPath("machines/" + name + ".rec");
    if (std::filesystem::exists(recording))
      Unpack("--zstd --strip-components=1 -xpf '" + recording + "' root");
    else
      Unpack("-xzf '" + TestDataPath("machines/" + name + ".tar.gz") + "'");
    std::string const answers = TestDataPath("machines/" + name);
    if (std::filesystem::exists(answers)) std::filesystem::copy(answers, fDir.Path(), std::filesystem::copy_options::recursive);
  }

  // A directory for ZEP_ROOT.
  std::string Root() const { return fDir.Path(); }

private:
  void Unpack(std::string const& archive) {
    EXPECT_EQ(std::system(("tar -C '" + fDir.Path() + "' " + archive).c_str()), 0) << archive << " cannot be unpacked";
  }

  TTempDir fDir;
};

}  // namespace NQRVZEP20
