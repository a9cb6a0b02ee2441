// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TNamespaceReader.h"

#include "collect/FailureOf.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/NamespaceBytes.h"
#include "collect/answer/TBadAnswer.h"

#include <boost/make_shared.hpp>

#include <limits>
#include <utility>

namespace NQRVZEP20 {

namespace {

constexpr std::uint64_t kAnyNumber = std::numeric_limits<unsigned int>::max();

}  // namespace

TNamespaceReader::TNamespaceReader(TAnswerCounts& counts)
    : fNamespace(new TReceivedNamespace),
      fNs(*fNamespace),
      fCounts(counts),
      fReader(fNs.ReaderAt(0)),
      fChecker(0, counts.fValues) {}

void TNamespaceReader::Add(std::string_view bytes) {
  std::size_t const at = fReader.At();
  fNs.fBytes += bytes;
  fReader = fNs.ReaderAt(at);  // the bytes may have moved
}

void TNamespaceReader::ReadClasses() {
  if (std::exchange(fHasClasses, true)) return;
  if (fReader.Text() != kNamespaceForm || fReader.Number() != kNamespaceVersion)
    throw TBadAnswer("it is not a namespace of version " + std::to_string(kNamespaceVersion));
  fNs.fName = ReadName();
  fClassCount = fReader.Count(kMostClasses - fCounts.fClasses, "the number of classes");
  fCounts.fClasses += fClassCount;
  fChecker = TValueChecker(fClassCount, fCounts.fValues);
  ReadQualifierDecls();
  while (fNs.fClasses.size() < fClassCount) ReadClass();
  fNs.fClassesFailure = ReadEnding("the classes");
}

boost::shared_ptr<TReceivedNamespace> TNamespaceReader::Finish() {
  ReadClasses();
  for (std::size_t number = 0; number < fClassCount; ++number)
    if (fNs.fRoots[number] == number) ReadTree(number);
  if (fReader.Left() != 0) throw TBadAnswer("there are bytes after the end");
  return fNamespace;
}

void TNamespaceReader::ReadQualifierDecls() {
  for (std::size_t left = CountOf("the number of qualifier declarations"); left > 0; --left) {
    std::string const name = ReadName();
    auto const type = ReadType();
    auto const scope = static_cast<unsigned int>(fReader.NumberUpTo(kAnyNumber, "a scope"));
    auto const flavor = static_cast<unsigned int>(fReader.NumberUpTo(kAnyNumber, "a flavor"));
    std::size_t const at = ReadValuePosition();
    fNs.fQualifierDecls.push_back(boost::make_shared<TReceivedQualifierDecl>(fNamespace, name, type, scope, flavor, at));
  }
}

TNamespaceReader::TQualifiers TNamespaceReader::ReadQualifiers(boost::weak_ptr<ICIMNamedElement> owner) {
  TQualifiers qualifiers;
  for (std::size_t left = CountOf("the number of qualifiers"); left > 0; --left) {
    std::string const name = ReadName();
    auto const number = static_cast<std::size_t>(fReader.NumberUpTo(fNs.fQualifierDecls.size(), "a qualifier declaration"));
    auto const declaration = number > 0 ? fNs.fQualifierDecls[number - 1] : nullptr;
    auto const flavor = static_cast<unsigned int>(fReader.NumberUpTo(kAnyNumber, "a flavor"));
    std::size_t const at = ReadValuePosition();
    qualifiers.push_back(boost::make_shared<TReceivedQualifier>(fNamespace, name, at, flavor, declaration, owner));
  }
  return qualifiers;
}

void TNamespaceReader::ReadClass() {
  std::size_t const number = fNs.fClasses.size();
  std::string const name = ReadName();
  auto const super = static_cast<std::size_t>(fReader.NumberUpTo(number, "the number of a superclass"));
  std::size_t const depth = super > 0 ? fDepths[super - 1] + 1 : 0;
  if (depth > kMostClassDepth) throw TBadAnswer("the class " + name + " is derived too deeply");
  unsigned int const flags = fReader.Byte();

  TReceivedClass::TFacts facts;
  facts.fNumber = number;
  facts.fIsAssociation = (flags & kAssociationFlag) != 0;
  facts.fIsAbstract = (flags & kAbstractFlag) != 0;
  facts.fHasSuperClass = super > 0;
  if (super > 0) facts.fSuperClass = fNs.fClasses[super - 1];
  auto const cls = boost::make_shared<TReceivedClass>(fNamespace, name, facts);
  if (!fNs.fNumbers.emplace(name, number).second) throw TBadAnswer("there are two classes " + name);
  fNs.fClasses.push_back(cls);
  fNs.fRoots.push_back(super > 0 ? fNs.fRoots[super - 1] : number);
  fNs.fChildren.emplace_back();
  if (super > 0) fNs.fChildren[super - 1].push_back(number);
  fDepths.push_back(depth);

  cls->SetQualifiers(ReadQualifiers(cls));
  for (std::size_t left = CountOf("the number of properties"); left > 0; --left) ReadPropertyDecl(cls);
  ReadStaticProperties(cls);
  for (std::size_t left = CountOf("the number of methods"); left > 0; --left) ReadMethod(cls);
}

void TNamespaceReader::ReadPropertyDecl(boost::shared_ptr<TReceivedClass> const& cls) {
  std::string const name = ReadName();
  TReceivedPropertyDecl::TFacts facts;
  facts.fType = ReadType();
  unsigned int const flags = fReader.Byte();
  facts.fIsKey = (flags & kKeyFlag) != 0;
  if ((flags & kKeyFailedFlag) != 0)
    facts.fKeyFailure = ReadFailure("the property " + name + " of " + cls->GetName(TCIMContext()));
  if ((flags & kOwnerFlag) != 0) facts.fOwner = cls;
  facts.fDefaultAt = ReadValuePosition();
  auto const decl = boost::make_shared<TReceivedPropertyDecl>(fNamespace, name, facts);
  decl->SetQualifiers(ReadQualifiers(decl));
  cls->Add(decl);
}

void TNamespaceReader::ReadStaticProperties(boost::shared_ptr<TReceivedClass> const& cls) {
  for (std::size_t left = CountOf("the number of static properties"); left > 0; --left) {
    std::string const name = ReadName();
    fNs.fStaticProperties.push_back({name, ReadDecl()});
    cls->Add(boost::make_shared<TReceivedProperty>(fNamespace, fNs.fStaticProperties.back(), ReadValuePosition()));
  }
  if (auto const failure = ReadEnding("the static properties of " + cls->GetName(TCIMContext())))
    cls->EndStaticPropertiesWith(*failure);
}

void TNamespaceReader::ReadMethod(boost::shared_ptr<TReceivedClass> const& cls) {
  std::string const name = ReadName();
  auto const returnType = ReadType();
  auto const method = boost::make_shared<TReceivedMethodDecl>(fNamespace, name, returnType, cls);
  method->SetQualifiers(ReadQualifiers(method));
  for (std::size_t left = CountOf("the number of parameters"); left > 0; --left) ReadParameter(method);
  cls->Add(method);
}

void TNamespaceReader::ReadParameter(boost::shared_ptr<TReceivedMethodDecl> const& method) {
  std::string const name = ReadName();
  TReceivedParameterDecl::TFacts facts;
  facts.fType = ReadType();
  facts.fMaxArraySize = static_cast<unsigned int>(fReader.NumberUpTo(kAnyNumber, "the bound of an array"));
  facts.fReferencedClassName = ReadName();
  facts.fMethod = method;
  auto const parameter = boost::make_shared<TReceivedParameterDecl>(fNamespace, name, facts);
  parameter->SetQualifiers(ReadQualifiers(parameter));
  method->Add(parameter);
}

void TNamespaceReader::ReadTree(std::size_t root) {
  TReceivedNamespace::TTree& tree = fNs.fTrees[root];
  tree.fBegin = fNs.fInstances.size();
  for (unsigned int record = fReader.Byte(); record != kEnd; record = fReader.Byte()) {
    if (record == kLayout)
      ReadLayout();
    else if (record == kInstance)
      ReadInstance();
    else
      throw TBadAnswer("a record has the kind " + std::to_string(record));
  }
  tree.fFailure = ReadEnding("the instances of " + NameOf(root));
  tree.fEnd = fNs.fInstances.size();
}

void TNamespaceReader::ReadLayout() {
  TReceivedLayout layout;
  layout.fClass = static_cast<std::size_t>(fReader.NumberUpTo(fClassCount - 1, "the class of an instance"));
  layout.fClassFailure = ReadEnding("the class of an instance of " + NameOf(layout.fClass));
  std::size_t const count = CountOf("the number of properties");
  for (std::size_t n = 0; n < count; ++n) {
    std::string const name = ReadName();
    layout.fNumbers.emplace(name, n);
    layout.fProperties.push_back({name, ReadDecl()});
  }
  fNs.fLayouts.push_back(std::move(layout));
}

void TNamespaceReader::ReadInstance() {
  if (++fCounts.fInstances > kMostInstances)
    throw TBadAnswer("there are more than " + std::to_string(kMostInstances) + " instances");
  std::uint64_t const number = fReader.Number();
  if (number >= fNs.fLayouts.size()) throw TBadAnswer("an instance has a layout that does not exist");
  TReceivedLayout const& layout = fNs.fLayouts[static_cast<std::size_t>(number)];
  fNs.fInstances.push_back(boost::make_shared<TReceivedInstance>(fNamespace, layout, fReader.At()));
  for (TReceivedPropertyName const& property : layout.fProperties) {
    bool const isMissing = IsMissingValue(fReader);
    if (!isMissing) fChecker.CheckValue(fReader);
    if (!isMissing && !fChecker.TakeForeignType()) continue;
    std::string const place = "the property " + property.fName + " of an instance of " + NameOf(layout.fClass);
    if (isMissing)
      ReadFailure(place);
    else
      Note(place, "its type does not exist");
  }
  ReadPath(layout);
}

void TNamespaceReader::ReadPath(TReceivedLayout const& layout) {
  unsigned int const kind = fReader.Byte();
  if (kind == kPathFailed) {
    ReadFailure("the path of an instance of " + NameOf(layout.fClass));
  } else if (kind == kPathApart) {
    fChecker.CheckReference(fReader);
  } else if (kind == kPathOfKeys) {
    ReadKeys(layout);
  } else {
    throw TBadAnswer("a path has the kind " + std::to_string(kind));
  }
}

// Each position once: a path reads the value of every key, which may be long.
void TNamespaceReader::ReadKeys(TReceivedLayout const& layout) {
  std::size_t const instance = fNs.fInstances.size();
  if (fKeyOf.size() < layout.fProperties.size()) fKeyOf.resize(layout.fProperties.size(), 0);
  for (std::size_t left = fReader.Count(kMostKeys, "the number of keys"); left > 0; --left) {
    std::uint64_t const key = fReader.Number();
    if (key >= layout.fProperties.size()) throw TBadAnswer("a key is not a property");
    if (std::exchange(fKeyOf[static_cast<std::size_t>(key)], instance) == instance) throw TBadAnswer("a path has a key twice");
  }
}

// The elements except instances and their values.
std::size_t TNamespaceReader::CountOf(char const* what) {
  std::size_t const count = fReader.Count(kMostElements, what);
  fCounts.fElements += count + 1;
  if (fCounts.fElements > kMostElementsInAll)
    throw TBadAnswer("there are more than " + std::to_string(kMostElementsInAll) + " elements");
  return count;
}

TCIMValue::TCIMType TNamespaceReader::ReadType() {
  return static_cast<TCIMValue::TCIMType::ECIMType>(fReader.NumberUpTo(kAnyNumber, "a type"));
}

std::size_t TNamespaceReader::ReadValuePosition() {
  std::size_t const at = fReader.At();
  fChecker.CheckValue(fReader);
  return at;
}

boost::shared_ptr<TReceivedPropertyDecl> TNamespaceReader::ReadDecl() {
  auto const cls = static_cast<std::size_t>(fReader.NumberUpTo(fNs.fClasses.size(), "the class of a declaration"));
  if (cls == 0) return {};
  auto const& decls = fNs.fClasses[cls - 1]->PropertyDecls();
  std::uint64_t const number = fReader.Number();
  if (number >= decls.size()) throw TBadAnswer("a property has a declaration that does not exist");
  return decls[static_cast<std::size_t>(number)];
}

TRecordedFailure TNamespaceReader::ReadFailure(std::string const& place) {
  TRecordedFailure failure = TRecordedFailure::ReadFrom(fReader);
  Note(place, FailureOf([&] { failure.Throw(); }));
  return failure;
}

void TNamespaceReader::Note(std::string const& place, std::string const& failure) {
  if (fFirstFailure.empty()) fFirstFailure = place + ": " + failure;
}

std::optional<TRecordedFailure> TNamespaceReader::ReadEnding(std::string const& place) {
  if (fReader.Byte() == 0) return std::nullopt;
  return ReadFailure(place);
}

std::string TNamespaceReader::NameOf(std::size_t cls) const { return fNs.fClasses[cls]->GetName(TCIMContext()); }

}  // namespace NQRVZEP20
