// SPDX-License-Identifier: Apache-2.0
#include "tests/collect/answer/DumpOf.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TZEPFailure.h"

#include <cstdint>
#include <cstring>
#include <sstream>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;
TCIMContext const kNone;

template <class TWork>
std::string TextOrFailure(TWork work) {
  try {
    return work();
  } catch (TZEPFailure const& failure) {
    return std::string("throws ") + failure.what() + " (" + failure.Reason() + ")";
  } catch (std::exception const& failure) {
    return std::string("throws ") + failure.what();
  } catch (...) {
    return "throws something else";
  }
}

std::string Quoted(std::string const& text) { return "\"" + std::to_string(text.size()) + ":" + text + "\""; }

template <class TBits, class TNumber>
std::string BitsOf(TNumber number) {
  TBits bits;
  static_assert(sizeof bits == sizeof number);
  std::memcpy(&bits, &number, sizeof bits);
  return std::to_string(bits);
}

std::string NameOf(boost::shared_ptr<ICIMClass> const& cls) { return cls ? "class " + cls->GetName(kNone) : "no class"; }

std::string DumpOf(TCIMDateTime const& time) {
  std::ostringstream text;
  text << time.IsNull() << time.IsInterval() << time.GetPrecision() << ' ' << time.GetYear() << ' ' << time.GetMonth() << ' '
       << time.GetDay() << ' ' << time.GetHour() << ' ' << time.GetMinute() << ' ' << time.GetSecond() << ' '
       << time.GetMicroSeconds() << ' ' << time.GetUTCOffset();
  return text.str();
}

std::string DataOf(TCIMValue const& value) {
  if (value.IsArray()) {
    std::string text = "[";
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value)) text += NQRVZEP20::DumpOf(element) + ", ";
    return text + "]";
  }
  switch (value.GetType()) {
    case TType::kCIMTypeReal32:
      return BitsOf<std::uint32_t>(value.operator float());
    case TType::kCIMTypeReal64:
      return BitsOf<std::uint64_t>(value.operator double());
    case TType::kCIMTypeDateTime:
      return DumpOf(value.operator TCIMDateTime());
    case TType::kCIMTypeReference:
      return NQRVZEP20::DumpOf(value.operator TCIMReference());
    case TType::kCIMTypeString:
      return Quoted(value);
    default:
      return TextOrFailure([&] { return value.ToString(); });
  }
}

// Writes a line for each element, indented below the element that it belongs to.
class TDump {
public:
  std::string Of(ICIMNamespace const& ns) {
    Line("namespace " + Quoted(ns.GetName(kNone)));
    Enumerate([&] {
      ns.EnumerateQualifierDecls([&](boost::shared_ptr<ICIMQualifierDecl> decl) { return QualifierDecl(ns, *decl); }, kNone);
    });
    Enumerate([&] {
      ns.EnumerateClasses(
          [&](boost::shared_ptr<ICIMClass> root) {
            Class(ns, *root);
            root->EnumerateSubClasses([&](boost::shared_ptr<ICIMClass> cls) { return Class(ns, *cls); }, kNone);
            return true;
          },
          kNone);
    });
    Line(TextOrFailure([&] { return NameOf(ns.GetClass("X_Unknown", kNone)); }));
    return fText.str();
  }

private:
  void Line(std::string const& text) { fText << text << '\n'; }

  template <class TEnumeration>
  void Enumerate(TEnumeration enumeration) {
    Line(TextOrFailure([&] {
      enumeration();
      return std::string("end");
    }));
  }

  bool QualifierDecl(ICIMNamespace const& ns, ICIMQualifierDecl const& decl) {
    std::string const name = decl.GetName(kNone);
    Line("qualifier declaration " + name + " " + std::to_string(decl.GetType(kNone)) + " " +
         std::to_string(decl.GetScope(kNone)) + " " + std::to_string(decl.GetFlavor(kNone)) + " " +
         NQRVZEP20::DumpOf(decl.GetDefaultValue(kNone)) + (ns.GetQualifierDecl(name, kNone).get() == &decl ? "" : " not found"));
    return true;
  }

  void Qualifiers(ICIMNamedElement const& element) {
    element.EnumerateQualifiers(
        [&](boost::shared_ptr<ICIMQualifier> qualifier) {
          std::string const name = qualifier->GetName(kNone);
          auto const decl = qualifier->GetDeclaration(kNone);
          Line("  qualifier " + name + " " + std::to_string(qualifier->GetFlavor(kNone)) + " " +
               NQRVZEP20::DumpOf(qualifier->GetValue(kNone)) + (decl ? " of " + decl->GetName(kNone) : "") +
               (qualifier->GetOwner(kNone).lock().get() == &element ? "" : " of another element") +
               (element.GetQualifier(name, kNone) == qualifier ? "" : " not found"));
          return true;
        },
        kNone);
  }

