// SPDX-License-Identifier: Apache-2.0

// Every provider plug-in of the build, against the schema of the DMTF and the MOF files of the classes that it lacks.

#include "tests/DmtfSchema.h"
#include "tests/providers/SchemaComparison.h"

#include "INamespaceProvider.h"
#include "Mof.h"
#include "TNamespaceProviderManager.h"

#include <dlfcn.h>

namespace NQRVZEP20 {
namespace {

// The classes of our own, each in a MOF file beside the sources of its provider.
void ReadOwnClasses(boost::shared_ptr<ICIMNamespace> ns) {
  for (auto const& entry : std::filesystem::recursive_directory_iterator(SourcePath("providers")))
    if (entry.path().extension() == ".mof") ReadMofFile(entry.path().string(), ns);
}

TEST(ProvidersSchemaTest, EveryClassAgreesWithTheSchema) {
  NEEDS(!DmtfArchive().empty(), kNoDmtfSchema);
  TDmtfSchema const schema;
  ASSERT_TRUE(schema.IsThere()) << "unzip failed";
  auto const ns = NewNamespace();
  ReadMofFile(schema.MainFile(), ns);
  ReadOwnClasses(ns);

  int plugIns = 0;
  for (auto const& entry : std::filesystem::directory_iterator(BuildPath("lib"))) {
    std::string const path = entry.path().string();
    if (path.size() < 7 || path.compare(path.size() - 7, 7, ".nsp.so") != 0) continue;
    ASSERT_NE(::dlopen(path.c_str(), RTLD_NOW), nullptr) << ::dlerror();
    ++plugIns;
  }
  ASSERT_GE(plugIns, 1);

  int providers = 0;
  TNamespaceProviderManager::GetInstance()->EnumerateNamespaceProviders([&](boost::shared_ptr<INamespaceProvider> provider) {
    ++providers;
    EXPECT_THAT(TSchemaComparison(*provider->GetNamespace(kNone), *ns).Differences(), IsEmpty()) << provider->GetName(kNone);
    return true;
  });
  EXPECT_EQ(providers, plugIns);
}

}  // namespace
}  // namespace NQRVZEP20
