// SPDX-License-Identifier: Apache-2.0
#include "collect/TNamespaceView.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TAddToVectorCallback.h"
#include "TZEPException.h"
#include "collect/Sample.h"
#include "tools/zep/output/Text.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

using TInstances = std::vector<boost::shared_ptr<ICIMInstance>>;

// The text of a property; empty where there is no such property or no value.
std::string TextOf(ICIMInstance const& instance, std::string const& name) {
  auto const property = instance.GetProperty(name, TCIMContext());
  if (!property) return "";
  TCIMValue const value = property->GetValue(TCIMContext());
  return value.IsNull() ? "" : value.ToString();
}

std::string PathIn(ICIMInstance const& instance) { return instance.GetPath(TCIMContext()).GetPath(); }

// The path of an instance without any key value is the name of its class.
bool HasKeys(std::string const& path) { return path.find('.') != std::string::npos; }

bool HaveSameValues(ICIMInstance const& one, ICIMInstance const& other) {
  bool areSame = true;
  one.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        auto const counterpart = other.GetProperty(property->GetName(TCIMContext()), TCIMContext());
        areSame = counterpart && counterpart->GetValue(TCIMContext()) == property->GetValue(TCIMContext());
        return areSame;
      },
      TCIMContext());
  return areSame;
}

}  // namespace

TNamespaceView::TNamespaceView(std::string providerName, boost::shared_ptr<ICIMNamespace> ns)
    : fProviderName(std::move(providerName)), fNamespace(std::move(ns)) {
  for (auto const& missing : InstancesOf("ZEP_MissingValue"))
    fMissing[{TextOf(*missing, "ElementPath"), TextOf(*missing, "ElementProperty")}] = {TextOf(*missing, "Code"),
                                                                                        TextOf(*missing, "Reason")};
}

std::string TNamespaceView::GetName() const { return fNamespace->GetName(TCIMContext()); }

boost::shared_ptr<ICIMClass> TNamespaceView::FindClass(std::string const& name) const {
  try {
    return fNamespace->GetClass(name, TCIMContext());
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    return {};
  }
}

TInstances TNamespaceView::InstancesOf(std::string const& className) const {
  TInstances instances;
  if (auto const cls = FindClass(className))
    cls->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
  return instances;
}

TInstances TNamespaceView::AllInstances() const {
  TInstances instances;
  fNamespace->EnumerateClasses(
      [&](boost::shared_ptr<ICIMClass> rootClass) {
        rootClass->EnumerateInstances(TAddToVectorCallback<ICIMInstance>(instances), TCIMContext());
        return true;
      },
      TCIMContext());
  return instances;
}

std::string TNamespaceView::PathOf(ICIMInstance const& instance) const {
  std::string const path = PathIn(instance);
  std::string const number = HasKeys(path) ? "" : "#" + std::to_string(NumberOf(instance, path));
  return WithBytesEscaped(GetName() + ":" + path) + number;
}

// A provider may make a new object at each call: then the first one with the same values counts.
std::size_t TNamespaceView::NumberOf(ICIMInstance const& instance, std::string const& className) const {
  auto const [place, isNew] = fWithoutKeys.try_emplace(className);
  TInstances& instances = place->second;
  if (isNew)
    for (auto const& candidate : InstancesOf(className))
      if (PathIn(*candidate) == className) instances.push_back(candidate);

  auto found = std::find_if(instances.begin(), instances.end(), [&](auto const& other) { return other.get() == &instance; });
  if (found == instances.end())
    found = std::find_if(instances.begin(), instances.end(), [&](auto const& other) { return HaveSameValues(*other, instance); });
  return static_cast<std::size_t>(found - instances.begin()) + 1;
}

std::string TNamespaceView::SourceOf(ICIMPropertyDecl const& property) const {
  auto const source = property.GetQualifier("ValueSource", TCIMContext());
  return source ? LabelledSource(source->GetValue(TCIMContext()).ToString()) : "provider " + fProviderName;
}

TMissing TNamespaceView::WhyMissing(ICIMInstance const& instance, std::string const& property) const {
  return WhyMissing(instance.GetPath(TCIMContext()).GetPath(), property, {kMissingNotGiven, "the provider gives no value"});
}

TMissing TNamespaceView::WhyNoInstance(std::string const& className) const {
  return WhyMissing(className, "", {kMissingNotDescribed, "the provider describes none"});
}

TAnswer TNamespaceView::Answer(ICIMInstance const& instance, std::string const& name) const {
  auto const property = instance.GetProperty(name, TCIMContext());
  if (!property) return TAnswer::Unknown({kMissingNotGiven, "the provider knows no property " + name}, "");
  std::string const source = SourceOf(*property->GetDeclaration(TCIMContext()));
  TCIMValue const value = property->GetValue(TCIMContext());
  if (value.IsNull()) return TAnswer::Unknown(WhyMissing(instance, name), source);
  return TAnswer::Known(value.ToString(), source);
}

TAnswer TNamespaceView::AnswerWithoutInstance(std::string const& className, std::string const& property) const {
  auto const cls = FindClass(className);
  if (!cls) return TAnswer::Unknown({kMissingNotDescribed, "no provider describes it"}, "");
  return TAnswer::Unknown(WhyNoInstance(className), SourceOf(*cls->GetPropertyDecl(property, TCIMContext())));
}

TMissing TNamespaceView::WhyMissing(std::string const& path, std::string const& property, TMissing const& otherwise) const {
  auto const found = fMissing.find({path, property});
  return found != fMissing.end() ? found->second : otherwise;
}

}  // namespace NQRVZEP20::zep
