// SPDX-License-Identifier: Apache-2.0
#include "tools/zep/plugin/ValueLines.h"

#include "CIMNames.h"
#include "ICIMInstance.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "collect/TValueWords.h"
#include "tools/zep/output/Json.h"
#include "tools/zep/output/Text.h"

namespace NQRVZEP20::zep {

namespace {

using TType = TCIMValue::TCIMType;

TCIMContext const kNoContext;
constexpr std::size_t kWidth = 110;             // of the text of a comment
constexpr std::size_t kMostWords = 6 * kWidth;  // of the list of values; the MOF file has the complete one

std::string DescriptionOf(ICIMNamedElement const& element) {
  auto const qualifier = element.GetQualifier("Description", kNoContext);
  TCIMValue const value = qualifier ? qualifier->GetValue(kNoContext) : TCIMValue();
  return value.IsNull() ? "" : value.ToString();
}

// The text up to the first full stop or the end of the first line.
std::string FirstSentenceOf(std::string const& text) {
  std::string const line = text.substr(0, text.find_first_of("\r\n"));
  std::size_t const stop = line.find(". ");
  return stop == line.npos ? line : line.substr(0, stop + 1);
}

// A backslash at the end would make the next line a part of the comment.
std::string AsComment(std::string const& text) {
  std::string comment;
  for (std::string const& line : Wrapped(Printable(text), kWidth))
    comment += "  // " + line + (!line.empty() && line.back() == '\\' ? "." : "") + "\n";
  return comment;
}

// "Values: 2 (Degraded), 5 (OK)".
std::string WordsOf(ICIMPropertyDecl const& property) {
  TValueWords const all(property);
  std::string words;
  for (auto const& [value, word] : all.Entries()) {
    if (words.size() > kMostWords) return words + ", ...";
    words += (words.empty() ? "Values: " : ", ") + value + " (" + word + ")";
  }
  return words;
}

std::string CommentOf(ICIMPropertyDecl const& property) {
  TCIMValue const initial = property.GetDefaultValue(kNoContext);
  auto const referenced = initial.GetReferencedClass();
  std::string heading = property.GetName(kNoContext) + ", " + NameOf(initial.GetType());
  if (referenced) heading += " to " + referenced->GetName(kNoContext) + " (GetReference of another instance)";
  if (property.IsKey(kNoContext)) heading += ", key";
  std::string const sentence = FirstSentenceOf(DescriptionOf(property));
  std::string const words = WordsOf(property);
  return AsComment(heading + (sentence.empty() ? "" : ": " + sentence)) + (words.empty() ? "" : AsComment(words));
}

// A value for a key. CIM names the class of an object in such a property.
std::string ExampleFor(ICIMPropertyDecl const& key, std::string const& className) {
  TType const type = key.GetDefaultValue(kNoContext).GetType();
  bool const isClassName = IsSameName(key.GetName(kNoContext), "CreationClassName");
  switch (type) {
    case TType::kCIMTypeBoolean:
      return "true";
    case TType::kCIMTypeReal32:
      return "1.0f";
    case TType::kCIMTypeReal64:
      return "1.0";
    case TType::kCIMTypeChar16:
      return "TCIMChar16('1')";
    case TType::kCIMTypeString:
      return isClassName ? "\"" + className + "\"" : "\"example\"";
    case TType::kCIMTypeDateTime:
      return "TCIMDateTime(\"20260101000000.000000+000\")";
    default:
      return type >= TType::kCIMTypeUint8 && type <= TType::kCIMTypeSint64 ? "1" : "TCIMValue()";
  }
}

std::string LineFor(ICIMPropertyDecl const& property, std::string const& className) {
  bool const isKey = property.IsKey(kNoContext);
  TCIMValue const initial = property.GetDefaultValue(kNoContext);
  std::string const value = isKey ? ExampleFor(property, className) : "TCIMValue()";
  std::string const line = "values.Set(\"" + property.GetName(kNoContext) + "\", " + value + ");\n";
  return isKey || initial.IsNull() ? "  " + line
                                   : AsComment("It keeps its default, " + initial.ToString() + ", unless it is set.");
}

}  // namespace

std::string ValueLinesOf(ICIMClass& cls) {
  std::string const className = cls.GetName(kNoContext);
  std::string keys, others;
  cls.CreateInstance(kNoContext)
      ->EnumerateProperties(
          [&](boost::shared_ptr<ICIMProperty> property) {
            auto const declaration = property->GetDeclaration(kNoContext);
            (declaration->IsKey(kNoContext) ? keys : others) += CommentOf(*declaration) + LineFor(*declaration, className);
            return true;
          },
          kNoContext);
  return keys + others;
}

}  // namespace NQRVZEP20::zep
