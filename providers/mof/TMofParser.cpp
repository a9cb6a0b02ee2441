// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/TMofParser.h"

#include "ICIMQualifierDecl.h"
#include "providers/memory/CIMNames.h"
#include "providers/memory/CIMTypes.h"
#include "providers/mof/MofStrings.h"

#include <algorithm>
#include <charconv>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

struct TScopeWord {
  std::string_view fWord;
  unsigned int fScope;
};

constexpr TScopeWord kScopes[] = {
    {"class", ICIMQualifierDecl::kScopeClass},           {"association", ICIMQualifierDecl::kScopeAssociation},
    {"indication", ICIMQualifierDecl::kScopeIndication}, {"property", ICIMQualifierDecl::kScopeProperty},
    {"reference", ICIMQualifierDecl::kScopeReference},   {"method", ICIMQualifierDecl::kScopeMethod},
    {"parameter", ICIMQualifierDecl::kScopeParameter},   {"any", ICIMQualifierDecl::kScopeAny},
};

struct TFlavorWord {
  std::string_view fWord;
  unsigned int fSet, fClear;
};

constexpr TFlavorWord kFlavors[] = {
    {"EnableOverride", ICIMQualifierDecl::kFlavorEnableOverride, 0},
    {"DisableOverride", 0, ICIMQualifierDecl::kFlavorEnableOverride},
    {"ToSubclass", ICIMQualifierDecl::kFlavorToSubclass, 0},
    {"Restricted", 0, ICIMQualifierDecl::kFlavorToSubclass},
    {"Translatable", ICIMQualifierDecl::kFlavorTranslatable, 0},
};

// The type of that name, except a reference; tag 0 for any other word.
TType IntrinsicType(std::string_view word) {
  if (word.size() < 5 || word.size() > 8) return TType::kCIMTypeInvalid;
  TType const type{std::string(word)};
  return type == TType::kCIMTypeReference ? TType(TType::kCIMTypeInvalid) : type;
}

}  // namespace

TMofParser::TMofParser(TMofFile const& file, char const* start) : fFile(file), fLexer(file, start), fToken(fLexer.Next()) {}

void TMofParser::ParseFile(TMofDocument& document, TMofSources& sources) {
  while (fToken.fKind != TMofToken::kEnd) {
    if (fToken.fKind == TMofToken::kPragma)
      ParsePragma(document, sources);
    else if (IsWord("qualifier"))
      document.fQualifierDecls.push_back(ParseQualifierDecl());
    else if (IsMark('[') || IsWord("class") || IsWord("instance"))
      ParseClassOrInstance(document);
    else
      Refuse("\"qualifier\", \"class\", \"instance\" or a pragma");
  }
}

// Checks the syntax of the declaration and stores its position. Qualifiers before an instance are dropped.
void TMofParser::ParseClassOrInstance(TMofDocument& document) {
  char const* const start = fToken.fText.data();
  ParseQualifiers();
  char const* const keyword = fToken.fText.data();
  if (IsWord("class")) {
    ParseClass();
    document.fClasses.push_back({&fFile, start, keyword});
  } else if (IsWord("instance")) {
    ParseInstance();
    document.fInstances.push_back({&fFile, keyword});
  } else
    Refuse("\"class\" or \"instance\"");
}

// An included file is read at once; any other pragma is ignored.
void TMofParser::ParsePragma(TMofDocument& document, TMofSources& sources) {
  Advance();
  TMofSpan const name = ExpectName("the name of a pragma");
  Expect('(');
  TMofSpan const argument = Here();
  std::string const text = ParseString();
  if (IsSameName(name.fText, "include")) {
    TMofParser(sources.OpenIncluded(text, argument)).ParseFile(document, sources);
    sources.CloseIncluded();
  }
  Expect(')');
}

TMofQualifierDecl TMofParser::ParseQualifierDecl() {
  Advance();
  TMofQualifierDecl decl;
  decl.fName = ExpectName("the name of a qualifier");
  Expect(':');
  decl.fType = ParseIntrinsicType();
  ParseArrayMark(decl.fType);
  if (Skip('=')) decl.fValue = ParseValue();
  Expect(',');
  decl.fScope = ParseScope();
  decl.fFlavor = ICIMQualifierDecl::kFlavorDefault;
  if (Skip(',')) {
    if (!SkipWord("flavor")) Refuse("\"Flavor\"");
    Expect('(');
    decl.fFlavor = ParseFlavor(true);
    Expect(')');
  }
  Expect(';');
  return decl;
}

