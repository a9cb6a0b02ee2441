// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/TClassRows.h"

#include "ICIMClass.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

// Adds the secrets that the class itself declares. One that a subclass declares stays.
void AddSecretsOf(ICIMClass const& cls, std::map<std::string, std::string>& secrets) {
  cls.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> const& property) {
        auto const qualifier = property->GetQualifier("Secret", TCIMContext());
        TCIMValue const kind = qualifier ? qualifier->GetValue(TCIMContext()) : TCIMValue();
        if (!kind.IsNull()) secrets.emplace(property->GetName(TCIMContext()), kind.ToString());
        return true;
      },
      TCIMContext());
}

}  // namespace

void TClassRows::AddClassOf(ICIMInstance const& instance) {
  auto const ofInstance = instance.GetClass(TCIMContext());
  if (!fKnown.insert(ofInstance.get()).second) return;
  TRow row;
  AddSecretsOf(*ofInstance, row.fSecrets);
  for (auto above = ofInstance->GetSuperClass(TCIMContext()); above; above = above->GetSuperClass(TCIMContext())) {
    row.fSuperclasses.push_back(above->GetName(TCIMContext()));
    AddSecretsOf(*above, row.fSecrets);
  }
  TRow& known = fRows[ofInstance->GetName(TCIMContext())];
  for (std::string const& name : row.fSuperclasses)
    if (std::find(known.fSuperclasses.begin(), known.fSuperclasses.end(), name) == known.fSuperclasses.end())
      known.fSuperclasses.push_back(name);
  known.fSecrets.merge(row.fSecrets);
}

TJson TClassRows::AsJson() const {
  TJson json = TJson::array();
  for (auto const& [name, row] : fRows) {
    json.push_back({{"class", name}, {"superclasses", row.fSuperclasses}});
    if (!row.fSecrets.empty()) json.back()["secrets"] = row.fSecrets;
  }
  return json;
}

}  // namespace NQRVZEP20::zep
