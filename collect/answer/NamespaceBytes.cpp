// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/NamespaceBytes.h"

#include "CIMNames.h"
#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TByteWriter.h"
#include "collect/answer/TRecordedFailure.h"
#include "collect/answer/ValueBytes.h"

#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace NQRVZEP20 {

namespace {

using TClassPtr = boost::shared_ptr<ICIMClass>;
using TDeclPtr = boost::shared_ptr<ICIMPropertyDecl const>;

constexpr std::size_t kPieceBytes = 64 * 1024;
TCIMContext const kNone;

template <class TEnumerate>
std::optional<TRecordedFailure> FailureOfEnumeration(TEnumerate enumerate) {
  try {
    enumerate();
    return std::nullopt;
  } catch (...) {
    return TRecordedFailure::OfCurrentException();
  }
}

void WriteEnding(TByteWriter& writer, std::optional<TRecordedFailure> const& failure) {
  writer.Byte(failure ? 1 : 0);
  if (failure) failure->WriteTo(writer);
}

// A list whose length is known only at its end.
class TList {
public:
  TByteWriter& Next() {
    ++fCount;
    return fElements;
  }
  void WriteTo(TByteWriter& writer) const {
    writer.Number(fCount);
    writer.Raw(fElements.Bytes());
  }

private:
  TByteWriter fElements;
  std::uint64_t fCount = 0;
};

// The number of a property declaration in a class of that number.
struct TDeclNumber {
  std::size_t fClass, fDecl;
  bool operator==(TDeclNumber const& other) const { return fClass == other.fClass && fDecl == other.fDecl; }
};

// Every class of the namespace, each after its superclass, and their property declarations.
class TSchema {
public:
  explicit TSchema(ICIMNamespace const& ns) {
    fFailure = FailureOfEnumeration([&] {
      ns.EnumerateClasses(
          [&](TClassPtr root) {
            Add(root);
            root->EnumerateSubClasses([&](TClassPtr const& cls) { return Add(cls); }, kNone);
            return true;
          },
          kNone);
    });
  }

  std::vector<TClassPtr> const& Classes() const { return fClasses; }
  std::vector<TDeclPtr> const& DeclsOf(std::size_t cls) const { return fDecls[cls]; }
  TClassNumbers const& Numbers() const { return fNumbers; }
  std::optional<TRecordedFailure> const& Failure() const { return fFailure; }
  std::optional<std::size_t> const& SuperOf(std::size_t cls) const { return fSupers[cls]; }

  std::optional<std::size_t> NumberOf(ICIMClass const& cls) const {
    auto const known = fNumbersOfObjects.find(&cls);
    if (known != fNumbersOfObjects.end()) return known->second;
    auto const found = fNumbers.find(FoldName(cls.GetName(kNone)));
    return found == fNumbers.end() ? std::nullopt : std::optional(found->second);
  }

  // The declaration itself, or else that of its name in the class or the nearest one above it.
  std::optional<TDeclNumber> Find(TDeclPtr const& decl, std::string const& name, std::size_t cls) const {
    auto const known = fDeclNumbers.find(decl.get());
    if (known != fDeclNumbers.end()) return known->second;
    for (std::optional<std::size_t> at = cls; at; at = fSupers[*at])
      for (std::size_t n = 0; n < fDecls[*at].size(); ++n)
        if (IsSameName(fDecls[*at][n]->GetName(kNone), name)) return TDeclNumber{*at, n};
    return std::nullopt;
  }

private:
  bool Add(TClassPtr const& cls) {
    std::string const name = cls->GetName(kNone);
    TClassPtr const superClass = cls->GetSuperClass(kNone);
    std::optional<std::size_t> const super = superClass ? NumberOf(*superClass) : std::nullopt;
    if (superClass && !super) throw TBadAnswer("the class " + name + " is enumerated before its superclass");
    std::size_t const number = fClasses.size();
    if (!fNumbers.emplace(FoldName(name), number).second) throw TBadAnswer("there are two classes " + name);
    std::vector<TDeclPtr> decls;
    cls->EnumeratePropertyDecls(
        [&](boost::shared_ptr<ICIMPropertyDecl> const& decl) {
          fDeclNumbers[decl.get()] = {number, decls.size()};
          decls.emplace_back(decl);
          return true;
        },
        kNone);
    fNumbersOfObjects.emplace(cls.get(), number);
    fClasses.push_back(cls);
    fSupers.push_back(super);
    fDecls.push_back(std::move(decls));
    return true;
  }

