// SPDX-License-Identifier: Apache-2.0
#include "collect/MofFile.h"

#include "TMofError.h"
#include "tests/Support.h"

#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

TEST(MofFileTest, AFileIsReadAsANamespaceOfItsOwn) {
  TTempDir const dir;
  WriteFile(dir.Path("disks.mof"),
            "Qualifier Key : boolean = false, Scope(property);\n"
            "class X_Disk { [Key] uint32 Id; };\n"
            "instance of X_Disk { Id = 7; };\n");
  TNamespaceView const view = ViewOfMof(dir.Path("disks.mof"));
  EXPECT_EQ(view.GetName(), "mof");
  EXPECT_EQ(view.GetProviderName(), dir.Path("disks.mof"));
  EXPECT_EQ(view.GetSampleLabel(), "");
  ASSERT_EQ(view.InstancesOf("X_Disk").size(), 1u);
  EXPECT_EQ(view.PathOf(*view.InstancesOf("X_Disk").front()), "mof:X_Disk.Id=\"7\"");
}

TEST(MofFileTest, AMistakeIsThrownWithItsPlace) {
  TTempDir const dir;
  WriteFile(dir.Path("bad.mof"), "class X_A {\n  \x01\n");
  try {
    ViewOfMof(dir.Path("bad.mof"));
    FAIL() << "no exception";
  } catch (TMofError const& error) {
    EXPECT_EQ(std::string(error.what()).find(dir.Path("bad.mof") + ":2:3: "), 0u) << error.what();
  }
  EXPECT_THROW(ViewOfMof(dir.Path("none.mof")), TMofError);
}

}  // namespace
}  // namespace NQRVZEP20
