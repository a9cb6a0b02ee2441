// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <boost/shared_ptr.hpp>

#include <string>

namespace NQRVZEP20 {

class TCIMChar16Impl;

// A CIM char16: one 16-bit character code. Its string form is the code as a decimal number, not the character.
//
// A plain value: copies are deep and share nothing. Not synchronised: use one object from one thread at a time.
class ZEP_EXPORT TCIMChar16 {
public:
  TCIMChar16();  // code 0
  TCIMChar16(unsigned short code);

  // Makes a NULL character, regardless of the text. Kept.
  TCIMChar16(std::string const& text);

  TCIMChar16(TCIMChar16 const& other);
  TCIMChar16& operator=(TCIMChar16 const& other);
  ~TCIMChar16();

  unsigned short GetValue() const;  // 0 for a NULL character

  // The code in decimal: 65 gives "65". Throws kZEPStatusInvalidDateTime for a NULL character.
  std::string ToString() const;

  // Both return true for any two characters, regardless of their codes: any two characters are equal, and each is less than
  // the other. Do not sort or deduplicate with these operators. Both throw kZEPStatusInvalidDateTime when either character
  // is NULL. Kept.
  bool operator==(TCIMChar16 const& other) const;
  bool operator<(TCIMChar16 const& other) const;

private:
  boost::shared_ptr<TCIMChar16Impl> fBody;  // never shared between two characters
};

}  // namespace NQRVZEP20
