// SPDX-License-Identifier: Apache-2.0

// Tests the default bodies of the operations that a plug-in may leave out.

#include "Fakes.h"
#include "ICIMParameterDecl.h"
#include "ICIMQualifierDecl.h"
#include "tests/Support.h"

namespace NQRVZEP20 {
namespace {

// The declarations and the qualifier of a plug-in that writes nothing but what it has to.
template <class TInterface>
class TBareElement : public TInterface {
public:
  std::string GetName(TCIMContext const&) const override { return "Bare"; }
  boost::shared_ptr<ICIMQualifier> GetQualifier(std::string const&, TCIMContext const&) const override { return {}; }
  void EnumerateQualifiers(boost::function<bool(boost::shared_ptr<ICIMQualifier>)>, TCIMContext const&) const override {}
};

class TBareMethodDecl : public TBareElement<ICIMMethodDecl> {
public:
  TCIMValue::TCIMType GetReturnType(TCIMContext const&) const override { return ECIMType::kCIMTypeUint32; }
  boost::shared_ptr<ICIMParameterDecl> AddParameterDecl(std::string const&, TCIMValue::TCIMType, unsigned int, std::string const&,
                                                        TCIMContext const&) override {
    Refuse();
  }
  void EnumerateParameterDecls(boost::function<bool(boost::shared_ptr<ICIMParameterDecl>)>, TCIMContext const&) const override {}
};

class TBareParameterDecl : public TBareElement<ICIMParameterDecl> {
public:
  TCIMValue::TCIMType GetType(TCIMContext const&) const override { return ECIMType::kCIMTypeUint32; }
  unsigned int GetMaxArraySize(TCIMContext const&) const override { return 0; }
  std::string GetReferencedClassName(TCIMContext const&) const override { return ""; }
};

class TBareQualifier : public ICIMQualifier {
public:
  std::string GetName(TCIMContext const&) const override { return "Bare"; }
  TCIMValue GetValue(TCIMContext const&) const override { return TCIMValue(true); }
  unsigned int GetFlavor(TCIMContext const&) const override { return 0; }
};

TEST(InterfaceBodiesTest, OperationsThatNeedAResultThrowNotImplemented) {
  TCIMContext const none;
  auto const ns = boost::make_shared<TFakeNamespace>();
  TFakeInstance const instance;
  TFakePropertyDecl const property("Id", ECIMType::kCIMTypeUint32, TCIMValue(1u));
  EXPECT_STATUS(ns->GetName(none), kZEPStatusNotImplemented);
  EXPECT_STATUS(ns->CreateQualifierDecl("Key", TCIMValue(false), 0, 0, none), kZEPStatusNotImplemented);
  ICIMClass& cls = ns->Add("X_Disk");
  EXPECT_STATUS(cls.AddQualifier(nullptr, TCIMValue(true), 0, none), kZEPStatusNotImplemented);
  EXPECT_STATUS(cls.SetStaticProperty("Id", TCIMValue(1u), none), kZEPStatusNotImplemented);
  EXPECT_STATUS(cls.AddMethodDecl("Reset", ECIMType::kCIMTypeUint32, none), kZEPStatusNotImplemented);
  EXPECT_STATUS(cls.CommitInstance(nullptr, none), kZEPStatusNotImplemented);
  EXPECT_STATUS(instance.GetClass(none), kZEPStatusNotImplemented);
  EXPECT_STATUS(instance.GetPath(none), kZEPStatusNotImplemented);
  EXPECT_STATUS(property.IsKey(none), kZEPStatusNotImplemented);
  EXPECT_STATUS(TBareQualifier().GetDeclaration(none), kZEPStatusNotImplemented);
}

TEST(InterfaceBodiesTest, AClassIsNotAbstract) {
  auto const ns = boost::make_shared<TFakeNamespace>();
  ICIMClass const& cls = ns->Add("X_Disk");
  EXPECT_FALSE(cls.IsAbstract(TCIMContext()));
}

TEST(InterfaceBodiesTest, BackPointersAreEmpty) {
  TCIMContext const none;
  EXPECT_FALSE(TFakePropertyDecl("Id", ECIMType::kCIMTypeUint32, TCIMValue(1u)).GetOwner(none).lock());
  EXPECT_FALSE(TBareMethodDecl().GetOwner(none).lock());
  EXPECT_FALSE(TBareParameterDecl().GetMethod(none).lock());
  EXPECT_FALSE(TBareQualifier().GetOwner(none).lock());
}

TEST(InterfaceBodiesTest, BeginAndEndOfDeclarationsDoNothing) {
  TCIMContext const none;
  auto const ns = boost::make_shared<TFakeNamespace>();
  ICIMClass& cls = ns->Add("X_Disk");
  EXPECT_NO_THROW(cls.BeginDeclarations(none));
  EXPECT_STATUS(cls.GetPropertyDecl("Id", none), kZEPStatusNotFound);
  EXPECT_NO_THROW(cls.EndDeclarations(none));
}

}  // namespace
}  // namespace NQRVZEP20
