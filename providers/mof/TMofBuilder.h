// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ICIMNamespace.h"
#include "providers/mof/MofTree.h"

#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

class ICIMMethodDecl;
class ICIMNamedElement;
class ICIMQualifierDecl;

// Declares in a namespace what a document holds. All classes are made before any property is declared, so that references
// may lead forward. Throws TMofError for what makes no sense and what the namespace refuses.
class TMofBuilder {
public:
  TMofBuilder(TMofDocument const& document, boost::shared_ptr<ICIMNamespace> ns) : fDocument(document), fNamespace(ns) {}

  void Build();

private:
  // A qualifier declaration as it is asked for once for each use.
  struct TDeclaredQualifier {
    boost::shared_ptr<ICIMQualifierDecl> fDecl;
    TCIMValue::TCIMType fType;
    TCIMValue fDefault;
    unsigned int fFlavor;
  };

  void DeclareQualifier(TMofQualifierDecl const& decl);
  boost::shared_ptr<ICIMClass> CreateClass(TMofClass const& cls);
  void DescribeClass(TMofClass const& cls, ICIMClass& made);
  void AddProperty(TMofFeature const& property, ICIMClass& cls);
  void AddMethod(TMofFeature const& method, ICIMClass& cls);
  void AddParameter(TMofParameter const& parameter, ICIMMethodDecl& method);
  void AddQualifiers(TMofQualifiers const& qualifiers, ICIMNamedElement& element);
  TCIMValue ValueOf(TMofQualifier const& qualifier, TDeclaredQualifier const& declared) const;
  bool HasStatic(TMofQualifiers const& qualifiers);
  TDeclaredQualifier const& Declared(TMofPlace const& name);
  boost::shared_ptr<ICIMClass> FindClass(TMofPlace const& name) const;
  TCIMValue NullOfProperty(TMofType const& type) const;

  TMofDocument const& fDocument;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::unordered_map<std::string_view, TDeclaredQualifier> fDeclared;  // by name, as it is spelled where it is used
};

}  // namespace NQRVZEP20
