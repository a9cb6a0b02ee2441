// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ZEPExport.h"

#include <string>

namespace NQRVZEP20 {

// The status codes of the library. Every TZEPException has one of them.
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
  fdrStatusEnd  // not a status code, but the number of codes above; its text is its own name
};

// One status code as a value. It converts implicitly from an enumerator and can be compared with one. Any thread may read it.
class ZEP_EXPORT TZEPStatusCode {
public:
  TZEPStatusCode(EZEPStatusCode code = kZEPStatusOK) noexcept : fCode(code) {}
  TZEPStatusCode(int code) noexcept : fCode(static_cast<EZEPStatusCode>(code)) {}

  EZEPStatusCode GetCode() const noexcept { return fCode; }

  // The code's text, which is the name of its constant, such as "kZEPStatusNotFound". The reference is valid until the end
  // of the process. The range is not checked: the code must be between kZEPStatusOK and fdrStatusEnd.
  std::string const& TranslateStatusCode() const;

  friend bool operator==(TZEPStatusCode const& a, TZEPStatusCode const& b) noexcept { return a.fCode == b.fCode; }
  friend bool operator!=(TZEPStatusCode const& a, TZEPStatusCode const& b) noexcept { return a.fCode != b.fCode; }

private:
  EZEPStatusCode fCode;
};

}  // namespace NQRVZEP20
