// SPDX-License-Identifier: Apache-2.0
#include "providers/storage/VolumeGroups.h"

#include "tests/providers/storage/MachineTree.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace NQRVZEP20 {
namespace {

std::string const kUuid = "2zYqff6JvJWtE9IUcnv14EbcuKN0NMES";

std::string Row(std::string const& group, std::string const& minor) {
  return R"({"vg_name":")" + group + R"(","vg_uuid":"2zYqff-6JvJ-WtE9-IUcn-v14E-bcuK-N0NMES","vg_size":"209715200",)" +
         R"("vg_free":"41943040","pv_major":"8","pv_minor":")" + minor + R"("})";
}

std::string Answer(std::string const& rows) { return R"({"report":[{"pv":[)" + rows + "]}]}"; }

TEST(VolumeGroupsTest, TheDevicesOfAGroupFollowEachOther) {
  auto const groups = VolumeGroupsFrom(Answer(Row("vg0", "1") + "," + Row("vg0", "17")));
  ASSERT_EQ(groups.size(), 1u);
  EXPECT_EQ(groups[0].fUuid, kUuid);
  EXPECT_EQ(*groups[0].fName, "vg0");
  EXPECT_EQ(*groups[0].fSize, 209715200u);
  EXPECT_EQ(*groups[0].fFree, 41943040u);
  EXPECT_THAT(groups[0].fMemberNumbers, ElementsAre("8:1", "8:17"));
}

TEST(VolumeGroupsTest, ADeviceWithoutAGroupIsLeftOut) { EXPECT_THAT(VolumeGroupsFrom(Answer(Row("", "1"))), IsEmpty()); }

TEST(VolumeGroupsTest, OtherAnswersHaveNoGroups) {
  for (char const* answer : {"", "{", "[]", "1", "{}", R"({"report":1})", R"({"report":[1,{"pv":2},{"pv":[3,{"vg_uuid":4}]}]})"})
    EXPECT_THAT(VolumeGroupsFrom(answer), IsEmpty()) << answer;
}

TEST(VolumeGroupsTest, ASizeThatIsNotANumberIsMissing) {
  std::string answer = Answer(Row("vg0", "1"));
  answer.replace(answer.find("41943040"), 8, "4 GiB");
  EXPECT_EQ(VolumeGroupsFrom(answer)[0].fFree.Why().fReason, "lvm reports \"4 GiB\", which is not a number of bytes");
}

class VolumeGroupsOfTest : public testing::Test {
protected:
  VolumeGroupsOfTest() {
    fTree.AddBlockDevice("/sys/devices/virtual/block/dm-0", "253:0", "2048");
    fTree.Add("/sys/devices/virtual/block/dm-0/dm/name", "vg--a-root\n");
    fTree.Add("/sys/devices/virtual/block/dm-0/dm/uuid", "LVM-" + kUuid + "Xt7GcRLxi8I9WSNKgpgzjUS6sner8isu\n");
  }

  std::vector<TVolumeGroup> Groups() const {
    std::vector<TKnownDevice> known;
    for (TBlockDevice const& device : BlockDevicesOf(fTree.fFiles))
      known.push_back({device, TUdevRecord(TMissing()), NumberOf(fTree.fFiles, device)});
    return VolumeGroupsOf(fTree.fFiles, known);
  }

  TMachineTree fTree;
};

TEST_F(VolumeGroupsOfTest, WithoutAnAnswerAGroupIsKnownByItsVolumes) {
  auto const groups = Groups();
  ASSERT_EQ(groups.size(), 1u);
  EXPECT_EQ(groups[0].fUuid, kUuid);
  EXPECT_EQ(*groups[0].fName, "vg-a");
  EXPECT_EQ(groups[0].fSize.Why().fReason, "/zep-answers/lvm/pvs does not exist");
  EXPECT_THAT(groups[0].fMemberNumbers, IsEmpty());
}

TEST_F(VolumeGroupsOfTest, TheAnswerOfLvmIsPreferred) {
  fTree.Add("/zep-answers/lvm/pvs", Answer(Row("vg-a", "1")));
  EXPECT_EQ(*Groups().at(0).fFree, 41943040u);
}

TEST_F(VolumeGroupsOfTest, AnAnswerWithoutGroupsIsAReason) {
  fTree.Add("/zep-answers/lvm/pvs", Answer(""));
  EXPECT_EQ(Groups().at(0).fSize.Why().fReason, "lvm reports no volume group");
}

TEST(VolumeGroupsTest, WithoutDevicesOfLvmThereAreNoGroups) {
  TMachineTree tree;
  tree.Add("/zep-answers/lvm/pvs", Answer(Row("vg0", "1")));
  EXPECT_THAT(VolumeGroupsOf(tree.fFiles, {}), IsEmpty());
}

}  // namespace
}  // namespace NQRVZEP20
