// SPDX-License-Identifier: Apache-2.0
#include "collect/ClassTree.h"

#include "ICIMClass.h"
#include "ICIMQualifier.h"

#include <map>

namespace NQRVZEP20 {

bool HasSetQualifier(ICIMClass const& cls, std::string const& qualifierName) {
  auto const qualifier = cls.GetQualifier(qualifierName, TCIMContext());
  return qualifier && !(qualifier->GetValue(TCIMContext()) == TCIMValue(false));
}

namespace {

// Adds classes that come after their superclasses.
class TCollector {
public:
  explicit TCollector(std::vector<TClassEntry>& entries) : fEntries(entries) {}

  bool operator()(boost::shared_ptr<ICIMClass> cls) {
    auto const superClass = cls->GetSuperClass(TCIMContext());
    std::string const superName = superClass ? superClass->GetName(TCIMContext()) : "";
    auto const above = fNumbers.find(superName);
    bool const isBelow = above != fNumbers.end();
    bool const isIndication = HasSetQualifier(*cls, "Indication") || (isBelow && fEntries[above->second].fIsIndication);
    std::string const name = cls->GetName(TCIMContext());
    fNumbers[name] = fEntries.size();
    fEntries.push_back({cls, name, superName, cls->IsAbstract(TCIMContext()), cls->GetClassFlag(TCIMContext()), isIndication,
                        isBelow ? fEntries[above->second].fDepth + 1 : 0});
    return true;
  }

private:
  std::vector<TClassEntry>& fEntries;
  std::map<std::string, std::size_t> fNumbers;  // in fEntries, by name
};

}  // namespace

std::vector<TClassEntry> ClassesOf(ICIMNamespace const& ns) {
  std::vector<TClassEntry> entries;
  TCollector collect(entries);
  ns.EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> root) {
        collect(root);
        root->EnumerateSubClasses([&](boost::shared_ptr<ICIMClass> cls) { return collect(cls); }, TCIMContext());
        return true;
      },
      TCIMContext());
  return entries;
}

}  // namespace NQRVZEP20
