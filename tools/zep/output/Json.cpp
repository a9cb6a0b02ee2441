// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Json.h"

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "collect/TValueWords.h"
#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace NQRVZEP20::zep {

namespace {

using TType = TCIMValue::TCIMType;

TJson RealAsJson(double real, std::string const& text) { return std::isfinite(real) ? TJson(real) : TJson(text); }

TJson ArrayAsJson(std::vector<TCIMValue> const& elements) {
  TJson array = TJson::array();
  for (TCIMValue const& element : elements) array.push_back(ValueAsJson(element));
  return array;
}

// The word for the value, or the words for the elements of an array; null where there is none.
TJson WordsAsJson(TValueWords const& words, TCIMValue const& value) {
  if (words.Entries().empty() || value.IsNull()) return nullptr;
  if (!value.IsArray()) return OrNull(words.WordFor(value));
  TJson array = TJson::array();
  for (TCIMValue const& element : static_cast<std::vector<TCIMValue>&>(value)) array.push_back(WordsAsJson(words, element));
  return array;
}

TJson PropertyAsJson(TNamespaceView const& view, ICIMInstance const& instance, ICIMProperty const& property) {
  TCIMValue const value = property.GetValue(TCIMContext());
  TJson json = {{"type", NameOf(value.GetType())}, {"value", ValueAsJson(value)}};
  auto const declaration = property.GetDeclaration(TCIMContext());
  TJson const words = WordsAsJson(TValueWords(*declaration), value);
  if (!words.is_null()) json["words"] = words;
  if (declaration->IsKey(TCIMContext())) json["key"] = true;
  json["source"] = view.SourceOf(*declaration);
  if (value.IsNull()) {
    TMissing const why = view.WhyMissing(instance, property.GetName(TCIMContext()));
    json["code"] = why.fCode;
    json["reason"] = why.fReason;
  }
  return json;
}

// Whether the member contains a message or repeats an argument. All others contain data, which is printed unchanged.
bool IsMessage(std::string const& key) {
  constexpr char const* kMessages[] = {"reason", "error", "failure", "lastLogLine", "words", "host", "url", "proxy", "command"};
  return std::find(std::begin(kMessages), std::end(kMessages), key) != std::end(kMessages);
}

TJson WithoutSecretsIn(TJson json, bool isMessage = false) {
  if (json.is_string()) return isMessage ? TJson(MessageWithoutSecrets(json.get<std::string>())) : json;
  if (json.is_object())
    for (auto& [key, value] : json.items()) value = WithoutSecretsIn(std::move(value), IsMessage(key));
  else if (json.is_array())
    for (TJson& value : json) value = WithoutSecretsIn(std::move(value), isMessage);
  return json;
}

}  // namespace

TJson DocumentHead(std::string const& what, EExitStatus status, std::string const& reason, std::string const& sampleLabel) {
  TJson document = {{"document", what}, {"version", kDocumentVersion}, {"zep", ZEP_VERSION}, {"sample", !sampleLabel.empty()}};
  if (!sampleLabel.empty()) document["label"] = sampleLabel;
  document["exitStatus"] = static_cast<int>(status);
  document["reason"] = OrNull(reason);
  return document;
}

std::string AsText(TJson const& document) { return AsVerbatimText(WithoutSecretsIn(document)); }

std::string AsVerbatimText(TJson const& document) { return document.dump(2, ' ', false, TJson::error_handler_t::replace) + "\n"; }

std::string AsLine(TJson const& document) {
  return WithoutSecretsIn(document).dump(-1, ' ', false, TJson::error_handler_t::replace) + "\n";
}

TJson OrNull(std::string const& text) { return text.empty() ? TJson(nullptr) : TJson(text); }

std::string FailureAsJson(std::string const& what, EExitStatus status, std::string const& reason,
                          std::string const& sampleLabel) {
  return AsLine(DocumentHead(what, status, reason, sampleLabel));
}

TJson ValueAsJson(TCIMValue const& value) {
  if (value.IsNull()) return nullptr;
  if (value.IsArray()) return ArrayAsJson(static_cast<std::vector<TCIMValue>&>(value));
  switch (value.GetType()) {
    case TType::kCIMTypeBoolean:
      return static_cast<bool>(value);
    case TType::kCIMTypeUint8:
    case TType::kCIMTypeUint16:
    case TType::kCIMTypeUint32:
      return std::stoull(value.ToString());
    case TType::kCIMTypeSint8:
    case TType::kCIMTypeSint16:
    case TType::kCIMTypeSint32:
      return std::stoll(value.ToString());
    case TType::kCIMTypeReal32:
      return RealAsJson(static_cast<float>(value), value.ToString());
    case TType::kCIMTypeReal64:
      return RealAsJson(static_cast<double>(value), value.ToString());
    case TType::kCIMTypeReference:
      return WithBytesEscaped(value.ToString());
    default:
      return value.ToString();
  }
}

std::string NameOf(TCIMValue::TCIMType type) {
  if (type == TType::kCIMTypeInvalid) return "none";
  return type.ToString() + ((type & TType::kCIMTypeArrayFlag) != 0 ? "[]" : "");
}

TJson InstanceAsJson(TNamespaceView const& view, ICIMInstance const& instance) {
  TJson properties = TJson::object();
  instance.EnumerateProperties(
      [&](boost::shared_ptr<ICIMProperty> property) {
        properties[property->GetName(TCIMContext())] = PropertyAsJson(view, instance, *property);
        return true;
      },
      TCIMContext());
  return {{"path", view.PathOf(instance)},
          {"provider", view.GetProviderName()},
          {"namespace", view.GetName()},
          {"class", instance.GetClass(TCIMContext())->GetName(TCIMContext())},
          {"properties", properties}};
}

}  // namespace NQRVZEP20::zep
