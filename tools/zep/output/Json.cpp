// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/output/Json.h"

#include "tools/zep/output/Text.h"
#include "tools/zep/secrets/Secrets.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <string_view>

namespace NQRVZEP20::zep {

namespace {

using TType = TCIMValue::TCIMType;

TJson RealAsJson(double real, std::string const& text) { return std::isfinite(real) ? TJson(real) : TJson(text); }

TJson ArrayAsJson(std::vector<TCIMValue> const& elements) {
  TJson array = TJson::array();
  for (TCIMValue const& element : elements) array.push_back(ValueAsJson(element));
  return array;
}

// Whether the member contains a message or repeats an argument. All others contain data, which is printed unchanged.
bool IsMessage(std::string_view key) {
  constexpr std::string_view kMessages[] = {"reason", "error", "exception", "failure", "lastLogLine",
                                            "words",  "host",  "url",       "proxy",   "command"};
  return std::find(std::begin(kMessages), std::end(kMessages), key) != std::end(kMessages);
}

void HideSecretsIn(TJson& json, bool isMessage = false) {
  if (json.is_string() && isMessage) json = MessageWithoutSecrets(json.get<std::string>());
  if (json.is_object())
    for (auto& [key, value] : json.get_ref<TJson::object_t&>()) HideSecretsIn(value, IsMessage(key));
  else if (json.is_array())
    for (TJson& value : json) HideSecretsIn(value, isMessage);
}

}  // namespace

TJson DocumentHead(std::string const& what, EExitStatus status, std::string const& reason, std::string const& sampleLabel) {
  TJson document = {{"document", what}, {"version", kDocumentVersion}, {"zep", ZEP_VERSION}, {"sample", !sampleLabel.empty()}};
  if (!sampleLabel.empty()) document["label"] = sampleLabel;
  document["exitStatus"] = static_cast<int>(status);
  document["reason"] = OrNull(reason);
  return document;
}

std::string AsText(TJson document) {
  HideSecretsIn(document);
  return AsVerbatimText(document);
}

std::string AsVerbatimText(TJson const& document) { return document.dump(2, ' ', false, TJson::error_handler_t::replace) + "\n"; }

std::string AsLine(TJson document) {
  HideSecretsIn(document);
  return AsVerbatimLine(document);
}

std::string AsVerbatimLine(TJson const& document) {
  return document.dump(-1, ' ', false, TJson::error_handler_t::replace) + "\n";
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

}  // namespace NQRVZEP20::zep
