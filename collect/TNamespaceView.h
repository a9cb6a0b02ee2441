// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"

#include <map>
#include <string>
#include <utility>
#include <vector>

namespace NQRVZEP20 {
class ICIMPropertyDecl;
}

namespace NQRVZEP20::zep {

// Codes that zep itself gives; providers have their own.
constexpr char const* kMissingNotDescribed = "not-described";      // no provider has the class, or an instance of it
constexpr char const* kMissingNotGiven = "not-given";              // the provider has no value
constexpr char const* kMissingUnexpected = "unexpected-form";      // there is a value, but none of the expected form
constexpr char const* kMissingNotApplicable = "not-applicable";    // there is no such value for this machine; nothing is missing
constexpr char const* kMissingProviderFailed = "provider-failed";  // the provider threw

// Why a value cannot be had.
struct TMissing {
  std::string fCode;    // a word for programs, such as "needs-root"
  std::string fReason;  // for people; no capital, no full stop
};

// A value as text, or why there is none; and where it comes from.
struct TAnswer {
  bool fIsKnown;
  std::string fValue;  // of one that is known
  TMissing fMissing;   // of one that is not
  std::string fSource;
  std::string fNote;  // what to say beside a value that is known; seldom anything

  static TAnswer Known(std::string value, std::string source) { return {true, std::move(value), {}, std::move(source), ""}; }
  static TAnswer Unknown(TMissing why, std::string source) { return {false, "", std::move(why), std::move(source), ""}; }

  bool IsNotApplicable() const { return !fIsKnown && fMissing.fCode == kMissingNotApplicable; }
};

// A provider's namespace, as zep reads it. Where a provider tells the source of a value (the property's qualifier
// ValueSource) or why it is missing (instances of ZEP_MissingValue: ElementPath, ElementProperty, Code, Reason), that is
// told on; any provider may do as the host provider does.
class TNamespaceView {
public:
  TNamespaceView(std::string providerName, boost::shared_ptr<ICIMNamespace> ns);

  std::string GetName() const;
  std::string const& GetProviderName() const { return fProviderName; }
  boost::shared_ptr<ICIMNamespace> Get() const { return fNamespace; }

  boost::shared_ptr<ICIMClass> FindClass(std::string const& name) const;  // empty when there is none

  // Those of the class and of the classes below it; none when there is no such class.
  std::vector<boost::shared_ptr<ICIMInstance>> InstancesOf(std::string const& className) const;
  std::vector<boost::shared_ptr<ICIMInstance>> AllInstances() const;

  // The object path with the namespace in front: "root/zep/host:CIM_Chassis.Tag=...". No two instances share it, and it is
  // UTF-8 without zero bytes: other bytes are written as "\xff", which is no other path, as a path doubles the backslashes of its
  // values. An instance without any key value has its number among those of its class, from 1, in place of keys:
  // "root/x:X_Disk#2".
  std::string PathOf(ICIMInstance const& instance) const;

  std::string SourceOf(ICIMPropertyDecl const& property) const;
  TMissing WhyMissing(ICIMInstance const& instance, std::string const& property) const;
  TMissing WhyNoInstance(std::string const& className) const;

  // A property of an instance.
  TAnswer Answer(ICIMInstance const& instance, std::string const& property) const;

  // The same where the class has no instance to ask, or is not there itself.
  TAnswer AnswerWithoutInstance(std::string const& className, std::string const& property) const;

private:
  std::size_t NumberOf(ICIMInstance const& instance, std::string const& className) const;
  TMissing WhyMissing(std::string const& path, std::string const& property, TMissing const& otherwise) const;

  std::string fProviderName;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::map<std::pair<std::string, std::string>, TMissing> fMissing;  // by path and property

  // Instances without key values by class, of the classes that NumberOf was asked for.
  mutable std::map<std::string, std::vector<boost::shared_ptr<ICIMInstance>>> fWithoutKeys;
};

}  // namespace NQRVZEP20::zep
