// SPDX-License-Identifier: Apache-2.0
#include "tests/collect/answer/RandomNamespace.h"

#include "ICIMClass.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMPropertyDecl.h"
#include "TZEPException.h"
#include "providers/memory/CIMTypes.h"
#include "providers/memory/TMemoryClass.h"

#include <boost/make_shared.hpp>

#include <cstring>
#include <random>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;
TCIMContext const kNone;

class TRandom {
public:
  explicit TRandom(unsigned int seed) : fEngine(seed), fNamespace(boost::make_shared<TMemoryNamespace>("root/random")) {}

  boost::shared_ptr<TMemoryNamespace> Make() {
    fNamespace->DeclareStandardQualifiers();
    for (unsigned int n = 0, count = 1 + Below(8); n < count; ++n) AddClass("X_Class" + std::to_string(n));
    for (auto const& cls : fClasses)
      for (unsigned int n = Below(6); n > 0; --n) AddInstance(cls);
    return fNamespace;
  }

private:
  unsigned int Below(unsigned int end) { return std::uniform_int_distribution<unsigned int>(0, end - 1)(fEngine); }
  bool Chance(unsigned int oneIn) { return Below(oneIn) == 0; }

  template <class T>
  T Bits() {
    std::uint64_t const bits = fEngine();
    T value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
  }

  std::string Text() {
    std::string text(Chance(10) ? Below(2000) : Below(12), ' ');
    for (char& c : text) c = static_cast<char>(Below(256));
    return text;
  }

  TCIMValue DateTime() {
    TCIMDateTime time;
    if (Chance(2))
      time.Set(Bits<unsigned int>(), static_cast<unsigned short>(Below(24)), static_cast<unsigned short>(Below(60)),
               static_cast<unsigned short>(Below(60)), Below(1000000));
    else
      time.Set(static_cast<unsigned short>(1990 + Below(80)), static_cast<unsigned short>(1 + Below(12)), 1 + Below(28),
               static_cast<unsigned short>(12 + Below(10)), static_cast<unsigned short>(Below(60)),
               static_cast<unsigned short>(Below(60)), Below(1000000), static_cast<short>(Below(240)));
    if (Chance(3)) time.SetPrecision(true);
    if (Chance(8)) time.Clear();
    return time;
  }

  TCIMValue Reference() {
    if (fInstances.empty() || Chance(6)) return NullReference();
    TCIMReference path = fInstances[Below(static_cast<unsigned int>(fInstances.size()))]->GetPath(kNone);
    if (Chance(3)) path.SetNameSpaceName(Text());
    if (Chance(8)) path.SetNamespace({});
    return TCIMValue(path);
  }

  TCIMValue NullReference() {
    TCIMValue null(TType::kCIMTypeReference, 0);
    if (!fClasses.empty() && Chance(2)) null.SetReferencedClass(fClasses[Below(static_cast<unsigned int>(fClasses.size()))]);
    return null;
  }

  TCIMValue Scalar(TType::ECIMType type) {
    switch (type) {
      case TType::kCIMTypeBoolean:
        return Chance(2);
      case TType::kCIMTypeUint8:
        return Bits<unsigned char>();
      case TType::kCIMTypeSint8:
        return Bits<signed char>();
      case TType::kCIMTypeUint16:
        return Bits<unsigned short>();
      case TType::kCIMTypeSint16:
        return Bits<short>();
      case TType::kCIMTypeUint32:
        return Bits<unsigned int>();
      case TType::kCIMTypeSint32:
        return Bits<int>();
      case TType::kCIMTypeUint64:
        return Bits<unsigned long>();
      case TType::kCIMTypeSint64:
        return Bits<long>();
      case TType::kCIMTypeReal32:
        return Bits<float>();
      case TType::kCIMTypeReal64:
        return Bits<double>();
      case TType::kCIMTypeChar16:
        return Chance(5) ? TCIMValue(TCIMChar16(std::string())) : TCIMValue(TCIMChar16(Bits<unsigned short>()));
      case TType::kCIMTypeString:
        return Text();
      case TType::kCIMTypeDateTime:
        return DateTime();
      default:
        return Reference();
    }
  }

  TType::ECIMType ScalarType(unsigned int types) { return static_cast<TType::ECIMType>(1 + Below(types)); }

  TCIMValue Value(TType::ECIMType type, unsigned int bound, bool isArray) {
    TCIMValue value;
    if (Chance(5)) {
      value.SetNullValue(isArray ? ArrayOf(type) : TType(type), bound);
      return value;
    }
    if (!isArray) return Scalar(type);
    std::vector<TCIMValue> elements;
    for (unsigned int n = Below(5); n > 0; --n) {
      TCIMValue null;
      null.SetNullValue(type, 0);
      elements.push_back(Chance(5) ? null : Scalar(type));
    }
    value.Set(type, bound, elements);
    return value;
  }

