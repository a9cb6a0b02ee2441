// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/Mof.h"
#include "providers/mof/TMofBuilder.h"
#include "providers/mof/TMofParser.h"

namespace NQRVZEP20 {

void ReadMofFile(std::string const& path, boost::shared_ptr<ICIMNamespace> ns) {
  TMofDocument document;
  TMofSources sources(document);
  TMofParser(sources.OpenFirst(path)).ParseFile(document, sources);
  TMofBuilder(document, ns).Build();
}

void ReadMofText(std::string const& text, std::string const& name, boost::shared_ptr<ICIMNamespace> ns) {
  TMofDocument document;
  TMofSources sources(document);
  TMofParser(sources.OpenText(text, name)).ParseFile(document, sources);
  TMofBuilder(document, ns).Build();
}

}  // namespace NQRVZEP20
