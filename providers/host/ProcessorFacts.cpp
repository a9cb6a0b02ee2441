// SPDX-License-Identifier: Apache-2.0
#include "ProcessorFacts.h"

#include <charconv>
#include <cmath>

namespace NQRVZEP20 {

namespace {

using TText = TFinding<std::string>;

// The lines of /proc/cpuinfo that identify a processor: those of x86, then those of ARM.
constexpr struct {
  char const *fLine, *fName;
} kIdentity[] = {
    {"vendor_id", "Vendor"},    {"cpu family", "CPU family"}, {"model", "Model"},           {"CPU implementer", "Vendor"},
    {"CPU variant", "Variant"}, {"CPU part", "Part"},         {"CPU revision", "Revision"}, {"address sizes", "Address sizes"},
};

// The lines that have the name of the processor: on x86, POWER and RISC-V.
TText BrandOf(TCpuInfo const& cpu) {
  for (char const* name : {"model name", "cpu", "uarch"})
    if (auto const brand = cpu.Text(name)) return brand;
  return cpu.Text("model name");
}

TFinding<std::uint32_t> MegahertzFrom(std::string const& text) {
  double megahertz = 0;
  auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), megahertz);
  if (error == std::errc() && end == text.data() + text.size() && megahertz >= 1 && megahertz < 1e6)
    return static_cast<std::uint32_t>(std::lround(megahertz));
  return TMissing{kMissingUnexpected, "\"" + text + "\" is not a frequency in megahertz"};
}

TFinding<std::uint32_t> CurrentMegahertz(TKernelProcessors::TSocket const& socket, TMachineFiles const& files) {
  auto const megahertz = socket.fInfo.Text("cpu MHz").Then(MegahertzFrom);
  return megahertz ? megahertz : MegahertzIn(files, CpuDirectory(socket.FirstCpu()) + "cpufreq/scaling_cur_freq");
}

// Of an x86 processor. Others do not report it.
TFinding<std::uint16_t> DataWidthOf(TCpuInfo const& cpu) {
  return cpu.Text("flags").Then([&](std::string const&) { return std::uint16_t(cpu.HasFlag("lm") ? 64 : 32); });
}

std::vector<std::pair<std::string, std::string>> IdentityOf(TCpuInfo const& cpu) {
  std::vector<std::pair<std::string, std::string>> identity;
  for (auto const& [line, name] : kIdentity)
    if (auto const value = cpu.Text(line)) identity.emplace_back(name, *value);
  return identity;
}

}  // namespace

TProcessorFacts ProcessorFactsOf(TKernelProcessors::TSocket const& socket, TMachineFiles const& files) {
  return {BrandOf(socket.fInfo),
          socket.fInfo.Text("stepping"),
          MegahertzIn(files, CpuDirectory(socket.FirstCpu()) + "cpufreq/cpuinfo_max_freq"),
          CurrentMegahertz(socket, files),
          DataWidthOf(socket.fInfo),
          static_cast<std::uint16_t>(socket.fCores.size()),
          static_cast<std::uint16_t>(socket.Cpus().size()),
          IdentityOf(socket.fInfo)};
}

TFinding<std::uint32_t> MegahertzIn(TMachineFiles const& files, std::string const& path) {
  return files.Number<std::uint32_t>(path).Then([](std::uint32_t kilohertz) { return (kilohertz + 500) / 1000; });
}

}  // namespace NQRVZEP20
