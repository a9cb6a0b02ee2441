#include "DhcpClients.h"

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

// As the library reads it; empty when the line begins with none.
std::string ProcessNumberOf(std::string const& line) {
  std::size_t const start = std::min(line.find_first_not_of(' '), line.size());
  return line.substr(start, std::min(line.find_first_not_of("0123456789", start), line.size()) - start);
}

// What the process calls itself. There is none of the number 0, or of one with zeros before it, which "kill" understands.
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

bool IsStillListed(std::string const& line) {
  std::vector<std::string> const lines = DhcpClientLines();
  return std::find(lines.begin(), lines.end(), line) != lines.end();
}

}  // namespace

std::string WhyNotToBeEnded(std::vector<std::string> const& lines) {
  for (std::string const& line : lines) {
    std::string const number = ProcessNumberOf(line);
    if (number.empty()) continue;  // ends nothing
    std::optional<std::string> const name = NameOfProcess(number);
    if (name && name->find(kName) != name->npos) continue;
    if (!name && !IsStillListed(line)) continue;  // it has ended meanwhile
    std::string const truth = name ? "process " + number + " is \"" + *name + "\"" : "there is no process " + number;
    return "the line \"" + line + "\" of \"ps -e\" is wrong: " + truth +
           ". Nothing was ended; --no-stop leaves the DHCP clients alone";
  }
  return "";
}

}  // namespace NQRVZEP20::zep
