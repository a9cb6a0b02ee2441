// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofBuilder.h"

#include "ICIMClass.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMPropertyDecl.h"
#include "TZEPException.h"
#include "providers/memory/CIMNames.h"
#include "providers/memory/CIMTypes.h"
#include "providers/mof/MofRefusal.h"
#include "providers/mof/MofValues.h"
#include "providers/mof/TMofInstances.h"
#include "providers/mof/TMofParser.h"

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

TCIMContext const kNone;

}  // namespace

void TMofBuilder::Build() {
  for (TMofQualifierDecl const& decl : fDocument.fQualifierDecls) DeclareQualifier(decl);
  std::vector<boost::shared_ptr<ICIMClass>> made;
  made.reserve(fDocument.fClasses.size());
  for (TMofClassText const& cls : fDocument.fClasses)
    made.push_back(CreateClass(TMofParser(*cls.fFile, cls.fKeyword).ParseClassHead()));
  for (std::size_t at = 0; at < made.size(); ++at) {
    TMofClassText const& cls = fDocument.fClasses[at];
    DescribeClass(TMofParser(*cls.fFile, cls.fStart).ParseClass(), *made[at]);
  }
  TMofInstances(fDocument, fNamespace).Build();
}

void TMofBuilder::DeclareQualifier(TMofQualifierDecl const& decl) {
  TCIMValue value(decl.fType.fType, decl.fType.fMaxArraySize);
  if (decl.fValue) value = ReadMofValue(*decl.fValue, decl.fType.fType, decl.fType.fMaxArraySize, fNamespace);
  AtPlace(decl.fName, kZEPStatusAlreadyExists, "is declared already",
          [&] { fNamespace->CreateQualifierDecl(NameAt(decl.fName), value, decl.fScope, decl.fFlavor, kNone); });
}

boost::shared_ptr<ICIMClass> TMofBuilder::CreateClass(TMofClass const& cls) {
  boost::shared_ptr<ICIMClass> superClass;
  if (!cls.fSuperClass.fText.empty())
    superClass = AtPlace(cls.fSuperClass, kZEPStatusNotFound, "is the superclass, and is not declared above",
                         [&] { return fNamespace->GetClass(NameAt(cls.fSuperClass), kNone); });
  return AtPlace(cls.fName, kZEPStatusAlreadyExists, "is declared already",
                 [&] { return fNamespace->CreateClass(superClass, NameAt(cls.fName), kNone); });
}

void TMofBuilder::DescribeClass(TMofClass const& cls, ICIMClass& made) {
  AddQualifiers(cls.fQualifiers, made);
  for (TMofFeature const& feature : cls.fFeatures) feature.fIsMethod ? AddMethod(feature, made) : AddProperty(feature, made);
}

void TMofBuilder::AddProperty(TMofFeature const& property, ICIMClass& cls) {
  TCIMValue value = NullOfProperty(property.fType);
  TCIMValue staticValue;
  if (property.fDefault) {
    TCIMValue const written = ReadMofValue(*property.fDefault, property.fType.fType, property.fType.fMaxArraySize, fNamespace);
    if (written.IsReference() && !written.IsNull() && written.GetReferencedClass() != value.GetReferencedClass())
      throw TMofError(property.fDefault->fPlace, "expected an object of the class itself that the reference refers to");
    TCIMValue& target = HasStatic(property.fQualifiers) ? staticValue : value;
    if (!written.IsNull()) target = TCIMValue(written);
  }
  auto const made = AtPlace(property.fName, kZEPStatusAlreadyExists, "is declared already in this class",
                            [&] { return cls.AddPropertyDecl(NameAt(property.fName), value, kNone); });
  AddQualifiers(property.fQualifiers, *made);
  if (!staticValue.IsNull())
    AtPlace(property.fName, kZEPStatusOK, "", [&] { cls.SetStaticProperty(NameAt(property.fName), staticValue, kNone); });
}

