// SPDX-License-Identifier: Apache-2.0
#include "collect/MofFile.h"

#include "providers/memory/TMemoryNamespace.h"
#include "providers/mof/Mof.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TNamespaceView ViewOfMof(std::string const& file) {
  auto const ns = boost::make_shared<TMemoryNamespace>("mof");
  ReadMofFile(file, ns);
  return TNamespaceView(file, ns);
}

}  // namespace NQRVZEP20
