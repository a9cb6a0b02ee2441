// SPDX-License-Identifier: Apache-2.0
#include "TCIMReferenceValueImpl.h"

namespace NQRVZEP20 {

TCIMReferenceValueImpl::TCIMReferenceValueImpl(TCIMReference const& reference) : fReference(reference) {}
TCIMReferenceValueImpl::TCIMReferenceValueImpl(TCIMReferenceValueImpl const& other) = default;
TCIMReferenceValueImpl::~TCIMReferenceValueImpl() = default;

TCIMReferenceValueImpl::operator TCIMReference() const { return fReference; }

std::string TCIMReferenceValueImpl::ToString(unsigned char) const { return fReference.GetPath(); }

bool TCIMReferenceValueImpl::operator==(TCIMValue const& other) const {
  if (!other.IsReference()) return false;
  return fReference == DataOf<TCIMReferenceValueImpl>(other).fReference;
}

bool TCIMReferenceValueImpl::operator<(TCIMValue const& other) const {
  if (!other.IsReference()) return false;
  return fReference < DataOf<TCIMReferenceValueImpl>(other).fReference;
}

}  // namespace NQRVZEP20
