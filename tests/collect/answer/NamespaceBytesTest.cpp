// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/NamespaceBytes.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMPropertyDecl.h"
#include "TZEPFailure.h"
#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TNamespaceReader.h"
#include "collect/answer/TReceivedNamespace.h"
#include "providers/memory/TMemoryClass.h"
#include "tests/collect/SamplePlugIns.h"
#include "tests/collect/answer/Bytes.h"
#include "tests/collect/answer/DumpOf.h"
#include "tests/collect/answer/RandomNamespace.h"

#include <gtest/gtest.h>
#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

using TMemory = boost::shared_ptr<TMemoryNamespace>;

void ExpectSame(ICIMNamespace const& ns) {
  std::string const bytes = BytesOf(ns);
  auto const received = TReceivedNamespace::From(bytes);
  EXPECT_EQ(DumpOf(*received), DumpOf(ns));
  EXPECT_EQ(BytesOf(*received), bytes);
}

TEST(NamespaceBytesTest, TheHostProviderAnswersTheSameWhenReadAgain) {
  auto const views = ViewsOf(SamplePlugIns());
  ASSERT_FALSE(views.empty());
  for (TNamespaceView const& view : views) ExpectSame(*view.Get());
}

TEST(NamespaceBytesTest, RandomNamespacesAnswerTheSameWhenReadAgain) {
  for (unsigned int seed = 0; seed < 200; ++seed) {
    SCOPED_TRACE(seed);
    ExpectSame(*RandomNamespace(seed));
  }
}

TEST(NamespaceBytesTest, AnEmptyNamespaceIsReadAgain) { ExpectSame(TMemoryNamespace("")); }

// A reader that gets the bytes in these pieces reads the classes before the instances exist.
TEST(NamespaceBytesTest, TheFirstPieceHoldsTheClasses) {
  for (unsigned int const seed : {1u, 2u, 3u}) {
    auto const ns = RandomNamespace(seed);
    TAnswerCounts counts;
    TNamespaceReader reader(counts);
    WriteNamespace(*ns, [&](std::string_view piece) {
      reader.Add(piece);
      reader.ReadClasses();
    });
    EXPECT_EQ(DumpOf(*reader.Finish()), DumpOf(*ns));
  }
}

TEST(NamespaceBytesTest, InstancesAboveTheSizeOfAPieceAreSentInSeveral) {
  TMemory const ns = boost::make_shared<TMemoryNamespace>("root/many");
  ns->DefineClass("X_Item").Key("Id", "uint32").Property("Text", "string");
  for (unsigned int n = 0; n < 3000; ++n) ns->AddInstance("X_Item", {{"Id", n}, {"Text", std::string(100, 'x')}});
  int pieces = 0;
  std::string bytes;
  WriteNamespace(*ns, [&](std::string_view piece) {
    ++pieces;
    EXPECT_LT(piece.size(), 128u * 1024);
    bytes.append(piece);
  });
  EXPECT_GT(pieces, 3);
  EXPECT_EQ(DumpOf(*TReceivedNamespace::From(bytes)->GetClass("X_Item", TCIMContext())->GetNamespace(TCIMContext())),
            DumpOf(*ns));
}

// ---- Providers that throw ----

enum class EPlace { kClasses, kInstances, kPath, kClassOfInstance, kValue };

// Throws at one place, what `throws` throws.
class TThrowing {
public:
  static void At(EPlace place) {
    if (place == fgPlace) fgThrow();
  }
  static EPlace fgPlace;
  static void (*fgThrow)();
};
EPlace TThrowing::fgPlace = EPlace::kClasses;
void (*TThrowing::fgThrow)() = nullptr;

class TThrowingProperty : public ICIMProperty {
public:
  explicit TThrowingProperty(boost::shared_ptr<ICIMProperty> property) : fProperty(property) {}
  TCIMValue GetValue(TCIMContext const& context) const override {
    TThrowing::At(EPlace::kValue);
    return fProperty->GetValue(context);
  }
  void SetValue(TCIMValue const&, TCIMContext const&) override {}
  std::string GetName(TCIMContext const& context) const override { return fProperty->GetName(context); }
  boost::shared_ptr<ICIMPropertyDecl const> GetDeclaration(TCIMContext const& context) const override {
    return fProperty->GetDeclaration(context);
  }

private:
  boost::shared_ptr<ICIMProperty> const fProperty;
};

class TThrowingInstance : public ICIMInstance {
public:
  explicit TThrowingInstance(boost::shared_ptr<ICIMInstance> instance) : fInstance(instance) {}
  boost::shared_ptr<ICIMClass> GetClass(TCIMContext const& context) const override {
    TThrowing::At(EPlace::kClassOfInstance);
    return fInstance->GetClass(context);
  }
  boost::shared_ptr<ICIMProperty> GetProperty(std::string const& name, TCIMContext const& context) const override {
    auto const property = fInstance->GetProperty(name, context);
    return property ? boost::make_shared<TThrowingProperty>(property) : nullptr;
  }
  void EnumerateProperties(boost::function<bool(boost::shared_ptr<ICIMProperty>)> callback,
                           TCIMContext const& context) const override {
    fInstance->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> property) { return callback(boost::make_shared<TThrowingProperty>(property)); },
        context);
  }
  TCIMReference GetPath(TCIMContext const& context) const override {
    TThrowing::At(EPlace::kPath);
    return fInstance->GetPath(context);
  }

private:
  boost::shared_ptr<ICIMInstance> const fInstance;
};

