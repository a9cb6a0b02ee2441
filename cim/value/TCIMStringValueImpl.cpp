// SPDX-License-Identifier: Apache-2.0
#include "TCIMStringValueImpl.h"

namespace NQRVZEP20 {

TCIMStringValueImpl::operator std::string() const { return fText; }

std::string TCIMStringValueImpl::ToString(unsigned char) const { return fText; }

bool TCIMStringValueImpl::operator==(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeString) return false;
  return fText == DataOf<TCIMStringValueImpl>(other).fText;
}

bool TCIMStringValueImpl::operator<(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeString) return false;
  return fText < DataOf<TCIMStringValueImpl>(other).fText;
}

}  // namespace NQRVZEP20
