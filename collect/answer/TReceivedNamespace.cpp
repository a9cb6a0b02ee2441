// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TReceivedNamespace.h"

#include "KeyText.h"
#include "TZEPException.h"
#include "collect/answer/TNamespaceReader.h"

#include <boost/make_shared.hpp>

#include <algorithm>

namespace NQRVZEP20 {

void RefuseChange() { throw TZEPException(kZEPStatusNotSupported); }

boost::shared_ptr<TReceivedNamespace> TReceivedNamespace::From(std::string_view bytes, TAnswerCounts& counts) {
  TNamespaceReader reader(counts);
  reader.Add(bytes);
  return reader.Finish();
}

boost::shared_ptr<TReceivedNamespace> TReceivedNamespace::From(std::string_view bytes) {
  TAnswerCounts counts;
  return From(bytes, counts);
}

std::string TReceivedNamespace::GetName(TCIMContext const&) const { return fName; }

boost::shared_ptr<ICIMClass> TReceivedNamespace::CreateClass(boost::shared_ptr<ICIMClass>, std::string const&,
                                                             TCIMContext const&) {
  RefuseChange();
}

boost::shared_ptr<ICIMClass> TReceivedNamespace::FindClass(std::string const& className) const {
  auto const found = fNumbers.find(className);
  if (found != fNumbers.end()) return fClasses[found->second];
  if (fClassesFailure) fClassesFailure->Throw();  // the class may be one that the provider did not name any more
  return {};
}

boost::shared_ptr<ICIMClass> TReceivedNamespace::GetClass(std::string const& className, TCIMContext const&) const {
  if (auto cls = FindClass(className)) return cls;
  throw TZEPException(kZEPStatusNotFound);
}

void TReceivedNamespace::EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                                          TCIMContext const&) const {
  for (auto const& [root, tree] : fTrees)
    if (!callback(fClasses[root])) return;
  if (fClassesFailure) fClassesFailure->Throw();
}

boost::shared_ptr<ICIMQualifierDecl> TReceivedNamespace::CreateQualifierDecl(std::string const&, TCIMValue const&, unsigned int,
                                                                             unsigned int, TCIMContext const&) {
  RefuseChange();
}

boost::shared_ptr<ICIMQualifierDecl> TReceivedNamespace::GetQualifierDecl(std::string const& name, TCIMContext const&) const {
  for (auto const& declaration : fQualifierDecls)
    if (IsSameName(declaration->Name(), name)) return declaration;
  return {};
}

void TReceivedNamespace::EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                                                 TCIMContext const&) const {
  for (auto const& declaration : fQualifierDecls)
    if (!callback(declaration)) return;
}

boost::shared_ptr<ICIMInstance> TReceivedNamespace::GetInstance(TCIMReference const& path, TCIMContext const& context) const {
  boost::shared_ptr<ICIMClass> const named = path.GetClass();
  auto const cls = named ? fNumbers.find(named->GetName(context)) : fNumbers.end();
  std::string const keys = KeyText(path);
  if (cls == fNumbers.end() || keys.empty()) return {};
  TByKeys const& byKeys = InstancesByKeys(cls->second);
  auto const found = byKeys.find(keys);
  return found == byKeys.end() ? boost::shared_ptr<ICIMInstance>() : found->second;
}

TCIMValue TReceivedNamespace::ValueAt(std::size_t at) const {
  TByteReader reader = ReaderAt(at);
  if (IsMissingValue(reader)) TRecordedFailure::ReadFrom(reader).Throw();
  return ReadValue(reader, *this);
}

std::vector<boost::shared_ptr<TReceivedClass>> TReceivedNamespace::ClassesBelow(std::size_t number) const {
  std::vector<boost::shared_ptr<TReceivedClass>> classes;
  for (std::size_t const cls : TreeOf(number))
    if (cls != number) classes.push_back(fClasses[cls]);
  return classes;
}

