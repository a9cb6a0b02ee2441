// SPDX-License-Identifier: Apache-2.0

// Reads any text as MOF. The text must be refused with a position, or, once written as MOF, read back as the same.

#include "providers/memory/TMemoryNamespace.h"
#include "providers/mof/Mof.h"
#include "providers/mof/TMofError.h"

#include <boost/make_shared.hpp>

#include <cstdint>
#include <cstdlib>
#include <string>

using namespace NQRVZEP20;

namespace {

boost::shared_ptr<TMemoryNamespace> Read(std::string const& text) {
  auto ns = boost::make_shared<TMemoryNamespace>("mof");
  ReadMofText(text, "fuzz", ns);
  return ns;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  std::string written;
  try {
    written = WriteMof(*Read(std::string(reinterpret_cast<char const*>(data), size)));
  } catch (TMofError const& error) {
    if (std::string(error.what()).rfind("fuzz:", 0) != 0) std::abort();
    return 0;
  }
  if (WriteMof(*Read(written)) != written) std::abort();
  return 0;
}
