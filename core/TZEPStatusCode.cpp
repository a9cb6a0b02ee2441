// SPDX-License-Identifier: Apache-2.0
#include "TZEPStatusCode.h"

#include <array>

namespace NQRVZEP20 {
namespace {

// The text of each code, which is the name of its constant.
std::array<std::string, fdrStatusEnd + 1> const kZEPErrorMessages = {
    "kZEPStatusOK",
    "kZEPStatusNotImplemented",
    "kZEPStatusUnknownClass",
    "kZEPStatusFail",
    "kZEPStatusOutOfMemory",
    "kZEPStatusNoMoreItems",
    "kZEPStatusErrorCollectingClass",
    "kZEPStatusInvalidClass",
    "kZEPStatusInvalidProperty",
    "kZEPStatusInvalidSpecificationDocument",
    "kZEPStatusInvalidDataCollectionDocument",
    "kZEPStatusFileSystemError",
    "kZEPStatusDirectoryAlreadyExists",
    "kZEPStatusNotArray",
    "kZEPStatusTypeMismatch",
    "kZEPStatusNotFound",
    "kZEPStatusAlreadyExists",
    "kZEPStatusInvalidOpSequence",
    "kZEPStatusInvalidInstance",
    "kZEPStatusCorruptedContainer",
    "kZEPStatusInvalidPlugin",
    "kZEPStatusInvalidDateTime",
    "kZEPStatusNotAssociation",
    "kZEPStatusNotReference",
    "kZEPStatusInvalidReference",
    "kZEPStatusInvalidCIMName",
    "kZEPStatusFileNotFound",
    "kZEPStatusAccessDenied",
    "kZEPStatusNotOverridable",
    "kZEPStatusInvalidGzipFile",
    "kZEPStatusCorruptGzipFile",
    "kZEPStatusNotSupported",
    "kZEPStatusValueIsNULL",
    "kZEPStatusINETNotFound",
    "kZEPStatusConnectionFailed",
    "kZEPStatusLibCurlFailure",
    "kZEPStatusInvalidFormat",
    "kZEPStatusContainerMismatch",
    "kZEPStatusRequiredContextMissing",
    "kZEPStatusVersionMismatch",
    "kZEPStatusLuzFilecopyFailure",
    "kZEPStatusTransferFailure",
    "kZEPStatusCimomConnectFailure",
    "fdrStatusEnd",
};

}  // namespace

std::string const& TZEPStatusCode::TranslateStatusCode() const { return kZEPErrorMessages[fCode]; }

}  // namespace NQRVZEP20
