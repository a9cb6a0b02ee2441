// SPDX-License-Identifier: Apache-2.0
#include "collect/answer/TRecordedFailure.h"

#include "TZEPFailure.h"
#include "collect/FailureOf.h"
#include "collect/SafeText.h"
#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TBadAnswer.h"
#include "collect/answer/TByteReader.h"
#include "collect/answer/TByteWriter.h"

#include <new>
#include <stdexcept>

namespace NQRVZEP20 {

namespace {

struct TNoException {};  // thrown for something that was not a std::exception

}  // namespace

TRecordedFailure TRecordedFailure::OfCurrentException() {
  TRecordedFailure recorded;
  try {
    throw;
  } catch (std::bad_alloc const&) {
    throw;
  } catch (TZEPFailure const& failure) {
    recorded.fKind = kStatusWithReason;
    recorded.fCode = failure.GetStatusCode().GetCode();
    recorded.fText = failure.Reason();
  } catch (TZEPException const& failure) {
    recorded.fKind = kStatus;
    recorded.fCode = failure.GetStatusCode().GetCode();
  } catch (std::exception const& failure) {
    recorded.fKind = kText;
    recorded.fText = TextOf(failure);
  } catch (...) {
    recorded.fKind = kOther;
  }
  return recorded;
}

TRecordedFailure TRecordedFailure::ReadFrom(TByteReader& reader) {
  TRecordedFailure recorded;
  recorded.fKind = static_cast<EKind>(reader.NumberUpTo(kOther, "the kind of a failure"));
  // The texts of the codes are in a table.
  recorded.fCode = static_cast<int>(reader.NumberUpTo(fdrStatusEnd, "a status code"));
  recorded.fText = Shortened(reader.Text(), kLongestFailure);
  return recorded;
}

void TRecordedFailure::WriteTo(TByteWriter& writer) const {
  bool const hasText = fCode >= kZEPStatusOK && fCode <= fdrStatusEnd;
  writer.Number(fKind);
  writer.Number(static_cast<unsigned int>(hasText ? fCode : kZEPStatusFail));
  writer.Text(fText);
}

void TRecordedFailure::Throw() const {
  switch (fKind) {
    case kStatus:
      throw TZEPException(static_cast<EZEPStatusCode>(fCode));
    case kStatusWithReason:
      throw TZEPFailure(static_cast<EZEPStatusCode>(fCode), fText);
    case kText:
      throw std::runtime_error(fText);
    default:
      throw TNoException();
  }
}

}  // namespace NQRVZEP20