  bool Class(ICIMNamespace const& ns, ICIMClass const& cls) {
    std::string const name = cls.GetName(kNone);
    Line("class " + name + " : " + NameOf(cls.GetSuperClass(kNone)) + (cls.GetClassFlag(kNone) ? " association" : "") +
         (cls.IsAbstract(kNone) ? " abstract" : "") + (cls.IsRootClass(kNone) ? " root" : "") +
         (cls.GetNamespace(kNone).get() == &ns ? "" : " of another namespace"));
    Line(TextOrFailure([&] { return ns.GetClass(name, kNone).get() == &cls ? "found" : "another is found"; }));
    Qualifiers(cls);
    Enumerate([&] {
      cls.EnumerateSubClasses(
          [&](boost::shared_ptr<ICIMClass> below) {
            Line(" below it: " + below->GetName(kNone));
            return true;
          },
          kNone);
    });
    Enumerate([&] {
      cls.EnumeratePropertyDecls([&](boost::shared_ptr<ICIMPropertyDecl> decl) { return PropertyDecl(cls, *decl); }, kNone);
    });
    Enumerate([&] {
      cls.EnumerateStaticProperties([&](boost::shared_ptr<ICIMProperty> property) { return Property(*property); }, kNone);
    });
    Enumerate(
        [&] { cls.EnumerateMethodDecls([&](boost::shared_ptr<ICIMMethodDecl> method) { return Method(cls, *method); }, kNone); });
    Enumerate(
        [&] { cls.EnumerateInstances([&](boost::shared_ptr<ICIMInstance> instance) { return Instance(ns, instance); }, kNone); });
    return true;
  }

  bool PropertyDecl(ICIMClass const& cls, ICIMPropertyDecl const& decl) {
    std::string const name = decl.GetName(kNone);
    Line(" property " + name + " " + std::to_string(decl.GetType(kNone)) + " " + NQRVZEP20::DumpOf(decl.GetDefaultValue(kNone)) +
         " " + TextOrFailure([&] { return decl.IsKey(kNone) ? "key" : ""; }) +
         (decl.GetOwner(kNone).lock().get() == &cls ? "" : " of another class") +
         (cls.GetPropertyDecl(name, kNone).get() == &decl ? "" : " not found"));
    Qualifiers(decl);
    return true;
  }

  bool Property(ICIMProperty const& property) {
    auto const owner = TextOrFailure([&] {
      auto const decl = property.GetDeclaration(kNone);
      auto const cls = boost::dynamic_pointer_cast<ICIMClass>(decl->GetOwner(kNone).lock());
      return NameOf(cls) + "." + decl->GetName(kNone);
    });
    Line(" value " + property.GetName(kNone) + " of " + owner + ": " +
         TextOrFailure([&] { return NQRVZEP20::DumpOf(property.GetValue(kNone)); }));
    return true;
  }

  bool Method(ICIMClass const& cls, ICIMMethodDecl const& method) {
    Line(" method " + method.GetName(kNone) + " " + std::to_string(method.GetReturnType(kNone)) +
         (method.GetOwner(kNone).lock().get() == &cls ? "" : " of another class"));
    Qualifiers(method);
    method.EnumerateParameterDecls(
        [&](boost::shared_ptr<ICIMParameterDecl> parameter) {
          Line(" parameter " + parameter->GetName(kNone) + " " + std::to_string(parameter->GetType(kNone)) + " " +
               std::to_string(parameter->GetMaxArraySize(kNone)) + " " + parameter->GetReferencedClassName(kNone) +
               (parameter->GetMethod(kNone).lock().get() == &method ? "" : " of another method"));
          Qualifiers(*parameter);
          return true;
        },
        kNone);
    return true;
  }

  bool Instance(ICIMNamespace const& ns, boost::shared_ptr<ICIMInstance> const& instance) {
    Line(" instance of " + TextOrFailure([&] { return NameOf(instance->GetClass(kNone)); }) + " at " + TextOrFailure([&] {
           TCIMReference const path = instance->GetPath(kNone);
           auto const found = ns.GetInstance(path, kNone);
           return NQRVZEP20::DumpOf(path) + (found == instance ? " found" : found ? " another is found" : "");
         }));
    instance->EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> property) {
          auto const sameName = instance->GetProperty(property->GetName(kNone), kNone);
          if (!sameName) Line("  not found by its name:");
          return Property(*property);
        },
        kNone);
    if (instance->GetProperty("X_Unknown", kNone)) Line("  has a property that no class declares");
    return true;
  }

  std::ostringstream fText;
};

}  // namespace

std::string DumpOf(TCIMReference const& reference) {
  std::string text =
      (reference.GetNamespace() ? "" : "nowhere ") + Quoted(reference.GetNameSpaceName()) + " " + NameOf(reference.GetClass());
  reference.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    text += " " + Quoted(key.first) + "=" + DumpOf(key.second);
    return true;
  });
  return text;
}

std::string DumpOf(TCIMValue const& value) {
  std::string const tag = std::to_string(value.GetType()) + "/" + std::to_string(value.GetMaxArraySize()) + " ";
  if (value.IsNull()) return tag + "NULL" + (value.IsReference() ? " of " + NameOf(value.GetReferencedClass()) : "");
  return tag + DataOf(value);
}

std::string DumpOf(ICIMNamespace const& ns) { return TDump().Of(ns); }

}  // namespace NQRVZEP20