class TThrowingClass : public TMemoryClass {
public:
  using TMemoryClass::TMemoryClass;
  void EnumerateInstances(boost::function<bool(boost::shared_ptr<ICIMInstance>)> callback,
                          TCIMContext const& context) const override {
    int visited = 0;
    TMemoryClass::EnumerateInstances(
        [&](boost::shared_ptr<ICIMInstance> instance) {
          if (++visited == 2) TThrowing::At(EPlace::kInstances);
          return callback(boost::make_shared<TThrowingInstance>(instance));
        },
        context);
  }
};

// Its class X_Item has three instances.
class TThrowingNamespace : public TMemoryNamespace {
public:
  using TMemoryNamespace::TMemoryNamespace;
  static boost::shared_ptr<TThrowingNamespace> Make() {
    auto const ns = boost::make_shared<TThrowingNamespace>("root/throwing");
    auto const cls = boost::make_shared<TThrowingClass>(ns, nullptr, "X_Item");
    ns->fItems = cls;
    ns->DeclareStandardQualifiers();
    auto const key = ns->GetQualifierDecl("Key", TCIMContext());
    cls->AddPropertyDecl("Id", TCIMValue(TCIMValue::TCIMType::kCIMTypeUint32, 0), TCIMContext())
        ->AddQualifier(key, TCIMValue(true), 0, TCIMContext());
    for (unsigned int n = 0; n < 3; ++n) cls->AddInstance({{"Id", n}});
    return ns;
  }
  boost::shared_ptr<ICIMClass> GetClass(std::string const& name, TCIMContext const&) const override {
    if (name == "X_Item") return fItems;
    TThrowing::At(EPlace::kClasses);
    throw TZEPException(kZEPStatusNotFound);
  }
  void EnumerateClasses(boost::function<bool(boost::shared_ptr<ICIMClass>)> callback, TCIMContext const&) const override {
    callback(fItems);
    TThrowing::At(EPlace::kClasses);
  }
  boost::shared_ptr<ICIMInstance> GetInstance(TCIMReference const&, TCIMContext const&) const override { return {}; }

private:
  boost::shared_ptr<TThrowingClass> fItems;
};

// The received namespace finds instances that this provider does not find.
std::string WithoutFound(std::string text) {
  for (std::size_t at; (at = text.find(" found")) != text.npos;) text.erase(at, 6);
  return text;
}

TEST(NamespaceBytesTest, AnExceptionOfAProviderIsThrownInTheSamePlace) {
  struct TRow {
    void (*fThrow)();
    char const* fText;
  } const rows[] = {
      {[] { throw TZEPException(kZEPStatusAccessDenied); }, "throws kZEPStatusAccessDenied"},
      {[] { throw TZEPFailure(kZEPStatusFail, "no disk"); }, "throws kZEPStatusFail (no disk)"},
      {[] { throw std::runtime_error("out of order"); }, "throws out of order"},
      {[] { throw 5; }, "throws something else"},
  };
  for (TRow const& row : rows)
    for (EPlace const place : {EPlace::kClasses, EPlace::kInstances, EPlace::kPath, EPlace::kClassOfInstance, EPlace::kValue}) {
      SCOPED_TRACE(std::string(row.fText) + " at " + std::to_string(static_cast<int>(place)));
      TThrowing::fgPlace = place;
      TThrowing::fgThrow = row.fThrow;
      auto const ns = TThrowingNamespace::Make();
      std::string const dump = WithoutFound(DumpOf(*ns));
      EXPECT_NE(dump.find(row.fText), dump.npos);
      EXPECT_EQ(WithoutFound(DumpOf(*TReceivedNamespace::From(BytesOf(*ns)))), dump);
    }
}

TEST(NamespaceBytesTest, OutOfMemoryEndsTheWriting) {
  TThrowing::fgPlace = EPlace::kValue;
  TThrowing::fgThrow = [] { throw std::bad_alloc(); };
  auto const ns = TThrowingNamespace::Make();
  EXPECT_THROW(BytesOf(*ns), std::bad_alloc);
}

// ---- References ----

TEST(NamespaceBytesTest, AReferenceToAClassOutsideTheNamespaceKeepsItsKeys) {
  TMemory const elsewhere = boost::make_shared<TMemoryNamespace>("root/elsewhere");
  elsewhere->DefineClass("Y_Disk").Key("Id", "uint32").Key("Name", "string");
  TMemory const ns = boost::make_shared<TMemoryNamespace>("root/here");
  ns->DefineClass("X_Link").Key("Id", "uint32").Property("Disk", "reference");
  auto const disk = elsewhere->AddInstance("Y_Disk", {{"Id", 7}, {"Name", "sda"}});
  ns->AddInstance("X_Link", {{"Id", 1}, {"Disk", disk->GetReference()}});
  ExpectSame(*ns);
}

TEST(NamespaceBytesTest, ReferencesThatAreNestedTooDeeplyAreRefused) {
  TMemory const ns = boost::make_shared<TMemoryNamespace>("root/deep");
  ns->DefineClass("X_Link").KeyReference("Next", "X_Link");
  TCIMValue next(TCIMValue::TCIMType::kCIMTypeReference, 0);
  for (int depth = 0; depth < 104; ++depth) next = ns->AddInstance("X_Link", {{"Next", next}})->GetReference();
  EXPECT_NE(DumpOf(*TReceivedNamespace::From(BytesOf(*ns))).find("nested more than 100 deep"), std::string::npos);
}

}  // namespace
}  // namespace NQRVZEP20
