// SPDX-License-Identifier: Apache-2.0
#include "providers/mof/MofValues.h"

#include "ICIMClass.h"
#include "providers/memory/CIMTypes.h"
#include "providers/mof/MofNumbers.h"
#include "providers/mof/MofStrings.h"

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

[[noreturn]] void Refuse(TMofLiteral const& literal, TType type) {
  throw TMofError(literal.fSpan, "expected a value of the type " + type.ToString());
}

TCIMDateTime DateTimeOf(TMofLiteral const& literal) {
  try {
    return TCIMDateTime(literal.fString);
  } catch (TZEPException const&) {
    throw TMofError(literal.fSpan, "expected a datetime of 25 characters, such as \"20070315143000.000000+060\"");
  }
}

TCIMValue StringValue(TMofLiteral const& literal, TType type, boost::shared_ptr<ICIMNamespace> ns) {
  if (type == TType::kCIMTypeString) return TCIMValue(literal.fString);
  if (type == TType::kCIMTypeDateTime) return TCIMValue(DateTimeOf(literal));
  if (type == TType::kCIMTypeReference) return ReadMofPath(literal.fString, literal.fSpan, ns);
  Refuse(literal, type);
}

TCIMValue ScalarValue(TMofLiteral const& literal, TType type, boost::shared_ptr<ICIMNamespace> const& ns) {
  switch (literal.fKind) {
    case TMofLiteral::kNull:
      return TCIMValue(type, 0);
    case TMofLiteral::kString:
      return StringValue(literal, type, ns);
    case TMofLiteral::kNumber:
      return ReadMofNumber(literal.fSpan.fText, type, literal.fSpan);
    case TMofLiteral::kBoolean:
      if (type != TType::kCIMTypeBoolean) break;
      return TCIMValue(literal.fSpan.fText.size() == 4);  // "true"
    case TMofLiteral::kChar:
      if (type != TType::kCIMTypeChar16) break;
      return TCIMValue(TCIMChar16(CharacterOf(literal.fSpan)));
    case TMofLiteral::kAlias:
      throw TMofError(literal.fSpan, "an alias is allowed only as the value of a reference in an instance");
  }
  Refuse(literal, type);
}

// The value has no text when its character is NULL.
std::string CharacterText(TCIMValue const& value) {
  try {
    return EscapedCharacter(static_cast<unsigned short>(std::stoul(value.ToString())));
  } catch (TZEPException const&) {
    ThrowUnprintable();
  }
}

// A NULL datetime within a value that is not NULL is written as NULL.
std::string DateTimeText(TCIMDateTime const& datetime) {
  if (datetime.IsNull()) return "NULL";
  std::string const text = datetime.ToString();
  if (text.size() != 25) ThrowUnprintable();
  return "\"" + text + "\"";
}

}  // namespace

void ThrowUnprintable() { throw TZEPException(kZEPStatusNotSupported); }

TCIMValue ReadMofValue(TMofValue const& value, TType type, unsigned int maxArraySize, boost::shared_ptr<ICIMNamespace> ns) {
  bool const isNull = !value.fIsArray && value.fLiterals.front().fKind == TMofLiteral::kNull;
  if (isNull) return TCIMValue(type, IsArrayType(type) ? maxArraySize : 0);
  if (value.fIsArray && !IsArrayType(type)) throw TMofError(value.fSpan, "expected one value, not an array");
  if (!value.fIsArray && IsArrayType(type)) throw TMofError(value.fSpan, "expected an array of values in braces");
  if (!value.fIsArray) return ScalarValue(value.fLiterals.front(), type, ns);

  std::vector<TCIMValue> elements;
  elements.reserve(value.fLiterals.size());
  for (TMofLiteral const& literal : value.fLiterals) elements.push_back(ScalarValue(literal, BaseTypeOf(type), ns));
  return TCIMValue(BaseTypeOf(type), maxArraySize, elements);
}

std::string MofScalarText(TCIMValue const& value) {
  if (value.IsNull()) return "NULL";
  switch (value.GetType()) {
    case TType::kCIMTypeBoolean:
      return value ? "TRUE" : "FALSE";
    case TType::kCIMTypeString:
      return "\"" + Escaped(value.operator std::string()) + "\"";
    case TType::kCIMTypeReal32:
      return MofRealText(value.operator float());
    case TType::kCIMTypeReal64:
      return MofRealText(value.operator double());
    case TType::kCIMTypeDateTime:
      return DateTimeText(value);
    case TType::kCIMTypeChar16:
      return CharacterText(value);
    case TType::kCIMTypeReference:
      return "\"" + Escaped(MofPathText(value)) + "\"";
    default:
      return value.ToString();
  }
}

}  // namespace NQRVZEP20
