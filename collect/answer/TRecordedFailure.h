// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace NQRVZEP20 {

class TByteReader;
class TByteWriter;

// An exception as a value, so that it can be written in one process and thrown again in another: a TZEPException with its code,
// a TZEPFailure also with its reason, any other std::exception with its text, or something else.
class TRecordedFailure {
public:
  static TRecordedFailure OfCurrentException();  // call it in a handler; passes on std::bad_alloc
  static TRecordedFailure ReadFrom(TByteReader& reader);
  void WriteTo(TByteWriter& writer) const;

  // Throws a TZEPException, a TZEPFailure, a std::runtime_error with the text, or something that is not a std::exception.
  [[noreturn]] void Throw() const;

private:
  enum EKind : unsigned char { kStatus, kStatusWithReason, kText, kOther };

  EKind fKind = kOther;
  int fCode = 0;      // of a TZEPException
  std::string fText;  // the reason, or the text of another exception
};

}  // namespace NQRVZEP20
