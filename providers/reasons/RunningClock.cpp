// SPDX-License-Identifier: Apache-2.0
#include "RunningClock.h"

#include "TZEPException.h"

#include <charconv>
#include <ctime>

namespace NQRVZEP20 {

namespace {

constexpr std::size_t kLongestStat = std::size_t(16) << 20;  // it has a line for each CPU, and a long one for interrupts

TMissing NotANumber(char const* file) { return {kMissingUnexpected, std::string(file) + " has no number of seconds"}; }

// The start of a text as a number of whole seconds.
TFinding<std::uint64_t> SecondsFrom(std::string_view text, char const* file) {
  std::uint64_t seconds = 0;
  if (std::from_chars(text.data(), text.data() + text.size(), seconds).ec != std::errc()) return NotANumber(file);
  return seconds;
}

TFinding<std::uint64_t> BootSeconds(TMachineFiles const& files) {
  return files.Content("/proc/stat", kLongestStat).Then([](std::string const& stat) -> TFinding<std::uint64_t> {
    std::string_view const name = "\nbtime ";
    std::size_t const at = stat.find(name);
    if (at == std::string::npos) return TMissing{kMissingNotGiven, "/proc/stat contains no btime"};
    return SecondsFrom(std::string_view(stat).substr(at + name.size()), "/proc/stat");
  });
}

}  // namespace

TFinding<TCIMDateTime> DateTimeFrom(std::uint64_t secondsSince1970, unsigned microSeconds) {
  auto const seconds = static_cast<std::time_t>(secondsSince1970);
  std::tm utc = {};
  if (secondsSince1970 > 253402300799 || ::gmtime_r(&seconds, &utc) == nullptr)  // the end of the year 9999
    return TMissing{kMissingUnexpected, std::to_string(secondsSince1970) + " seconds after 1970 is not a date"};
  try {
    return TCIMDateTime(static_cast<unsigned short>(utc.tm_year + 1900), static_cast<unsigned short>(utc.tm_mon + 1),
                        static_cast<unsigned>(utc.tm_mday), static_cast<unsigned short>(utc.tm_hour),
                        static_cast<unsigned short>(utc.tm_min), static_cast<unsigned short>(utc.tm_sec), microSeconds, 0);
  } catch (TZEPException const&) {
    return TMissing{kMissingUnexpected, std::to_string(secondsSince1970) + " seconds after 1970 is not a date"};
  }
}

TCIMDateTime UnknownTime() { return TCIMDateTime("99990101000000.000000+000"); }

TRunningClock RunningClockOf(TMachineFiles const& files) {
  auto const boot = BootSeconds(files);
  auto const uptime = files.Line("/proc/uptime").Then([](std::string const& text) { return SecondsFrom(text, "/proc/uptime"); });
  auto const now =
      boot.Then([&](std::uint64_t start) { return uptime.Then([&](std::uint64_t passed) { return start + passed; }); });
  auto const dateTimeFrom = [](std::uint64_t seconds) { return DateTimeFrom(seconds); };
  return {boot, boot.Then(dateTimeFrom), now.Then(dateTimeFrom), uptime};
}

}  // namespace NQRVZEP20
