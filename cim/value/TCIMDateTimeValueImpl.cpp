// SPDX-License-Identifier: Apache-2.0
#include "TCIMDateTimeValueImpl.h"

namespace NQRVZEP20 {

TCIMDateTimeValueImpl::TCIMDateTimeValueImpl(TCIMDateTime const& dateTime) : fDateTime(dateTime) {}
TCIMDateTimeValueImpl::TCIMDateTimeValueImpl(TCIMDateTimeValueImpl const& other) = default;
TCIMDateTimeValueImpl::~TCIMDateTimeValueImpl() = default;

TCIMDateTimeValueImpl::operator TCIMDateTime() const { return fDateTime; }

std::string TCIMDateTimeValueImpl::ToString(unsigned char) const { return fDateTime.ToString(); }

bool TCIMDateTimeValueImpl::operator==(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeDateTime) return false;
  return fDateTime == DataOf<TCIMDateTimeValueImpl>(other).fDateTime;
}

bool TCIMDateTimeValueImpl::operator<(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeDateTime) return false;
  return fDateTime < DataOf<TCIMDateTimeValueImpl>(other).fDateTime;
}

}  // namespace NQRVZEP20
