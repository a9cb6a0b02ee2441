// SPDX-License-Identifier: Apache-2.0
#include "cim/value/StandardTime.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <limits>
#include <new>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {
namespace {

constexpr std::int64_t kDay = 86400;
constexpr std::int64_t kYear = 365 * kDay;
constexpr std::int64_t kFarPast = std::numeric_limits<std::int64_t>::min() / 2;
constexpr std::int64_t kFarFuture = std::numeric_limits<std::int64_t>::max() / 2;

// For a time in daylight saving, mktime searches for the nearest standard time, in steps of a week less some hours and for at
// most eight and a half years. It cannot miss a standard time of this length, nor fail to reach one across this many years.
constexpr std::int64_t kLeastStandardTime = 7 * kDay;
constexpr std::int64_t kLongestDaylightSaving = 8 * kYear;

// mktime is left to decide this close to a change of the standard UTC offset.
constexpr std::int64_t kMargin = 8 * kDay;

// ---- The zone's file ----

// The file that the C library reads for a text of TZ; empty without one.
std::string FileOf(char const* zone) {
  if (zone == nullptr) return "/etc/localtime";
  std::string name = *zone == '\0' ? "Universal" : *zone == ':' ? zone + 1 : zone;
  if (name.empty() || name.front() == '/') return name;
  char const* const directory = std::getenv("TZDIR");
  return std::string(directory != nullptr && *directory != '\0' ? directory : "/usr/share/zoneinfo") + '/' + name;
}

// The parts of a compiled zone (tzfile(5)) that are needed.
struct TZoneFile {
  bool fIsUsable = false;  // has times of 64 bits, and no leap seconds
  std::vector<std::int64_t> fTransitions;
};

std::int64_t BigEndian(std::string_view bytes) {
  std::uint64_t number = (bytes[0] & 0x80) != 0 ? ~std::uint64_t{0} : 0;
  for (char const byte : bytes) number = number << 8 | static_cast<unsigned char>(byte);
  return static_cast<std::int64_t>(number);
}

struct TZoneHeader {
  static constexpr std::size_t kLength = 44;
  bool fIsValid = false;
  std::size_t fTransitions = 0, fLeapSeconds = 0, fBodyLength = 0;

  TZoneHeader(std::string_view text, std::size_t bytesOfATime) {
    if (text.size() < kLength || text.substr(0, 4) != "TZif" || text[4] < '2') return;
    auto const count = [&](std::size_t at) { return static_cast<std::size_t>(BigEndian(text.substr(at, 4)) & 0xffffff); };
    fTransitions = count(32);
    fLeapSeconds = count(28);
    fBodyLength =
        count(20) + count(24) + fLeapSeconds * (bytesOfATime + 4) + fTransitions * (bytesOfATime + 1) + count(36) * 6 + count(40);
    fIsValid = text.size() >= kLength + fBodyLength;
  }
};

// The file holds its data twice: with times of 32 bits, which are skipped, and of 64 bits.
TZoneFile ZoneFileOf(std::string_view text) {
  TZoneHeader const narrow(text, 4);
  if (!narrow.fIsValid) return {};
  text.remove_prefix(TZoneHeader::kLength + narrow.fBodyLength);
  TZoneHeader const wide(text, 8);
  if (!wide.fIsValid || wide.fLeapSeconds != 0) return {};
  text.remove_prefix(TZoneHeader::kLength);

  TZoneFile file;
  for (std::size_t i = 0; i < wide.fTransitions; ++i) file.fTransitions.push_back(BigEndian(text.substr(8 * i, 8)));
  file.fIsUsable = std::is_sorted(file.fTransitions.begin(), file.fTransitions.end());
  return file;
}

// ---- The zone according to the C library ----

struct TOffset {
  long fSeconds = 0;
  bool fIsStandard = false;

  bool operator==(TOffset const& other) const { return fSeconds == other.fSeconds && fIsStandard == other.fIsStandard; }
};

// Empty when the C library cannot tell, or tells an offset that no zone has.
std::optional<TOffset> OffsetAt(std::time_t time) {
  std::tm local;
  if (::localtime_r(&time, &local) == nullptr || std::abs(local.tm_gmtoff) > 2 * kDay) return std::nullopt;
  return TOffset{local.tm_gmtoff, local.tm_isdst == 0};
}

// That of the time between two transitions. Empty when the C library knows another zone than the file, which has changed.
std::optional<TOffset> OffsetBetween(std::int64_t from, std::int64_t to) {
  std::optional<TOffset> const offset = OffsetAt(from);
  return offset == OffsetAt(to - 1) ? offset : std::nullopt;
}

// The standard UTC offset after the last transition, where the same rule applies to each year. Empty when the rule leaves
// standard time less than four weeks a year.
std::optional<long> OffsetOfRule(std::int64_t lastTransition) {
  std::optional<long> standard;
  int weeks = 0;
  for (std::int64_t time = lastTransition; time < lastTransition + kYear; time += 7 * kDay) {
    std::optional<TOffset> const offset = OffsetAt(time);
    if (!offset) return std::nullopt;
    if (!offset->fIsStandard) continue;
    if (standard && *standard != offset->fSeconds) return std::nullopt;
    standard = offset->fSeconds;
    ++weeks;
  }
  return weeks >= 4 ? standard : std::nullopt;
}

}  // namespace

