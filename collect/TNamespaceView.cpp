// SPDX-License-Identifier: Apache-2.0
#include "collect/TNamespaceView.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "TAddToVectorCallback.h"
#include "TZEPException.h"
#include "collect/SafeText.h"
#include "collect/Sample.h"
#include "collect/answer/TReceivedNamespace.h"

#include <algorithm>

namespace NQRVZEP20 {

namespace {

using TInstances = std::vector<boost::shared_ptr<ICIMInstance>>;

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

TNamespaceView::TNamespaceView(std::string providerName, boost::shared_ptr<ICIMNamespace> ns, std::string sampleLabel)
    : fProviderName(std::move(providerName)),
      fNamespace(std::move(ns)),
      fSampleLabel(std::move(sampleLabel)),
      fReasons(std::make_shared<TReasonReader const>(*fNamespace)) {}

std::string TNamespaceView::GetName() const { return fNamespace->GetName(TCIMContext()); }

boost::shared_ptr<ICIMClass> TNamespaceView::FindClass(std::string const& name) const {
  if (auto const* const received = dynamic_cast<TReceivedNamespace const*>(fNamespace.get())) return received->FindClass(name);
  if (fUnknownClasses.count(name) > 0) return {};
  try {
    return fNamespace->GetClass(name, TCIMContext());
  } catch (TZEPException const& failure) {
    if (failure.GetStatusCode() != kZEPStatusNotFound) throw;
    fUnknownClasses.insert(name);
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

// A provider may create a new object at each call. Then the first instance with the same values counts.
std::size_t TNamespaceView::NumberOf(ICIMInstance const& instance, std::string const& className) const {
  auto const [place, isNew] = fWithoutKeys.try_emplace(className);
  TNumbered& numbered = place->second;
  TInstances& instances = numbered.fInstances;
  if (isNew)
    for (auto const& candidate : InstancesOf(className))
      if (PathIn(*candidate) == className) {
        instances.push_back(candidate);
        numbered.fNumbers.emplace(candidate.get(), instances.size());
      }

  auto const number = numbered.fNumbers.find(&instance);
  if (number != numbered.fNumbers.end()) return number->second;
  auto const same = [&](auto const& other) { return HaveSameValues(*other, instance); };
  return static_cast<std::size_t>(std::find_if(instances.begin(), instances.end(), same) - instances.begin()) + 1;
}

std::string TNamespaceView::SourceOf(ICIMPropertyDecl const& property) const {
  auto const source = TReasonReader::SourceOf(property);
  return source ? LabelledSource(*source, fSampleLabel) : "provider " + fProviderName;
}

bool TNamespaceView::IsOfReport(ICIMInstance const& instance) const {
  if (fSampleLabel.empty()) return true;
  bool isOfSample = false;
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        isOfSample = SourceOf(*property->GetDeclaration(TCIMContext())).compare(0, fSampleLabel.size(), fSampleLabel) == 0;
        return !isOfSample;
      },
      TCIMContext());
  return isOfSample;
}

TMissing TNamespaceView::WhyMissing(ICIMInstance const& instance, std::string const& property) const {
  return fReasons->WhyMissing(instance, property).value_or(TMissing{kMissingNotGiven, "the provider gives no value"});
}

TMissing TNamespaceView::WhyNoInstance(std::string const& className) const {
  return fReasons->WhyNoInstance(className).value_or(TMissing{kMissingNotDescribed, "the provider describes no instances"});
}

TAnswer<TCIMValue> TNamespaceView::Answer(ICIMInstance const& instance, std::string const& name) const {
  using TValueAnswer = TAnswer<TCIMValue>;
  auto const property = instance.GetProperty(name, TCIMContext());
  if (!property) return TValueAnswer::Unknown({kMissingNotGiven, "the provider has no property " + name}, "");
  std::string const source = SourceOf(*property->GetDeclaration(TCIMContext()));
  TCIMValue const value = property->GetValue(TCIMContext());
  if (value.IsNull()) return TValueAnswer::Unknown(WhyMissing(instance, name), source);
  return TValueAnswer::Known(value, source);
}

TAnswer<TCIMValue> TNamespaceView::AnswerOfFirst(std::string const& className, std::string const& property) const {
  auto const instances = InstancesOf(className);
  return instances.empty() ? AnswerWithoutInstance(className, property) : Answer(*instances.front(), property);
}

TAnswer<TCIMValue> TNamespaceView::AnswerWithoutInstance(std::string const& className, std::string const& property) const {
  using TValueAnswer = TAnswer<TCIMValue>;
  auto const cls = FindClass(className);
  if (!cls) return TValueAnswer::Unknown({kMissingNotDescribed, "no provider describes it"}, "");
  return TValueAnswer::Unknown(WhyNoInstance(className), SourceOf(*cls->GetPropertyDecl(property, TCIMContext())));
}

}  // namespace NQRVZEP20