void TMofBuilder::AddMethod(TMofFeature const& method, ICIMClass& cls) {
  if (method.fType.fType == TType::kCIMTypeReference || IsArrayType(method.fType.fType))
    throw TMofError(method.fName, "a method returns neither a reference nor an array");
  auto const made = AtPlace(method.fName, kZEPStatusAlreadyExists, "is declared already in this class",
                            [&] { return cls.AddMethodDecl(NameAt(method.fName), method.fType.fType, kNone); });
  AddQualifiers(method.fQualifiers, *made);
  for (TMofParameter const& parameter : method.fParameters) AddParameter(parameter, *made);
}

void TMofBuilder::AddParameter(TMofParameter const& parameter, ICIMMethodDecl& method) {
  TMofType const& type = parameter.fType;
  std::string className;
  if (BaseTypeOf(type.fType) == TType::kCIMTypeReference) className = FindClass(type.fReferencedClass)->GetName(kNone);
  auto const made = AtPlace(parameter.fName, kZEPStatusAlreadyExists, "is declared already in this method", [&] {
    return method.AddParameterDecl(NameAt(parameter.fName), type.fType, type.fMaxArraySize, className, kNone);
  });
  AddQualifiers(parameter.fQualifiers, *made);
}

void TMofBuilder::AddQualifiers(TMofQualifiers const& qualifiers, ICIMNamedElement& element) {
  for (TMofQualifier const& qualifier : qualifiers) {
    TDeclaredQualifier const& declared = Declared(qualifier.fName);
    TCIMValue const value = ValueOf(qualifier, declared);
    AtPlace(qualifier.fName, kZEPStatusAlreadyExists, "is written twice here",
            [&] { element.AddQualifier(declared.fDecl, value, qualifier.fFlavor.value_or(declared.fFlavor), kNone); });
  }
}

// Without a value a boolean is true, and anything else the declared default.
TCIMValue TMofBuilder::ValueOf(TMofQualifier const& qualifier, TDeclaredQualifier const& declared) const {
  if (qualifier.fValue) return ReadMofValue(*qualifier.fValue, declared.fType, declared.fDefault.GetMaxArraySize(), fNamespace);
  return declared.fType == TType::kCIMTypeBoolean ? TCIMValue(true) : declared.fDefault;
}

TMofBuilder::TDeclaredQualifier const& TMofBuilder::Declared(TMofPlace const& name) {
  auto const found = fDeclared.find(name.fText);
  if (found != fDeclared.end()) return found->second;
  auto const decl = AtPlace(name, kZEPStatusNotFound, "is no qualifier that is declared", [&] {
    boost::shared_ptr<ICIMQualifierDecl> const named = fNamespace->GetQualifierDecl(NameAt(name), kNone);
    if (!named) throw TZEPException(kZEPStatusNotFound);
    return named;
  });
  TDeclaredQualifier const declared{decl, decl->GetType(kNone), decl->GetDefaultValue(kNone), decl->GetFlavor(kNone)};
  return fDeclared.emplace(name.fText, declared).first->second;
}

boost::shared_ptr<ICIMClass> TMofBuilder::FindClass(TMofPlace const& name) const {
  return AtPlace(name, kZEPStatusNotFound, "is no class that is declared",
                 [&] { return fNamespace->GetClass(NameAt(name), kNone); });
}

// Whether they make the value of a property one of the class.
bool TMofBuilder::HasStatic(TMofQualifiers const& qualifiers) {
  for (TMofQualifier const& qualifier : qualifiers)
    if (IsSameName(qualifier.fName.fText, "Static")) return ValueOf(qualifier, Declared(qualifier.fName)) == TCIMValue(true);
  return false;
}

TCIMValue TMofBuilder::NullOfProperty(TMofType const& type) const {
  TCIMValue null(type.fType, type.fMaxArraySize);
  if (BaseTypeOf(type.fType) != TType::kCIMTypeReference) return null;
  if (IsArrayType(type.fType)) throw TMofError(type.fReferencedClass, "a property cannot be an array of references");
  null.SetReferencedClass(FindClass(type.fReferencedClass));
  return null;
}

}  // namespace NQRVZEP20