// The instances of a tree are in the order in which the provider enumerates those of its root class.
void TReceivedNamespace::VisitInstances(std::size_t cls,
                                        boost::function<bool(boost::shared_ptr<ICIMInstance>)> const& callback) const {
  TTree const& tree = fTrees.at(fRoots[cls]);
  if (cls == fRoots[cls]) {
    for (std::size_t n = tree.fBegin; n < tree.fEnd; ++n)
      if (!callback(fInstances[n])) return;
  } else {
    std::vector<std::size_t> wanted;
    for (std::size_t const below : TreeOf(cls)) wanted.insert(wanted.end(), InstancesOf(below).begin(), InstancesOf(below).end());
    std::sort(wanted.begin(), wanted.end());
    for (std::size_t const n : wanted)
      if (!callback(fInstances[n])) return;
  }
  if (tree.fFailure) tree.fFailure->Throw();
}

// Most readers ask one instance for all that they want, and then the next one.
std::vector<std::size_t> const& TReceivedNamespace::PositionsOf(TReceivedInstance const& instance) const {
  if (fPositionsAt != instance.At()) {
    fPositions = instance.PositionsIn(*this);
    fPositionsAt = instance.At();
  }
  return fPositions;
}

boost::shared_ptr<ICIMNamespace> TReceivedNamespace::Namespace() const {
  return boost::const_pointer_cast<TReceivedNamespace>(shared_from_this());
}

boost::shared_ptr<ICIMClass> TReceivedNamespace::ClassAt(std::size_t number) const { return fClasses[number]; }

boost::shared_ptr<ICIMClass> TReceivedNamespace::OutsideClass(std::string const& name) const {
  auto& cls = fOutside[FoldName(name)];
  TReceivedClass::TFacts facts;
  facts.fIsOutside = true;
  if (!cls)
    cls = boost::make_shared<TReceivedClass>(boost::const_pointer_cast<TReceivedNamespace>(shared_from_this()), name, facts);
  return cls;
}

void TReceivedNamespace::DeclareOutside(boost::shared_ptr<ICIMClass> const& cls, std::string const& key,
                                        TCIMValue const& value) const {
  auto const outside = boost::static_pointer_cast<TReceivedClass>(cls);
  if (outside->FindPropertyDecl(key)) return;
  TReceivedPropertyDecl::TFacts facts;
  facts.fType = value.GetType();
  facts.fDefaultAt = TReceivedPropertyDecl::kNoDefault;
  facts.fIsKey = true;
  facts.fOwner = outside;
  outside->Add(
      boost::make_shared<TReceivedPropertyDecl>(boost::const_pointer_cast<TReceivedNamespace>(shared_from_this()), key, facts));
}

// Made when it is first needed: most readers look no instance up.
TReceivedNamespace::TByKeys const& TReceivedNamespace::InstancesByKeys(std::size_t cls) const {
  auto const [place, isNew] = fByKeys.try_emplace(cls);
  if (!isNew) return place->second;
  for (std::size_t const n : InstancesOf(cls))
    place->second.emplace(KeyText(fInstances[n]->GetPath(TCIMContext())), fInstances[n]);
  return place->second;
}

std::vector<std::size_t> TReceivedNamespace::TreeOf(std::size_t cls) const {
  std::vector<std::size_t> tree = {cls};
  for (std::size_t at = 0; at < tree.size(); ++at) {
    auto const& children = fChildren[tree[at]];
    tree.insert(tree.end(), children.begin(), children.end());
  }
  std::sort(tree.begin(), tree.end());
  return tree;
}

// Made when it is first needed: most readers visit the instances of root classes.
std::vector<std::size_t> const& TReceivedNamespace::InstancesOf(std::size_t cls) const {
  if (fInstancesOf.empty()) {
    fInstancesOf.resize(fClasses.size());
    for (auto const& [root, tree] : fTrees)
      for (std::size_t n = tree.fBegin; n < tree.fEnd; ++n) {
        std::size_t const own = fInstances[n]->Layout().fClass;
        if (fRoots[own] == root) fInstancesOf[own].push_back(n);
      }
  }
  return fInstancesOf[cls];
}

}  // namespace NQRVZEP20