  // Of any type that a qualifier may have.
  void AddQualifier(ICIMNamedElement& element) {
    auto const type = ScalarType(TType::kCIMTypeDateTime);
    bool const isArray = Chance(3);
    std::string const name = "Q" + std::to_string(fQualifiers++);
    auto const decl = fNamespace->CreateQualifierDecl(name, Value(type, isArray ? 4 : 0, isArray), Below(128), Below(8), kNone);
    TCIMValue value = Value(type, isArray ? 4 : 0, isArray);
    element.AddQualifier(decl, value, Below(8), kNone);
  }

  void Mark(ICIMNamedElement& element, char const* qualifier) {
    auto const decl = fNamespace->GetQualifierDecl(qualifier, kNone);
    element.AddQualifier(decl, TCIMValue(true), decl->GetFlavor(kNone), kNone);
  }

  void AddClass(std::string const& name) {
    auto const super = fClasses.empty() || Chance(3) ? nullptr : fClasses[Below(static_cast<unsigned int>(fClasses.size()))];
    auto const cls = boost::static_pointer_cast<TMemoryClass>(fNamespace->CreateClass(super, name, kNone));
    if (Chance(6)) Mark(*cls, "Abstract");
    if (Chance(5)) Mark(*cls, "Association");
    while (Chance(2)) AddQualifier(*cls);
    for (unsigned int n = 0, count = Below(7); n < count; ++n) AddProperty(*cls, "P" + std::to_string(Below(12)));
    if (Chance(3)) AddMethod(*cls);
    fClasses.push_back(cls);
  }

  void AddProperty(TMemoryClass& cls, std::string const& name) {
    auto const type = ScalarType(TType::kCIMTypeReference);
    bool const isArray = Chance(3);
    if (cls.FindPropertyDecl(name)) return;
    auto const decl = cls.AddPropertyDecl(name, Value(type, isArray ? Below(3) * 4 : 0, isArray), kNone);
    bool const isReal = type == TType::kCIMTypeReal32 || type == TType::kCIMTypeReal64;
    if (!isArray && !isReal && Chance(3)) Mark(*decl, "Key");
    if (Chance(3)) AddQualifier(*decl);
    if (Chance(6)) cls.SetStaticProperty(name, Like(decl->GetDefaultValue(kNone)), kNone);
  }

  void AddMethod(TMemoryClass& cls) {
    auto const method = cls.AddMethodDecl("M", ScalarType(TType::kCIMTypeReference), kNone);
    if (Chance(2)) AddQualifier(*method);
    for (unsigned int n = 0, count = Below(4); n < count; ++n) {
      bool const isArray = Chance(2);
      auto const type = ScalarType(TType::kCIMTypeReference);
      bool const isReference = type == TType::kCIMTypeReference;
      auto const parameter = method->AddParameterDecl("A" + std::to_string(n), isArray ? ArrayOf(type) : TType(type),
                                                      isArray ? Below(9) : 0, isReference ? "X_Any" : "", kNone);
      if (Chance(3)) AddQualifier(*parameter);
    }
  }

  TCIMValue Like(TCIMValue const& pattern) {
    return Value(BaseTypeOf(pattern.GetType()), pattern.GetMaxArraySize(), pattern.IsArray());
  }

  void AddInstance(boost::shared_ptr<TMemoryClass> const& cls) {
    if (cls->IsAbstract(kNone)) return;
    auto const instance = boost::static_pointer_cast<TMemoryInstance>(cls->CreateInstance(kNone));
    instance->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> property) {
          property->SetValue(Like(property->GetValue(kNone)), kNone);
          return true;
        },
        kNone);
    try {
      cls->CommitInstance(instance, kNone);
      fInstances.push_back(instance);
    } catch (TZEPException const& failure) {
      if (failure.GetStatusCode() != kZEPStatusAlreadyExists) throw;  // the same keys by chance
    }
  }

  std::mt19937_64 fEngine;
  boost::shared_ptr<TMemoryNamespace> const fNamespace;
  std::vector<boost::shared_ptr<TMemoryClass>> fClasses;
  std::vector<boost::shared_ptr<TMemoryInstance>> fInstances;
  unsigned int fQualifiers = 0;
};

}  // namespace

boost::shared_ptr<TMemoryNamespace> RandomNamespace(unsigned int seed) { return TRandom(seed).Make(); }

}  // namespace NQRVZEP20