  std::vector<TClassPtr> fClasses;
  std::vector<std::optional<std::size_t>> fSupers;
  std::vector<std::vector<TDeclPtr>> fDecls;  // by class
  TClassNumbers fNumbers;
  std::unordered_map<ICIMClass const*, std::size_t> fNumbersOfObjects;
  std::unordered_map<ICIMPropertyDecl const*, TDeclNumber> fDeclNumbers;
  std::optional<TRecordedFailure> fFailure;  // that ended the enumeration of the classes
};

void WriteDeclNumber(TByteWriter& writer, std::optional<TDeclNumber> const& number) {
  writer.Number(number ? number->fClass + 1 : 0);
  if (number) writer.Number(number->fDecl);
}

// The declaration of a property; empty when the provider does not give one.
TDeclPtr DeclarationOf(ICIMProperty const& property) {
  try {
    return property.GetDeclaration(kNone);
  } catch (std::bad_alloc const&) {
    throw;
  } catch (...) {
    return {};
  }
}

// ---- Classes ----

class TSchemaWriter {
public:
  TSchemaWriter(ICIMNamespace const& ns, TSchema const& schema, TByteWriter& writer)
      : fNamespace(ns), fSchema(schema), fWriter(writer) {}

  void Write() {
    fWriter.Text(kNamespaceForm);
    fWriter.Number(kNamespaceVersion);
    fWriter.Text(fNamespace.GetName(kNone));
    fWriter.Number(fSchema.Classes().size());
    WriteQualifierDecls();
    for (std::size_t number = 0; number < fSchema.Classes().size(); ++number) WriteClass(number);
    WriteEnding(fWriter, fSchema.Failure());
  }

private:
  void WriteQualifierDecls() {
    TList list;
    fNamespace.EnumerateQualifierDecls(
        [&](boost::shared_ptr<ICIMQualifierDecl> const& decl) {
          std::string const name = decl->GetName(kNone);
          fQualifierDecls.emplace(FoldName(name), fQualifierDecls.size());
          TByteWriter& writer = list.Next();
          writer.Text(name);
          writer.Number(static_cast<unsigned int>(decl->GetType(kNone)));
          writer.Number(decl->GetScope(kNone));
          writer.Number(decl->GetFlavor(kNone));
          WriteValue(writer, decl->GetDefaultValue(kNone), fSchema.Numbers());
          return true;
        },
        kNone);
    list.WriteTo(fWriter);
  }

  void WriteQualifiers(TByteWriter& writer, ICIMNamedElement const& element) {
    TList list;
    element.EnumerateQualifiers(
        [&](boost::shared_ptr<ICIMQualifier> const& qualifier) {
          std::string const name = qualifier->GetName(kNone);
          auto const decl = qualifier->GetDeclaration(kNone) ? fQualifierDecls.find(FoldName(name)) : fQualifierDecls.end();
          TByteWriter& next = list.Next();
          next.Text(name);
          next.Number(decl != fQualifierDecls.end() ? decl->second + 1 : 0);
          next.Number(qualifier->GetFlavor(kNone));
          WriteValue(next, qualifier->GetValue(kNone), fSchema.Numbers());
          return true;
        },
        kNone);
    list.WriteTo(writer);
  }

  void WriteClass(std::size_t number) {
    ICIMClass const& cls = *fSchema.Classes()[number];
    auto const& super = fSchema.SuperOf(number);
    fWriter.Text(cls.GetName(kNone));
    fWriter.Number(super ? *super + 1 : 0);
    fWriter.Byte((cls.GetClassFlag(kNone) ? kAssociationFlag : 0u) | (cls.IsAbstract(kNone) ? kAbstractFlag : 0u));
    WriteQualifiers(fWriter, cls);
    fWriter.Number(fSchema.DeclsOf(number).size());
    for (TDeclPtr const& decl : fSchema.DeclsOf(number)) WritePropertyDecl(*decl);
    WriteStaticProperties(cls, number);
    WriteMethods(cls);
  }

