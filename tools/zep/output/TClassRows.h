// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMInstance.h"
#include "tools/zep/output/Json.h"

#include <map>
#include <set>
#include <string>
#include <vector>

namespace NQRVZEP20::zep {

// The member "classes" of the document of a report: each class once, with its superclasses, and with those of its properties that
// the author of the plug-in marked as secrets by the qualifier Secret.
class TClassRows {
public:
  // Adds the class of the instance. Throws what the class throws; the rows are then unchanged.
  void AddClassOf(ICIMInstance const& instance);

  TJson AsJson() const;

private:
  // Classes of one name in several namespaces have one row.
  struct TRow {
    std::vector<std::string> fSuperclasses;       // the nearest first
    std::map<std::string, std::string> fSecrets;  // the kind of secret of a property, inherited ones included
  };

  std::map<std::string, TRow> fRows;
  std::set<ICIMClass const*> fKnown;
};

}  // namespace NQRVZEP20::zep
