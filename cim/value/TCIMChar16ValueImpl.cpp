// SPDX-License-Identifier: Apache-2.0
#include "TCIMChar16ValueImpl.h"

namespace NQRVZEP20 {

TCIMChar16ValueImpl::TCIMChar16ValueImpl(TCIMChar16 const& character) : fCharacter(character) {}
TCIMChar16ValueImpl::TCIMChar16ValueImpl(TCIMChar16ValueImpl const& other) = default;
TCIMChar16ValueImpl::~TCIMChar16ValueImpl() = default;

TCIMChar16ValueImpl::operator TCIMChar16() const { return fCharacter; }

std::string TCIMChar16ValueImpl::ToString(unsigned char) const { return fCharacter.ToString(); }

bool TCIMChar16ValueImpl::operator==(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeChar16) return false;
  return fCharacter == DataOf<TCIMChar16ValueImpl>(other).fCharacter;
}

bool TCIMChar16ValueImpl::operator<(TCIMValue const& other) const {
  if (other.GetType() != TCIMValue::TCIMType::kCIMTypeChar16) return false;
  return fCharacter < DataOf<TCIMChar16ValueImpl>(other).fCharacter;
}

}  // namespace NQRVZEP20
