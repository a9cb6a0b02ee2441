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

// Declares the contents of a document in a namespace. All classes are created before the first property is declared, so that a
// reference may name a later class. Throws TMofError for a declaration that is invalid or that the namespace refuses.
class TMofBuilder {
public:
  TMofBuilder(TMofDocument const& document, boost::shared_ptr<ICIMNamespace> ns) : fDocument(document), fNamespace(ns) {}

  void Build();

private:
  // A qualifier declaration, and its properties, which are read from the namespace only once.
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
  TDeclaredQualifier const& Declared(TMofSpan const& name);
  boost::shared_ptr<ICIMClass> FindClass(TMofSpan const& name) const;
  TCIMValue NullOfProperty(TMofType const& type) const;

  TMofDocument const& fDocument;
  boost::shared_ptr<ICIMNamespace> fNamespace;
  std::unordered_map<std::string_view, TDeclaredQualifier> fDeclared;  // by name, in the spelling of its use
};

}  // namespace NQRVZEP20