// ---- Reading ----

// Collects the eras, from the latest to the earliest.
class TStandardTime::TEraCollector {
public:
  explicit TEraCollector(TStandardTime& time) : fTime(time) {}

  // Adds standard time before that added so far.
  void Add(std::int64_t from, std::int64_t to, long utcOffset) {
    bool const isLong = to - from >= kLeastStandardTime;
    if (fEra.fUTCOffset != utcOffset) End();
    if (isLong && !fIsInEra) fEra = {from, to, utcOffset};
    if (isLong) fEra.fFrom = from;
    fIsInEra = fIsInEra || isLong;
  }

  // Ends the era that is being collected.
  void End() {
    if (fIsInEra && fTime.fCount < fTime.fEras.size()) {
      std::int64_t const from = fEra.fFrom == kFarPast ? kFarPast : fEra.fFrom + fEra.fUTCOffset + kMargin;
      std::int64_t const to = fEra.fTo == kFarFuture ? kFarFuture : fEra.fTo + fEra.fUTCOffset - kMargin;
      fTime.fEras[fTime.fCount++] = {from, to, fEra.fUTCOffset};
    }
    fIsInEra = false;
  }

private:
  TStandardTime& fTime;
  bool fIsInEra = false;
  TEra fEra{};  // its times are not yet local
};

void TStandardTime::CollectEras(std::vector<std::int64_t> const& transitions, std::int64_t start) {
  TEraCollector eras(*this);
  std::int64_t const last = transitions.empty() ? 0 : transitions.back();
  // A rule may begin in the middle of a short standard time; a year later, a long one has passed.
  if (std::optional<long> const offset = OffsetOfRule(last))
    eras.Add(transitions.empty() ? start : last + kYear, kFarFuture, *offset);

  for (std::size_t i = transitions.size(); i-- > 1;) {
    std::int64_t const from = transitions[i - 1], to = transitions[i];
    std::optional<TOffset> const offset = OffsetBetween(from, to);
    if (offset && offset->fIsStandard)
      eras.Add(from, to, offset->fSeconds);
    else if (!offset || to - from > kLongestDaylightSaving)
      eras.End();
  }
  eras.End();
}

// Without memory for the file, only mktime knows, and the file is read again a second later.
void TStandardTime::Read() {
  ::tzset();
  fCount = 0;
  fEras = {};
  fFile = {};
  try {
    ReadFile(fZone.IsTooLong() ? "" : FileOf(fZone.Text()));
  } catch (std::bad_alloc const&) {
    fCount = 0;
    fEras = {};
    fFile = {};
  }
}

void TStandardTime::ReadFile(std::string const& path) {
  fPath[path.size() < sizeof fPath ? path.copy(fPath, path.size()) : 0] = '\0';
  fFile = TFileState::Of(fPath);
  if (*fPath == '\0') return;

  // Without a file, TZ is itself a rule that applies to all years, or UTC is used.
  if (!fFile.fExists) return CollectEras({}, kStartOf1972);
  std::ifstream stream(path, std::ios::binary);
  TZoneFile const file = ZoneFileOf(std::string(std::istreambuf_iterator<char>(stream), {}));
  if (file.fIsUsable && TFileState::Of(fPath) == fFile) CollectEras(file.fTransitions, kFarPast);
}

// ---- Use ----

TStandardTime::TFileState TStandardTime::TFileState::Of(char const* path) {
  struct stat file;
  if (*path == '\0' || ::stat(path, &file) != 0) return {};
  return {true, file.st_dev, file.st_ino, file.st_size, file.st_mtim};
}

bool TStandardTime::TFileState::operator==(TFileState const& other) const {
  return fExists == other.fExists && fDevice == other.fDevice && fNumber == other.fNumber && fSize == other.fSize &&
         fModified.tv_sec == other.fModified.tv_sec && fModified.tv_nsec == other.fModified.tv_nsec;
}

TStandardTime const& TStandardTime::OfZone() {
  static thread_local TStandardTime zone;
  return zone.Checked();
}

// Not a part of OfZone, because compilers look the thread's object up (4 ns) each time that such a function names it.
[[gnu::noinline]] TStandardTime const& TStandardTime::Checked() {
  // time takes 3 ns. It makes the check of the file, 1000 ns, rare.
  std::time_t const now = std::time(nullptr);
  if (now != fCheckedAt || fZone.HasChanged()) Refresh(now);
  return *this;
}

void TStandardTime::Refresh(std::time_t now) {
  bool const isNewSecond = now != fCheckedAt;
  fCheckedAt = now;
  bool const isNewZone = !isNewSecond || fZone.HasChangedByName();
  if (isNewZone || !(TFileState::Of(fPath) == fFile)) Read();
}

}  // namespace NQRVZEP20
