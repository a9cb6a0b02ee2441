// SPDX-License-Identifier: Apache-2.0
#pragma once

// How the classes that a provider declares differ from the classes of the same name in a schema: that of the DMTF, with the MOF
// files of the providers.

#include "collect/TValueWords.h"
#include "tests/providers/memory/Collect.h"

#include <map>
#include <set>

namespace NQRVZEP20 {

class TSchemaComparison {
public:
  // Keeps references to both namespaces.
  TSchemaComparison(ICIMNamespace const& provider, ICIMNamespace const& schema) : fProvider(provider), fSchema(schema) {}

  // One line for each difference: "CIM_Chip.Capacity: type uint32, uint64 in the schema".
  std::vector<std::string> Differences() {
    for (auto const& root : All(fProvider, &ICIMNamespace::EnumerateClasses)) {
      CompareClass(*root);
      for (auto const& cls : All(*root, &ICIMClass::EnumerateSubClasses)) CompareClass(*cls);
    }
    return fDifferences;
  }

private:
  using TDecls = std::map<std::string, boost::shared_ptr<ICIMPropertyDecl const>>;

  static bool IsOfSchema(std::string const& className) {
    return className.rfind("CIM_", 0) == 0 || className.rfind("ZEP_", 0) == 0;
  }

  static std::string TextOf(ICIMPropertyDecl const& property, char const* qualifier) {
    auto const found = property.GetQualifier(qualifier, kNone);
    return found ? found->GetValue(kNone).ToString() : "";
  }

  // The name of each value.
  static std::map<std::string, std::string> NamesOf(ICIMPropertyDecl const& property) {
    auto const entries = TValueWords(property).Entries();
    return {entries.begin(), entries.end()};
  }

  // The properties of the class and its superclasses; those of the class itself come first.
  static TDecls DeclsOf(boost::shared_ptr<ICIMClass const> cls) {
    TDecls decls;
    for (; cls; cls = cls->GetSuperClass(kNone))
      for (auto const& property : All(*cls, &ICIMClass::EnumeratePropertyDecls))
        decls.emplace(property->GetName(kNone), property);
    return decls;
  }

  static std::set<std::string> KeysOf(TDecls const& decls) {
    std::set<std::string> keys;
    for (auto const& [name, decl] : decls)
      if (decl->IsKey(kNone)) keys.insert(name);
    return keys;
  }

  static std::string SuperClassOf(ICIMClass const& cls) {
    auto const superClass = cls.GetSuperClass(kNone);
    return superClass ? superClass->GetName(kNone) : "none";
  }

  void CompareClass(ICIMClass const& declared) {
    std::string const name = declared.GetName(kNone);
    if (!IsOfSchema(name)) return;
    boost::shared_ptr<ICIMClass> cls;
    try {
      cls = fSchema.GetClass(name, kNone);
    } catch (TZEPException const&) {
      return Add(name + ": not in the schema");
    }
    if (SuperClassOf(declared) != SuperClassOf(*cls)) Add(name + ": superclass " + SuperClassOf(declared));
    TDecls const ofSchema = DeclsOf(cls), ofProvider = DeclsOf(fProvider.GetClass(name, kNone));
    for (auto const& [propertyName, property] : ofProvider) {
      auto const found = ofSchema.find(propertyName);
      if (found == ofSchema.end())
        Add(name + "." + propertyName + ": not in the schema");
      else
        CompareProperty(name + "." + propertyName, *property, *found->second);
    }
    if (name.rfind("ZEP_", 0) == 0)
      for (auto const& property : All(*cls, &ICIMClass::EnumeratePropertyDecls))
        if (ofProvider.count(property->GetName(kNone)) == 0) Add(name + "." + property->GetName(kNone) + ": not declared");
    if (!ofProvider.empty() && KeysOf(ofProvider) != KeysOf(ofSchema)) Add(name + ": keys differ");
  }

  void CompareProperty(std::string const& place, ICIMPropertyDecl const& declared, ICIMPropertyDecl const& property) {
    std::string const type = declared.GetType(kNone).ToString(), expected = property.GetType(kNone).ToString();
    if (type != expected) Add(place + ": type " + type + ", " + expected + " in the schema");
    if (declared.IsKey(kNone) != property.IsKey(kNone)) Add(place + ": only one of the two is a key");
    if (!TextOf(property, "PUnit").empty() && TextOf(declared, "PUnit") != TextOf(property, "PUnit"))
      Add(place + ": unit \"" + TextOf(declared, "PUnit") + "\", \"" + TextOf(property, "PUnit") + "\" in the schema");

    auto const names = NamesOf(declared), all = NamesOf(property);
    if (names.empty() && !all.empty()) Add(place + ": no names of values");
    for (auto const& [value, word] : names) {
      auto const found = all.find(value);
      if (found == all.end() || found->second != word)
        Add(place + ": value " + value + " has another name than \"" + word + "\"");
    }
  }

  void Add(std::string const& difference) { fDifferences.push_back(difference); }

  ICIMNamespace const& fProvider;
  ICIMNamespace const& fSchema;
  std::vector<std::string> fDifferences;
};

}  // namespace NQRVZEP20
