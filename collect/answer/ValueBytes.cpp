// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/ValueBytes.h"

#include "CIMNames.h"
#include "ICIMClass.h"
#include "TZEPException.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"

#include <limits>

namespace NQRVZEP20 {

namespace {

using TType = TCIMValue::TCIMType;

// The first byte of a value: the tag, if it is below 32, and these.
constexpr unsigned int kNull = 0x20;
constexpr unsigned int kMissing = 0x40;
constexpr unsigned int kOtherTag = 0x80;  // the tag follows as a number
constexpr unsigned int kLargestShortTag = 0x1f;

// A reference and a datetime begin with a set of these.
constexpr unsigned int kHasNamespace = 1;
constexpr unsigned int kIsNull = 1, kIsInterval = 2, kHasPrecision = 4;
constexpr std::size_t kFieldBytes = 20;  // of a datetime

bool IsArrayTag(unsigned int tag) { return (tag & TType::kCIMTypeArrayFlag) != 0; }

// ---- Writing ----

void WriteTag(TByteWriter& writer, unsigned int tag, bool isNull) {
  unsigned int const null = isNull ? kNull : 0;
  if (tag <= kLargestShortTag) return writer.Byte(tag | null);
  writer.Byte(kOtherTag | null);
  writer.Number(tag);
}

// The number of the class plus 2; 1 and the name for a class of another namespace; 0 for none.
void WriteClass(TByteWriter& writer, boost::shared_ptr<ICIMClass> const& cls, TClassNumbers const& classes) {
  if (!cls) return writer.Number(0);
  std::string const name = cls->GetName(TCIMContext());
  auto const number = classes.find(FoldName(name));
  if (number != classes.end()) return writer.Number(number->second + 2);
  writer.Number(1);
  writer.Text(name);
}

// There is no conversion to TCIMChar16.
void WriteChar16(TByteWriter& writer, TCIMValue const& value) {
  std::string code;
  try {
    code = value.ToString();
  } catch (TZEPException const&) {
    code = "";  // a NULL character
  }
  writer.Byte(code.empty() ? 1 : 0);
  writer.Fixed(static_cast<std::uint16_t>(code.empty() ? 0 : std::stoul(code)));
}

void WriteDateTime(TByteWriter& writer, TCIMDateTime const& time) {
  writer.Byte((time.IsNull() ? kIsNull : 0) | (time.IsInterval() ? kIsInterval : 0) | (time.GetPrecision() ? kHasPrecision : 0));
  writer.Fixed(static_cast<std::uint16_t>(time.GetYear()));
  writer.Fixed(static_cast<std::uint16_t>(time.GetMonth()));
  writer.Fixed(static_cast<std::uint32_t>(time.GetDay()));
  writer.Fixed(static_cast<std::uint16_t>(time.GetHour()));
  writer.Fixed(static_cast<std::uint16_t>(time.GetMinute()));
  writer.Fixed(static_cast<std::uint16_t>(time.GetSecond()));
  writer.Fixed(static_cast<std::uint32_t>(time.GetMicroSeconds()));
  writer.Fixed(static_cast<std::int16_t>(time.GetUTCOffset()));
}

void WriteNested(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes, std::uint64_t depth);

void WriteNestedReference(TByteWriter& writer, TCIMReference const& reference, TClassNumbers const& classes,
                          std::uint64_t depth) {
  TByteWriter keys;
  std::uint64_t count = 0;
  reference.EnumerateKeyBindings([&](std::pair<std::string, TCIMValue> const& key) {
    if (++count > kMostKeys) throw TBadAnswer("a path has more than " + std::to_string(kMostKeys) + " keys");
    keys.Text(key.first);
    WriteNested(keys, key.second, classes, depth + 1);
    return true;
  });
  writer.Byte(reference.GetNamespace() ? kHasNamespace : 0);
  WriteClass(writer, reference.GetClass(), classes);
  writer.Text(reference.GetNameSpaceName());
  writer.Number(count);
  writer.Raw(keys.Bytes());
}

void WriteArray(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes, std::uint64_t depth) {
  std::vector<TCIMValue> const& elements = value;
  writer.Number(value.GetMaxArraySize());
  writer.Number(elements.size());
  for (TCIMValue const& element : elements) WriteNested(writer, element, classes, depth + 1);
}

void WriteNull(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes) {
  if (value.IsArray()) writer.Number(value.GetMaxArraySize());
  if (value.IsReference()) WriteClass(writer, value.GetReferencedClass(), classes);
}

void WriteData(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes, std::uint64_t depth) {
  switch (value.GetType()) {
    case TType::kCIMTypeBoolean:
      return writer.Byte(value.operator bool() ? 1 : 0);
    case TType::kCIMTypeUint8:
      return writer.Fixed(value.operator unsigned char());
    case TType::kCIMTypeSint8:
      return writer.Fixed(value.operator signed char());
    case TType::kCIMTypeUint16:
      return writer.Fixed(value.operator unsigned short());
    case TType::kCIMTypeSint16:
      return writer.Fixed(value.operator short());
    case TType::kCIMTypeUint32:
      return writer.Fixed(value.operator unsigned int());
    case TType::kCIMTypeSint32:
      return writer.Fixed(value.operator int());
    case TType::kCIMTypeUint64:
      return writer.Fixed(value.operator unsigned long());
    case TType::kCIMTypeSint64:
      return writer.Fixed(value.operator long());
    case TType::kCIMTypeReal32:
      return writer.Fixed(value.operator float());
    case TType::kCIMTypeReal64:
      return writer.Fixed(value.operator double());
    case TType::kCIMTypeChar16:
      return WriteChar16(writer, value);
    case TType::kCIMTypeString:
      return writer.Text(value.operator std::string());
    case TType::kCIMTypeDateTime:
      return WriteDateTime(writer, value);
    case TType::kCIMTypeReference:
      return WriteNestedReference(writer, value, classes, depth);
    default:
      return WriteArray(writer, value, classes, depth);
  }
}

void WriteNested(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes, std::uint64_t depth) {
  if (depth > kMostReferenceDepth)
    throw TBadAnswer("a value is nested more than " + std::to_string(kMostReferenceDepth) + " deep");
  WriteTag(writer, static_cast<unsigned int>(value.GetType()), value.IsNull());
  if (value.IsNull())
    WriteNull(writer, value, classes);
  else
    WriteData(writer, value, classes, depth);
}

// ---- Reading ----

struct TTag {
  unsigned int fType;
  bool fIsNull;
};

TTag ReadTag(TByteReader& reader) {
  unsigned int const first = reader.Byte();
  if ((first & kMissing) != 0) throw TBadAnswer("a failure is in the place of a value");
  bool const isNull = (first & kNull) != 0;
  if ((first & kOtherTag) == 0) return {first & kLargestShortTag, isNull};
  return {static_cast<unsigned int>(reader.NumberUpTo(std::numeric_limits<unsigned int>::max(), "a type")), isNull};
}

TType::ECIMType AsType(unsigned int tag) { return static_cast<TType::ECIMType>(tag); }

boost::shared_ptr<ICIMClass> ReadClass(TByteReader& reader, TReadingNamespace const& ns) {
  std::uint64_t const number = reader.Number();
  if (number == 0) return {};
  return number == 1 ? ns.OutsideClass(std::string(reader.Text())) : ns.ClassAt(static_cast<std::size_t>(number - 2));
}

TCIMValue ReadChar16(TByteReader& reader) {
  bool const isNull = reader.Byte() != 0;
  auto const code = reader.Fixed<std::uint16_t>();
  return TCIMValue(isNull ? TCIMChar16(std::string()) : TCIMChar16(code));
}

TCIMDateTime ReadDateTime(TByteReader& reader) {
  unsigned int const flags = reader.Byte();
  auto const year = reader.Fixed<std::uint16_t>(), month = reader.Fixed<std::uint16_t>();
  auto const day = reader.Fixed<std::uint32_t>();
  auto const hour = reader.Fixed<std::uint16_t>(), minute = reader.Fixed<std::uint16_t>(), second = reader.Fixed<std::uint16_t>();
  auto const microSeconds = reader.Fixed<std::uint32_t>();
  auto const offset = reader.Fixed<std::int16_t>();

  TCIMDateTime time;
  bool const isInterval = (flags & kIsInterval) != 0;
  bool const hasDate = year != 0 || month != 0 || offset != 0;  // an interval keeps those of the timestamp that it was
  if (isInterval && hasDate) time.Set(year, month, 1, 0, 0, 0, 0, offset);
  if (isInterval)
    time.Set(day, hour, minute, second, microSeconds);
  else if (hasDate || (flags & kIsNull) == 0)
    time.Set(year, month, day, hour, minute, second, microSeconds, offset);
  time.SetPrecision((flags & kHasPrecision) != 0);
  if ((flags & kIsNull) != 0) time.Clear();
  return time;
}

TCIMValue ReadArray(TByteReader& reader, unsigned int tag, TReadingNamespace const& ns) {
  auto const bound = static_cast<unsigned int>(reader.Number());
  auto const count = static_cast<std::size_t>(reader.Number());
  TCIMValue array(AsType(tag & ~static_cast<unsigned int>(TType::kCIMTypeArrayFlag)), bound, std::vector<TCIMValue>());
  std::vector<TCIMValue>& elements = array;
  elements.reserve(count);
  while (elements.size() < count) elements.push_back(ReadValue(reader, ns));
  return array;
}

TCIMValue ReadNull(TByteReader& reader, unsigned int tag, TReadingNamespace const& ns) {
  TCIMValue value;
  value.SetNullValue(AsType(tag), IsArrayTag(tag) ? static_cast<unsigned int>(reader.Number()) : 0);
  if (value.IsReference()) value.SetReferencedClass(ReadClass(reader, ns));
  return value;
}

}  // namespace

void WriteValue(TByteWriter& writer, TCIMValue const& value, TClassNumbers const& classes) {
  WriteNested(writer, value, classes, 0);
}

void WriteReference(TByteWriter& writer, TCIMReference const& reference, TClassNumbers const& classes) {
  WriteNestedReference(writer, reference, classes, 0);
}

void WriteMissingValue(TByteWriter& writer) { writer.Byte(kMissing); }

bool IsMissingValue(TByteReader& reader) {
  TByteReader ahead = reader;
  if (ahead.Byte() != kMissing) return false;
  reader = ahead;
  return true;
}

void TValueChecker::CheckClass(TByteReader& reader) const {
  std::uint64_t const number = reader.Number();
  if (number == 1) reader.Name();
  if (number > 1 && number - 2 >= fClasses) throw TBadAnswer("a value refers to a class that does not exist");
}

void TValueChecker::CheckReference(TByteReader& reader, std::uint64_t depth) {
  reader.Byte();
  TByteReader const atClass = reader;
  CheckClass(reader);
  reader.Text();  // the label
  std::size_t const keys = reader.Count(kMostKeys, "the number of keys");
  if (keys > 0 && TByteReader(atClass).Number() == 0) throw TBadAnswer("a reference has keys, but no class");
  for (std::size_t n = 0; n < keys; ++n) {
    reader.Name();
    CheckValue(reader, depth + 1);
  }
}

void TValueChecker::CheckData(TByteReader& reader, unsigned int type, std::uint64_t depth) {
  constexpr std::size_t kSizes[] = {0, 1, 1, 1, 2, 2, 4, 4, 8, 8, 4, 8, 3};  // by type, up to char16
  if (IsArrayTag(type)) {
    reader.NumberUpTo(std::numeric_limits<unsigned int>::max(), "the bound of an array");
    std::size_t const count = reader.Count(kMostArrayElements, "the size of an array");
    for (std::size_t n = 0; n < count; ++n) CheckValue(reader, depth + 1);
    return;
  }
  if (type == TType::kCIMTypeString) {
    reader.Text();
  } else if (type == TType::kCIMTypeDateTime) {
    reader.Skip(1 + kFieldBytes);
  } else if (type == TType::kCIMTypeReference) {
    CheckReference(reader, depth);
  } else if (type != TType::kCIMTypeInvalid && type < sizeof kSizes / sizeof *kSizes) {
    reader.Skip(kSizes[type]);
  } else {
    throw TBadAnswer("a value has the type " + std::to_string(type));
  }
}

void TValueChecker::CheckValue(TByteReader& reader, std::uint64_t depth) {
  if (depth > kMostReferenceDepth) throw TBadAnswer("a value is nested too deeply");
  if (++*fValues > kMostValues) throw TBadAnswer("there are more than " + std::to_string(kMostValues) + " values");
  TTag const tag = ReadTag(reader);
  if (!tag.fIsNull) return CheckData(reader, tag.fType, depth);
  if ((tag.fType & ~unsigned{TType::kCIMTypeArrayFlag}) > TType::kCIMTypeReference) fHasForeignType = true;
  if (IsArrayTag(tag.fType)) reader.NumberUpTo(std::numeric_limits<unsigned int>::max(), "the bound of an array");
  if (tag.fType == TType::kCIMTypeReference) CheckClass(reader);
}

void SkipValue(TByteReader& reader) {
  std::uint64_t values = 0;
  TValueChecker(std::numeric_limits<std::size_t>::max(), values).CheckValue(reader);
}

TCIMReference ReadReference(TByteReader& reader, TReadingNamespace const& ns) {
  bool const hasNamespace = (reader.Byte() & kHasNamespace) != 0;
  TByteReader const atClass = reader;
  bool const isOutside = TByteReader(atClass).Number() == 1;
  auto const cls = ReadClass(reader, ns);
  TCIMReference reference(hasNamespace ? ns.Namespace() : boost::shared_ptr<ICIMNamespace>(), TCIMContext());
  reference.SetNameSpaceName(std::string(reader.Text()));
  reference.SetClass(cls);
  for (auto keys = reader.Number(); keys > 0; --keys) {
    std::string const name(reader.Text());
    TCIMValue const value = ReadValue(reader, ns);
    if (isOutside) ns.DeclareOutside(cls, name, value);
    reference.AddKeyValue(name, value);
  }
  return reference;
}

TCIMValue ReadValue(TByteReader& reader, TReadingNamespace const& ns) {
  TTag const tag = ReadTag(reader);
  if (tag.fIsNull) return ReadNull(reader, tag.fType, ns);
  if (IsArrayTag(tag.fType)) return ReadArray(reader, tag.fType, ns);
  switch (tag.fType) {
    case TType::kCIMTypeBoolean:
      return reader.Byte() != 0;
    case TType::kCIMTypeUint8:
      return reader.Fixed<unsigned char>();
    case TType::kCIMTypeSint8:
      return reader.Fixed<signed char>();
    case TType::kCIMTypeUint16:
      return reader.Fixed<unsigned short>();
    case TType::kCIMTypeSint16:
      return reader.Fixed<short>();
    case TType::kCIMTypeUint32:
      return reader.Fixed<unsigned int>();
    case TType::kCIMTypeSint32:
      return reader.Fixed<int>();
    case TType::kCIMTypeUint64:
      return reader.Fixed<unsigned long>();
    case TType::kCIMTypeSint64:
      return reader.Fixed<long>();
    case TType::kCIMTypeReal32:
      return reader.Fixed<float>();
    case TType::kCIMTypeReal64:
      return reader.Fixed<double>();
    case TType::kCIMTypeChar16:
      return ReadChar16(reader);
    case TType::kCIMTypeString:
      return std::string(reader.Text());
    case TType::kCIMTypeDateTime:
      return ReadDateTime(reader);
    case TType::kCIMTypeReference: {
      TCIMReference reference = ReadReference(reader, ns);
      return TCIMValue(reference);
    }
    default:
      throw TBadAnswer("a value has the type " + std::to_string(tag.fType));
  }
}

}  // namespace NQRVZEP20
