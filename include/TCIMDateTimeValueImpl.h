// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "TCIMDateTime.h"
#include "TCIMValueImpl.h"

namespace NQRVZEP20 {

// The data of a TCIMValue that is a datetime.
class ZEP_EXPORT TCIMDateTimeValueImpl : public TCIMValueImpl {
public:
  TCIMDateTimeValueImpl(TCIMDateTime const& dateTime);
  TCIMDateTimeValueImpl(TCIMDateTimeValueImpl const& other);
  ~TCIMDateTimeValueImpl() override;

  operator TCIMDateTime() const override;

  // The CIM text, regardless of the radix. ToString and the comparisons throw kZEPStatusInvalidDateTime for a NULL
  // datetime.
  std::string ToString(unsigned char radix) const override;

  bool operator==(TCIMValue const& other) const override;
  bool operator<(TCIMValue const& other) const override;

private:
  TCIMDateTime const fDateTime;
};

}  // namespace NQRVZEP20
