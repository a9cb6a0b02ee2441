// SPDX-License-Identifier: Apache-2.0
#include "SdrRepository.h"

#include "TBytes.h"

#include <algorithm>
#include <chrono>
#include <random>
#include <set>
#include <thread>

namespace NQRVZEP20 {

namespace {

constexpr std::uint8_t kGetInfo = 0x20, kReserve = 0x22, kGetRecord = 0x23;
constexpr std::uint16_t kFirstRecord = 0x0000, kNoMoreRecords = 0xFFFF;
constexpr std::size_t kHeader = 5, kMostRecords = 4096, kInfoLength = 14;
constexpr std::size_t kLongestPart = 64;
constexpr int kAttempts = 8;  // of a record whose reservation others cancel

void AppendWord(std::string& data, std::uint16_t word) {
  (data += static_cast<char>(word & 0xFF)) += static_cast<char>(word >> 8);
}

bool HasTimes(TBytes const& info) {
  auto const isTime = [](std::uint32_t time) { return time != 0 && time != 0xFFFFFFFF; };
  return isTime(info.Long(5)) || isTime(info.Long(9));
}

// The parts of the answer that change with the records: version, number, and the times of the last addition and deletion.
std::string StateOf(std::string const& info) { return info.substr(0, 3) + info.substr(5, 8); }

// Two programs that read the records at the same time cancel the reservations of each other. Pauses of random length end that.
void LetOthersRead(int attempt) {
  static thread_local std::minstd_rand random(std::random_device{}());
  std::this_thread::sleep_for(std::chrono::milliseconds(random() % (10u << attempt)));
}

class TReader {
public:
  explicit TReader(TIpmi const& ipmi) : fIpmi(ipmi) {}

  // The record, and in `next` the number of the one after it.
  TFinding<std::string> Record(std::uint16_t id, std::uint16_t& next) {
    TFinding<std::string> record = TMissing{};
    for (int attempt = 0; attempt < kAttempts; ++attempt) {
      if (!fIsReserved) {
        auto const reserved = Reserve();
        if (!reserved) return reserved.Why();
      }
      record = WholeRecord(id, next);
      if (record || fIsReserved) return record;
      LetOthersRead(attempt);
    }
    return record;
  }

private:
  TFinding<std::uint16_t> Reserve() {
    auto const answer = Ask(fIpmi, {kStorage, kReserve}, 2);
    if (!answer) return answer.Why();
    fIsReserved = true;
    return fReservation = TBytes(*answer).Word(0);
  }

  TFinding<std::string> WholeRecord(std::uint16_t id, std::uint16_t& next) {
    auto const header = Part(id, 0, kHeader, next);
    if (!header) return header;
    std::string record = *header;
    std::size_t const length = kHeader + TBytes(record).At(4);
    while (record.size() < length) {
      auto const part = Part(id, record.size(), std::min(fLongestPart, length - record.size()), next);
      if (!part) return part;
      record += *part;
    }
    return record;
  }

  // Exactly `length` bytes, fewer only if the controller refuses so many.
  TFinding<std::string> Part(std::uint16_t id, std::size_t offset, std::size_t length, std::uint16_t& next) {
    for (;;) {
      TIpmiRequest const request = RequestFor(id, offset, length);
      auto const answer = fIpmi(request);
      if (answer && TBytes(*answer).At(0) == kReservationLost) fIsReserved = false;
      if (!RefusesLength(answer) || length <= kShortestPart) return PartFrom(answer, request, length, next);
      length = fLongestPart = std::max(length / 2, kShortestPart);
    }
  }

  TIpmiRequest RequestFor(std::uint16_t id, std::size_t offset, std::size_t length) const {
    TIpmiRequest request{kStorage, kGetRecord};
    AppendWord(request.fData, fReservation);
    AppendWord(request.fData, id);
    (request.fData += static_cast<char>(offset)) += static_cast<char>(length);
    return request;
  }

  static TFinding<std::string> PartFrom(TFinding<std::string> const& answer, TIpmiRequest const& request, std::size_t length,
                                        std::uint16_t& next) {
    auto const data = DataOf(answer, request, 2 + length);
    if (!data) return data;
    next = TBytes(*data).Word(0);
    return data->substr(2, length);
  }

  TIpmi const& fIpmi;
  bool fIsReserved = false;
  std::uint16_t fReservation = 0;
  std::size_t fLongestPart = kLongestPart;
};

TSdrRepository ReadRecords(TIpmi const& ipmi, std::size_t count, TProgress const& progress) {
  TSdrRepository repository;
  TReader reader(ipmi);
  std::set<std::uint16_t> seen;
  std::uint16_t id = kFirstRecord;
  do {
    std::uint16_t next = kNoMoreRecords;
    auto const record = reader.Record(id, next);
    if (!record) {
      repository.fIsComplete = record.Why();
      return repository;
    }
    repository.fRecords.push_back(*record);
    progress("sensor data records", repository.fRecords.size(), std::max(repository.fRecords.size(), count));
    id = next;
  } while (id != kNoMoreRecords && seen.insert(id).second && repository.fRecords.size() < kMostRecords);
  if (id != kNoMoreRecords) repository.fIsComplete = TMissing{kMissingUnexpected, "the list of sensor data records has no end"};
  return repository;
}

}  // namespace

TFinding<TSdrRepository> ReadSdrRepository(TIpmi const& ipmi, ISdrCache const* cache, TProgress const& progress) {
  auto const info = Ask(ipmi, {kStorage, kGetInfo}, kInfoLength);
  if (!info) return info.Why();
  TBytes const bytes(*info);
  if (bytes.Word(1) == 0) return TSdrRepository();
  if (!HasTimes(bytes)) cache = nullptr;
  if (cache != nullptr) {
    auto const records = cache->Load(StateOf(*info));
    if (records) return TSdrRepository{*records};
  }
  TSdrRepository const repository = ReadRecords(ipmi, bytes.Word(1), progress);
  if (cache != nullptr && repository.fIsComplete) cache->Save(StateOf(*info), repository.fRecords);
  return repository;
}

}  // namespace NQRVZEP20
