// SPDX-License-Identifier: Apache-2.0
#pragma once

// Machines whose files were recorded with tests/system/vm/record-machine.sh.

#include "tests/Support.h"

namespace NQRVZEP20 {

// A recorded machine of tests/data/machines, unpacked into a temporary directory.
class TRecordedMachine {
public:
  explicit TRecordedMachine(std::string const& name) {
    std::string const archive = TestDataPath("machines/" + name + ".tar.gz");
    int const status = std::system(("tar -C '" + fDir.Path() + "' -xzf '" + archive + "'").c_str());
    EXPECT_EQ(status, 0) << archive << " cannot be unpacked";
    std::string const answers = TestDataPath("machines/" + name);
    if (std::filesystem::exists(answers)) std::filesystem::copy(answers, fDir.Path(), std::filesystem::copy_options::recursive);
  }

  // A directory for ZEP_ROOT.
  std::string Root() const { return fDir.Path(); }

private:
  TTempDir fDir;
};

}  // namespace NQRVZEP20
