// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/InstanceJson.h"

#include "ICIMClass.h"
#include "collect/UnitText.h"
#include "tools/zep/secrets/Secrets.h"

namespace NQRVZEP20::zep {

namespace {

void AppendMember(std::string_view name, std::string const& text, TJsonText& json) {
  json.Member(name);
  json.String(text);
}

// As ValueAsJson.
void AppendValue(TCIMValue const& value, TJsonText& json) {
  using TType = TCIMValue::TCIMType;
  if (value.IsNull()) return json.Literal("null");
  if (value.IsArray()) {
    json.Begin('[');
    for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value)) {
      json.Element();
      AppendValue(element, json);
    }
    return json.End(']');
  }
  switch (value.GetType()) {
    case TType::kCIMTypeUint8:
    case TType::kCIMTypeUint16:
    case TType::kCIMTypeUint32:
    case TType::kCIMTypeSint8:
    case TType::kCIMTypeSint16:
    case TType::kCIMTypeSint32:
      return json.Literal(value.ToString());
    case TType::kCIMTypeBoolean:
    case TType::kCIMTypeReal32:
    case TType::kCIMTypeReal64:
    case TType::kCIMTypeReference:
      return json.Literal(ValueAsJson(value).dump());
    default:
      return json.String(value.ToString());
  }
}

}  // namespace

TInstanceJson::TInstanceJson(TNamespaceView const& view, EMessages messages) : fView(view), fMessages(messages) {}

TJson TInstanceJson::Of(ICIMInstance const& instance) {
  std::string text;
  Append(instance, text, TJsonText::kOnOneLine);
  return TJson::parse(text);
}

void TInstanceJson::Append(ICIMInstance const& instance, std::string& text, int depth) {
  TJsonText json(text, depth);
  json.Begin('{');
  AppendMember("path", fView.PathOf(instance), json);
  AppendMember("provider", fView.GetProviderName(), json);
  AppendMember("namespace", fView.GetName(), json);
  AppendMember("class", instance.GetClass(TCIMContext())->GetName(TCIMContext()), json);
  json.Member("properties");
  json.Begin('{');
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        json.Member(property->GetName(TCIMContext()));
        AppendProperty(instance, *property, json);
        return true;
      },
      TCIMContext());
  json.End('}');
  json.End('}');
}

void TInstanceJson::AppendProperty(ICIMInstance const& instance, ICIMProperty const& property, TJsonText& json) {
  TCIMValue const value = property.GetValue(TCIMContext());
  TDeclared const& declared = DeclaredBy(property.GetDeclaration(TCIMContext()));
  json.Begin('{');
  AppendMember("type", NameOf(value.GetType()), json);
  json.Member("value");
  AppendValue(value, json);
  AppendWords(declared.fWords, value, json);
  if (!declared.fUnit.empty()) AppendMember("unit", declared.fUnit, json);
  if (declared.fIsKey) json.Member("key"), json.Literal("true");
  AppendMember("source", declared.fSource, json);
  if (value.IsNull()) {
    TMissing const why = fView.WhyMissing(instance, property.GetName(TCIMContext()));
    AppendMember("code", why.fCode, json);
    json.Member("reason");
    AppendMessage(why.fReason, json);
  }
  json.End('}');
}

// The word for the value, or the words for the elements of an array; nothing where there is none.
void TInstanceJson::AppendWords(TValueWords const& words, TCIMValue const& value, TJsonText& json) const {
  if (words.Entries().empty() || value.IsNull()) return;
  auto const wordFor = [&](TCIMValue const& one) { return one.IsNull() ? std::string() : words.WordFor(one); };
  if (!value.IsArray()) {
    std::string const word = wordFor(value);
    if (!word.empty()) json.Member("words"), AppendMessage(word, json);
    return;
  }
  json.Member("words");
  json.Begin('[');
  for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value)) {
    json.Element();
    std::string const word = wordFor(element);
    word.empty() ? json.Literal("null") : AppendMessage(word, json);
  }
  json.End(']');
}

void TInstanceJson::AppendMessage(std::string const& message, TJsonText& json) const {
  json.String(fMessages == EMessages::kVerbatim ? message : MessageWithoutSecrets(message));
}

TInstanceJson::TDeclared const& TInstanceJson::DeclaredBy(TDeclaration const& declaration) {
  auto const found = fDeclared.find(declaration);
  if (found != fDeclared.end()) return found->second;
  TDeclared declared{TValueWords(*declaration), UnitOf(*declaration), declaration->IsKey(TCIMContext()),
                     fView.SourceOf(*declaration)};
  return fDeclared.emplace(declaration, std::move(declared)).first->second;
}

}  // namespace NQRVZEP20::zep
