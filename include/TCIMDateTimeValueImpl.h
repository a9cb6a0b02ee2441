// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"
#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The datetime kind of a TCIMValue's data.
class ZEP_EXPORT TCIMDateTimeValueImpl : public TCIMValueImpl {
public:
  TCIMDateTimeValueImpl(TCIMDateTime const& dateTime);
  TCIMDateTimeValueImpl(TCIMDateTimeValueImpl const& other);
  ~TCIMDateTimeValueImpl() override;

  operator TCIMDateTime() const override;

  // The CIM text, whatever the radix. This and the comparisons throw kZEPStatusInvalidDateTime for a NULL datetime.
  std::string ToString(unsigned char radix) const override;

  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  TCIMDateTime const fDateTime;
};

}  // namespace NQRVZEP20
