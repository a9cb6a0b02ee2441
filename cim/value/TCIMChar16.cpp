// SPDX-License-Identifier: Apache-2.0
#include "TCIMChar16.h"

#include "TCIMChar16Impl.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TCIMChar16::TCIMChar16() : fBody(boost::make_shared<TCIMChar16Impl>()) {}
TCIMChar16::TCIMChar16(unsigned short code) : fBody(boost::make_shared<TCIMChar16Impl>(code)) {}
TCIMChar16::TCIMChar16(std::string const& text) : fBody(boost::make_shared<TCIMChar16Impl>(text)) {}
TCIMChar16::TCIMChar16(TCIMChar16 const& other) : fBody(boost::make_shared<TCIMChar16Impl>(*other.fBody)) {}
TCIMChar16::~TCIMChar16() = default;

TCIMChar16& TCIMChar16::operator=(TCIMChar16 const& other) {
  *fBody = *other.fBody;
  return *this;
}

unsigned short TCIMChar16::GetValue() const { return fBody->GetValue(); }
std::string TCIMChar16::ToString() const { return fBody->ToString(); }
bool TCIMChar16::operator==(TCIMChar16 const& other) const { return *fBody == other.fBody; }
bool TCIMChar16::operator<(TCIMChar16 const& other) const { return *fBody < other.fBody; }

}  // namespace NQRVZEP20
