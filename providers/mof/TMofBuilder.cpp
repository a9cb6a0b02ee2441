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
  StepAt(decl.fName, kZEPStatusAlreadyExists, "is already declared",
         [&] { fNamespace->CreateQualifierDecl(TextAt(decl.fName), value, decl.fScope, decl.fFlavor, kNone); });
}

boost::shared_ptr<ICIMClass> TMofBuilder::CreateClass(TMofClass const& cls) {
  boost::shared_ptr<ICIMClass> superClass;
  if (!cls.fSuperClass.fText.empty())
    superClass = StepAt(cls.fSuperClass, kZEPStatusNotFound, "is not declared: a superclass must come before its subclasses",
                        [&] { return fNamespace->GetClass(TextAt(cls.fSuperClass), kNone); });
  return StepAt(cls.fName, kZEPStatusAlreadyExists, "is already declared",
                [&] { return fNamespace->CreateClass(superClass, TextAt(cls.fName), kNone); });
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
      throw TMofError(property.fDefault->fSpan, "expected the path of an object of exactly the class that the reference names");
    TCIMValue& target = HasStatic(property.fQualifiers) ? staticValue : value;
    if (!written.IsNull()) target = TCIMValue(written);
  }
  auto const made = StepAt(property.fName, kZEPStatusAlreadyExists, "is already declared in this class",
                           [&] { return cls.AddPropertyDecl(TextAt(property.fName), value, kNone); });
  AddQualifiers(property.fQualifiers, *made);
  if (!staticValue.IsNull())
    StepAt(property.fName, kZEPStatusOK, "", [&] { cls.SetStaticProperty(TextAt(property.fName), staticValue, kNone); });
}

void TMofBuilder::AddMethod(TMofFeature const& method, ICIMClass& cls) {
  if (method.fType.fType == TType::kCIMTypeReference || IsArrayType(method.fType.fType))
    throw TMofError(method.fName, "a method cannot return a reference or an array");
  auto const made = StepAt(method.fName, kZEPStatusAlreadyExists, "is already declared in this class",
                           [&] { return cls.AddMethodDecl(TextAt(method.fName), method.fType.fType, kNone); });
  AddQualifiers(method.fQualifiers, *made);
  for (TMofParameter const& parameter : method.fParameters) AddParameter(parameter, *made);
}

void TMofBuilder::AddParameter(TMofParameter const& parameter, ICIMMethodDecl& method) {
  TMofType const& type = parameter.fType;
  std::string className;
  if (BaseTypeOf(type.fType) == TType::kCIMTypeReference) className = FindClass(type.fReferencedClass)->GetName(kNone);
  auto const made = StepAt(parameter.fName, kZEPStatusAlreadyExists, "is already declared in this method", [&] {
    return method.AddParameterDecl(TextAt(parameter.fName), type.fType, type.fMaxArraySize, className, kNone);
  });
  AddQualifiers(parameter.fQualifiers, *made);
}

void TMofBuilder::AddQualifiers(TMofQualifiers const& qualifiers, ICIMNamedElement& element) {
  for (TMofQualifier const& qualifier : qualifiers) {
    TDeclaredQualifier const& declared = Declared(qualifier.fName);
    TCIMValue const value = ValueOf(qualifier, declared);
    StepAt(qualifier.fName, kZEPStatusAlreadyExists, "is given twice",
           [&] { element.AddQualifier(declared.fDecl, value, qualifier.fFlavor.value_or(declared.fFlavor), kNone); });
  }
}

// A qualifier without value is true if it is boolean; otherwise it has the declared default.
TCIMValue TMofBuilder::ValueOf(TMofQualifier const& qualifier, TDeclaredQualifier const& declared) const {
  if (qualifier.fValue) return ReadMofValue(*qualifier.fValue, declared.fType, declared.fDefault.GetMaxArraySize(), fNamespace);
  return declared.fType == TType::kCIMTypeBoolean ? TCIMValue(true) : declared.fDefault;
}

TMofBuilder::TDeclaredQualifier const& TMofBuilder::Declared(TMofSpan const& name) {
  auto const found = fDeclared.find(name.fText);
  if (found != fDeclared.end()) return found->second;
  auto const decl = StepAt(name, kZEPStatusNotFound, "is not a declared qualifier", [&] {
    boost::shared_ptr<ICIMQualifierDecl> const named = fNamespace->GetQualifierDecl(TextAt(name), kNone);
    if (!named) throw TZEPException(kZEPStatusNotFound);
    return named;
  });
  TDeclaredQualifier const declared{decl, decl->GetType(kNone), decl->GetDefaultValue(kNone), decl->GetFlavor(kNone)};
  return fDeclared.emplace(name.fText, declared).first->second;
}

boost::shared_ptr<ICIMClass> TMofBuilder::FindClass(TMofSpan const& name) const {
  return StepAt(name, kZEPStatusNotFound, "is not a declared class", [&] { return fNamespace->GetClass(TextAt(name), kNone); });
}

// Whether the qualifiers make a property static.
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
