#pragma once

#include "ZEPExport.h"

#include <string>

namespace NQRVZEP20 {

// The status codes of the whole library. Every failure that is reported by exception carries one of them.
enum EZEPStatusCode : int {
  kZEPStatusOK = 0,
  kZEPStatusNotImplemented,
  kZEPStatusUnknownClass,
  kZEPStatusFail,
  kZEPStatusOutOfMemory,
  kZEPStatusNoMoreItems,
  kZEPStatusErrorCollectingClass,
  kZEPStatusInvalidClass,
  kZEPStatusInvalidProperty,
  kZEPStatusInvalidSpecificationDocument,
  kZEPStatusInvalidDataCollectionDocument,
  kZEPStatusFileSystemError,
  kZEPStatusDirectoryAlreadyExists,
  kZEPStatusNotArray,
  kZEPStatusTypeMismatch,
  kZEPStatusNotFound,
  kZEPStatusAlreadyExists,
  kZEPStatusInvalidOpSequence,
  kZEPStatusInvalidInstance,
  kZEPStatusCorruptedContainer,
  kZEPStatusInvalidPlugin,
  kZEPStatusInvalidDateTime,
  kZEPStatusNotAssociation,
  kZEPStatusNotReference,
  kZEPStatusInvalidReference,
  kZEPStatusInvalidCIMName,
  kZEPStatusFileNotFound,
  kZEPStatusAccessDenied,
  kZEPStatusNotOverridable,
  kZEPStatusInvalidGzipFile,
  kZEPStatusCorruptGzipFile,
  kZEPStatusNotSupported,
  kZEPStatusValueIsNULL,
  kZEPStatusINETNotFound,
  kZEPStatusConnectionFailed,
  kZEPStatusLibCurlFailure,
  kZEPStatusInvalidFormat,
  kZEPStatusContainerMismatch,
  kZEPStatusRequiredContextMissing,
  kZEPStatusVersionMismatch,
  kZEPStatusLuzFilecopyFailure,
  kZEPStatusTransferFailure,
  kZEPStatusCimomConnectFailure,
  fdrStatusEnd  // not a status: the value of the last entry, which names itself
};

// One status code as a value. It is made implicitly from an enumerator and compares with one. Any thread may read it.
class ZEP_EXPORT TZEPStatusCode {
public:
  TZEPStatusCode(EZEPStatusCode code = kZEPStatusOK) noexcept : fCode(code) {}
  TZEPStatusCode(int code) noexcept : fCode(static_cast<EZEPStatusCode>(code)) {}

  EZEPStatusCode GetCode() const noexcept { return fCode; }

  // The code's text: its own constant name, such as "kZEPStatusNotFound". The reference stays valid to the end of the
  // process. There is no range check: the code must lie in kZEPStatusOK to fdrStatusEnd.
  std::string const& TranslateStatusCode() const;

  friend bool operator==(TZEPStatusCode const& a, TZEPStatusCode const& b) noexcept { return a.fCode == b.fCode; }
  friend bool operator!=(TZEPStatusCode const& a, TZEPStatusCode const& b) noexcept { return a.fCode != b.fCode; }

private:
  EZEPStatusCode fCode;
};

}  // namespace NQRVZEP20
