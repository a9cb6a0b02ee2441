// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMChar16.h"
#include "TCIMDateTime.h"
#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace NQRVZEP20 {

class ICIMClass;
class ICIMNamespace;
class TCIMNumericValueImpl;
class TCIMReference;
class TCIMStringValueImpl;
class TCIMValueImpl;

// One typed CIM value. Every property value, method argument, key value and array element that crosses the library's
// interface is a TCIMValue.
//
// A value consists of a type tag and, unless it is NULL, the data. A NULL value also has a tag: a property can be a NULL
// uint32, or a NULL array of string with at most 8 elements. Copies are deep and share nothing except the referenced class. A
// value can be converted only to exactly the C++ type of its tag. Not synchronised: concurrent reads are safe, a write needs
// exclusive access.
class ZEP_EXPORT TCIMValue {
public:
  // The type tag: a CIM intrinsic type, and whether it is an array of that type.
  class ZEP_EXPORT TCIMType {
  public:
    enum ECIMType : int {
      kCIMTypeInvalid = 0,  // the tag of a default-constructed value
      kCIMTypeBoolean = 1,
      kCIMTypeUint8 = 2,
      kCIMTypeSint8 = 3,
      kCIMTypeUint16 = 4,
      kCIMTypeSint16 = 5,
      kCIMTypeUint32 = 6,
      kCIMTypeSint32 = 7,
      kCIMTypeUint64 = 8,
      kCIMTypeSint64 = 9,
      kCIMTypeReal32 = 10,
      kCIMTypeReal64 = 11,
      kCIMTypeChar16 = 12,
      kCIMTypeString = 13,
      kCIMTypeDateTime = 14,
      kCIMTypeReference = 15,
      kCIMTypeArrayFlag = 16  // added to a base type: an array of that type
    };

    TCIMType(ECIMType type) noexcept : fType(type) {}

    // The type with that CIM name ("uint8", "string", ...), which is case-insensitive. There is no array syntax. An unknown
    // name is not an error: it gives the tag kCIMTypeInvalid.
    TCIMType(std::string name);

    operator ECIMType() const noexcept { return fType; }

    // The CIM name of the base type: the name of an array of sint32 is "sint32", too. Kept. Throws kZEPStatusTypeMismatch for
    // tag 0 and for a base type above 15.
    std::string ToString() const;

  private:
    ECIMType fType;
  };

  // ---- Construction. Each constructor starts from the default state and calls the Set with the same arguments. ----

  // The default state: NULL, tag 0, no referenced class, maximum array size 0.
  TCIMValue() noexcept;

  // A NULL value of that type. An `arraySize` other than 0 makes it an array type with that declared bound.
  TCIMValue(TCIMType type, unsigned int arraySize);

  TCIMValue(bool value);
  TCIMValue(unsigned char value);
  TCIMValue(signed char value);
  TCIMValue(unsigned short value);
  TCIMValue(short value);
  TCIMValue(unsigned int value);
  TCIMValue(int value);
  TCIMValue(unsigned long value);
  TCIMValue(long value);
  TCIMValue(float value);
  TCIMValue(double value);
  TCIMValue(TCIMChar16 const& value);
  TCIMValue(char const* value);
  TCIMValue(std::string const& value);
  TCIMValue(TCIMDateTime const& value);
  TCIMValue(TCIMReference& value);
  TCIMValue(TCIMType type, unsigned int maxArraySize, std::vector<TCIMValue> const& elements);

  // A scalar parsed from text. `text` is not modified; `ns` is used only for references. Numbers are parsed in decimal, as by
  // a standard stream in the classic locale: leading white space is skipped, and parsing stops at the first character that
  // cannot continue the number. A string without a number, or with a number that does not fit its type, gives 0. A negative
  // number for an unsigned type wraps around. uint8 and sint8 are parsed as 32-bit numbers and truncated to 8 bits without a
  // range check. A boolean is the word "true" or "false"; anything else gives false. A char16 is a NULL character, regardless
  // of the text (see TCIMChar16). Kept. Throws kZEPStatusTypeMismatch for tag 0, tags above 15 and arrays,
  // kZEPStatusInvalidDateTime for a malformed datetime, and the exceptions of TCIMReference::SetPath for a malformed
  // reference.
  TCIMValue(TCIMType type, std::string& text, boost::shared_ptr<ICIMNamespace> ns);

  TCIMValue(TCIMValue const& other);
  TCIMValue(TCIMValue&& other) noexcept;  // leaves `other` in the default state
  ~TCIMValue();

  // ---- Assignment ----

  // Assignment first compares the two values with ==, whose exceptions pass through. If they are equal, nothing changes: the
  // target keeps its own referenced class and maximum array size. Kept. Otherwise assignment copies the tag and the data;
  // from an array also the maximum array size, from a reference also the referenced class. A value may be assigned from
  // itself or from one of its own elements.
  TCIMValue& operator=(TCIMValue const& other);
  TCIMValue& operator=(TCIMValue&& other);
  void Set(TCIMValue const& other);

  // Makes this NULL with exactly that type. `arraySize` becomes the maximum array size if the type is an array type, and is
  // ignored otherwise.
  void SetNullValue(TCIMType::ECIMType type, unsigned int arraySize);

  // These operations replace the data and the tag; the referenced class and the maximum array size do not change.
  void Set(bool value);
  void Set(unsigned char value);
  void Set(signed char value);
  void Set(unsigned short value);
  void Set(short value);
  void Set(unsigned int value);
  void Set(int value);
  void Set(unsigned long value);
  void Set(long value);
  void Set(float value);
  void Set(double value);
  void Set(TCIMChar16 const& value);
  void Set(char const* value);
  void Set(std::string const& value);
  void Set(TCIMDateTime const& value);

