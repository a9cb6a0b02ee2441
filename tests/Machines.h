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
    fIsThere = std::system(("tar -C '" + fDir.Path() + "' -xzf '" + archive + "'").c_str()) == 0;
    EXPECT_TRUE(fIsThere) << archive << " cannot be unpacked";
  }

  // A directory for ZEP_ROOT.
  std::string Root() const { return fDir.Path(); }

private:
  TTempDir fDir;
  bool fIsThere = false;
};

}  // namespace NQRVZEP20
