// SPDX-License-Identifier: Apache-2.0

// The rules of a check that concern the keys and the values of instances.

#include "CIMNames.h"
#include "TCIMDateTime.h"
#include "collect/FailureOf.h"
#include "collect/SafeText.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/plugin/check/Rules.h"

#include <cmath>
#include <map>

namespace NQRVZEP20::zep {

namespace {

using TType = TCIMValue::TCIMType;

// ---- Keys ----

void CheckKeysOf(TInstanceContent const& instance, TRuleResult& result) {
  for (TPropertyContent const& property : instance.fProperties)
    if (property.fIsKey && property.fValue.IsNull())
      result.Find(instance.fPath + "." + property.fName, "the key is NULL", "set every key of an instance");
}

void CheckKeysIn(TContent const& content, TRuleResult& result) {
  std::map<std::string, std::size_t> withoutKeys, paths;  // by class, by path
  for (TInstanceContent const& instance : content.fInstances) {
    ++paths[instance.fPath];
    if (instance.fHasKeys)
      CheckKeysOf(instance, result);
    else
      ++withoutKeys[instance.fClass];
  }
  for (auto const& [cls, number] : withoutKeys)
    result.Find(cls, "instances without any key value, whose path is that of the class: " + std::to_string(number),
                "declare a key, and set it in each instance");
  for (auto const& [path, number] : paths)
    if (number > 1)
      result.Find(path, "instances with this path: " + std::to_string(number), "give each instance of a class other key values");
}

// ---- Texts ----

bool IsUtf8(std::string const& text) { return WithBytesEscaped(text) == text; }

void CheckNameOf(std::string const& place, std::string const& name, TRuleResult& result) {
  if (!IsCIMName(name) || !IsUtf8(name))
    result.Find(place, "\"" + name + "\" is not a CIM name in UTF-8",
                "use letters, digits and underscores, and begin with a letter or an underscore");
}

bool IsReal(TCIMValue const& value) {
  return value.GetType() == TType::kCIMTypeReal32 || value.GetType() == TType::kCIMTypeReal64;
}

bool IsFinite(TCIMValue const& real) {
  return real.GetType() == TType::kCIMTypeReal32 ? std::isfinite(static_cast<float>(real))
                                                 : std::isfinite(static_cast<double>(real));
}

// Whether the text of a scalar gives the same value again. Of references and of char16, the library does not read every text that
// it prints (docs/formats.md); their texts are not compared.
bool SurvivesAsText(TCIMValue const& value) {
  if (value.IsReference() || value.GetType() == TType::kCIMTypeChar16) return true;
  std::string text = value.ToString();
  return TCIMValue(value.GetType(), text, {}) == value;
}

bool SurvivesAsJson(TCIMValue const& value) {
  TJson const json = ValueAsJson(value);
  return TJson::parse(json.dump()) == json;  // dump throws for text that is not UTF-8
}

// A value with the place where it is.
struct TPlaced {
  std::string fPlace;
  bool fIsKey;
  TCIMValue const& fValue;
};

void CheckReal(TPlaced const& real, TRuleResult& result) {
  if (!IsFinite(real.fValue))
    return result.Find(real.fPlace, real.fValue.ToString() + " is not a number in JSON", "leave the value NULL");
  if (SurvivesAsText(real.fValue)) return;
  std::string const loss = "its text " + real.fValue.ToString() + " has only six digits of the value";
  if (real.fIsKey)
    result.Find(real.fPlace, loss, "use an integer or a string as the key");
  else
    result.Note(real.fPlace, loss);
}

void CheckScalar(TPlaced const& scalar, TRuleResult& result) {
  if (scalar.fValue.IsNull()) return;
  if (IsReal(scalar.fValue)) return CheckReal(scalar, result);
  if (scalar.fValue.GetType() == TType::kCIMTypeString && !IsUtf8(scalar.fValue))
    return result.Find(scalar.fPlace,
                       "\"" + WithBytesEscaped(scalar.fValue.ToString()) + "\" has bytes that are zero or not UTF-8",
                       "convert the text, or leave the value NULL");
  bool survives = false;
  std::string const failure = FailureOf([&] { survives = SurvivesAsText(scalar.fValue) && SurvivesAsJson(scalar.fValue); });
  if (!survives)
    result.Find(scalar.fPlace, "the value cannot be read again from its text" + (failure.empty() ? "" : ": " + failure));
}

void CheckValue(TPlaced const& placed, TRuleResult& result) {
  if (!placed.fValue.IsArray() || placed.fValue.IsNull()) return CheckScalar(placed, result);
  std::vector<TCIMValue> const& elements = placed.fValue;
  for (std::size_t at = 0; at < elements.size(); ++at)
    CheckScalar({placed.fPlace + "[" + std::to_string(at) + "]", placed.fIsKey, elements[at]}, result);
}

// A provider and a namespace may have any name in UTF-8.
void CheckFreeName(std::string const& place, std::string const& name, TRuleResult& result) {
  if (name.empty()) return result.Find(place, "the name is empty", "give it a name");
  if (!IsUtf8(name))
    result.Find(place, "the name \"" + WithBytesEscaped(name) + "\" has bytes that are zero or not UTF-8", "use UTF-8");
}

void CheckTextsIn(TContent const& content, TRuleResult& result) {
  CheckFreeName("provider " + content.fProvider, content.fProvider, result);
  CheckFreeName("namespace " + content.fNamespace, content.fNamespace, result);
  for (TClassContent const& cls : content.fClasses) {
    CheckNameOf("class " + cls.fName, cls.fName, result);
    for (TDeclaredValue const& declared : cls.fDeclaredValues) CheckValue({declared.fPlace, false, declared.fValue}, result);
    for (TDeclaration const& declaration : cls.fDeclarations)
      CheckNameOf(cls.fName + "." + declaration.fName, declaration.fName, result);
  }
  for (TInstanceContent const& instance : content.fInstances)
    for (TPropertyContent const& property : instance.fProperties)
      CheckValue({instance.fPath + "." + property.fName, property.fIsKey, property.fValue}, result);
}

}  // namespace

void CheckKeys(TObservation const& observation, TRuleResult& result) {
  result.CannotCheck(observation.WhyNoContent());
  for (TContent const& content : observation.fFirst.fContents) CheckKeysIn(content, result);
}

void CheckText(TObservation const& observation, TRuleResult& result) {
  result.CannotCheck(observation.WhyNoContent());
  for (TContent const& content : observation.fFirst.fContents) CheckTextsIn(content, result);
}

}  // namespace NQRVZEP20::zep
