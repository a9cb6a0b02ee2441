// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMNames.h"
#include "ICIMNamespace.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TReceivedClass.h"
#include "collect/answer/TReceivedInstance.h"
#include "collect/answer/TReceivedLayout.h"
#include "collect/answer/TReceivedQualifierDecl.h"
#include "collect/answer/ValueBytes.h"

#include <boost/enable_shared_from_this.hpp>

#include <deque>
#include <map>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// A namespace that was received in serialised form (NamespaceBytes.h). Its operations return what those of the provider
// returned when it was serialised, and throw what they threw. Operations that would change it throw kZEPStatusNotSupported.
//
// The bytes are validated completely by From, so later reads never leave them. They are kept, and values are decoded when they
// are read, so a namespace takes little more memory than its bytes. An element that outlives its namespace throws
// boost::bad_weak_ptr. Use it from one thread at a time.
class TReceivedNamespace : public ICIMNamespace,
                           public TReadingNamespace,
                           public boost::enable_shared_from_this<TReceivedNamespace> {
public:
  // Throws TBadAnswer for bytes that are not a namespace, or exceed the limits (AnswerLimits.h) together with those that `counts`
  // counts already.
  static boost::shared_ptr<TReceivedNamespace> From(std::string_view bytes, TAnswerCounts& counts);
  static boost::shared_ptr<TReceivedNamespace> From(std::string_view bytes);  // of a plug-in without other namespaces

  std::string GetName(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMClass> CreateClass(boost::shared_ptr<ICIMClass> superClass, std::string const& name,
                                           TCIMContext const& context) override;
  boost::shared_ptr<ICIMClass> GetClass(std::string const& className, TCIMContext const& context) const override;
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const& context) const override;
  boost::shared_ptr<ICIMQualifierDecl> CreateQualifierDecl(std::string const& name, TCIMValue const& defaultValue,
                                                           unsigned int scope, unsigned int flavor,
                                                           TCIMContext const& context) override;
  boost::shared_ptr<ICIMQualifierDecl> GetQualifierDecl(std::string const& name, TCIMContext const& context) const override;
  void EnumerateQualifierDecls(boost::function<bool(boost::shared_ptr<ICIMQualifierDecl>)> callback,
                               TCIMContext const& context) const override;
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const& path, TCIMContext const& context) const override;

  // Like GetClass, but returns an empty pointer instead of throwing kZEPStatusNotFound, which takes far longer.
  boost::shared_ptr<ICIMClass> FindClass(std::string const& className) const;

  // ---- For its elements ----

  TCIMValue ValueAt(std::size_t at) const;  // throws the recorded failure if there is no value
  TByteReader ReaderAt(std::size_t at) const { return TByteReader(fBytes, at); }
  std::vector<boost::shared_ptr<TReceivedClass>> ClassesBelow(std::size_t number) const;

  // The positions of the values of an instance, and of its path after them; valid until the next call.
  std::vector<std::size_t> const& PositionsOf(TReceivedInstance const& instance) const;
  void VisitInstances(std::size_t cls, boost::function<bool(boost::shared_ptr<ICIMInstance>)> const& callback) const;

  boost::shared_ptr<ICIMNamespace> Namespace() const override;
  boost::shared_ptr<ICIMClass> ClassAt(std::size_t number) const override;
  boost::shared_ptr<ICIMClass> OutsideClass(std::string const& name) const override;
  void DeclareOutside(boost::shared_ptr<ICIMClass> const& cls, std::string const& key, TCIMValue const& value) const override;

private:
  friend class TNamespaceReader;

  // The instances of a root class and of the classes below it.
  struct TTree {
    std::size_t fBegin = 0, fEnd = 0;  // in fInstances
    std::optional<TRecordedFailure> fFailure;
  };

  using TByKeys = std::unordered_map<std::string, boost::shared_ptr<TReceivedInstance>>;  // by KeyText of their paths

  TReceivedNamespace() = default;
  TByKeys const& InstancesByKeys(std::size_t cls) const;               // of exactly that class
  std::vector<std::size_t> TreeOf(std::size_t cls) const;              // the class and those below it, in their order
  std::vector<std::size_t> const& InstancesOf(std::size_t cls) const;  // of exactly that class, in the tree of its root

  std::string fBytes;
  std::string fName;
  std::vector<boost::shared_ptr<TReceivedQualifierDecl>> fQualifierDecls;
  std::vector<boost::shared_ptr<TReceivedClass>> fClasses;
  std::vector<std::size_t> fRoots;                  // by class
  std::vector<std::vector<std::size_t>> fChildren;  // the same
  std::unordered_map<std::string, std::size_t, TNameHash, TNameEqual> fNumbers;
  std::optional<TRecordedFailure> fClassesFailure;
  std::deque<TReceivedPropertyName> fStaticProperties;  // of all classes; a deque, so that addresses are stable
  std::deque<TReceivedLayout> fLayouts;                 // a deque for the same reason
  std::vector<boost::shared_ptr<TReceivedInstance>> fInstances;
  std::map<std::size_t, TTree> fTrees;  // by the number of the root class

  mutable std::vector<std::vector<std::size_t>> fInstancesOf;                 // by class; empty until it is needed
  mutable std::size_t fPositionsAt = std::string::npos;                       // of the instance that fPositions is about
  mutable std::vector<std::size_t> fPositions;                                // see PositionsOf
  mutable std::map<std::size_t, TByKeys> fByKeys;                             // by class; of those that were searched
  mutable std::map<std::string, boost::shared_ptr<TReceivedClass>> fOutside;  // by lower-case name
};

}  // namespace NQRVZEP20
