// SPDX-License-Identifier: Apache-2.0
#include "TPciIds.h"

extern "C" {
#include <pci/pci.h>
}

#include <array>
#include <cstdio>
#include <stdexcept>

namespace NQRVZEP20 {

namespace {

// libpci ends the process after an error unless the function that reports it does not return.
__attribute__((noreturn)) void ThrowError(char* format, ...) { throw std::runtime_error(format); }
void Ignore(char*, ...) {}

constexpr std::size_t kNames = 4;

// The lines of an answer: vendor, device, subsystem, class; an empty line for a name that is not in the list.
std::array<std::string, kNames> LinesOf(std::string const& answer) {
  std::array<std::string, kNames> lines;
  std::size_t begin = 0;
  for (std::string& line : lines) {
    std::size_t const end = std::min(answer.find('\n', begin), answer.size());
    line = answer.substr(begin, end - begin);
    begin = std::min(end + 1, answer.size());
  }
  return lines;
}

std::string AnswerName(TPciNumbers const& n) {
  char text[64];
  std::snprintf(text, sizeof text, "pci-names/%04x-%04x-%04x-%04x-%06x", n.fVendor, n.fDevice, n.fSubsystemVendor, n.fSubsystem,
                n.fClass);
  return text;
}

TFinding<std::string> NameFrom(std::string const& line, char const* kind) {
  if (!line.empty()) return line;
  return TMissing{kMissingNotGiven, std::string("the list of PCI identifiers (pci.ids) does not contain the ") + kind};
}

}  // namespace

struct TPciIds::TAccess {
  TAccess() : fAccess(::pci_alloc()) {
    fAccess->error = ThrowError;
    fAccess->warning = Ignore;
    fAccess->debug = Ignore;
  }
  ~TAccess() { ::pci_cleanup(fAccess); }
  TAccess(TAccess const&) = delete;
  TAccess& operator=(TAccess const&) = delete;

  // Empty if the list does not contain the numbers.
  std::string Name(int kind, int a, int b = 0, int c = 0, int d = 0) {
    char buffer[1024];
    char const* const name =
        ::pci_lookup_name(fAccess, buffer, sizeof buffer, kind | PCI_LOOKUP_NO_NUMBERS | PCI_LOOKUP_NO_HWDB, a, b, c, d);
    return name != nullptr ? name : "";
  }

  pci_access* fAccess;
};

TPciIds::TPciIds() = default;
TPciIds::~TPciIds() = default;

TPciNames TPciIds::NamesOf(TPciNumbers const& numbers, TMachineFiles const& files) {
  auto const answer = files.Answer(AnswerName(numbers), [&]() -> TFinding<std::string> { return Lookup(numbers); });
  if (!answer) return {answer.Why(), answer.Why(), answer.Why(), answer.Why()};
  auto const lines = LinesOf(*answer);
  return {NameFrom(lines[0], "vendor"), NameFrom(lines[1], "device"), NameFrom(lines[2], "subsystem"),
          NameFrom(lines[3], "class")};
}

std::string TPciIds::Lookup(TPciNumbers const& n) {
  if (!fAccess) fAccess = std::make_unique<TAccess>();
  std::string lines = fAccess->Name(PCI_LOOKUP_VENDOR, n.fVendor) + "\n";
  lines += fAccess->Name(PCI_LOOKUP_DEVICE, n.fVendor, n.fDevice) + "\n";
  if (n.fSubsystemVendor != 0)
    lines += fAccess->Name(PCI_LOOKUP_SUBSYSTEM | PCI_LOOKUP_DEVICE, n.fVendor, n.fDevice, n.fSubsystemVendor, n.fSubsystem);
  return lines + "\n" + fAccess->Name(PCI_LOOKUP_CLASS, static_cast<int>(n.fClass >> 8)) + "\n";
}

}  // namespace NQRVZEP20
