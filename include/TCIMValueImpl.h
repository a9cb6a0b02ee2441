// SPDX-License-Identifier: Apache-2.0
#include "TCIMValue.h"  // leads to this header again, which is why the guard stands below it

#ifndef ZEP_TCIM_VALUE_IMPL_H
#define ZEP_TCIM_VALUE_IMPL_H

#include "ZEPExport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The data of a TCIMValue that is not NULL. There is one derived class for each kind of data: numbers, strings, datetimes,
// char16, references and arrays.
//
// Every conversion of this base class throws kZEPStatusTypeMismatch; a derived class overrides those that it supports. An
// object does not change after construction (except the elements of a TCIMArrayValueImpl), so any number of threads may read
// it. Callers use TCIMValue and rarely need this class.
class ZEP_EXPORT TCIMValueImpl {
public:
  virtual ~TCIMValueImpl() = default;

  virtual operator bool() const;
  virtual operator unsigned char() const;
  virtual operator signed char() const;
  virtual operator unsigned short() const;
  virtual operator short() const;
  virtual operator unsigned int() const;
  virtual operator int() const;
  virtual operator unsigned long() const;
  virtual operator long() const;
  virtual operator float() const;
  virtual operator double() const;
  virtual operator std::string() const;
  virtual operator TCIMChar16() const;
  virtual operator TCIMDateTime() const;
  virtual operator TCIMReference() const;
  virtual operator std::vector<TCIMValue>&() const;

  // The data as text; each kind documents its use of `radix`.
  virtual std::string ToString(unsigned char radix) const = 0;

  // Compare with a value that is not NULL. False for a value of another type; throws kZEPStatusValueIsNULL for a NULL value
  // of the same type.
  virtual bool operator==(TCIMValue const& other) const = 0;
  virtual bool operator<(TCIMValue const& other) const = 0;

protected:
  TCIMValueImpl() = default;
  TCIMValueImpl(TCIMValueImpl const&) = default;
  TCIMValueImpl(TCIMValueImpl&&) = default;
  TCIMValueImpl& operator=(TCIMValueImpl const&) = delete;

  // The data of `value`. The caller has checked that the tag of `value` belongs to TKind. Throws kZEPStatusValueIsNULL for a
  // NULL value.
  template <class TKind>
  static TKind const& DataOf(TCIMValue const& value) {
    return static_cast<TKind const&>(DataOf(value));
  }

private:
  static TCIMValueImpl const& DataOf(TCIMValue const& value) {
    if (value.IsNull()) RefuseNull();
    return *value.fData;
  }
  [[noreturn]] static void RefuseNull();
};

}  // namespace NQRVZEP20

#endif
