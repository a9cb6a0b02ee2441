// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "TCIMValue.h"
#include "TReasonReader.h"
#include "collect/TAnswer.h"

#include <map>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// A provider's namespace as a front end reads it: instances by class, paths that are unique, and for each value its source and,
// when it is missing, the reason.
//
// Sources and reasons are those that the provider states in its namespace (TReasonReader.h); otherwise the provider's name is the
// source, and the reason is a general one.
//
// A copy shares the namespace, which lives as long as one of them. Use a view from one thread at a time; PathOf caches. All
// members pass on the exceptions of the provider, which may be of any type (FailureOf.h), and block for as long as the provider
// does.
class TNamespaceView {
public:
  // Reads the reasons. `ns` is not null. `sampleLabel`: the label of the sample from which the provider reads, if any.
  TNamespaceView(std::string providerName, boost::shared_ptr<ICIMNamespace> ns, std::string sampleLabel = "");

  std::string GetName() const;
  std::string const& GetProviderName() const { return fProviderName; }
  std::string const& GetSampleLabel() const { return fSampleLabel; }
  boost::shared_ptr<ICIMNamespace> Get() const { return fNamespace; }

  // Empty when there is no such class.
  boost::shared_ptr<ICIMClass> FindClass(std::string const& name) const;

  // The instances of the class and of the classes below it; none when there is no such class.
  std::vector<boost::shared_ptr<ICIMInstance>> InstancesOf(std::string const& className) const;
  std::vector<boost::shared_ptr<ICIMInstance>> AllInstances() const;

  // The object path with the namespace before it: "root/zep/host:CIM_Chassis.Tag=...". No two instances have the same, and it is
  // UTF-8 without zero bytes: other bytes become escapes such as "\xff", which cannot be confused with a value, because a path
  // doubles the backslashes of values. An instance without any key value has its number among those of its class, from 1, in
  // place of the keys: "root/x:X_Disk#2".
  std::string PathOf(ICIMInstance const& instance) const;

  // Labelled when there is a sample (Sample.h).
  std::string SourceOf(ICIMPropertyDecl const& property) const;

  TMissing WhyMissing(ICIMInstance const& instance, std::string const& property) const;
  TMissing WhyNoInstance(std::string const& className) const;

  // The value of a property, with its CIM type: numbers stay numbers.
  TAnswer<TCIMValue> Answer(ICIMInstance const& instance, std::string const& name) const;

  // The same for a property of the first instance of the class. When there is none, the reason is the class's.
  TAnswer<TCIMValue> AnswerOfFirst(std::string const& className, std::string const& property) const;

  // The same where the class has no instance or does not exist: always unknown.
  TAnswer<TCIMValue> AnswerWithoutInstance(std::string const& className, std::string const& property) const;

private:
  std::size_t NumberOf(ICIMInstance const& instance, std::string const& className) const;

  std::string fProviderName;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::string fSampleLabel;  // empty without a sample
  TReasonReader fReasons;

  // Instances without key values, by class; only of classes that NumberOf was called for.
  mutable std::map<std::string, std::vector<boost::shared_ptr<ICIMInstance>>> fWithoutKeys;
};

}  // namespace NQRVZEP20
