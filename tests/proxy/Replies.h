// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "AutoProxyDiscovery.h"
#include "tests/Support.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>

namespace NQRVZEP20 {

using TBytes = std::vector<unsigned char>;

// A recorded reply of a DHCP server, read from a file of hexadecimal text.
inline TBytes RecordedReply(std::string const& name) {
  std::string digits = ReadFile(TestDataPath("wpad/" + name));
  digits.erase(std::remove(digits.begin(), digits.end(), '\n'), digits.end());
  TBytes bytes;
  for (std::size_t at = 0; at + 1 < digits.size(); at += 2)
    bytes.push_back(static_cast<unsigned char>(std::stoi(digits.substr(at, 2), nullptr, 16)));
  return bytes;
}

// An options area at the end of a page, before an unreadable page.
class TOptionsArea {
public:
  TOptionsArea() : fPage(static_cast<std::size_t>(::sysconf(_SC_PAGESIZE))) {
    fPages = static_cast<unsigned char*>(::mmap(nullptr, 2 * fPage, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0));
    if (fPages == MAP_FAILED || ::mprotect(fPages + fPage, fPage, PROT_NONE) != 0) throw std::runtime_error("no pages");
  }
  ~TOptionsArea() { ::munmap(fPages, 2 * fPage); }
  TOptionsArea(TOptionsArea const&) = delete;
  TOptionsArea& operator=(TOptionsArea const&) = delete;

  unsigned char* Data() { return fPages + fPage - AutoProxyDiscovery::kOptionsSize; }
  // Stores the bytes, as many as fit into the area, followed by zeros.
  void Hold(TBytes const& bytes) {
    std::fill_n(Data(), AutoProxyDiscovery::kOptionsSize, static_cast<unsigned char>(0));
    std::copy_n(bytes.begin(), std::min<std::size_t>(bytes.size(), AutoProxyDiscovery::kOptionsSize), Data());
  }

private:
  std::size_t fPage;
  unsigned char* fPages;
};

}  // namespace NQRVZEP20
