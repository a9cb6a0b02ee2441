// SPDX-License-Identifier: Apache-2.0
#include "TCIMValueImpl.h"

#include "TCIMReference.h"
#include "TZEPException.h"

namespace NQRVZEP20 {
namespace {

[[noreturn]] void Refuse() { throw TZEPException(kZEPStatusTypeMismatch); }

}  // namespace

TCIMValueImpl::operator bool() const { Refuse(); }
TCIMValueImpl::operator unsigned char() const { Refuse(); }
TCIMValueImpl::operator signed char() const { Refuse(); }
TCIMValueImpl::operator unsigned short() const { Refuse(); }
TCIMValueImpl::operator short() const { Refuse(); }
TCIMValueImpl::operator unsigned int() const { Refuse(); }
TCIMValueImpl::operator int() const { Refuse(); }
TCIMValueImpl::operator unsigned long() const { Refuse(); }
TCIMValueImpl::operator long() const { Refuse(); }
TCIMValueImpl::operator float() const { Refuse(); }
TCIMValueImpl::operator double() const { Refuse(); }
TCIMValueImpl::operator std::string() const { Refuse(); }
TCIMValueImpl::operator TCIMChar16() const { Refuse(); }
TCIMValueImpl::operator TCIMDateTime() const { Refuse(); }
TCIMValueImpl::operator TCIMReference() const { Refuse(); }
TCIMValueImpl::operator std::vector<TCIMValue>&() const { Refuse(); }

void TCIMValueImpl::RefuseNull() { throw TZEPException(kZEPStatusValueIsNULL); }

}  // namespace NQRVZEP20
