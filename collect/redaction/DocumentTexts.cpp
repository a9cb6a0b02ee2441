// SPDX-License-Identifier: Apache-2.0
#include "collect/redaction/DocumentTexts.h"

#include "collect/redaction/Texts.h"

#include <algorithm>
#include <set>

namespace NQRVZEP20 {

namespace {

using TJson = nlohmann::ordered_json;

// Members whose texts zep or a class defines.
constexpr std::string_view kNames[] = {"class",      "classes", "columns",   "document", "id",       "key",
                                       "label",      "name",    "namespace", "outcome",  "provider", "question",
                                       "redaction",  "rule",    "severity",  "stage",    "status",   "superclasses",
                                       "thresholds", "time",    "title",     "type",     "worst",    "zep"};

// Whether the text has the form of the codes that zep defines: "not-given". A plug-in may give any text.
bool IsCode(TJson const& value) {
  if (!value.is_string()) return false;
  auto const& text = value.get_ref<std::string const&>();
  return std::all_of(text.begin(), text.end(), [](char byte) { return byte == '-' || (byte >= 'a' && byte <= 'z'); });
}

bool IsName(std::string_view member, TJson const& value, TPlace const& place) {
  if (member == "redaction" && place.AsText().empty()) return true;
  if (member == "thresholds" && place.AsText() == "/findings") return true;
  if (member == "code") return IsCode(value);
  return (value.is_string() || value.is_array()) && std::binary_search(std::begin(kNames), std::end(kNames), member);
}

bool IsIdentifierByte(char byte) { return byte == '_' || IsLetterOrDigit(byte); }

class TTextWriter {
public:
  TTextWriter(TJson const& document, TUseText const& use) : fUse(use) {
    auto const instances = document.find("instances");
    if (instances == document.end() || !instances->is_array()) return;
    for (TJson const& instance : *instances)
      if (instance.is_object()) {
        fNamespaces.insert(instance.value("namespace", ""));
        fClasses.insert(instance.value("class", ""));
      }
  }

  void Rewrite(TJson& json, TPlace const& place) {
    if (json.is_string()) RewriteText(json.get_ref<std::string&>(), place);
    if (json.is_array()) RewriteElements(json, place);
    if (json.is_object()) RewriteMembers(json, place);
  }

private:
  void RewriteText(std::string& text, TPlace const& place) {
    std::size_t const begin = BeginOfKeys(text);
    if (auto const rewritten = fUse(std::string_view(text).substr(begin), place)) text.replace(begin, text.npos, *rewritten);
  }

  void RewriteElements(TJson& array, TPlace const& place) {
    std::size_t at = 0;
    for (TJson& element : array) Rewrite(element, TPlace(&place, std::to_string(at++)));
  }

  void RewriteMembers(TJson& object, TPlace const& place) {
    bool const isNumber = IsNumber(object);
    for (auto& [name, value] : object.get_ref<TJson::object_t&>())
      if (!IsName(name, value, place) && !(isNumber && name == "value")) Rewrite(value, TPlace(&place, name));
  }

  // The size of the namespace and the class with which an object path begins; 0 of any other text.
  std::size_t BeginOfKeys(std::string const& text) const {
    std::string_view const view = text;
    std::size_t const colon = text.find(':');
    if (colon == text.npos || fNamespaces.count(view.substr(0, colon)) == 0) return 0;
    std::size_t end = colon + 1;
    while (end < text.size() && IsIdentifierByte(text[end])) ++end;
    return fClasses.count(view.substr(colon + 1, end - colon - 1)) == 0 ? 0 : end;
  }

  TUseText const& fUse;
  std::set<std::string, std::less<>> fNamespaces, fClasses;
};

// "a~1b" for "a/b", as in a JSON pointer
std::string Escaped(std::string_view name) {
  std::string escaped;
  for (char const byte : name) escaped += byte == '/' ? "~1" : byte == '~' ? "~0" : std::string(1, byte);
  return escaped;
}

}  // namespace

std::string TPlace::AsText() const { return fParent == nullptr ? "" : fParent->AsText() + "/" + Escaped(fName); }

std::string PlaceOfProperty(std::size_t instance, std::string_view name) {
  return "/instances/" + std::to_string(instance) + "/properties/" + Escaped(name);
}

bool IsNumber(nlohmann::ordered_json const& object) {
  constexpr std::string_view numbers[] = {"uint", "sint", "real", "boolean", "datetime"};
  auto const type = object.find("type");
  if (type == object.end() || !type->is_string()) return false;
  std::string_view const name = type->get_ref<std::string const&>();
  return std::any_of(std::begin(numbers), std::end(numbers),
                     [&](std::string_view number) { return name.substr(0, number.size()) == number; });
}

void RewriteTexts(nlohmann::ordered_json& document, TUseText const& use) {
  TTextWriter(document, use).Rewrite(document, TPlace(nullptr, ""));
}

}  // namespace NQRVZEP20
