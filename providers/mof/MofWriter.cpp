// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/Mof.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMQualifierDecl.h"
#include "TAddToVectorCallback.h"
#include "providers/mof/TMofWriter.h"

#include <algorithm>
#include <map>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TClasses = std::vector<boost::shared_ptr<ICIMClass>>;
using TInstances = std::vector<boost::shared_ptr<ICIMInstance>>;

TCIMContext const kNone;

bool IsPlain(boost::shared_ptr<ICIMClass> const& cls) { return !cls->GetClassFlag(kNone); }

// Plain classes first, which is the order in which a copy creates them.
TClasses RootClassesOf(ICIMNamespace const& ns) {
  TClasses roots;
  ns.EnumerateClasses(TAddToVectorCallback<ICIMClass>(roots), kNone);
  std::stable_partition(roots.begin(), roots.end(), IsPlain);
  return roots;
}

// The direct subclasses of each class by its name, plain ones first.
std::map<std::string, TClasses> SubClassesOf(TClasses const& roots) {
  std::map<std::string, TClasses> subClasses;
  for (auto const& root : roots)
    root->EnumerateSubClasses(
        [&](boost::shared_ptr<ICIMClass> cls) {
          subClasses[cls->GetSuperClass(kNone)->GetName(kNone)].push_back(cls);
          return true;
        },
        kNone);
  for (auto& [name, classes] : subClasses) std::stable_partition(classes.begin(), classes.end(), IsPlain);
  return subClasses;
}

// Plain classes, then associations, each after its superclass: a class that is referred to comes first.
TClasses InWrittenOrder(TClasses const& roots) {
  std::map<std::string, TClasses> const subClasses = SubClassesOf(roots);
  TClasses all;
  TClasses pending(roots.rbegin(), roots.rend());  // a stack: the next class is the last
  while (!pending.empty()) {
    all.push_back(pending.back());
    pending.pop_back();
    auto const below = subClasses.find(all.back()->GetName(kNone));
    if (below != subClasses.end()) pending.insert(pending.end(), below->second.rbegin(), below->second.rend());
  }
  std::stable_partition(all.begin(), all.end(), IsPlain);
  return all;
}

std::map<std::string, TInstances> InstancesByClass(TClasses const& roots) {
  std::map<std::string, TInstances> instances;
  for (auto const& root : roots)
    root->EnumerateInstances(
        [&](boost::shared_ptr<ICIMInstance> instance) {
          instances[instance->GetClass(kNone)->GetName(kNone)].push_back(instance);
          return true;
        },
        kNone);
  return instances;
}

}  // namespace

std::string WriteMof(ICIMNamespace const& ns) {
  TMofWriter writer;
  ns.EnumerateQualifierDecls(
      [&](boost::shared_ptr<ICIMQualifierDecl> decl) {
        writer.WriteQualifierDecl(*decl);
        return true;
      },
      kNone);
  TClasses const roots = RootClassesOf(ns);
  TClasses const classes = InWrittenOrder(roots);
  for (auto const& cls : classes) writer.WriteClass(*cls);
  std::map<std::string, TInstances> instances = InstancesByClass(roots);
  for (auto const& cls : classes)
    for (auto const& instance : instances[cls->GetName(kNone)]) writer.WriteInstance(*instance);
  return writer.GetText();
}

std::string WriteMofClass(ICIMClass const& cls) {
  TMofWriter writer;
  writer.WriteClass(cls);
  return writer.GetText();
}

}  // namespace NQRVZEP20
