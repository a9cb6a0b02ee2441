// SPDX-License-Identifier: Apache-2.0
#include "TPciIds.h"

#include <boost/interprocess/file_mapping.hpp>
#include <boost/interprocess/mapped_region.hpp>

#include <array>
#include <cstdio>

namespace NQRVZEP20 {

namespace {

namespace ipc = boost::interprocess;

// Of Debian, and of Fedora and SUSE.
constexpr char const* kLists[] = {"/usr/share/misc/pci.ids", "/usr/share/hwdata/pci.ids"};

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

// The list is mapped: the system replaces the file when it updates the list, and never shortens it.
struct TPciIds::TMappedList {
  explicit TMappedList(char const* path)
      : fRegion(ipc::file_mapping(path, ipc::read_only), ipc::read_only),
        fList({static_cast<char const*>(fRegion.get_address()), fRegion.get_size()}) {}

  // Null if the list cannot be read.
  static std::unique_ptr<TMappedList> Open(char const* path) {
    try {
      return std::make_unique<TMappedList>(path);
    } catch (ipc::interprocess_exception const&) {
      return nullptr;
    }
  }

  ipc::mapped_region fRegion;
  TPciIdList fList;
};

TPciIds::TPciIds() = default;
TPciIds::~TPciIds() = default;

TPciNames TPciIds::NamesOf(TPciNumbers const& numbers, TMachineFiles const& files) {
  auto const answer = files.Answer(AnswerName(numbers), [&] { return Lookup(numbers); });
  if (!answer) return {answer.Why(), answer.Why(), answer.Why(), answer.Why()};
  auto const lines = LinesOf(*answer);
  return {NameFrom(lines[0], "vendor"), NameFrom(lines[1], "device"), NameFrom(lines[2], "subsystem"),
          NameFrom(lines[3], "class")};
}

// In the order of LinesOf.
TFinding<std::string> TPciIds::Lookup(TPciNumbers const& numbers) {
  for (char const* const path : kLists)
    if (!fList) fList = TMappedList::Open(path);
  if (!fList)
    return TMissing{kMissingUnreadable,
                    "the list of PCI identifiers (pci.ids) is not installed; it is part of the package pci.ids"};
  TPciIdList const& list = fList->fList;
  std::string const subsystem = numbers.fSubsystemVendor != 0 ? list.SubsystemOf(numbers) : "";
  return list.VendorOf(numbers) + "\n" + list.DeviceOf(numbers) + "\n" + subsystem + "\n" + list.ClassOf(numbers) + "\n";
}

}  // namespace NQRVZEP20
