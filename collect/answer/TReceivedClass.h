// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "CIMNames.h"
#include "ICIMClass.h"
#include "collect/answer/TReceivedElement.h"
#include "collect/answer/TReceivedMethodDecl.h"
#include "collect/answer/TReceivedProperty.h"
#include "collect/answer/TReceivedPropertyDecl.h"

#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

// A class of a received namespace, or a class outside it to which a reference refers.
class TReceivedClass : public TReceivedElement<ICIMClass> {
public:
  struct TFacts {
    std::size_t fNumber = 0;
    bool fIsOutside = false;  // the class is not in the namespace, and fNumber has no meaning
    bool fIsAssociation = false;
    bool fIsAbstract = false;
    boost::weak_ptr<TReceivedClass> fSuperClass;
    bool fHasSuperClass = false;
  };

  TReceivedClass(boost::weak_ptr<TReceivedNamespace> ns, std::string name, TFacts facts);

  boost::shared_ptr<ICIMNamespace> GetNamespace(TCIMContext const& context) const override;
  bool GetClassFlag(TCIMContext const& context) const override;
  bool IsAbstract(TCIMContext const& context) const override;
  bool IsRootClass(TCIMContext const& context) const override;
  boost::shared_ptr<ICIMClass> GetSuperClass(TCIMContext const& context) const override;
  void EnumerateSubClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback,
                           TCIMContext const& context) const override;

  boost::shared_ptr<ICIMPropertyDecl> AddPropertyDecl(std::string const& name, TCIMValue const& defaultValue,
                                                      TCIMContext const& context) override;
  boost::shared_ptr<ICIMPropertyDecl const> GetPropertyDecl(std::string const& name, TCIMContext const& context) const override;
  void EnumeratePropertyDecls(boost::function<bool(boost::shared_ptr<ICIMPropertyDecl>)> callback,
                              TCIMContext const& context) const override;

  void EnumerateStaticProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                                 TCIMContext const& context) const override;

  boost::shared_ptr<ICIMInstance> CreateInstance(TCIMContext const& context) override;
  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override;

  void EnumerateMethodDecls(boost::function<bool(boost::shared_ptr<ICIMMethodDecl>)> callback,
                            TCIMContext const& context) const override;

  // ---- For the reader of the namespace ----

  TFacts const& Facts() const { return fFacts; }
  std::vector<boost::shared_ptr<TReceivedPropertyDecl>> const& PropertyDecls() const { return fPropertyDecls; }
  boost::shared_ptr<TReceivedPropertyDecl> FindPropertyDecl(std::string const& name) const;  // its own; empty if there is none
  void Add(boost::shared_ptr<TReceivedPropertyDecl> property);
  void Add(boost::shared_ptr<TReceivedMethodDecl> method) { fMethodDecls.push_back(method); }
  void Add(boost::shared_ptr<TReceivedProperty> staticProperty) { fStaticProperties.push_back(staticProperty); }
  void EndStaticPropertiesWith(TRecordedFailure failure) { fStaticFailure = std::move(failure); }

private:
  TFacts const fFacts;
  std::vector<boost::shared_ptr<TReceivedPropertyDecl>> fPropertyDecls;
  std::unordered_map<std::string, std::size_t, TNameHash, TNameEqual>
      fNumbers;  // of the declarations; of two with one name the first
  std::vector<boost::shared_ptr<TReceivedMethodDecl>> fMethodDecls;
  std::vector<boost::shared_ptr<TReceivedProperty>> fStaticProperties;
  std::optional<TRecordedFailure> fStaticFailure;  // thrown after the static properties
};

}  // namespace NQRVZEP20
