#pragma once

#include "TCIMValue.h"
#include "ZEPExport.h"

#include <string>
#include <vector>

namespace NQRVZEP20 {

// The data of a TCIMValue that is not NULL: one kind of implementation per kind of CIM type.
//
// The base refuses every conversion with kZEPStatusTypeMismatch; a kind overrides those it can do. An implementation is
// never changed once it is made (but see TCIMArrayValueImpl), so any number of threads may read it. Callers hold a
// TCIMValue and seldom meet this class.
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

  // The data as text; each kind says what `radix` means to it.
  virtual std::string ToString(unsigned char radix) const = 0;

  // Comparison with a value that holds data; false for a value of another type. A NULL value of the same type throws
  // kZEPStatusValueIsNULL.
  virtual bool operator==(TCIMValue const& other) const = 0;
  virtual bool operator<(TCIMValue const& other) const = 0;

protected:
  TCIMValueImpl() = default;
  TCIMValueImpl(TCIMValueImpl const&) = default;
  TCIMValueImpl& operator=(TCIMValueImpl const&) = delete;

  // The data of another value, whose tag the caller has found to be that of TKind. Throws kZEPStatusValueIsNULL for NULL.
  template <class TKind>
  static TKind const& DataOf(TCIMValue const& value) {
    return static_cast<TKind const&>(DataOf(value));
  }

private:
  static TCIMValueImpl const& DataOf(TCIMValue const& value);
};

}  // namespace NQRVZEP20
