// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/check/Content.h"

#include "CIMNames.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "KeyText.h"
#include "TCIMReference.h"
#include "collect/ClassTree.h"
#include "collect/FailureOf.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>

namespace NQRVZEP20::zep {

namespace {

TCIMContext const kNone;

class TReader {
public:
  explicit TReader(TNamespaceView const& view) : fView(view) {}

  TContent Read() {
    fContent.fProvider = fView.GetProviderName();
    Try(fContent.fProvider, "the name of the namespace", [&] { fContent.fNamespace = fView.GetName(); });
    Try(fContent.fNamespace, "the enumeration of the classes", [&] { ReadClasses(); });
    return std::move(fContent);
  }

private:
  // Whether the step succeeded; otherwise adds a failure.
  template <class TStep>
  bool Try(std::string const& place, std::string const& what, TStep step) {
    std::string const failure = FailureOf(step);
    if (!failure.empty()) fContent.fFailures.push_back({place, what + " throws: " + MessageWithoutSecrets(failure), ""});
    return failure.empty();
  }

  void ReadClasses() {
    for (TClassEntry const& entry : ClassesOf(*fView.Get())) {
      Try(entry.fName, "the class", [&] { fContent.fClasses.push_back(ContentOf(*entry.fClass)); });
      if (entry.fSuperClass.empty()) Try(entry.fName, "the enumeration of the instances", [&] { ReadInstances(*entry.fClass); });
    }
  }

  void ReadInstances(ICIMClass const& root) {
    root.EnumerateInstances(
        [&](boost::shared_ptr<ICIMInstance> const& instance) {
          TInstanceContent content;
          std::string const number = std::to_string(fContent.fInstances.size() + 1);
          if (Try("instance " + number, "its class", [&] { content.fClass = instance->GetClass(kNone)->GetName(kNone); }) &&
              Try(content.fClass, "the path of an instance", [&] { ReadPath(*instance, content); })) {
            Try(content.fPath, "the enumeration of the properties", [&] { ReadProperties(*instance, content); });
            fContent.fInstances.push_back(std::move(content));
          }
          return true;
        },
        kNone);
  }

  void ReadPath(ICIMInstance const& instance, TInstanceContent& content) {
    content.fHasKeys = !KeyText(instance.GetPath(kNone)).empty();
    content.fPath = fView.PathOf(instance);
  }

  void ReadProperties(ICIMInstance const& instance, TInstanceContent& content) {
    instance.EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> const& property) {
          TPropertyContent of{property->GetName(kNone), {}, false};
          if (Try(content.fPath + "." + of.fName, "the value", [&] { of.fValue = property->GetValue(kNone); }) &&
              Try(content.fPath + "." + of.fName, "the declaration",
                  [&] { of.fIsKey = property->GetDeclaration(kNone)->IsKey(kNone); }))
            content.fProperties.push_back(std::move(of));
          return true;
        },
        kNone);
  }

  TNamespaceView const& fView;
  TContent fContent;
};

void AddDeclarations(ICIMClass const& cls, std::vector<TDeclaration>& declarations) {
  cls.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> const& decl) {
        std::string const name = decl->GetName(kNone);
        auto const isSame = [&](TDeclaration const& known) { return IsSameName(known.fName, name); };
        if (std::none_of(declarations.begin(), declarations.end(), isSame))
          declarations.push_back({name, decl->GetType(kNone), decl->IsKey(kNone)});
        return true;
      },
      kNone);
}

using TDeclaredValues = std::vector<TDeclaredValue>;

void AddQualifiers(ICIMNamedElement const& element, std::string const& place, TDeclaredValues& values) {
  element.EnumerateQualifiers(
      [&](boost::shared_ptr<ICIMQualifier> const& qualifier) {
        values.push_back({place + ", qualifier " + qualifier->GetName(kNone), qualifier->GetValue(kNone)});
        return true;
      },
      kNone);
}

void AddValuesOfProperties(ICIMClass const& cls, std::string const& place, TDeclaredValues& values) {
  cls.EnumeratePropertyDecls(
      [&](boost::shared_ptr<ICIMPropertyDecl> const& decl) {
        std::string const placeOfDecl = place + "." + decl->GetName(kNone);
        values.push_back({placeOfDecl + ", default value", decl->GetDefaultValue(kNone)});
        AddQualifiers(*decl, placeOfDecl, values);
        return true;
      },
      kNone);
}

// Of the class itself, without superclasses, as every other declared value.
void AddValuesOfStaticProperties(ICIMClass const& cls, std::string const& place, TDeclaredValues& values) {
  cls.EnumerateStaticProperties(
      [&](boost::shared_ptr<ICIMProperty> const& property) {
        values.push_back({place + "." + property->GetName(kNone) + ", static value", property->GetValue(kNone)});
        return true;
      },
      kNone);
}

void AddValuesOfMethods(ICIMClass const& cls, std::string const& place, TDeclaredValues& values) {
  cls.EnumerateMethodDecls(
      [&](boost::shared_ptr<ICIMMethodDecl> const& decl) {
        std::string const placeOfDecl = place + "." + decl->GetName(kNone) + "()";
        AddQualifiers(*decl, placeOfDecl, values);
        decl->EnumerateParameterDecls(
            [&](boost::shared_ptr<ICIMParameterDecl> const& parameter) {
              AddQualifiers(*parameter, placeOfDecl + ", parameter " + parameter->GetName(kNone), values);
              return true;
            },
            kNone);
        return true;
      },
      kNone);
}

TDeclaredValues DeclaredValuesOf(ICIMClass const& cls) {
  TDeclaredValues values;
  std::string const place = cls.GetName(kNone);
  AddQualifiers(cls, place, values);
  AddValuesOfProperties(cls, place, values);
  AddValuesOfStaticProperties(cls, place, values);
  AddValuesOfMethods(cls, place, values);
  return values;
}

}  // namespace

TDeclaration const* FindDeclaration(TClassContent const& cls, std::string const& name) {
  auto const found = std::find_if(cls.fDeclarations.begin(), cls.fDeclarations.end(),
                                  [&](TDeclaration const& declaration) { return IsSameName(declaration.fName, name); });
  return found == cls.fDeclarations.end() ? nullptr : &*found;
}

TClassContent ContentOf(ICIMClass const& cls) {
  TClassContent content{cls.GetName(kNone), {}, {}, cls.IsAbstract(kNone), DeclaredValuesOf(cls)};
  AddDeclarations(cls, content.fDeclarations);
  for (auto super = cls.GetSuperClass(kNone); super; super = super->GetSuperClass(kNone)) {
    content.fSuperClasses.push_back(super->GetName(kNone));
    AddDeclarations(*super, content.fDeclarations);
  }
  return content;
}

TContent ContentOf(TNamespaceView const& view) { return TReader(view).Read(); }

}  // namespace NQRVZEP20::zep