  void WritePropertyDecl(ICIMPropertyDecl const& decl) {
    bool isKey = false;
    auto const keyFailure = FailureOfEnumeration([&] { isKey = decl.IsKey(kNone); });
    bool const hasOwner = decl.GetOwner(kNone).lock() != nullptr;
    fWriter.Text(decl.GetName(kNone));
    fWriter.Number(static_cast<unsigned int>(decl.GetType(kNone)));
    fWriter.Byte((isKey ? kKeyFlag : 0u) | (keyFailure ? kKeyFailedFlag : 0u) | (hasOwner ? kOwnerFlag : 0u));
    if (keyFailure) keyFailure->WriteTo(fWriter);
    WriteValue(fWriter, decl.GetDefaultValue(kNone), fSchema.Numbers());
    WriteQualifiers(fWriter, decl);
  }

  void WriteStaticProperties(ICIMClass const& cls, std::size_t number) {
    TList list;
    auto const failure = FailureOfEnumeration([&] {
      cls.EnumerateStaticProperties(
          [&](boost::shared_ptr<ICIMProperty> const& property) {
            std::string const name = property->GetName(kNone);
            TCIMValue const value = property->GetValue(kNone);
            TByteWriter& writer = list.Next();
            writer.Text(name);
            WriteDeclNumber(writer, fSchema.Find(DeclarationOf(*property), name, number));
            WriteValue(writer, value, fSchema.Numbers());
            return true;
          },
          kNone);
    });
    list.WriteTo(fWriter);
    WriteEnding(fWriter, failure);
  }

  void WriteMethods(ICIMClass const& cls) {
    TList list;
    cls.EnumerateMethodDecls(
        [&](boost::shared_ptr<ICIMMethodDecl> const& method) {
          TByteWriter& writer = list.Next();
          writer.Text(method->GetName(kNone));
          writer.Number(static_cast<unsigned int>(method->GetReturnType(kNone)));
          WriteQualifiers(writer, *method);
          WriteParameters(writer, *method);
          return true;
        },
        kNone);
    list.WriteTo(fWriter);
  }

  void WriteParameters(TByteWriter& writer, ICIMMethodDecl const& method) {
    TList list;
    method.EnumerateParameterDecls(
        [&](boost::shared_ptr<ICIMParameterDecl> const& parameter) {
          TByteWriter& next = list.Next();
          next.Text(parameter->GetName(kNone));
          next.Number(static_cast<unsigned int>(parameter->GetType(kNone)));
          next.Number(parameter->GetMaxArraySize(kNone));
          next.Text(parameter->GetReferencedClassName(kNone));
          WriteQualifiers(next, *parameter);
          return true;
        },
        kNone);
    list.WriteTo(writer);
  }

  ICIMNamespace const& fNamespace;
  TSchema const& fSchema;
  TByteWriter& fWriter;
  std::map<std::string, std::size_t> fQualifierDecls;  // by lower-case name
};

// ---- Instances ----

class TInstanceWriter {
public:
  TInstanceWriter(TSchema const& schema, TByteWriter& writer, std::function<void(std::string_view)> const& send,
                  std::function<void(std::string const&)> const& noteInstance)
      : fSchema(schema), fWriter(writer), fSend(send), fNoteInstance(noteInstance), fLayoutsOf(schema.Classes().size()) {}

  void Write() {
    for (std::size_t number = 0; number < fSchema.Classes().size(); ++number)
      if (!fSchema.SuperOf(number)) WriteInstancesOf(number);
    Send();
  }

private:
  struct TLayout {
    std::vector<TDeclPtr> fDecls;
    std::vector<std::string> fNames;
    std::vector<std::optional<TDeclNumber>> fNumbers;
  };

  void WriteInstancesOf(std::size_t root) {
    auto const failure = FailureOfEnumeration([&] {
      fSchema.Classes()[root]->EnumerateInstances(
          [&](boost::shared_ptr<ICIMInstance> const& instance) {
            WriteInstance(*instance, root);
            return true;
          },
          kNone);
    });
    fWriter.Byte(kEnd);
    WriteEnding(fWriter, failure);
  }

