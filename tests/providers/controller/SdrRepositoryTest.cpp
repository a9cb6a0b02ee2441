// SPDX-License-Identifier: Apache-2.0
#include "providers/controller/SdrRepository.h"

#include "tests/providers/controller/FakeController.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using testing::ElementsAre;

class TMemoryCache : public ISdrCache {
public:
  TFinding<std::vector<std::string>> Load(std::string const& state) const override {
    auto const found = fRecords.find(state);
    if (found == fRecords.end()) return TMissing{kMissingNotGiven, "not cached"};
    return found->second;
  }
  void Save(std::string const& state, std::vector<std::string> const& records) const override { fRecords[state] = records; }

  mutable std::map<std::string, std::vector<std::string>> fRecords;
};

class SdrRepositoryTest : public testing::Test {
protected:
  SdrRepositoryTest() {
    fController.fRecords = {FullSensorRecord(0, 0x30, "CPU Temp"), CompactSensorRecord(1, 0x51, 8, "PSU 1")};
  }

  TFinding<TSdrRepository> Read(ISdrCache const* cache = nullptr) { return Read(fController.Connection(), cache); }
  TFinding<TSdrRepository> Read(TIpmi const& ipmi, ISdrCache const* cache) {
    return ReadSdrRepository(ipmi, cache, [&](char const*, std::size_t done, std::size_t all) {
      fProgress += std::to_string(done) + "/" + std::to_string(all) + " ";
    });
  }

  TFakeController fController;
  std::string fProgress;
};

TEST_F(SdrRepositoryTest, EveryRecordIsRead) {
  auto const repository = Read();
  ASSERT_TRUE(repository);
  EXPECT_EQ(repository->fRecords, fController.fRecords);
  EXPECT_TRUE(repository->fIsComplete);
  EXPECT_EQ(fProgress, "1/2 2/2 ");
}

TEST_F(SdrRepositoryTest, MoreRecordsThanReportedAreRead) {
  TIpmi const ipmi = [&, connection = fController.Connection()](TIpmiRequest const& request) -> TFinding<std::string> {
    std::string answer = *connection(request);
    if (request.fNetFn == kStorage && request.fCommand == 0x20) answer[2] = 1;  // the number of records
    return answer;
  };
  EXPECT_EQ(Read(ipmi, nullptr)->fRecords, fController.fRecords);
  EXPECT_EQ(fProgress, "1/1 2/2 ");
}

TEST_F(SdrRepositoryTest, AControllerThatRefusesLongPartsIsAskedForShortOnes) {
  fController.fLongestPart = 10;
  EXPECT_EQ(Read()->fRecords, fController.fRecords);
}

TEST_F(SdrRepositoryTest, ALostReservationIsRenewed) {
  fController.fLostReservations = 2;
  EXPECT_EQ(Read()->fRecords, fController.fRecords);
  fController.fLostReservations = 100;
  EXPECT_FALSE(Read()->fIsComplete);
}

TEST_F(SdrRepositoryTest, RecordsBeforeAFailureAreKept) {
  fController.fMostRequests = 4;  // the state, the reservation and one record
  auto const repository = Read();
  EXPECT_THAT(repository->fRecords, ElementsAre(fController.fRecords[0]));
  EXPECT_EQ(repository->fIsComplete.Why().fReason, "the controller does not answer");
}

TEST_F(SdrRepositoryTest, AListWithoutEndIsLeft) {
  fController.fRepeatsRecords = true;
  auto const repository = Read();
  EXPECT_LE(repository->fRecords.size(), 3U);
  EXPECT_EQ(repository->fIsComplete.Why().fReason, "the list of sensor data records has no end");
}

TEST_F(SdrRepositoryTest, AnUnchangedRepositoryComesFromTheCache) {
  TMemoryCache const cache;
  EXPECT_TRUE(Read(&cache));
  fController.fRequests = 0;
  auto const again = Read(&cache);
  EXPECT_EQ(again->fRecords, fController.fRecords);
  EXPECT_EQ(fController.fRequests, 1U);
  fController.fAdded = 2;
  fController.fRequests = 0;
  EXPECT_TRUE(Read(&cache));
  EXPECT_GT(fController.fRequests, 1U) << "read from the controller";
}

TEST_F(SdrRepositoryTest, AnIncompleteRepositoryIsNotCached) {
  TMemoryCache const cache;
  fController.fMostRequests = 4;
  Read(&cache);
  EXPECT_TRUE(cache.fRecords.empty());
}

TEST_F(SdrRepositoryTest, AControllerWithoutRecordsHasAnEmptyRepository) {
  fController.fRecords.clear();
  EXPECT_TRUE(Read()->fRecords.empty());
}

}  // namespace
}  // namespace NQRVZEP20
