// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <nlohmann/json.hpp>

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace NQRVZEP20 {

// The place of a text in a document, as a JSON pointer: "/instances/4/path".
class TPlace {
public:
  TPlace(TPlace const* parent, std::string_view name) : fParent(parent), fName(name) {}

  std::string_view Name() const { return fName; }
  std::string AsText() const;

private:
  TPlace const* fParent;
  std::string_view fName;
};

// The place of a property of the instance with this index, as TPlace::AsText returns it.
std::string PlaceOfProperty(std::size_t instance, std::string_view name);

// Whether the object is a property whose value is a number or a time, perhaps as a text.
bool IsNumber(nlohmann::ordered_json const& object);

// Replaces each text of the document of a report by the one that `use` returns for it, if it returns one. Names that zep and the
// classes define are omitted: titles, codes of zep, types, classes, namespaces; of an object path, the namespace and the class.
// So are texts of numbers and times.
using TUseText = std::function<std::optional<std::string>(std::string_view text, TPlace const& place)>;
void RewriteTexts(nlohmann::ordered_json& document, TUseText const& use);

}  // namespace NQRVZEP20
