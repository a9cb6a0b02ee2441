// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/wpad/DhcpClients.h"

#include "TOSSpecific.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <optional>
#include <sstream>

namespace NQRVZEP20::zep {

namespace {

constexpr char const* kName = "dhclient";
constexpr int kSilenceSeconds = 300;

// The number at the start of the line, as the library reads it; empty when there is none.
std::string ProcessNumberOf(std::string const& line) {
  std::size_t const start = std::min(line.find_first_not_of(' '), line.size());
  return line.substr(start, std::min(line.find_first_not_of("0123456789", start), line.size()) - start);
}

// Whether it is a process number in the form that /proc uses. "kill" accepts more: for "007" it ends process 7.
bool IsPlainNumber(std::string const& number) {
  constexpr std::size_t kMostDigits = 7;  // the kernel's largest is 4194304
  return number.front() != '0' && number.size() <= kMostDigits;
}

// The name of the process; none when no process has that number.
std::optional<std::string> NameOfProcess(std::string const& number) {
  std::ifstream file("/proc/" + number + "/comm", std::ios::binary);
  if (!file) return std::nullopt;
  std::string name((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
  if (!name.empty() && name.back() == '\n') name.pop_back();
  return name;
}

}  // namespace

std::vector<std::string> DhcpClientLines() {
  std::istringstream processes(TOSSpecific::SpawnProcess("ps", {"-e"}, kSilenceSeconds));
  std::vector<std::string> lines;
  for (std::string line; std::getline(processes, line);)
    if (line.find(kName) != line.npos) lines.push_back(line);
  return lines;
}

namespace {

// Compares the number only: the rest of a forged line may differ each time.
bool IsStillListed(std::string const& number) {
  std::vector<std::string> const lines = DhcpClientLines();
  return std::any_of(lines.begin(), lines.end(), [&](std::string const& line) { return ProcessNumberOf(line) == number; });
}

// Why the process with that ID must not be killed; empty if it may be, or if there is none.
std::string WhyNotNumber(std::string const& number) {
  if (number.empty()) return "";
  if (!IsPlainNumber(number)) return number + " is not a process ID";
  std::optional<std::string> const name = NameOfProcess(number);
  if (name) return name->find(kName) != name->npos ? "" : "process " + number + " is \"" + *name + "\"";
  return IsStillListed(number) ? "process " + number + " does not exist" : "";  // otherwise it has ended since
}

}  // namespace

std::string WhyNotToBeEnded(std::vector<std::string> const& lines) {
  for (std::string const& line : lines) {
    std::string const why = WhyNotNumber(ProcessNumberOf(line));
    if (why.empty()) continue;
    return "the line \"" + line + "\" of \"ps -e\" is wrong: " + why +
           ". Nothing was killed. Another process may have forged the line with a line break in its name: compare \"ps -e\" with "
           "the names in /proc/PID/comm and kill that process. --no-stop leaves the DHCP clients running";
  }
  return "";
}

}  // namespace NQRVZEP20::zep