  // Also sets the referenced class to the reference's class.
  void Set(TCIMReference& value);

  // Makes this an array of `type` holding a copy of the elements. `maxArraySize` is the declared bound, 0 for none; it is
  // never compared with the number of elements. An element of another type is logged as an error and throws
  // kZEPStatusInvalidProperty; an element whose tag has no name throws kZEPStatusTypeMismatch and is not logged. The elements
  // are checked after the assignment, so the value holds the new array even if the check throws. Kept.
  void Set(TCIMType type, unsigned int maxArraySize, std::vector<TCIMValue> const& elements);

  // Sets the referenced class of a NULL value. If the value is not NULL, throws kZEPStatusInvalidOpSequence and changes
  // nothing.
  void SetReferencedClass(boost::shared_ptr<ICIMClass> referencedClass);

  // ---- Queries ----

  bool IsNull() const noexcept { return fData == nullptr; }
  TCIMType GetType() const noexcept { return fType; }
  bool IsArray() const noexcept { return (fType & TCIMType::kCIMTypeArrayFlag) != 0; }
  bool IsReference() const noexcept { return fType == TCIMType::kCIMTypeReference; }    // false for an array of references
  unsigned int GetMaxArraySize() const noexcept { return fMaxArraySize; }               // 0: unbounded, or not an array
  boost::shared_ptr<ICIMClass> GetReferencedClass() const { return fReferencedClass; }  // may be empty

  // ---- Conversions. Each throws kZEPStatusValueIsNULL for a NULL value, and otherwise kZEPStatusTypeMismatch unless the tag
  //      is exactly that of the requested type. There is no conversion to TCIMChar16: use ToString, which gives the code. ----

  operator bool() const;
  operator unsigned char() const;
  operator signed char() const;
  operator unsigned short() const;
  operator short() const;
  operator unsigned int() const;
  operator int() const;
  operator unsigned long() const;
  operator long() const;
  operator float() const;
  operator double() const;
  operator std::string() const;
  operator TCIMDateTime() const;
  operator TCIMReference() const;

  // The elements themselves, not a copy: they can be changed in place, without a check. The returned reference is valid until
  // the value is next changed or destroyed.
  operator std::vector<TCIMValue>&() const;

  // The value as text. `radix` is 8, 10 or 16; only unsigned integers can be printed with 8 and 16, and with 16 they have
  // upper-case digits and are zero-padded to the width of the type. Strings, datetimes, char16 and references ignore the
  // radix. Strings are neither quoted nor escaped; an array is printed as "{ a, b }". Throws kZEPStatusValueIsNULL for a NULL
  // value or element. For a boolean or a number, throws kZEPStatusNotSupported for any other radix, and for a signed integer
  // or a real also for 8 and 16.
  std::string ToString(unsigned char radix = 10) const;

  // ---- Comparisons. NULL sorts first; other values are ordered by tag and then by data. <= and > evaluate == first.
  //      Comparing two arrays of one type with < throws kZEPStatusNotImplemented. ----

  bool operator==(TCIMValue const& other) const;
  bool operator<(TCIMValue const& other) const;
  bool operator!=(TCIMValue const& other) const { return !(*this == other); }
  bool operator>=(TCIMValue const& other) const { return !(*this < other); }
  bool operator<=(TCIMValue const& other) const { return *this == other || *this < other; }
  bool operator>(TCIMValue const& other) const { return !(*this == other) && !(*this < other); }

private:
  friend class TCIMValueImpl;

  bool IsNumber() const noexcept { return fType >= TCIMType::kCIMTypeBoolean && fType <= TCIMType::kCIMTypeReal64; }
  bool HoldsNumber() const noexcept { return fData != nullptr && IsNumber(); }
  bool HoldsString() const noexcept { return fData != nullptr && fType == TCIMType::kCIMTypeString; }
  TCIMNumericValueImpl const& Number() const noexcept;  // of a value that holds one
  TCIMStringValueImpl const& String() const noexcept;   // of a value that holds one

  template <class TSource>
  TCIMValueImpl* NewNumber(TSource const& source) noexcept;
  template <class TSource>
  TCIMValueImpl* NewString(TSource&& source);
  template <class TKind, class TSource>
  TCIMValueImpl* NewData(TSource const& source);
  TCIMNumericValueImpl const& NumberAs(TCIMType required) const;
  TCIMValueImpl const& DataAs(TCIMType required) const;
  [[noreturn]] void Refuse() const;

  void CopyOther(TCIMValue const& other);
  bool EqualsOther(TCIMValue const& other) const;
  bool IsLessThanOther(TCIMValue const& other) const;
  void DestroyData() noexcept;
  void TakeData(TCIMValue&& other) noexcept;
  void TakeFrom(TCIMValue&& other) noexcept;

  TCIMType fType;
  unsigned int fMaxArraySize = 0;
  boost::shared_ptr<ICIMClass> fReferencedClass;

  // The data of one value, never shared. Numbers and strings, the most frequent kinds, are stored inside the value; every other
  // kind is allocated on the heap.
  TCIMValueImpl* fData = nullptr;  // null: the value is NULL; or points to the number or string in fPlace; or owns a heap object
  alignas(void*) unsigned char fPlace[40];
};

// Writes the name that TCIMType::ToString returns; its exceptions pass through.
ZEP_EXPORT std::ostream& operator<<(std::ostream& stream, TCIMValue::TCIMType const& type);

// Named values that a caller passes to an operation of the object model. Usually empty.
using TCIMContext = std::map<std::string, TCIMValue>;

}  // namespace NQRVZEP20

#include "TCIMValueInline.h"
