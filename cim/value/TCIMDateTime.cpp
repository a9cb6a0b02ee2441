// SPDX-License-Identifier: Apache-2.0
#include "TCIMDateTime.h"

#include "TCIMDateTimeImpl.h"
#include "TZEPException.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {

TCIMDateTime::TCIMDateTime() : fBody(boost::make_shared<TCIMDateTimeImpl>()) {}

TCIMDateTime::TCIMDateTime(std::string const& text) : TCIMDateTime() { Set(text); }

TCIMDateTime::TCIMDateTime(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds,
                           unsigned int microSeconds)
    : TCIMDateTime() {
  Set(days, hours, minutes, seconds, microSeconds);
}

TCIMDateTime::TCIMDateTime(unsigned short year, unsigned short month, unsigned int day, unsigned short hour,
                           unsigned short minute, unsigned short second, unsigned int microSeconds, short utcOffset)
    : TCIMDateTime() {
  Set(year, month, day, hour, minute, second, microSeconds, utcOffset);
}

TCIMDateTime::TCIMDateTime(TCIMDateTime const& other) : fBody(boost::make_shared<TCIMDateTimeImpl>(*other.fBody)) {}

TCIMDateTime& TCIMDateTime::operator=(TCIMDateTime const& other) {
  fBody = boost::make_shared<TCIMDateTimeImpl>(*other.fBody);
  return *this;
}

TCIMDateTime::~TCIMDateTime() = default;

void TCIMDateTime::Set(std::string const& text) { fBody->Set(text); }

void TCIMDateTime::Set(unsigned int days, unsigned short hours, unsigned short minutes, unsigned short seconds,
                       unsigned int microSeconds) {
  fBody->Set(days, hours, minutes, seconds, microSeconds);
}

void TCIMDateTime::Set(unsigned short year, unsigned short month, unsigned int day, unsigned short hour, unsigned short minute,
                       unsigned short second, unsigned int microSeconds, short utcOffset) {
  fBody->Set(year, month, day, hour, minute, second, microSeconds, utcOffset);
}

void TCIMDateTime::SetPrecision(bool precision) { fBody->SetPrecision(precision); }
void TCIMDateTime::Clear() { fBody->Clear(); }

bool TCIMDateTime::IsNull() const { return fBody->IsNull(); }
bool TCIMDateTime::IsInterval() const { return fBody->IsInterval(); }
unsigned short TCIMDateTime::GetYear() const { return fBody->GetYear(); }
unsigned short TCIMDateTime::GetMonth() const { return fBody->GetMonth(); }
unsigned int TCIMDateTime::GetDay() const { return fBody->GetDay(); }
unsigned short TCIMDateTime::GetHour() const { return fBody->GetHour(); }
unsigned short TCIMDateTime::GetMinute() const { return fBody->GetMinute(); }
unsigned short TCIMDateTime::GetSecond() const { return fBody->GetSecond(); }
unsigned int TCIMDateTime::GetMicroSeconds() const { return fBody->GetMicroSeconds(); }
short TCIMDateTime::GetUTCOffset() const { return fBody->GetUTCOffset(); }
bool TCIMDateTime::GetPrecision() const { return fBody->GetPrecision(); }
boost::shared_ptr<TCIMDateTimeImpl> TCIMDateTime::GetBody() const { return fBody; }

std::string TCIMDateTime::ToString() const { return fBody->ToString(); }
std::string TCIMDateTime::ToUIString() const { return fBody->ToUIString(); }

bool TCIMDateTime::operator==(TCIMDateTime const& other) const { return *fBody == *other.fBody; }
bool TCIMDateTime::operator<(TCIMDateTime const& other) const { return *fBody < *other.fBody; }

TCIMDateTime TCIMDateTime::operator+(TCIMDateTime const& other) const {
  TCIMDateTime sum;
  *sum.fBody = *fBody + *other.fBody;
  return sum;
}

TCIMDateTime TCIMDateTime::operator-(TCIMDateTime const& other) const {
  TCIMDateTime difference;
  *difference.fBody = *fBody - *other.fBody;
  return difference;
}

TCIMDateTime TCIMDateTime::GetDifference(TCIMDateTime&, TCIMDateTime&) { throw TZEPException(kZEPStatusNotImplemented); }

}  // namespace NQRVZEP20
