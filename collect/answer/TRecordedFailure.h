// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

class TByteReader;
class TByteWriter;

// A record of an exception, which can be written in one process and thrown in another: a TZEPException with its code, a
// TZEPFailure also with its reason, any other std::exception with its message, or an exception of any other type.
class TRecordedFailure {
public:
  static TRecordedFailure OfCurrentException();           // call it in a catch block; rethrows std::bad_alloc
  static TRecordedFailure ReadFrom(TByteReader& reader);  // a long text is cut (AnswerLimits.h)
  void WriteTo(TByteWriter& writer) const;

  // Throws a TZEPException, a TZEPFailure, a std::runtime_error with the message, or an object that is not a std::exception.
  [[noreturn]] void Throw() const;

private:
  enum EKind : unsigned char { kStatus, kStatusWithReason, kText, kOther };

  EKind fKind = kOther;
  int fCode = 0;      // the code of a TZEPException
  std::string fText;  // the reason, or the message of another exception
};

}  // namespace NQRVZEP20
