// SPDX-License-Identifier: Apache-2.0

// Reads any bytes as the options of a DHCP reply. The area is at the end of a page, before an unreadable page, and a value
// that is found must be that of an option completely inside the area.

#include "AutoProxyDiscovery.h"
#include "fuzz/Require.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace {

constexpr std::size_t kSize = AutoProxyDiscovery::kOptionsSize;

unsigned char* AreaBeforeAnUnreadablePage() {
  auto const page = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
  void* const pages = ::mmap(nullptr, 2 * page, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  Require(pages != MAP_FAILED);
  unsigned char* const end = static_cast<unsigned char*>(pages) + page;
  Require(::mprotect(end, page, PROT_NONE) == 0);
  return end - kSize;
}

// Whether the area contains an option 252 with that value.
bool HasOption(unsigned char const* area, std::string const& value) {
  for (std::size_t at = 0; at + 2 + value.size() <= kSize; ++at)
    if (area[at] == 252 && area[at + 1] == value.size() && std::memcmp(area + at + 2, value.data(), value.size()) == 0)
      return true;
  return false;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static unsigned char* const area = AreaBeforeAnUnreadablePage();
  std::size_t const length = std::min(size, kSize);
  for (std::size_t const start : {std::size_t{0}, kSize - length}) {  // at the start of the area, and at its end
    std::fill_n(area, kSize, static_cast<unsigned char>(0));
    std::copy_n(data, length, area + start);
    std::string const url = AutoProxyDiscovery::dhcp_parser(area);
    Require(url.empty() || HasOption(area, url));
  }
  return 0;
}
