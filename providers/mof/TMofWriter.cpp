// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofWriter.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TZEPException.h"
#include "providers/memory/CIMNames.h"
#include "providers/memory/CIMTypes.h"
#include "providers/mof/MofLayout.h"
#include "providers/mof/MofValues.h"

#include <map>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;
using TStaticValues = std::map<std::string, TCIMValue>;  // by lower-case name

TCIMContext const kNone;

std::vector<std::string> ScopeWords(unsigned int scope) {
  constexpr char const* kWords[] = {"class", "association", "indication", "property", "reference", "method", "parameter"};
  if (scope == ICIMQualifierDecl::kScopeAny) return {"any"};
  std::vector<std::string> words;
  for (unsigned int bit = 0; bit < std::size(kWords); ++bit)
    if ((scope & 1u << bit) != 0) words.emplace_back(kWords[bit]);
  return words;
}

std::string FlavorText(unsigned int flavor, char const* between) {
  std::string text = (flavor & ICIMQualifierDecl::kFlavorEnableOverride) != 0 ? "EnableOverride" : "DisableOverride";
  text += between;
  text += (flavor & ICIMQualifierDecl::kFlavorToSubclass) != 0 ? "ToSubclass" : "Restricted";
  if ((flavor & ICIMQualifierDecl::kFlavorTranslatable) != 0) text += std::string(between) + "Translatable";
  return text;
}

// "[4]", "[]" or nothing.
std::string ArrayMark(TType type, unsigned int maxArraySize) {
  if (!IsArrayType(type)) return "";
  return "[" + (maxArraySize != 0 ? std::to_string(maxArraySize) : "") + "]";
}

std::string TypeText(TType type, std::string const& referencedClass) {
  if (BaseTypeOf(type) != TType::kCIMTypeReference) return type.ToString();
  TType const sameName(referencedClass);  // a class with the name of a type would be read as the type
  if (referencedClass.empty() || HasTypeName(sameName)) ThrowUnprintable();
  return referencedClass + " REF";
}

std::string ReferencedClassOf(TCIMValue const& value) {
  boost::shared_ptr<ICIMClass> const cls = value.GetReferencedClass();
  return cls ? cls->GetName(kNone) : "";
}

bool IsTrue(TCIMValue const& value) {
  return value.GetType() == TType::kCIMTypeBoolean && !value.IsNull() && value.operator bool();
}

std::string QualifierText(ICIMQualifier const& qualifier, std::size_t indent) {
  std::string const name = qualifier.GetName(kNone);
  TCIMValue const value = qualifier.GetValue(kNone);
  unsigned int const flavor = qualifier.GetFlavor(kNone);
  std::string text = name;
  if (value.IsArray() && !value.IsNull())
    text += " " + MofValueText(value, indent + name.size() + 1, indent + 4);
  else if (!IsTrue(value))
    text += "(" + MofValueText(value, indent + name.size() + 1, indent + 4) + ")";
  if (flavor != qualifier.GetDeclaration(kNone)->GetFlavor(kNone)) text += " : " + FlavorText(flavor, " ");
  return text;
}

TStaticValues StaticValuesOf(ICIMClass const& cls) {
  TStaticValues values;
  cls.EnumerateStaticProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        TCIMValue const value = property->GetValue(kNone);
        if (!value.IsNull()) values.emplace(FoldName(property->GetName(kNone)), value);
        return true;
      },
      kNone);
  return values;
}

bool IsStatic(ICIMPropertyDecl const& property) {
  boost::shared_ptr<ICIMQualifier> const qualifier = property.GetQualifier("Static", kNone);
  return qualifier && IsTrue(qualifier->GetValue(kNone));
}

// The initial value of a property: its static value, which is removed from `statics`, or its default.
TCIMValue TakeInitialValue(ICIMPropertyDecl const& property, TStaticValues& statics) {
  TCIMValue const defaultValue = property.GetDefaultValue(kNone);
  auto const found = statics.find(FoldName(property.GetName(kNone)));
  bool const hasStaticValue = found != statics.end();
  if (IsStatic(property) ? !defaultValue.IsNull() : hasStaticValue) ThrowUnprintable();
  if (!hasStaticValue) return defaultValue;
  TCIMValue const value = found->second;
  statics.erase(found);
  return value;
}

}  // namespace

