// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace NQRVZEP20 {

// The values of a JSON text in their order, to be read once: the elements or members of a value follow it. All their texts are in
// one string, so that a tree takes far less time and memory than objects of nlohmann::ordered_json.
//
// A value is named by its number; that of the whole text is 0. The text must have less than 4 GiB.
class TJsonTree {
public:
  enum class EKind : std::uint8_t { kNull, kBoolean, kInteger, kFloat, kString, kArray, kObject };

  EKind KindOf(std::size_t value) const { return fValues[value].fKind; }
  // The name of a member; otherwise empty.
  std::string_view NameOf(std::size_t value) const { return In(fValues[value].fName); }
  // The content of a string; otherwise the JSON text of the value. Of an array or an object: empty.
  std::string_view TextOf(std::size_t value) const { return In(fValues[value].fText); }
  // The number of the first value that is neither this one nor below it.
  std::size_t EndOf(std::size_t value) const { return fValues[value].fEnd; }

  // ---- To fill it, value by value ----

  void Reserve(std::size_t bytes) { fTexts.reserve(bytes); }
  void SetNameOfNext(std::string_view name) { fNextName = Add(name); }
  void Add(EKind kind, std::string_view text);
  // Begins and ends an array or an object.
  void Open(EKind kind);
  void Close();

private:
  // A part of the texts.
  struct TPart {
    std::uint32_t fBegin = 0, fSize = 0;
  };
  struct TValue {
    EKind fKind;
    TPart fName, fText;
    std::uint32_t fEnd;
  };

  TPart Add(std::string_view text);
  std::string_view In(TPart const& part) const { return std::string_view(fTexts).substr(part.fBegin, part.fSize); }

  std::vector<TValue> fValues;
  std::string fTexts;
  TPart fNextName;
  std::vector<std::size_t> fOpen;
};

}  // namespace NQRVZEP20