unsigned int TMofParser::ParseScope() {
  if (!SkipWord("scope")) Refuse("\"Scope\"");
  Expect('(');
  unsigned int scope = 0;
  if (Skip(')')) return scope;
  do {
    auto const found = std::find_if(std::begin(kScopes), std::end(kScopes), [&](auto const& row) { return IsWord(row.fWord); });
    if (found == std::end(kScopes)) Refuse("a scope, such as \"property\" or \"any\"");
    scope |= found->fScope;
    Advance();
  } while (Skip(','));
  Expect(')');
  return scope;
}

// Words; in a declaration, optional commas separate them. A flavor that no word states is that of a qualifier without flavor.
unsigned int TMofParser::ParseFlavor(bool inDeclaration) {
  unsigned int flavor = ICIMQualifierDecl::kFlavorDefault;
  for (bool isFirst = true;; isFirst = false) {
    auto const found = std::find_if(std::begin(kFlavors), std::end(kFlavors), [&](auto const& row) { return IsWord(row.fWord); });
    if (found == std::end(kFlavors)) {
      if (isFirst) Refuse("a flavor, such as \"ToSubclass\"");
      if (fToken.fKind == TMofToken::kMark) return flavor;
      Refuse(inDeclaration ? "a flavor or \")\"" : "a flavor or \",\" or \"]\"");
    }
    flavor = (flavor | found->fSet) & ~found->fClear;
    Advance();
    if (inDeclaration) Skip(',');
  }
}

TMofClass TMofParser::ParseClass() {
  TMofQualifiers qualifiers = ParseQualifiers();
  TMofClass cls = ParseClassHead();
  cls.fQualifiers = std::move(qualifiers);
  Expect('{');
  while (!IsMark('}')) cls.fFeatures.push_back(ParseFeature());
  Advance();
  Expect(';');
  return cls;
}

TMofClass TMofParser::ParseClassHead() {
  Advance();
  TMofClass cls;
  cls.fName = ExpectName("the name of a class");
  ParseAlias();
  if (Skip(':')) cls.fSuperClass = ExpectName("the name of the superclass");
  return cls;
}

// Qualifiers of values are dropped, as those of the instance are.
TMofInstance TMofParser::ParseInstance() {
  TMofInstance instance = ParseInstanceHead();
  Expect('{');
  while (!IsMark('}')) {
    ParseQualifiers();
    TMofAssignment assignment;
    assignment.fName = ExpectName("the name of a property or \"}\"");
    Expect('=');
    assignment.fValue = ParseValue();
    Expect(';');
    instance.fValues.push_back(std::move(assignment));
  }
  Advance();
  Expect(';');
  return instance;
}

TMofInstance TMofParser::ParseInstanceHead() {
  Advance();
  if (!SkipWord("of")) Refuse("\"of\"");
  TMofInstance instance;
  instance.fClassName = ExpectName("the name of a class");
  instance.fAlias = ParseAlias();
  return instance;
}

TMofQualifiers TMofParser::ParseQualifiers() {
  TMofQualifiers qualifiers;
  if (!Skip('[')) return qualifiers;
  ParseListUpTo(']', [&] { qualifiers.push_back(ParseQualifier()); });
  return qualifiers;
}

TMofQualifier TMofParser::ParseQualifier() {
  TMofQualifier qualifier;
  qualifier.fName = ExpectName("the name of a qualifier");
  if (IsMark('{'))
    qualifier.fValue = ParseArray();
  else if (Skip('(')) {
    qualifier.fValue = ParseValue();
    Expect(')');
  }
  if (Skip(':')) qualifier.fFlavor = ParseFlavor(false);
  return qualifier;
}

TMofFeature TMofParser::ParseFeature() {
  TMofFeature feature;
  static_cast<TMofParameter&>(feature) = ParseParameter();
  if (Skip('(')) {
    feature.fIsMethod = true;
    if (!Skip(')')) ParseListUpTo(')', [&] { feature.fParameters.push_back(ParseParameter()); });
  } else if (Skip('='))
    feature.fDefault = ParseValue();
  bool const isBareProperty = !feature.fIsMethod && !feature.fDefault;
  if (!Skip(';')) Refuse(isBareProperty ? "\"(\", \"=\" or \";\"" : "\";\"");
  return feature;
}

TMofParameter TMofParser::ParseParameter() {
  TMofParameter parameter;
  parameter.fQualifiers = ParseQualifiers();
  parameter.fType = ParseType();
  parameter.fName = ExpectName("a name");
  ParseArrayMark(parameter.fType);
  return parameter;
}