void TMofWriter::WriteQualifierDecl(ICIMQualifierDecl const& decl) {
  TType const type = decl.GetType(kNone);
  TCIMValue const value = decl.GetDefaultValue(kNone);
  fText += "Qualifier " + decl.GetName(kNone) + " : " + type.ToString() + ArrayMark(type, value.GetMaxArraySize());
  if (!value.IsNull()) fText += " = " + MofValueText(value, 0, 4);
  fText += ",\n    Scope(" + MofList(ScopeWords(decl.GetScope(kNone)), 10, 10) + ")";
  fText += ",\n    Flavor(" + FlavorText(decl.GetFlavor(kNone), ", ") + ");\n\n";
}

void TMofWriter::WriteClass(ICIMClass const& cls) {
  WriteQualifiers(cls, 0);
  fText += "class " + cls.GetName(kNone);
  if (!cls.IsRootClass(kNone)) fText += " : " + cls.GetSuperClass(kNone)->GetName(kNone);
  fText += " {\n";
  TStaticValues statics = StaticValuesOf(cls);
  cls.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> property) {
        WriteProperty(*property, TakeInitialValue(*property, statics));
        return true;
      },
      kNone);
  if (!statics.empty()) ThrowUnprintable();
  cls.EnumerateMethodDecls(
      [&](boost::shared_ptr<ICIMMethodDecl> method) {
        WriteMethod(*method);
        return true;
      },
      kNone);
  fText += "};\n\n";
}

void TMofWriter::WriteQualifiers(ICIMNamedElement const& element, std::size_t indent) {
  std::vector<std::string> items;
  element.EnumerateQualifiers(
      [&](boost::shared_ptr<ICIMQualifier> qualifier) {
        items.push_back(QualifierText(*qualifier, indent + 1));
        return true;
      },
      kNone);
  if (!items.empty()) fText += std::string(indent, ' ') + "[" + MofList(items, indent + 1, indent + 1) + "]\n";
}

void TMofWriter::WriteProperty(ICIMPropertyDecl const& property, TCIMValue const& initial) {
  fText += "\n";
  WriteQualifiers(property, 2);
  TType const type = property.GetType(kNone);
  if (type == ArrayOf(TType::kCIMTypeReference)) ThrowUnprintable();
  std::string const head = "  " + TypeText(type, ReferencedClassOf(initial)) + " " + property.GetName(kNone) +
                           ArrayMark(type, initial.GetMaxArraySize());
  fText += head;
  if (!initial.IsNull()) fText += " = " + MofValueText(initial, head.size() + 3, 6);
  fText += ";\n";
}

void TMofWriter::WriteMethod(ICIMMethodDecl const& method) {
  fText += "\n";
  WriteQualifiers(method, 2);
  TType const type = method.GetReturnType(kNone);
  if (type == TType::kCIMTypeReference) ThrowUnprintable();
  fText += "  " + type.ToString() + " " + method.GetName(kNone) + "(";
  char const* before = "\n";
  method.EnumerateParameterDecls(
      [&](boost::shared_ptr<ICIMParameterDecl> parameter) {
        fText += before;
        WriteParameter(*parameter);
        before = ",\n";
        return true;
      },
      kNone);
  fText += ");\n";
}

void TMofWriter::WriteParameter(ICIMParameterDecl const& parameter) {
  WriteQualifiers(parameter, 4);
  TType const type = parameter.GetType(kNone);
  fText += "    " + TypeText(type, parameter.GetReferencedClassName(kNone)) + " " + parameter.GetName(kNone) +
           ArrayMark(type, parameter.GetMaxArraySize(kNone));
}

void TMofWriter::WriteInstance(ICIMInstance const& instance) {
  fText += "instance of " + instance.GetClass(kNone)->GetName(kNone) + " {\n";
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        TCIMValue const value = property->GetValue(kNone);
        bool const isPlainNull = value.IsNull() && property->GetDeclaration(kNone)->GetDefaultValue(kNone).IsNull();
        std::string const head = "  " + property->GetName(kNone) + " = ";
        if (!isPlainNull) fText += head + MofValueText(value, head.size(), 6) + ";\n";
        return true;
      },
      kNone);
  fText += "};\n\n";
}

}  // namespace NQRVZEP20
