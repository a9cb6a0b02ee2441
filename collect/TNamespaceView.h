// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "TCIMValue.h"
#include "TReasonReader.h"
#include "collect/TAnswer.h"

#include <map>
#include <memory>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

class ICIMPropertyDecl;

// A front end's view of a provider's namespace: instances by class, unique paths, and for each value its source and, if it is
// missing, the reason.
//
// Sources and reasons are those that the provider recorded in its namespace (TReasonReader.h); otherwise the source is the
// provider's name, and the reason is a generic one.
//
// Copies share the namespace and the reasons. Use a view from one thread at a time, because it caches paths and the names of
// classes that the namespace lacks: it is for a namespace that changes no more. In all members, exceptions of the provider, which
// may be of any type (FailureOf.h), pass through; each call blocks as long as the provider does.
class TNamespaceView {
public:
  // Reads the reasons. `ns` must not be null. `sampleLabel`: the label of the sample that the provider reads, if any.
  TNamespaceView(std::string providerName, boost::shared_ptr<ICIMNamespace> ns, std::string sampleLabel = "");

  std::string GetName() const;
  std::string const& GetProviderName() const { return fProviderName; }
  std::string const& GetSampleLabel() const { return fSampleLabel; }
  boost::shared_ptr<ICIMNamespace> Get() const { return fNamespace; }

  // The returned pointer is empty if there is no such class.
  boost::shared_ptr<ICIMClass> FindClass(std::string const& name) const;

  // The instances of the class and its subclasses; none if there is no such class.
  std::vector<boost::shared_ptr<ICIMInstance>> InstancesOf(std::string const& className) const;
  std::vector<boost::shared_ptr<ICIMInstance>> AllInstances() const;

  // The object path with the namespace as a prefix: "root/zep/host:CIM_Chassis.Tag=...". It is unique, and valid UTF-8 without
  // zero bytes: other bytes become escapes such as "\xff", which are unambiguous because backslashes in values are doubled. For
  // an instance without any key value, the path contains its number among such instances of its class, starting at 1, instead
  // of keys: "root/x:X_Disk#2".
  std::string PathOf(ICIMInstance const& instance) const;

  // The source, labelled if there is a sample (Sample.h).
  std::string SourceOf(ICIMPropertyDecl const& property) const;

  // Whether the instance describes the machine of the report: with a sample, whether any of its values comes from the sample.
  bool IsOfReport(ICIMInstance const& instance) const;

  TMissing WhyMissing(ICIMInstance const& instance, std::string const& property) const;
  TMissing WhyNoInstance(std::string const& className) const;

  // The value of a property as a typed CIM value.
  TAnswer<TCIMValue> Answer(ICIMInstance const& instance, std::string const& name) const;

  // The same for a property of the first instance of the class. If there is no instance, the answer is AnswerWithoutInstance.
  TAnswer<TCIMValue> AnswerOfFirst(std::string const& className, std::string const& property) const;

  // The answer for a class that has no instance or does not exist: always unknown, with the reason for the class.
  TAnswer<TCIMValue> AnswerWithoutInstance(std::string const& className, std::string const& property) const;

private:
  std::size_t NumberOf(ICIMInstance const& instance, std::string const& className) const;

  std::string fProviderName;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::string fSampleLabel;                       // empty without a sample
  std::shared_ptr<TReasonReader const> fReasons;  // shared by copies

  struct TNumbered {
    std::vector<boost::shared_ptr<ICIMInstance>> fInstances;
    std::unordered_map<ICIMInstance const*, std::size_t> fNumbers;  // of the instances, from 1
  };

  // Instances without key values, by class; only of classes that NumberOf was called for.
  mutable std::map<std::string, TNumbered> fWithoutKeys;

  // Rules and sections look for the same classes again and again, and an exception takes 3 microseconds.
  mutable std::set<std::string> fUnknownClasses;
};

}  // namespace NQRVZEP20