TMofType TMofParser::ParseType() {
  if (IntrinsicType(fToken.fText) != TType::kCIMTypeInvalid) return ParseIntrinsicType();
  TMofType type;
  type.fReferencedClass = ExpectName("a type, a class and \"REF\", or \"}\"");
  type.fType = TType::kCIMTypeReference;
  if (!SkipWord("ref")) Refuse("\"REF\" after \"" + TextAt(type.fReferencedClass) + "\", which is not a type");
  return type;
}

TMofType TMofParser::ParseIntrinsicType() {
  TMofType type;
  type.fType = IntrinsicType(fToken.fText);
  if (type.fType == TType::kCIMTypeInvalid) Refuse("a type");
  Advance();
  return type;
}

void TMofParser::ParseArrayMark(TMofType& type) {
  if (!Skip('[')) return;
  type.fType = ArrayOf(type.fType);
  if (!IsMark(']')) {
    std::string_view const digits = fToken.fText;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), type.fMaxArraySize);
    bool const isNumber = error == std::errc() && end == digits.data() + digits.size();
    if (!isNumber || type.fMaxArraySize == 0) Refuse("\"]\" or a size of at least 1");
    Advance();
  }
  Expect(']');
}

TMofSpan TMofParser::ParseAlias() {
  if (!SkipWord("as")) return TMofSpan{&fFile, {}};
  TMofSpan const alias = Here();
  if (fToken.fKind != TMofToken::kAlias) Refuse("an alias, such as \"$Disk\"");
  Advance();
  return alias;
}

TMofValue TMofParser::ParseValue() {
  if (IsMark('{')) return ParseArray();
  TMofValue value;
  value.fSpan = Here();
  value.fLiterals.push_back(ParseLiteral());
  return value;
}

TMofValue TMofParser::ParseArray() {
  TMofValue value;
  value.fSpan = Here();
  value.fIsArray = true;
  Expect('{');
  if (!Skip('}')) ParseListUpTo('}', [&] { value.fLiterals.push_back(ParseLiteral()); });
  return value;
}

TMofLiteral TMofParser::ParseLiteral() {
  TMofLiteral literal{TMofLiteral::kNull, Here(), {}};
  switch (fToken.fKind) {
    case TMofToken::kString:
      literal.fKind = TMofLiteral::kString;
      literal.fString = ParseString();
      return literal;
    case TMofToken::kNumber:
      literal.fKind = TMofLiteral::kNumber;
      break;
    case TMofToken::kChar:
      literal.fKind = TMofLiteral::kChar;
      break;
    case TMofToken::kAlias:
      literal.fKind = TMofLiteral::kAlias;
      break;
    default:
      if (IsWord("true") || IsWord("false"))
        literal.fKind = TMofLiteral::kBoolean;
      else if (!IsWord("null"))
        Refuse("a value");
  }
  Advance();
  return literal;
}

// Items separated by commas, and the mark after the last one.
template <class TParseItem>
void TMofParser::ParseListUpTo(char end, TParseItem const& parseItem) {
  do parseItem();
  while (Skip(','));
  if (!Skip(end)) Refuse(std::string("\",\" or \"") + end + "\"");
}

// Adjacent strings are one.
std::string TMofParser::ParseString() {
  if (fToken.fKind != TMofToken::kString) Refuse("a string");
  std::string text;
  for (; fToken.fKind == TMofToken::kString; Advance()) AppendUnescaped(text, Here());
  return text;
}

bool TMofParser::IsWord(std::string_view word) const {
  return fToken.fKind == TMofToken::kName && IsSameName(fToken.fText, word);
}

bool TMofParser::Skip(char mark) {
  if (!IsMark(mark)) return false;
  Advance();
  return true;
}

bool TMofParser::SkipWord(std::string_view word) {
  if (!IsWord(word)) return false;
  Advance();
  return true;
}

void TMofParser::Expect(char mark) {
  if (!Skip(mark)) Refuse(std::string("\"") + mark + "\"");
}

TMofSpan TMofParser::ExpectName(char const* what) {
  if (fToken.fKind != TMofToken::kName) Refuse(what);
  TMofSpan const name = Here();
  Advance();
  return name;
}

void TMofParser::Refuse(std::string const& expected) const {
  constexpr std::size_t kMaxShown = 40;
  std::string found = fToken.fKind == TMofToken::kEnd ? "the end of the file" : std::string(fToken.fText.substr(0, kMaxShown));
  if (fToken.fText.size() > kMaxShown) found += "...";
  if (fToken.fKind == TMofToken::kMark || fToken.fKind == TMofToken::kName) found = "\"" + found + "\"";
  throw TMofError(Here(), "expected " + expected + ", found " + found);
}

}  // namespace NQRVZEP20