  // A record is complete before it is added. Nearly every instance has the layout of the one before it.
  void WriteInstance(ICIMInstance const& instance, std::size_t root) {
    std::size_t cls = root;
    auto const classFailure = FailureOfEnumeration([&] { cls = fSchema.NumberOf(*instance.GetClass(kNone)).value_or(root); });
    if (classFailure) cls = ClassOfPath(instance).value_or(root);
    bool const isKnown = !classFailure && !fLayoutsOf[cls].empty();
    std::size_t layout = isKnown ? fLayoutsOf[cls].back() : 0;
    if (!isKnown || !WriteValuesOfLayout(instance, layout)) {
      ReadProperties(instance);
      layout = LayoutFor(cls, classFailure);
      BeginRecord(layout);
      for (auto const& property : fProperties) AddValue(*property);
      fProperties.clear();
    }
    fStarts.push_back(fRecord.Bytes().size());
    WritePath(instance, cls, fLayouts[layout]);
    fWriter.Raw(fRecord.Bytes());
    if (fWriter.Bytes().size() >= kPieceBytes) Send();
    if (fNoteInstance) fNoteInstance(fSchema.Classes()[cls]->GetName(kNone));
  }

  void BeginRecord(std::size_t layout) {
    fStarts.clear();
    fRecord.Clear();
    fRecord.Byte(kInstance);
    fRecord.Number(layout);
  }

