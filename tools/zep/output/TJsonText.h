// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace NQRVZEP20::zep {

// Appends JSON to a text piece by piece, in the form in which AsText and AsLine (Json.h) print a document. For large arrays,
// whose elements would take much memory as a document.
//
// Refers to the text, which must outlive the object.
class TJsonText {
public:
  // `depth`: the number of objects and arrays that contain this text, by which its lines are indented; kOnOneLine: as AsLine
  // does.
  static constexpr int kOnOneLine = -1;
  TJsonText(std::string& text, int depth) : fText(text), fIsOnOneLine(depth == kOnOneLine), fDepth(depth) {}

  // An object, '{' and '}', or an array, '[' and ']'. Before each value in it, Member or Element is called.
  void Begin(char bracket);
  void End(char bracket);
  void Member(std::string_view name);
  void Element();

  // Values. A literal is a number, "true", "false" or "null". Bytes that are not valid UTF-8 become the replacement character.
  void String(std::string_view text);
  void Literal(std::string_view text) { fText += text; }

private:
  void NewLine();

  std::string& fText;
  bool fIsOnOneLine;
  bool fIsEmpty = true;  // the innermost object or array
  int fDepth;
};

}  // namespace NQRVZEP20::zep
