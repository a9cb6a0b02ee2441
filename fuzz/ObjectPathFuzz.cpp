// SPDX-License-Identifier: Apache-2.0

// Reads any text as an object path. The text must be refused in one of the expected ways, or the path must print as a text
// that, with a namespace prefix, reads back as an equal path. A path with references among its keys is only printed: a
// printed reference lacks the prefix that reading it needs.

#include "ILogger.h"
#include "TCIMReference.h"
#include "TRootObject.h"
#include "TZEPException.h"
#include "providers/memory/TMemoryNamespace.h"

#include <boost/make_shared.hpp>

#include <cstdint>
#include <cstdlib>
#include <string>

using namespace NQRVZEP20;

namespace {

boost::shared_ptr<TMemoryNamespace> MakeNamespace() {
  auto ns = boost::make_shared<TMemoryNamespace>("ns");
  ns->DefineClass("D")
      .Key("I", "uint32")
      .Key("S", "string")
      .Key("B", "boolean")
      .Key("T", "sint8")
      .Key("L", "sint64")
      .Key("W", "datetime");
  ns->DefineClass("L").KeyReference("D", "D").Key("P", "uint8");
  return ns;
}

bool HasReferences(TCIMReference const& path) {
  bool found = false;
  path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) { return !(found = key.second.IsReference()); });
  return found;
}

void RequireThatItReadsBack(boost::shared_ptr<TMemoryNamespace> const& ns, TCIMReference const& path) {
  std::string const printed = path.GetPath();
  if (HasReferences(path)) return;
  TCIMReference const again(ns, "ns:" + printed, TCIMContext());
  if (!(again == path) || again < path || path < again || again.GetPath() != printed) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  static boost::shared_ptr<TMemoryNamespace> const ns = MakeNamespace();
  TRootObject::GetCoreLogger()->ClearLog();
  TCIMReference path(ns, TCIMContext());
  try {
    path.SetPath(std::string(reinterpret_cast<char const*>(data), size));
  } catch (TZEPException const& failure) {
    EZEPStatusCode const status = failure.GetStatusCode().GetCode();
    if (status != kZEPStatusInvalidReference && status != kZEPStatusInvalidDateTime) std::abort();
  }
  if (path.GetClass()) RequireThatItReadsBack(ns, path);  // also a path that was read up to a failure
  return 0;
}