  // False when the instance turns out to have other properties.
  bool WriteValuesOfLayout(ICIMInstance const& instance, std::size_t number) {
    TLayout const& layout = fLayouts[number];
    std::size_t count = 0;
    bool fits = true;
    BeginRecord(number);
    instance.EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> const& property) {
          TDeclPtr const decl = DeclarationOf(*property);
          fits = count < layout.fDecls.size() && decl && decl == layout.fDecls[count++];
          if (fits) AddValue(*property);
          return fits;
        },
        kNone);
    return fits && count == layout.fDecls.size();
  }

  void ReadProperties(ICIMInstance const& instance) {
    fProperties.clear();
    instance.EnumerateProperties(
        [&](boost::shared_ptr<ICIMProperty> const& property) {
          fProperties.push_back(property);
          return true;
        },
        kNone);
  }

  std::optional<std::size_t> ClassOfPath(ICIMInstance const& instance) const {
    std::optional<std::size_t> number;
    FailureOfEnumeration([&] {
      auto const cls = instance.GetPath(kNone).GetClass();
      if (cls) number = fSchema.NumberOf(*cls);
    });
    return number;
  }

  std::size_t LayoutFor(std::size_t cls, std::optional<TRecordedFailure> const& classFailure) {
    auto& known = fLayoutsOf[cls];
    if (!classFailure && !known.empty() && Fits(fLayouts[known.back()], cls)) return known.back();
    TLayout layout;
    for (auto const& property : fProperties) {
      layout.fDecls.push_back(DeclarationOf(*property));
      layout.fNames.push_back(property->GetName(kNone));
      layout.fNumbers.push_back(fSchema.Find(layout.fDecls.back(), layout.fNames.back(), cls));
    }
    fWriter.Byte(kLayout);
    fWriter.Number(cls);
    WriteEnding(fWriter, classFailure);
    fWriter.Number(fProperties.size());
    for (std::size_t n = 0; n < fProperties.size(); ++n) {
      fWriter.Text(layout.fNames[n]);
      WriteDeclNumber(fWriter, layout.fNumbers[n]);
    }
    fLayouts.push_back(std::move(layout));
    if (!classFailure) known.push_back(fLayouts.size() - 1);
    return fLayouts.size() - 1;
  }

  // A property of the same declaration has the same name.
  bool Fits(TLayout const& layout, std::size_t cls) const {
    if (layout.fNames.size() != fProperties.size()) return false;
    for (std::size_t n = 0; n < fProperties.size(); ++n) {
      TDeclPtr const decl = DeclarationOf(*fProperties[n]);
      if (decl && decl == layout.fDecls[n]) continue;
      std::string const name = fProperties[n]->GetName(kNone);
      if (name != layout.fNames[n] || !(fSchema.Find(decl, name, cls) == layout.fNumbers[n])) return false;
    }
    return true;
  }

  void AddValue(ICIMProperty const& property) {
    std::size_t const start = fRecord.Bytes().size();
    fStarts.push_back(start);
    try {
      WriteValue(fRecord, property.GetValue(kNone), fSchema.Numbers());
    } catch (...) {
      auto const failure = TRecordedFailure::OfCurrentException();
      fRecord.CutTo(start);
      WriteMissingValue(fRecord);
      failure.WriteTo(fRecord);
    }
  }

  void WritePath(ICIMInstance const& instance, std::size_t cls, TLayout const& layout) {
    std::optional<TCIMReference> path;
    auto const failure = FailureOfEnumeration([&] { path.emplace(instance.GetPath(kNone)); });
    if (failure) {
      fRecord.Byte(kPathFailed);
      return failure->WriteTo(fRecord);
    }
    std::vector<std::size_t> keys;
    if (!IsOfKeys(*path, cls, layout, keys)) return WritePathApart(*path);
    fRecord.Byte(kPathOfKeys);
    fRecord.Number(keys.size());
    for (std::size_t const key : keys) fRecord.Number(key);
  }

  void WritePathApart(TCIMReference const& path) {
    TByteWriter reference;
    auto const failure = FailureOfEnumeration([&] { WriteReference(reference, path, fSchema.Numbers()); });
    fRecord.Byte(failure ? kPathFailed : kPathApart);
    if (failure) return failure->WriteTo(fRecord);
    fRecord.Raw(reference.Bytes());
  }

  // Whether the path consists of the class and of properties, with exactly their names and values.
  bool IsOfKeys(TCIMReference const& path, std::size_t cls, TLayout const& layout, std::vector<std::size_t>& keys) {
    auto const pathClass = path.GetClass();
    if (!pathClass || !path.GetNamespace() || !path.GetNameSpaceName().empty()) return false;
    if (pathClass != fSchema.Classes()[cls] && fSchema.NumberOf(*pathClass) != cls) return false;
    bool areAll = true;
    path.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
      auto const position = PositionOf(key.first, layout);
      areAll = position && keys.size() < kMostKeys && HasBytesOf(key.second, *position);
      if (areAll) keys.push_back(*position);
      return areAll;
    });
    return areAll;
  }

  static std::optional<std::size_t> PositionOf(std::string const& name, TLayout const& layout) {
    for (std::size_t n = 0; n < layout.fNames.size(); ++n)
      if (layout.fNames[n] == name) return n;
    return std::nullopt;
  }

  bool HasBytesOf(TCIMValue const& value, std::size_t position) {
    fKey.Clear();
    WriteValue(fKey, value, fSchema.Numbers());
    std::size_t const start = fStarts[position];
    return fRecord.Bytes().compare(start, fStarts[position + 1] - start, fKey.Bytes()) == 0;
  }

  void Send() {
    fSend(fWriter.Bytes());
    fWriter.Clear();
  }

  TSchema const& fSchema;
  TByteWriter& fWriter;
  std::function<void(std::string_view)> const& fSend;
  std::function<void(std::string const&)> const& fNoteInstance;
  std::vector<TLayout> fLayouts;
  std::vector<std::vector<std::size_t>> fLayoutsOf;  // by class

  // Of the instance that is being written:
  std::vector<boost::shared_ptr<ICIMProperty>> fProperties;
  TByteWriter fRecord, fKey;
  std::vector<std::size_t> fStarts;  // where each value begins in fRecord, and where the last one ends
};

}  // namespace

void WriteNamespace(ICIMNamespace const& ns, std::function<void(std::string_view bytes)> const& send,
                    std::function<void(std::string const& className)> const& noteInstance) {
  TByteWriter writer;
  TSchema const schema(ns);
  TSchemaWriter(ns, schema, writer).Write();
  send(writer.Bytes());
  writer.Clear();
  TInstanceWriter(schema, writer, send, noteInstance).Write();
}

}  // namespace NQRVZEP20
